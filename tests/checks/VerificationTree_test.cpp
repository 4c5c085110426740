// Whole verifications: a schedule whose shows share sequences is verified with every show
// file read once and every check run once, targets that are missing or garbage end in
// results, and nothing of the suite is changed.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <map>

#include "engine/LibVerify.h"
#include "schedule/DateTime.h"
#include "schedule/Schedule.h"
#include "schedule/YearSchedule.h"
#include "show/Show.h"
#include "support/VerifierFixture.h"

namespace vtr {
namespace {

namespace fs = std::filesystem;
using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using testsupport::ResultTexts;
using WeekTimeFunctions::NewWeekTime;

// Every file below the folder with its bytes.
std::map<std::string, std::string> Snapshot(const std::string& folder) {
    std::map<std::string, std::string> files;
    for (const auto& entry : fs::recursive_directory_iterator(folder)) {
        if (entry.is_regular_file())
            files[entry.path().string()] = testsupport::ReadFileBytes(entry.path().string());
    }
    return files;
}

std::size_t Count(const std::vector<std::string>& lines, const std::string& line) {
    return static_cast<std::size_t>(std::count(lines.begin(), lines.end(), line));
}

class VerificationTreeTest : public testsupport::SuiteTest {
  protected:
    VerificationTreeTest() {
        InstallApplicationFiles();
        testsupport::WriteFileBytes(DataFile("shellcmd.map"), "");
    }

    std::string Sequence(const std::string& name) {
        const std::string path = DataFile(name);
        testsupport::WriteFileBytes(
            path,
            "<?xml version=\"1.0\"?><sequence length=\"60000\"><channels>"
            "<channel id=\"1\" name=\"Roof\" deviceType=\"1\" unit=\"1\" circuit=\"1\">"
            "<event start=\"0\" end=\"1000\" intensity=\"100\"/></channel>"
            "</channels><tracks><track name=\"House\"><channelRef id=\"1\"/></track>"
            "</tracks></sequence>");
        return path;
    }
    std::string ShowFile(const std::string& name, const Show& show) {
        const std::string path = DataFile(name);
        testsupport::WriteFileBytes(path, ShowFunctions::ShowToText(show));
        return path;
    }

    ScopedNowSource now_{[] { return DateTime::FromParts(2024, 12, 1, 12, 0, 0); }};
};

TEST_F(VerificationTreeTest, SharedShowsAndSequencesAreReadAndCheckedOnce) {
    const std::string snow = Sequence("Snow.las");
    const std::string carol = Sequence("Carol.lms");
    const std::string bells = Sequence("Bells.lms");

    Show a;
    a.Background()->List() = {snow, carol};
    a.Musical()->List() = {carol, bells};
    const std::string showA = ShowFile("a.lss", a);
    Show b;
    b.Background()->List() = {snow};
    b.Main()->List() = {carol};
    b.Musical()->List() = {bells};
    const std::string showB = ShowFile("b.lss", b);
    Show c;
    c.Background()->List() = {snow};
    c.Musical()->List() = {carol};
    const std::string showC = ShowFile("c.lss", c);

    Schedule weekly;
    weekly.AddShowEventByFile(showA, NewWeekTime(1, 18, 0, 0), NewWeekTime(1, 22, 0, 0));
    weekly.AddShowEventByFile(showB, NewWeekTime(2, 18, 0, 0), NewWeekTime(2, 22, 0, 0));
    weekly.AddShowEventByFile(showA, NewWeekTime(3, 18, 0, 0), NewWeekTime(3, 22, 0, 0));
    weekly.Save(DataFile("weeksched.lsc"));
    YearSchedule calendar;
    calendar.AddShowEventByFile(showC, DateTime::FromParts(2024, 12, 24, 17),
                                DateTime::FromParts(2024, 12, 24, 23));
    calendar.AddShowEventByFile(showB, DateTime::FromParts(2024, 12, 31, 20),
                                DateTime::FromParts(2025, 1, 1, 1));
    calendar.Save(DataFile("yearsched.lsc"));

    const auto before = Snapshot(folder_.Path());
    LibVerify::SetScheduleFiles(DataFile("weeksched.lsc"), DataFile("yearsched.lsc"));
    LibVerify::RunVerification();

    const auto ran = client.Lines("Checking ");
    for (const std::string& show : {showA, showB, showC}) {
        EXPECT_EQ(Count(ran, "Show file existence: " + show), 1u) << show;
        EXPECT_EQ(Count(ran, "Load show file: " + show), 1u) << show;
        EXPECT_EQ(Count(ran, "Show has sequence: " + show), 1u) << show;
    }
    // Every check ran once: no description twice.
    std::vector<std::string> sorted = ran;
    std::sort(sorted.begin(), sorted.end());
    EXPECT_EQ(std::adjacent_find(sorted.begin(), sorted.end()), sorted.end());

    // Each show file was read once though two checks of it load it; no sequence file was
    // loaded more than once.
    const auto loads = LibVerify::GetFileLoadCounts();
    EXPECT_EQ(loads.showReads, 3);
    EXPECT_LE(loads.sequenceLoads, 3);
    for (const std::string& sequence : {snow, carol, bells})
        EXPECT_LE(Count(client.log, "Transient Loading 0% of " + sequence), 1u) << sequence;

    // The musical sequence in the non-audio sections, once per section and show.
    std::vector<std::string> musical;
    for (const std::string& result : ResultTexts()) {
        if (result.rfind("33:", 0) == 0)
            musical.push_back(result);
    }
    EXPECT_THAT(musical, ElementsAre("33: [SEQUENCE]: " + carol + " | [SHOW]: " + showA +
                                         " | [SECTION]: background",
                                     "33: [SEQUENCE]: " + carol + " | [SHOW]: " + showB +
                                         " | [SECTION]: animation"));
    EXPECT_EQ(client.log.back(), "ChecksCompleted false");
    EXPECT_EQ(LibVerify::ChecksRemainingCount(), 0);

    // Nothing of the suite (schedules, shows, sequences, the store) was changed, and no
    // temporary file is left.
    EXPECT_EQ(Snapshot(folder_.Path()), before);
}

TEST_F(VerificationTreeTest, ACleanInstallationWithOneShowHasNoFindingsFromTheseChecks) {
    Show show;
    show.Background()->List() = {Sequence("Snow.las")};
    show.Musical()->List() = {Sequence("Carol.lms")};
    LibVerify::VerifyShowFile(ShowFile("a.lss", show));
    LibVerify::RunVerification();
    // Only the verifier's own folder differs from the suite's application folder here.
    std::vector<std::string> numbers;
    for (const ResultPtr& result : LibVerify::GetResults())
        numbers.push_back(std::to_string(result->MessageNumber()));
    EXPECT_THAT(numbers, Contains("6"));
    for (const char* unexpected : {"3", "4", "5", "7", "9", "10", "11", "12", "13", "14", "15",
                                   "16", "17", "18", "20", "21", "22", "25", "33"})
        EXPECT_THAT(numbers, ::testing::Not(Contains(unexpected))) << unexpected;
}

TEST_F(VerificationTreeTest, AMissingShowTargetEndsInResults) {
    LibVerify::VerifyShowFile(DataFile("missing.lss"));
    LibVerify::RunVerification();
    EXPECT_THAT(ResultTexts(), Contains("21: " + DataFile("missing.lss")));
    EXPECT_EQ(client.log.back(), "ChecksCompleted false");
    EXPECT_THAT(fs::directory_iterator(TempDir()) == fs::directory_iterator(), true);
}

TEST_F(VerificationTreeTest, AGarbageShowTargetEndsInResultsAndIsLeftAsItWas) {
    const std::string garbage = DataFile("garbage.lss");
    const std::string bytes("(\x00\xff((*O*C**,)", 14);
    testsupport::WriteFileBytes(garbage, bytes);
    LibVerify::VerifyShowFile(garbage);
    LibVerify::RunVerification();
    EXPECT_THAT(ResultTexts(), Contains("22: " + garbage));
    // Reported by the load alone: the checks it would have queued are never made.
    EXPECT_THAT(ResultTexts(), ::testing::Not(Contains("25: " + garbage)));
    EXPECT_EQ(testsupport::ReadFileBytes(garbage), bytes);
}

TEST_F(VerificationTreeTest, ASequenceTargetIsVerifiedThroughItsTemporaryShow) {
    const std::string carol = Sequence("Carol.lms");
    LibVerify::VerifySequenceFile(carol);
    LibVerify::RunVerification();
    const auto ran = client.Lines("Checking ");
    EXPECT_EQ(Count(ran, "At least one show scheduled"), 1u);
    // The one temporary show was found, read and has a sequence; in its musical section a
    // musical sequence is fine.
    std::vector<std::string> loaded;
    for (const std::string& line : ran) {
        if (line.rfind("Load show file: ", 0) == 0)
            loaded.push_back(line);
    }
    ASSERT_EQ(loaded.size(), 1u);
    EXPECT_NE(loaded[0].find("VTRVer-Show-"), std::string::npos);
    for (const std::string& result : ResultTexts()) {
        for (const char* number : {"20:", "21:", "22:", "25:", "33:"})
            EXPECT_NE(result.rfind(number, 0), 0u) << result;
    }
    EXPECT_THAT(fs::directory_iterator(TempDir()) == fs::directory_iterator(), true);
}

TEST_F(VerificationTreeTest, AMissingStoreEndsWithTheInstallationMessage) {
    fs::remove(StoreFile());
    LibVerify::SetScheduleFiles(DataFile("weeksched.lsc"), DataFile("yearsched.lsc"));
    LibVerify::RunVerification();
    EXPECT_THAT(ResultTexts(), ElementsAre("3:", "9:"));
    EXPECT_FALSE(fs::exists(StoreFile()));  // read, never created
}

}  // namespace
}  // namespace vtr
