#include "engine/OutputLog.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "engine/LibVerify.h"
#include "schedule/DateTime.h"
#include "support/TempStore.h"
#include "support/VerifierFixture.h"

namespace vtr {
namespace {

using ::testing::ElementsAre;

DateTime At(int hour, int minute, int second) {
    return DateTime::FromParts(2031, 3, 14, hour, minute, second);
}

ResultPtr MakeResult(Severity severity, const std::string& summary,
                     const std::vector<std::string>& details) {
    auto result = std::make_shared<Result>();
    result->SetSeverity(severity);
    result->SetSummary(summary);
    for (const std::string& detail : details)
        result->AddDetail(detail);
    return result;
}

TEST(OutputLogTest, TimeStampIsTwelveHourWithUnpaddedHourAndTwoDigitMinutesAndSeconds) {
    EXPECT_EQ(OutputLog::TimeStamp(At(0, 0, 0)), "12:00:00 AM");
    EXPECT_EQ(OutputLog::TimeStamp(At(0, 59, 59)), "12:59:59 AM");
    EXPECT_EQ(OutputLog::TimeStamp(At(9, 5, 3)), "9:05:03 AM");
    EXPECT_EQ(OutputLog::TimeStamp(At(11, 59, 59)), "11:59:59 AM");
    EXPECT_EQ(OutputLog::TimeStamp(At(12, 0, 0)), "12:00:00 PM");
    EXPECT_EQ(OutputLog::TimeStamp(At(13, 7, 9)), "1:07:09 PM");
    EXPECT_EQ(OutputLog::TimeStamp(At(23, 10, 0)), "11:10:00 PM");
}

TEST(OutputLogTest, LinesUseTheInstalledClock) {
    ScopedNowSource clock([] { return At(21, 4, 30); });
    EXPECT_EQ(OutputLog::TimeStamp(), "9:04:30 PM");
    EXPECT_EQ(OutputLog::FormatLine("Verification completed"),
              "9:04:30 PM: Verification completed");
    EXPECT_EQ(OutputLog::FormatLine(At(6, 0, 1), "x"), "6:00:01 AM: x");
    EXPECT_EQ((OutputLog::LogLine{"6:00:01 AM", "Checking: a", OutputLog::kBlack}.Formatted()),
              "6:00:01 AM: Checking: a");
}

TEST(OutputLogTest, ResultTextJoinsDetailsWithSlashesAndNothingAfterTheLast) {
    EXPECT_EQ(OutputLog::ResultText(*MakeResult(Severity::Warning, "Summary", {})), "Summary");
    EXPECT_EQ(OutputLog::ResultText(*MakeResult(Severity::Warning, "Summary", {"A"})),
              "Summary: A");
    EXPECT_EQ(OutputLog::ResultText(*MakeResult(Severity::Error, "Summary", {"A", "B", "C"})),
              "Summary: A / B / C");
    // A detail that holds the separator is written as it is.
    EXPECT_EQ(OutputLog::ResultText(*MakeResult(Severity::Info, "S", {"a / b", "c"})),
              "S: a / b / c");
}

TEST(OutputLogTest, NotificationTextsAndResultColours) {
    testsupport::ScriptedCheck check("Show file existence: x.lss");
    EXPECT_EQ(OutputLog::CheckAddedText(check), "Adding check: Show file existence: x.lss");
    EXPECT_EQ(OutputLog::CheckingText(check), "Checking: Show file existence: x.lss");
    EXPECT_EQ(OutputLog::ChecksCompletedText(false), "Verification completed");
    EXPECT_EQ(OutputLog::ChecksCompletedText(true), "Stopping verification due to cancellation");

    EXPECT_EQ(OutputLog::ResultColour(Severity::Info), (OutputLog::Colour{0, 0, 255}));
    EXPECT_EQ(OutputLog::ResultColour(Severity::Warning), (OutputLog::Colour{255, 128, 0}));
    EXPECT_EQ(OutputLog::ResultColour(Severity::Error), (OutputLog::Colour{255, 0, 0}));
    EXPECT_EQ(OutputLog::ResultColour(static_cast<Severity>(7)), (OutputLog::Colour{0, 0, 0}));
}

TEST(OutputLogTest, WriterLogsWhatTheWindowLogsAndClearsOnInitializing) {
    ScopedNowSource clock([] { return At(19, 30, 0); });
    std::vector<std::string> lines;
    std::vector<OutputLog::Colour> colours;
    int clears = 0;
    OutputLog::LogWriter writer(
        [&](const OutputLog::LogLine& line) {
            lines.push_back(line.Formatted());
            colours.push_back(line.colour);
        },
        [&] { ++clears; });

    testsupport::ScriptedCheck check("Vantori installation");
    writer.Initializing();
    writer.CheckAdded(check);
    writer.Checking(check);
    writer.CheckCompleted(check);
    writer.ResultAdded(MakeResult(Severity::Error, "Vantori is not fully installed", {}));
    writer.ResultAdded(MakeResult(Severity::Warning, "W", {"A", "B"}));
    writer.TransientMessage("Loading 50% of a.lms");
    writer.VerificationCancelled();
    writer.ChecksCompleted(true);

    EXPECT_EQ(clears, 1);
    EXPECT_THAT(lines, ElementsAre("7:30:00 PM: Adding check: Vantori installation",
                                   "7:30:00 PM: Checking: Vantori installation",
                                   "7:30:00 PM: Vantori is not fully installed",
                                   "7:30:00 PM: W: A / B", "7:30:00 PM: Loading 50% of a.lms",
                                   "7:30:00 PM: Stopping verification due to cancellation"));
    EXPECT_THAT(colours, ElementsAre(OutputLog::kBlack, OutputLog::kBlack, OutputLog::kRed,
                                     OutputLog::kOrange, OutputLog::kBlack, OutputLog::kBlack));
}

class OutputLogRunTest : public testsupport::StoreTest {};

TEST_F(OutputLogRunTest, AWholeRunOnAnEmptyStoreLogsEveryStepInOrder) {
    ScopedNowSource clock([] { return At(8, 15, 0); });
    std::vector<std::string> lines;
    OutputLog::LogWriter writer(
        [&](const OutputLog::LogLine& line) { lines.push_back(line.Formatted()); });
    LibVerify::AddNotificationClient(&writer);
    LibVerify::SetScheduleFiles(folder_.File("weeksched.lsc"), folder_.File("yearsched.lsc"));
    LibVerify::RunVerification();
    LibVerify::RemoveNotificationClient(&writer);

    // An empty store: the installation is not complete, so the installation check queues
    // nothing and the other two root checks find nothing.
    EXPECT_THAT(lines, ElementsAre("8:15:00 AM: Adding check: Vantori installation",
                                   "8:15:00 AM: Adding check: Windows Media Player version",
                                   "8:15:00 AM: Adding check: Old KR-P compatibility",
                                   "8:15:00 AM: Checking: Vantori installation",
                                   "8:15:00 AM: Vantori is not fully installed",
                                   "8:15:00 AM: Checking: Windows Media Player version",
                                   "8:15:00 AM: Unsupported version of Windows Media Player",
                                   "8:15:00 AM: Checking: Old KR-P compatibility",
                                   "8:15:00 AM: Verification completed"));
}

}  // namespace
}  // namespace vtr
