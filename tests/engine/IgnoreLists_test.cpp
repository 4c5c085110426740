#include "engine/IgnoreLists.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "engine/LibVerify.h"
#include "environment/LibRegistryVTR.h"
#include "support/Raised.h"
#include "support/TempStore.h"

namespace vtr {
namespace {

using LibRegistryVTR::GetSuiteLong;
using LibRegistryVTR::GetSuiteString;
using LibRegistryVTR::SetSuiteLong;
using LibRegistryVTR::SetSuiteString;

class IgnoreListsTest : public testsupport::StoreTest {
  protected:
    IgnoreListsTest() { Clear(); }
    ~IgnoreListsTest() override { Clear(); }
    static void Clear() {
        LibVerify::IgnoredMessageNumbers().Clear();
        LibVerify::IgnoredResultKeys().Clear();
        LibVerify::ClearResults();
    }
    // What a new verification would start with.
    static void Reload() {
        Clear();
        IgnoreLists::LoadIgnoreLists();
    }
    static Result MakeResult(int32_t number, std::vector<std::string> details) {
        Result result;
        result.SetMessageNumber(number);
        for (const auto& detail : details)
            result.AddDetail(detail);
        return result;
    }
};

TEST_F(IgnoreListsTest, LoadsOnlyTheValuesPresentBelowTheCount) {
    SetSuiteLong("CountIgnoreMsgNum", 3, "Verifier");
    SetSuiteString("IgnoreMsgNum1", "23", "Verifier");
    SetSuiteString("IgnoreMsgNum3", "41", "Verifier");
    SetSuiteString("IgnoreMsgNum4", "99", "Verifier");  // beyond the count
    SetSuiteLong("CountIgnoreMsg", 4, "Verifier");
    SetSuiteString("IgnoreMsg1", "28-a / ", "Verifier");
    SetSuiteString("IgnoreMsg2", "", "Verifier");
    SetSuiteString("IgnoreMsg3", "28-a / ", "Verifier");  // a repeat is skipped
    SetSuiteString("IgnoreMsg4", "30-b / ", "Verifier");
    Reload();
    EXPECT_EQ(LibVerify::IgnoredMessageNumbers().Entries(), (std::vector<std::string>{"23", "41"}));
    EXPECT_EQ(LibVerify::IgnoredResultKeys().Entries(),
              (std::vector<std::string>{"28-a / ", "30-b / "}));
    EXPECT_TRUE(IgnoreLists::IsMessageNumberIgnored("41"));
    EXPECT_FALSE(IgnoreLists::IsMessageNumberIgnored("99"));
    EXPECT_TRUE(IgnoreLists::IsIgnoreKeyIgnored("30-b / "));
    EXPECT_FALSE(IgnoreLists::IsIgnoreKeyIgnored("30-b"));
}

TEST_F(IgnoreListsTest, AnEmptyOrOddStoreLoadsNothing) {
    Reload();
    EXPECT_EQ(LibVerify::IgnoredMessageNumbers().Count(), 0u);
    SetSuiteLong("CountIgnoreMsgNum", -5, "Verifier");
    SetSuiteString("IgnoreMsgNum1", "23", "Verifier");
    Reload();
    EXPECT_EQ(LibVerify::IgnoredMessageNumbers().Count(), 0u);
}

TEST_F(IgnoreListsTest, UnignoringLowersTheCountAndLeavesTheOldValue) {
    IgnoreLists::IgnoreMessageNumber(23);
    EXPECT_EQ(GetSuiteLong("CountIgnoreMsgNum", "Verifier", -1), 1);
    EXPECT_EQ(GetSuiteString("IgnoreMsgNum1", "Verifier", ""), "23");
    IgnoreLists::UnignoreMessageNumber(23);
    EXPECT_EQ(GetSuiteLong("CountIgnoreMsgNum", "Verifier", -1), 0);
    EXPECT_EQ(GetSuiteString("IgnoreMsgNum1", "Verifier", ""), "23");
    Reload();
    EXPECT_FALSE(IgnoreLists::IsMessageNumberIgnored("23"));
    LibVerify::AddResult(Severity::Warning, "x", 23, 23);
    EXPECT_EQ(LibVerify::GetResults().size(), 1u);
}

TEST_F(IgnoreListsTest, RemovingRewritesTheListCompactlyInItsOrder) {
    const Result a = MakeResult(28, {"[SEQUENCE]: a.lms", "[CHANNEL]: x / y"});
    const Result b = MakeResult(30, {"b"});
    const Result c = MakeResult(31, {});
    IgnoreLists::IgnoreResult(a);
    IgnoreLists::IgnoreResult(b);
    IgnoreLists::IgnoreResult(c);
    IgnoreLists::UnignoreResult(b);
    EXPECT_EQ(GetSuiteLong("CountIgnoreMsg", "Verifier", -1), 2);
    EXPECT_EQ(GetSuiteString("IgnoreMsg1", "Verifier", ""),
              "28-[SEQUENCE]: a.lms / [CHANNEL]: x / y / ");
    EXPECT_EQ(GetSuiteString("IgnoreMsg2", "Verifier", ""), "31-");
    EXPECT_EQ(GetSuiteString("IgnoreMsg3", "Verifier", ""), "31-") << "left as it was";
    Reload();
    EXPECT_EQ(LibVerify::IgnoredResultKeys().Entries(),
              (std::vector<std::string>{a.IgnoreKey(), c.IgnoreKey()}));
    // Ignored as a whole key, separators inside the details and all.
    EXPECT_EQ(LibVerify::AddResult(Severity::Warning, "s", 28, 28, a.Details())->Ignorable(), true);
    EXPECT_EQ(LibVerify::GetIgnoredResults().size(), 1u);
    EXPECT_EQ(
        LibVerify::AddResult(Severity::Warning, "s", 28, 28, {"[SEQUENCE]: a.lms"})->Ignorable(),
        false);
}

TEST_F(IgnoreListsTest, NothingChangesForARepeatOrAnAbsentEntry) {
    IgnoreLists::IgnoreMessageNumber(5);
    const std::string stored = ReadStore();
    SetSuiteLong("CountIgnoreMsgNum", 7, "Verifier");  // would be rewritten by a save
    const std::string changed = ReadStore();
    IgnoreLists::IgnoreMessageNumber(5);
    IgnoreLists::UnignoreMessageNumber(6);
    IgnoreLists::UnignoreResult(MakeResult(1, {}));
    EXPECT_EQ(ReadStore(), changed);
    EXPECT_NE(stored, changed);
    EXPECT_EQ(LibVerify::IgnoredMessageNumbers().Entries(), std::vector<std::string>{"5"});
}

TEST_F(IgnoreListsTest, AStoreThatCannotBeWrittenKeepsTheListsInMemory) {
    // The store's folder is a file: every write fails.
    testsupport::WriteFileBytes(folder_.File("blocker"), "");
    testsupport::ScopedStore broken(folder_.File("blocker") + "/registry.reg");
    EXPECT_NO_THROW(IgnoreLists::IgnoreMessageNumber(12));
    EXPECT_NO_THROW(IgnoreLists::IgnoreResult(MakeResult(3, {"d"})));
    EXPECT_TRUE(IgnoreLists::IsMessageNumberIgnored("12"));
    EXPECT_TRUE(IgnoreLists::IsIgnoreKeyIgnored("3-d / "));
    EXPECT_NO_THROW(IgnoreLists::UnignoreMessageNumber(12));
    EXPECT_FALSE(IgnoreLists::IsMessageNumberIgnored("12"));
    EXPECT_NO_THROW(IgnoreLists::LoadIgnoreLists());
}

TEST_F(IgnoreListsTest, AChangeKeepsWhatAnotherWriterStoredMeanwhile) {
    IgnoreLists::IgnoreMessageNumber(5);
    Reload();
    // Another process adds an entry after this one read the lists.
    SetSuiteString("IgnoreMsgNum2", "7", "Verifier");
    SetSuiteLong("CountIgnoreMsgNum", 2, "Verifier");
    IgnoreLists::IgnoreMessageNumber(23);
    EXPECT_EQ(GetSuiteLong("CountIgnoreMsgNum", "Verifier", -1), 3);
    EXPECT_EQ(GetSuiteString("IgnoreMsgNum2", "Verifier", ""), "7");
    EXPECT_EQ(GetSuiteString("IgnoreMsgNum3", "Verifier", ""), "23");
    // The in-memory list is what the store now holds.
    EXPECT_EQ(LibVerify::IgnoredMessageNumbers().Entries(),
              (std::vector<std::string>{"5", "7", "23"}));

    // And removes from the list as stored, not from a stale copy.
    SetSuiteString("IgnoreMsgNum4", "41", "Verifier");
    SetSuiteLong("CountIgnoreMsgNum", 4, "Verifier");
    IgnoreLists::UnignoreMessageNumber(5);
    EXPECT_EQ(LibVerify::IgnoredMessageNumbers().Entries(),
              (std::vector<std::string>{"7", "23", "41"}));
    Reload();
    EXPECT_EQ(LibVerify::IgnoredMessageNumbers().Entries(),
              (std::vector<std::string>{"7", "23", "41"}));
}

TEST_F(IgnoreListsTest, EachChangeSaysWhatItFound) {
    using IgnoreLists::ChangeOutcome;
    EXPECT_EQ(IgnoreLists::AddIgnoredMessageNumber(9), ChangeOutcome::Added);
    EXPECT_EQ(IgnoreLists::AddIgnoredMessageNumber(9), ChangeOutcome::AlreadyListed);
    EXPECT_EQ(IgnoreLists::RemoveIgnoredMessageNumber(9), ChangeOutcome::Removed);
    EXPECT_EQ(IgnoreLists::RemoveIgnoredMessageNumber(9), ChangeOutcome::NotListed);
    EXPECT_EQ(IgnoreLists::AddIgnoredResultKey("28-a / "), ChangeOutcome::Added);
    EXPECT_EQ(IgnoreLists::AddIgnoredResultKey("28-a / "), ChangeOutcome::AlreadyListed);
    EXPECT_EQ(IgnoreLists::RemoveIgnoredResultKey("28-b / "), ChangeOutcome::NotListed);
    EXPECT_EQ(IgnoreLists::RemoveIgnoredResultKey("28-a / "), ChangeOutcome::Removed);
    EXPECT_EQ(GetSuiteLong("CountIgnoreMsg", "Verifier", -1), 0);
}

TEST_F(IgnoreListsTest, AStoreThatCannotBeChangedIsReportedAndKeptAsItWas) {
    IgnoreLists::IgnoreMessageNumber(5);
    const std::string stored = ReadStore();
    std::filesystem::permissions(StoreFile(), std::filesystem::perms::owner_read);
    const auto error = testsupport::Raised([] { IgnoreLists::AddIgnoredMessageNumber(12); });
    ASSERT_TRUE(error);
    EXPECT_EQ(error->Description(), "the settings store is read-only: " + StoreFile() +
                                        " (its permissions do not allow writing; it was left "
                                        "as it is)");
    EXPECT_EQ(ReadStore(), stored);
    EXPECT_EQ(LibVerify::IgnoredMessageNumbers().Entries(), std::vector<std::string>{"5"});
    EXPECT_TRUE(testsupport::Raised([] { IgnoreLists::RemoveIgnoredMessageNumber(5); }));
    EXPECT_EQ(LibVerify::IgnoredMessageNumbers().Entries(), std::vector<std::string>{"5"});
    // The verification's own use goes on in memory.
    EXPECT_NO_THROW(IgnoreLists::IgnoreMessageNumber(12));
    EXPECT_TRUE(IgnoreLists::IsMessageNumberIgnored("12"));
    EXPECT_EQ(ReadStore(), stored);
}

}  // namespace
}  // namespace vtr
