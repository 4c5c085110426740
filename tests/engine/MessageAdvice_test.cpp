#include "engine/MessageAdvice.h"

#include <gtest/gtest.h>

#include <cstring>

#include "engine/Messages.h"

namespace vtr {
namespace {

// The reports give every finding its help: each message of the catalog has advice of a few
// sentences, and no number outside the catalog has any.
TEST(MessageAdvice, EveryMessageOfTheCatalogAndNoOther) {
    for (const Message& message : Messages::kAll) {
        const char* advice = MessageAdvice::For(message.number);
        ASSERT_NE(advice, nullptr) << message.number;
        const std::size_t length = std::strlen(advice);
        EXPECT_GE(length, 30u) << message.number;
        EXPECT_LE(length, 400u) << message.number;
        EXPECT_EQ(advice[length - 1], '.') << message.number;
    }
    for (const int32_t number : {-1, 8, 19, 34, 40, 50, 55, 9999})
        EXPECT_EQ(MessageAdvice::For(number), nullptr) << number;
    EXPECT_STREQ(MessageAdvice::For(1), "Nothing to do: every check passed.");
}

}  // namespace
}  // namespace vtr
