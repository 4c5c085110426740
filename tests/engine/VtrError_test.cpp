#include "engine/VtrError.h"

#include <gtest/gtest.h>

#include "engine/OrderedStringSet.h"

namespace vtr {
namespace {

TEST(VtrError, CarriesNumberSourceAndDescription) {
    try {
        Raise(37, "Here", "Something went wrong");
        FAIL() << "no error raised";
    } catch (const VtrError& e) {
        EXPECT_EQ(e.Number(), 37);
        EXPECT_EQ(e.Source(), "Here");
        EXPECT_EQ(e.Description(), "Something went wrong");
        EXPECT_STREQ(e.what(), "Something went wrong");
    }
}

TEST(VtrError, ResumedStepKeepsItsDefaultOnFailure) {
    EXPECT_EQ(ResumeOr(std::string("default"), [] () -> std::string { Raise(1, "", "x"); }),
              "default");
    EXPECT_EQ(ResumeOr(0, [] { return 42; }), 42);
    EXPECT_EQ(ResumeOr(7, [] () -> int { throw std::bad_alloc(); }), 7);
    int ran = 0;
    EXPECT_FALSE(ResumeStep([&] { ++ran; throw 3; }));
    EXPECT_TRUE(ResumeStep([&] { ++ran; }));
    EXPECT_EQ(ran, 2);
}

TEST(OrderedStringSet, KeepsInsertionOrderAndRefusesDuplicates) {
    OrderedStringSet set;
    EXPECT_TRUE(set.Add("23"));
    EXPECT_TRUE(set.Add("5"));
    EXPECT_FALSE(set.Add("23"));
    EXPECT_TRUE(set.Add("7"));
    EXPECT_TRUE(set.Remove("5"));
    EXPECT_FALSE(set.Remove("5"));
    EXPECT_EQ(set.Entries(), (std::vector<std::string>{"23", "7"}));
    EXPECT_TRUE(set.Contains("7"));
    EXPECT_FALSE(set.Contains("5"));
}

}  // namespace
}  // namespace vtr
