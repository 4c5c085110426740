#include "environment/RegistryFile.h"

#include <gtest/gtest.h>

namespace vtr::RegistryFile {
namespace {

namespace Code = RegistryStore::StatusCode;

// UTF-8 text to UTF-16LE bytes (as a Windows export is written).
std::string Utf16(const std::string& text, bool byteOrderMark = true) {
    std::string out = byteOrderMark ? std::string("\xFF\xFE") : std::string();
    auto put = [&](uint32_t unit) {
        out += static_cast<char>(unit & 0xFF);
        out += static_cast<char>(unit >> 8);
    };
    for (std::size_t i = 0; i < text.size();) {
        const auto c = static_cast<unsigned char>(text[i]);
        uint32_t cp;
        int length;
        if (c < 0x80) {
            cp = c, length = 1;
        } else if (c < 0xE0) {
            cp = c & 0x1F, length = 2;
        } else if (c < 0xF0) {
            cp = c & 0x0F, length = 3;
        } else {
            cp = c & 0x07, length = 4;
        }
        for (int k = 1; k < length; ++k)
            cp = cp << 6 | (text[i + k] & 0x3F);
        i += length;
        if (cp >= 0x10000) {
            put(0xD800 + ((cp - 0x10000) >> 10));
            put(0xDC00 + ((cp - 0x10000) & 0x3FF));
        } else {
            put(cp);
        }
    }
    return out;
}

const Value* Find(const Document& document, const std::string& key, const std::string& name) {
    const Key* found = document.FindKey(SplitKeyPath(key));
    if (found == nullptr)
        return nullptr;
    auto value = found->values.find(Fold(name));
    return value == found->values.end() ? nullptr : &value->second.value;
}

// The text of a string value (without its NUL), or "<none>".
std::string Text(const Document& document, const std::string& key, const std::string& name) {
    const Value* value = Find(document, key, name);
    if (value == nullptr)
        return "<none>";
    if (value->type != RegistryStore::ValueType::String)
        return "<type " + std::to_string(value->type) + ">";
    return value->data.substr(0, value->data.size() - 1);
}

const char kShared[] = "Software\\Vantori\\Shared";

// What a Windows export of the suite's key looks like (before UTF-16 encoding).
const std::string kExport =
    "Windows Registry Editor Version 5.00\r\n"
    "\r\n"
    "[HKEY_CURRENT_USER\\Software\\Vantori]\r\n"
    "\r\n"
    "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
    "\"AppPath\"=\"C:\\\\Program Files\\\\Vantori\\\\\"\r\n"
    "\"UserDataPath\"=\"D:\\\\Shows \\\"2024\\\"\"\r\n"
    "\"PostInstall\"=dword:00000001\r\n"
    "\"Caf\xC3\xA9\"=\"cr\xC3\xA8me \xF0\x9F\x8E\x84\"\r\n"
    "\"Expand\"=hex(2):25,00,55,00,53,00,45,00,52,00,50,00,52,00,4f,00,46,00,49,00,\\\r\n"
    "  4c,00,45,00,25,00,00,00\r\n"
    "@=\"default\"\r\n"
    "\r\n"
    "; network settings follow\r\n"
    "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\NetVersion]\r\n"
    "\"Ver\"=\"{1234}\"\r\n"
    "\r\n"
    "[HKEY_LOCAL_MACHINE\\Software\\Vantori]\r\n"
    "\"Machine\"=\"kept\"\r\n"
    "\r\n";

TEST(RegistryFile, ReadsAWindowsExportInUtf16) {
    const Document document = Document::Parse(Utf16(kExport));
    ASSERT_TRUE(document.Understood());
    EXPECT_EQ(Text(document, kShared, "AppPath"), "C:\\Program Files\\Vantori\\");
    EXPECT_EQ(Text(document, kShared, "UserDataPath"), "D:\\Shows \"2024\"");
    EXPECT_EQ(Text(document, kShared, "Caf\xC3\xA9"), "cr\xC3\xA8me \xF0\x9F\x8E\x84");
    EXPECT_EQ(Text(document, kShared, ""), "default");
    EXPECT_EQ(*Find(document, kShared, "PostInstall"), Value::Dword(1));
    // Other types are kept but not read.
    const Value* expand = Find(document, kShared, "Expand");
    ASSERT_NE(expand, nullptr);
    EXPECT_TRUE(expand->opaque);
    EXPECT_EQ(expand->type, 2u);
    EXPECT_EQ(Text(document, "Software\\Vantori\\Shared\\NetVersion", "Ver"), "{1234}");
    // Names compare without regard to case; only the current user's root is read.
    EXPECT_EQ(Text(document, "SOFTWARE\\vantori\\shared", "apppath"),
              "C:\\Program Files\\Vantori\\");
    EXPECT_EQ(document.FindKey(SplitKeyPath("Software\\Vantori"))->subkeys.size(), 1u);
    EXPECT_EQ(document.Root().subkeys.size(), 1u);
}

TEST(RegistryFile, AChangedValueIsTheOnlyDifferenceInTheWrittenFile) {
    Document document = Document::Parse(Utf16(kExport));
    ASSERT_EQ(document.SetValue(SplitKeyPath("software\\VANTORI\\shared"), "apppath",
                                Value::String("E:\\Vantori")),
              Code::Success);
    std::string expected = kExport;
    const std::string before = "\"AppPath\"=\"C:\\\\Program Files\\\\Vantori\\\\\"";
    expected.replace(expected.find(before), before.size(), "\"AppPath\"=\"E:\\\\Vantori\"");
    EXPECT_EQ(*document.Serialize(), Utf16(expected));

    // Setting what is already there writes nothing.
    Document same = Document::Parse(Utf16(kExport));
    EXPECT_EQ(same.SetValue(SplitKeyPath(kShared), "PostInstall", Value::Dword(1)), Code::Success);
    EXPECT_FALSE(same.Modified());
}

TEST(RegistryFile, NewValuesJoinTheirSectionAndNewKeysAreAddedWithTheFullRootName) {
    Document document = Document::Parse(Utf16(kExport));
    ASSERT_EQ(document.SetValue(SplitKeyPath("Software\\Vantori\\Shared\\NetVersion"), "Extra",
                                Value::Dword(10)),
              Code::Success);
    ASSERT_EQ(document.CreateKey(SplitKeyPath("Software\\Vantori\\Verifier")), Code::Success);
    ASSERT_EQ(document.SetValue(SplitKeyPath("Software\\Vantori\\Verifier"), "CountIgnoreMsg",
                                Value::Dword(2)),
              Code::Success);
    std::string expected = kExport;
    const std::string ver = "\"Ver\"=\"{1234}\"\r\n";
    expected.insert(expected.find(ver) + ver.size(), "\"Extra\"=dword:0000000a\r\n");
    expected +=
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Verifier]\r\n"
        "\"CountIgnoreMsg\"=dword:00000002\r\n";
    EXPECT_EQ(*document.Serialize(), Utf16(expected));
}

TEST(RegistryFile, ReadsUtf8AndTheOlderHeaderAndKeepsTheirForm) {
    const std::string text =
        "REGEDIT4\n"
        "\n"
        "[HKCU\\Software\\Vantori\\Shared]\n"
        "\"AppPath\" = \"/opt/vantori\"\n";
    for (const std::string& bom : {std::string(), std::string("\xEF\xBB\xBF")}) {
        Document document = Document::Parse(bom + text);
        ASSERT_TRUE(document.Understood());
        EXPECT_EQ(Text(document, kShared, "AppPath"), "/opt/vantori");
        ASSERT_EQ(
            document.SetValue(SplitKeyPath(kShared), "MediaDataPath", Value::String("/srv/media")),
            Code::Success);
        EXPECT_EQ(*document.Serialize(), bom + text + "\"MediaDataPath\"=\"/srv/media\"\n");
    }
    // UTF-16 without a byte-order mark is recognised and written back without one.
    Document bare = Document::Parse(Utf16(text, false));
    ASSERT_TRUE(bare.Understood());
    EXPECT_EQ(Text(bare, kShared, "AppPath"), "/opt/vantori");
    ASSERT_EQ(bare.SetValue(SplitKeyPath(kShared), "AppPath", Value::String("/x")), Code::Success);
    EXPECT_EQ(*bare.Serialize(),
              Utf16("REGEDIT4\n\n[HKCU\\Software\\Vantori\\Shared]\n\"AppPath\"=\"/x\"\n", false));
}

TEST(RegistryFile, RemovalsApplyInFileOrder) {
    const Document document = Document::Parse(
        "Windows Registry Editor Version 5.00\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\n"
        "\"A\"=\"1\"\n"
        "\"B\"=\"1\"\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Old]\n"
        "\"X\"=\"1\"\n"
        "[-HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\n"
        "\"B\"=\"2\"\n"
        "\"C\"=\"2\"\n"
        "\"c\"=-\n"
        "\"D\"=\"3\"\n");
    EXPECT_EQ(Text(document, kShared, "A"), "<none>");
    EXPECT_EQ(Text(document, kShared, "B"), "2");
    EXPECT_EQ(Text(document, kShared, "C"), "<none>");
    EXPECT_EQ(Text(document, kShared, "D"), "3");
    EXPECT_EQ(document.FindKey(SplitKeyPath("Software\\Vantori\\Shared\\Old")), nullptr);
}

TEST(RegistryFile, ChangesLandAfterEarlierRemovals) {
    const std::string text =
        "Windows Registry Editor Version 5.00\n"
        "\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\n"
        "\"A\"=\"1\"\n"
        "\"A\"=-\n"
        "\n"
        "[-HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Net]\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Net\\DMX1]\n";
    Document document = Document::Parse(text);
    ASSERT_EQ(document.SetValue(SplitKeyPath(kShared), "A", Value::String("again")), Code::Success);
    // The key Net exists only through its subkey's section, after its removal.
    ASSERT_EQ(document.SetValue(SplitKeyPath("Software\\Vantori\\Shared\\Net"), "Ver",
                                Value::String("n")),
              Code::Success);
    EXPECT_EQ(*document.Serialize(),
              "Windows Registry Editor Version 5.00\n"
              "\n"
              "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\n"
              "\"A\"=\"1\"\n"
              "\"A\"=-\n"
              "\"A\"=\"again\"\n"
              "\n"
              "[-HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Net]\n"
              "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Net\\DMX1]\n"
              "\n"
              "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Net]\n"
              "\"Ver\"=\"n\"\n");
    const Document reread = Document::Parse(*document.Serialize());
    EXPECT_EQ(Text(reread, kShared, "A"), "again");
    EXPECT_EQ(Text(reread, "Software\\Vantori\\Shared\\Net", "Ver"), "n");
}

TEST(RegistryFile, DeletingAKeyTakesOutItsSectionsAndKeepsItsParentAndComments) {
    Document document = Document::Parse(
        "Windows Registry Editor Version 5.00\n"
        "\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network1\\AuxA]\n"
        "\"Comment\"=\"a\"\n"
        "\n"
        "; universes\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network2]\n"
        "\"Comment\"=\"b\"\n");
    EXPECT_EQ(document.DeleteKey(SplitKeyPath("Software\\Vantori\\Shared\\Network1")),
              Code::AccessDenied);  // it has a subkey
    EXPECT_EQ(document.DeleteKey(SplitKeyPath("Software\\Vantori\\Shared\\Missing")),
              Code::FileNotFound);
    ASSERT_EQ(document.DeleteKey(SplitKeyPath("Software\\Vantori\\Shared\\Network1\\AuxA")),
              Code::Success);
    // Network1 existed only through AuxA's section: it stays, with a section of its own.
    EXPECT_EQ(*document.Serialize(),
              "Windows Registry Editor Version 5.00\n"
              "\n"
              "; universes\n"
              "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network2]\n"
              "\"Comment\"=\"b\"\n"
              "\n"
              "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network1]\n");
    ASSERT_EQ(document.DeleteKey(SplitKeyPath("Software\\Vantori\\Shared\\Network1")),
              Code::Success);
    EXPECT_EQ(document.FindKey(SplitKeyPath("Software\\Vantori\\Shared\\Network1")), nullptr);
    EXPECT_NE(document.FindKey(SplitKeyPath("Software\\Vantori\\Shared")), nullptr);
}

TEST(RegistryFile, OtherValueTypesAndUnreadableLinesAreWrittenBackUntouched) {
    const std::string text =
        "Windows Registry Editor Version 5.00\r\n"
        "\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
        "\"Blob\"=hex:01,02,\\\r\n"
        "    03,04\r\n"
        "\"Q\"=hex(b):01,00,00,00,00,00,00,00\r\n"
        "this line means nothing\r\n"
        "\"Broken\"=\"no end\r\n"
        "\"Fine\"=\"yes\"\r\n";
    Document document = Document::Parse(Utf16(text));
    ASSERT_TRUE(document.Understood());
    EXPECT_EQ(Text(document, kShared, "Fine"), "yes");
    EXPECT_EQ(Text(document, kShared, "Broken"), "<none>");
    EXPECT_TRUE(Find(document, kShared, "Blob")->opaque);
    ASSERT_EQ(document.SetValue(SplitKeyPath(kShared), "Fine", Value::String("no")), Code::Success);
    std::string expected = text;
    expected.replace(expected.find("\"Fine\"=\"yes\""), 12, "\"Fine\"=\"no\"");
    EXPECT_EQ(*document.Serialize(), Utf16(expected));
}

TEST(RegistryFile, StringsThatCannotStandOnOneLineAreWrittenAsStringBytes) {
    Document document = Document::Parse(Utf16("Windows Registry Editor Version 5.00\r\n"));
    ASSERT_EQ(document.CreateKey(SplitKeyPath(kShared)), Code::Success);
    ASSERT_EQ(document.SetValue(SplitKeyPath(kShared), "Two", Value::String("line\r\nbreak")),
              Code::Success);
    const Document reread = Document::Parse(*document.Serialize());
    EXPECT_EQ(Text(reread, kShared, "Two"), "line\r\nbreak");
    EXPECT_NE(reread.Serialize()->find(Utf16("\"Two\"=hex(1):6c,00,69,00", false)),
              std::string::npos);

    // A string of stored length 0 and one holding only its NUL.
    const Document lengths = Document::Parse(
        "Windows Registry Editor Version 5.00\n[HKCU\\K]\n\"Zero\"=hex(1):\n\"One\"=\"\"\n");
    EXPECT_EQ(Find(lengths, "K", "Zero")->data, "");
    EXPECT_EQ(Find(lengths, "K", "One")->data, std::string(1, '\0'));
}

TEST(RegistryFile, ATextThatIsNotARegistryExportIsReadAsEmptyAndNeverChanged) {
    for (const std::string& bytes :
         {std::string("just some notes\n[HKCU\\K]\n"), std::string("\xFF\xFEW\x00i", 5),
          std::string("\x00\x01\x02garbage", 10)}) {
        Document document = Document::Parse(bytes);
        EXPECT_FALSE(document.Understood());
        EXPECT_TRUE(document.Root().subkeys.empty());
        EXPECT_EQ(document.CreateKey(SplitKeyPath("K")), Code::BadDatabase);
        EXPECT_EQ(document.SetValue({}, "V", Value::Dword(1)), Code::BadDatabase);
        EXPECT_FALSE(document.Serialize());
    }
    // An empty text is an empty store, which gets a header on its first change.
    Document empty = Document::Parse("");
    EXPECT_TRUE(empty.Understood());
    ASSERT_EQ(empty.SetValue(SplitKeyPath(""), "V", Value::Dword(1)), Code::Success);
    EXPECT_EQ(
        *empty.Serialize(),
        "Windows Registry Editor Version 5.00\n\n[HKEY_CURRENT_USER]\n\"V\"=dword:00000001\n");
}

TEST(RegistryFile, AStringTheFileCannotHoldIsRefused) {
    Document document =
        Document::Parse(Utf16("Windows Registry Editor Version 5.00\r\n\r\n[HKCU\\K]\r\n"));
    const std::string before = *document.Serialize();
    EXPECT_EQ(document.SetValue(SplitKeyPath("K"), "Bad", Value::String("\xFF\xFE not UTF-8")),
              Code::InvalidData);
    EXPECT_FALSE(document.Modified());
    EXPECT_EQ(*document.Serialize(), before);
    // A name with a line break cannot be written at all.
    EXPECT_EQ(document.SetValue(SplitKeyPath("K"), "two\nlines", Value::Dword(1)),
              Code::InvalidData);
}

TEST(RegistryFile, ABatchWritesWhatItsChangesWouldOneByOne) {
    const std::string text =
        "Windows Registry Editor Version 5.00\r\n"
        "\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Verifier]\r\n"
        "\"CountIgnoreMsg\"=dword:00000002\r\n"
        "\"IgnoreMsg1\"=\"5-a / \"\r\n"
        "\"IgnoreMsg2\"=\"6-b / \"\r\n"
        "\r\n"
        "; the rest is kept as it is\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
        "\"AppPath\"=\"C:\\\\Vantori\\\\\"";  // no line end at the very end
    const KeyPath verifier = SplitKeyPath("Software\\Vantori\\Verifier");
    const KeyPath shared = SplitKeyPath(kShared);
    auto change = [&](Document& d) {
        EXPECT_EQ(d.SetValue(verifier, "IgnoreMsg2", Value::String("7-c / ")), Code::Success);
        EXPECT_EQ(d.SetValue(verifier, "IgnoreMsg3", Value::String("8-d / ")), Code::Success);
        EXPECT_EQ(d.SetValue(verifier, "IgnoreMsg4", Value::String("x")), Code::Success);
        EXPECT_EQ(d.SetValue(verifier, "IgnoreMsg4", Value::String("9-e / ")), Code::Success);
        EXPECT_EQ(d.SetValue(verifier, "countignoremsg", Value::Dword(4)), Code::Success);
        EXPECT_EQ(d.SetValue(shared, "UserDataPath", Value::String("D:\\Data")), Code::Success);
        EXPECT_EQ(d.CreateKey(SplitKeyPath("Software\\Vantori\\Shared\\NetVersion")),
                  Code::Success);
        EXPECT_EQ(d.SetValue(SplitKeyPath("Software\\Vantori\\Shared\\NetVersion"), "Ver",
                             Value::String("{1}")),
                  Code::Success);
    };
    const std::string expected =
        "Windows Registry Editor Version 5.00\r\n"
        "\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Verifier]\r\n"
        "\"CountIgnoreMsg\"=dword:00000004\r\n"
        "\"IgnoreMsg1\"=\"5-a / \"\r\n"
        "\"IgnoreMsg2\"=\"7-c / \"\r\n"
        "\"IgnoreMsg3\"=\"8-d / \"\r\n"
        "\"IgnoreMsg4\"=\"9-e / \"\r\n"
        "\r\n"
        "; the rest is kept as it is\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
        "\"AppPath\"=\"C:\\\\Vantori\\\\\"\r\n"
        "\"UserDataPath\"=\"D:\\\\Data\"\r\n"
        "\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\NetVersion]\r\n"
        "\"Ver\"=\"{1}\"\r\n";
    for (const std::string& bytes : {text, Utf16(text)}) {
        Document batch = Document::Parse(bytes);
        batch.BeginBatch();
        change(batch);
        // Queries see the changes at once; the text gets them at the end of the batch.
        EXPECT_EQ(Text(batch, "Software\\Vantori\\Verifier", "IgnoreMsg4"), "9-e / ");
        EXPECT_EQ(*batch.Serialize(), bytes);
        EXPECT_EQ(batch.EndBatch(), Code::Success);
        EXPECT_TRUE(batch.Modified());
        EXPECT_EQ(*batch.Serialize(), bytes == text ? expected : Utf16(expected));

        Document single = Document::Parse(bytes);
        change(single);
        EXPECT_EQ(single.Serialize(), batch.Serialize());
        // The next batch finds its lines where the last one left them.
        batch.BeginBatch();
        EXPECT_EQ(batch.SetValue(verifier, "IgnoreMsg5", Value::String("10-f / ")), Code::Success);
        EXPECT_EQ(batch.SetValue(verifier, "IgnoreMsg1", Value::String("4-z / ")), Code::Success);
        EXPECT_EQ(batch.EndBatch(), Code::Success);
        std::string next = expected;
        next.replace(next.find("5-a / "), 6, "4-z / ");
        const std::string fourth = "\"IgnoreMsg4\"=\"9-e / \"\r\n";
        next.insert(next.find(fourth) + fourth.size(), "\"IgnoreMsg5\"=\"10-f / \"\r\n");
        EXPECT_EQ(*batch.Serialize(), bytes == text ? next : Utf16(next));
    }
}

TEST(RegistryFile, ABatchWithAChangeTheFileCannotHoldIsUndoneWhole) {
    const std::string text =
        "Windows Registry Editor Version 5.00\n\n[HKCU\\K]\n\"A\"=\"1\"\n\"B\"=dword:00000002\n";
    Document document = Document::Parse(text);
    document.BeginBatch();
    EXPECT_EQ(document.SetValue({"K"}, "A", Value::String("changed")), Code::Success);
    EXPECT_EQ(document.CreateKey({"K", "Sub"}), Code::Success);
    EXPECT_EQ(document.SetValue({"K"}, "two\nlines", Value::Dword(1)), Code::Success);
    EXPECT_EQ(document.EndBatch(), Code::InvalidData);
    EXPECT_FALSE(document.Modified());
    EXPECT_EQ(*document.Serialize(), text);
    EXPECT_EQ(Text(document, "K", "A"), "1");
    EXPECT_EQ(document.FindKey({"K", "Sub"}), nullptr);
    // The document goes on as it was.
    EXPECT_EQ(document.SetValue({"K"}, "A", Value::String("2")), Code::Success);
    EXPECT_EQ(*document.Serialize(),
              "Windows Registry Editor Version 5.00\n\n[HKCU\\K]\n\"A\"=\"2\"\n"
              "\"B\"=dword:00000002\n");
}

TEST(RegistryFile, ValuesThatCannotJoinTheirSectionGetASectionAtTheEnd) {
    // The section ends with a line continued past the end of the file: a line added after it
    // would be read as part of it.
    const std::string text =
        "Windows Registry Editor Version 5.00\n\n[HKCU\\K]\n\"Old\"=\"1\"\n\"x\" junk \\\n";
    Document document = Document::Parse(text);
    document.BeginBatch();
    EXPECT_EQ(document.SetValue({"K"}, "A", Value::String("a")), Code::Success);
    EXPECT_EQ(document.SetValue({"K"}, "B", Value::Dword(2)), Code::Success);
    EXPECT_EQ(document.EndBatch(), Code::Success);
    EXPECT_EQ(*document.Serialize(), text +
                                         "\n[HKEY_CURRENT_USER\\K]\n\"A\"=\"a\"\n"
                                         "\"B\"=dword:00000002\n");
    const Document reread = Document::Parse(*document.Serialize());
    EXPECT_EQ(Text(reread, "K", "A"), "a");
    EXPECT_EQ(*Find(reread, "K", "B"), Value::Dword(2));
    EXPECT_EQ(Text(reread, "K", "Old"), "1");
    // Later changes land in the new section.
    EXPECT_EQ(document.SetValue({"K"}, "C", Value::String("c")), Code::Success);
    EXPECT_EQ(*document.Serialize(), text +
                                         "\n[HKEY_CURRENT_USER\\K]\n\"A\"=\"a\"\n"
                                         "\"B\"=dword:00000002\n\"C\"=\"c\"\n");
}

}  // namespace
}  // namespace vtr::RegistryFile
