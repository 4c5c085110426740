#include "engine/VtrError.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <stdexcept>
#include <string>
#include <vector>

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
    EXPECT_EQ(ResumeOr(std::string("default"), []() -> std::string { Raise(1, "", "x"); }),
              "default");
    EXPECT_EQ(ResumeOr(0, [] { return 42; }), 42);
    EXPECT_EQ(ResumeOr(7, []() -> int { throw std::bad_alloc(); }), 7);
    int ran = 0;
    EXPECT_FALSE(ResumeStep([&] {
        ++ran;
        throw 3;
    }));
    EXPECT_TRUE(ResumeStep([&] { ++ran; }));
    EXPECT_EQ(ran, 2);
}

TEST(VtrError, AFailureIsDescribedByItsDescriptionItsTextOrAsUnknown) {
    EXPECT_EQ(DescribeException(std::make_exception_ptr(
                  VtrError(37, "LibVerify.VerifyShowFile", "Show file not found"))),
              "Show file not found");
    EXPECT_EQ(DescribeException(std::make_exception_ptr(std::runtime_error("disk full"))),
              "disk full");
    EXPECT_EQ(DescribeException(std::make_exception_ptr(42)), "Unknown error");
    EXPECT_EQ(DescribeException(std::make_exception_ptr(42), "unexpected failure"),
              "unexpected failure");
    EXPECT_EQ(DescribeException(nullptr), "Unknown error");
}

// What the resume helpers tell the process's reporter, written down in order.
std::vector<std::string>& Told() {
    static std::vector<std::string> told;
    return told;
}

class ResumeReporterTest : public ::testing::Test {
  protected:
    void SetUp() override {
        saved_ = GetResumeReporter();
        Told().clear();
        SetResumeReporter([](std::string_view description) { Told().emplace_back(description); });
    }
    void TearDown() override { SetResumeReporter(saved_); }

  private:
    ResumeReporter saved_ = nullptr;
};

TEST_F(ResumeReporterTest, EverySwallowedFailureIsToldWithItsText) {
    ResumeStep([] { Raise(53, "LibFile.Open", "File not found: C:\\Shows\\A.lss"); });
    EXPECT_EQ(ResumeOr(5, []() -> int { throw std::out_of_range("index 7 of 3"); }), 5);
    ResumeStep([] { throw 3; });
    // Steps that complete tell nothing.
    EXPECT_TRUE(ResumeStep([] {}));
    EXPECT_EQ(ResumeOr(0, [] { return 1; }), 1);
    EXPECT_THAT(Told(), ::testing::ElementsAre("File not found: C:\\Shows\\A.lss", "index 7 of 3",
                                               "Unknown error"));
}

TEST_F(ResumeReporterTest, WithoutAReporterNothingIsToldAndAFailingReporterIsContained) {
    SetResumeReporter(nullptr);
    EXPECT_FALSE(ResumeStep([] { Raise(5, "", "quiet"); }));
    EXPECT_TRUE(Told().empty());

    SetResumeReporter([](std::string_view) { throw std::runtime_error("reporter broke"); });
    EXPECT_FALSE(ResumeStep([] { Raise(5, "", "loud"); }));
    EXPECT_EQ(ResumeOr(std::string("kept"), []() -> std::string { throw 1; }), "kept");
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
