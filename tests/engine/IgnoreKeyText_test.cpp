#include "engine/IgnoreKeyText.h"

#include <gtest/gtest.h>

#include <string>

namespace vtr {
namespace {

using IgnoreKeyText::Decode;
using IgnoreKeyText::Encode;
using IgnoreKeyText::IsUtf8;

TEST(IgnoreKeyTextTest, KeysOfUtf8TextAreTheirOwnText) {
    for (const std::string key :
         {"20-", "23-[SEQUENCE]: /s/a.las / ", "21-C:\\Shows\\Evening.lss / ",
          "28-[CHANNEL]: Étoile ✶ / ", "21-C:\\x41.lss / "}) {
        EXPECT_EQ(Encode(key), key);
        EXPECT_EQ(Decode(key), key);
    }
}

TEST(IgnoreKeyTextTest, OtherKeysAreEscapedAndComeBackByteForByte) {
    EXPECT_EQ(Encode("21-C:\\Shows\\Caf\xE9.lss / "), "escaped:21-C:\\\\Shows\\\\Caf\\xE9.lss / ");
    EXPECT_EQ(Encode("30-[CHANNEL]: a\nb\x7f / "), "escaped:30-[CHANNEL]: a\\x0Ab\\x7F / ");
    // Characters of UTF-8 stay whole beside escaped bytes.
    EXPECT_EQ(Encode("30-é\xFF"), "escaped:30-é\\xFF");
    // A text that would read as escaped is escaped itself (no real key looks like one).
    EXPECT_EQ(Encode("escaped:1"), "escaped:escaped:1");

    std::string every;
    for (int byte = 0; byte < 256; ++byte)
        every += static_cast<char>(byte);
    for (const std::string& key :
         {std::string("21-C:\\Shows\\Caf\xE9.lss / "), std::string("x\\\\xE9\\"), every,
          std::string("escaped:\\x41"), std::string("\xC0\xAF \xED\xA0\x80 \xF4\x90\x80\x80"),
          std::string(1, '\0')}) {
        const std::string text = Encode(key);
        EXPECT_TRUE(IsUtf8(text)) << text;
        EXPECT_EQ(Decode(text), key) << text;
    }
}

TEST(IgnoreKeyTextTest, AMalformedEscapeIsRefused) {
    EXPECT_EQ(Decode("escaped:\\xe9"), std::string("\xE9"));
    for (const char* text : {"escaped:\\", "escaped:a\\b", "escaped:\\x", "escaped:\\x4",
                             "escaped:\\xG0", "escaped:\\u00e9"})
        EXPECT_FALSE(Decode(text)) << text;
}

TEST(IgnoreKeyTextTest, Utf8IsCheckedStrictly) {
    EXPECT_TRUE(IsUtf8(""));
    EXPECT_TRUE(IsUtf8("plain é ✶ \xF0\x9F\x8E\x84"));
    for (const char* bytes : {"\x80", "\xC3", "\xC0\xAF", "\xE0\x80\xAF", "\xED\xA0\x80",
                              "\xF4\x90\x80\x80", "\xF8\x88\x80\x80\x80", "\xFF"})
        EXPECT_FALSE(IsUtf8(bytes)) << bytes;
}

}  // namespace
}  // namespace vtr
