// The schedule checks: the two schedule files exist, and every show that the weekly
// schedule or the calendar from today on will play is handed to the show checks.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "checks/schedule/CheckShowIsScheduled.h"
#include "checks/schedule/CheckWeeklyScheduleExists.h"
#include "checks/schedule/CheckYearlyScheduleExists.h"
#include "engine/LibVerify.h"
#include "schedule/DateTime.h"
#include "schedule/Schedule.h"
#include "schedule/YearSchedule.h"
#include "support/VerifierFixture.h"

namespace vtr {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using testsupport::ResultTexts;
using WeekTimeFunctions::NewWeekTime;

class ScheduleChecksTest : public testsupport::SuiteTest {
  protected:
    ScheduleChecksTest() {
        LibVerify::SetScheduleFiles(DataFile("weeksched.lsc"), DataFile("yearsched.lsc"));
    }

    std::vector<std::string> RunShowIsScheduled() {
        CheckShowIsScheduled check;
        RunAlone(check);
        return client.Lines("Added ");
    }

    // Today is Saturday 15 June 2024, 20:00 for the calendar tests.
    ScopedNowSource now_{[] { return DateTime::FromParts(2024, 6, 15, 20, 0, 0); }};
};

TEST_F(ScheduleChecksTest, IdentifiersAndDescriptions) {
    EXPECT_EQ(CheckWeeklyScheduleExists().CheckIdentifier(), "13");
    EXPECT_EQ(CheckWeeklyScheduleExists().Description(), "Weekly schedule file existence");
    EXPECT_EQ(CheckYearlyScheduleExists().CheckIdentifier(), "14");
    EXPECT_EQ(CheckYearlyScheduleExists().Description(), "Yearly schedule file existence");
    EXPECT_EQ(CheckShowIsScheduled().CheckIdentifier(), "16");
    EXPECT_EQ(CheckShowIsScheduled().Description(), "At least one show scheduled");
}

TEST_F(ScheduleChecksTest, TheScheduleFilesOfTheRunMustExist) {
    CheckWeeklyScheduleExists weekly;
    CheckYearlyScheduleExists yearly;
    RunAlone(weekly);
    EXPECT_THAT(ResultTexts(), ElementsAre("17: " + DataFile("weeksched.lsc")));
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "Weekly schedule file does not exist");
    EXPECT_EQ(LibVerify::GetResults()[0]->Severity(), Severity::Warning);
    RunAlone(yearly);
    EXPECT_THAT(ResultTexts(), ElementsAre("18: " + DataFile("yearsched.lsc")));
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "Yearly schedule file does not exist");

    Schedule().Save(DataFile("weeksched.lsc"));
    YearSchedule().Save(DataFile("yearsched.lsc"));
    RunAlone(weekly);
    RunAlone(yearly);
    EXPECT_THAT(ResultTexts(), IsEmpty());

    // The names of the run, whatever they are.
    LibVerify::SetScheduleFiles(DataFile("other-week.lsc"), DataFolder());
    RunAlone(weekly);
    EXPECT_THAT(ResultTexts(), ElementsAre("17: " + DataFile("other-week.lsc")));
    RunAlone(yearly);  // a folder is not a schedule file
    EXPECT_THAT(ResultTexts(), ElementsAre("18: " + DataFolder()));
}

TEST_F(ScheduleChecksTest, EveryWeeklyShowIsHandedOnOnce) {
    Schedule schedule;
    schedule.AddShowEventByFile("/shows/a.lss", NewWeekTime(1, 18, 0, 0), NewWeekTime(1, 22, 0, 0));
    schedule.AddShowEventByFile("/shows/b.lss", NewWeekTime(2, 18, 0, 0), NewWeekTime(2, 22, 0, 0));
    schedule.AddShowEventByFile("/shows/a.lss", NewWeekTime(5, 18, 0, 0), NewWeekTime(5, 23, 0, 0));
    schedule.Save(DataFile("weeksched.lsc"));
    EXPECT_THAT(RunShowIsScheduled(), ElementsAre("Show file existence: /shows/a.lss",
                                                  "Show file existence: /shows/b.lss"));
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(ScheduleChecksTest, NoShowsAnywhereGivesMessage20) {
    Schedule().Save(DataFile("weeksched.lsc"));
    EXPECT_THAT(RunShowIsScheduled(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("20:"));
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "No shows are scheduled");

    // A schedule file that is garbage is an empty schedule.
    testsupport::WriteFileBytes(DataFile("weeksched.lsc"), "((((garbage");
    testsupport::WriteFileBytes(DataFile("yearsched.lsc"), "\x01\x02 not a calendar");
    LibVerify::SetScheduleFiles(DataFile("weeksched.lsc"), DataFile("yearsched.lsc"));
    EXPECT_THAT(RunShowIsScheduled(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("20:"));
}

TEST_F(ScheduleChecksTest, CalendarShowsCountFromTodayOn) {
    YearSchedule calendar;
    calendar.AddShowEventByFile("/shows/past.lss", DateTime::FromParts(2024, 6, 14, 18),
                                DateTime::FromParts(2024, 6, 14, 22));
    calendar.AddShowEventByFile(
        "/shows/today.lss", DateTime::FromParts(2024, 6, 15, 18),
        DateTime::FromParts(2024, 6, 15, 19));  // already over: still counts
    calendar.AddShowEventByFile("/shows/later.lss", DateTime::FromParts(2024, 12, 24, 17),
                                DateTime::FromParts(2024, 12, 25, 1));
    calendar.AddShowEventByFile("/shows/spring.lss", DateTime::FromParts(2024, 3, 1, 17),
                                DateTime::FromParts(2024, 3, 1, 18));
    calendar.Save(DataFile("yearsched.lsc"));
    Schedule weekly;
    weekly.AddShowEventByFile("/shows/weekly.lss", NewWeekTime(0, 18, 0, 0),
                              NewWeekTime(0, 19, 0, 0));
    weekly.Save(DataFile("weeksched.lsc"));

    // Weekly shows first, then the calendar's dates in their stored order.
    EXPECT_THAT(RunShowIsScheduled(), ElementsAre("Show file existence: /shows/weekly.lss",
                                                  "Show file existence: /shows/today.lss",
                                                  "Show file existence: /shows/later.lss"));
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(ScheduleChecksTest, OnlyPastCalendarShowsAndNoWeeklyFileGiveMessages17And20) {
    YearSchedule calendar;
    calendar.AddShowEventByFile("/shows/past.lss", DateTime::FromParts(2024, 6, 14, 18),
                                DateTime::FromParts(2024, 6, 14, 22));
    calendar.Save(DataFile("yearsched.lsc"));
    LibVerify::SetScheduleFiles(DataFile("weeksched.lsc"), DataFile("yearsched.lsc"));
    LibVerify::RunVerification();
    const auto results = ResultTexts();
    EXPECT_THAT(results, ::testing::Contains("17: " + DataFile("weeksched.lsc")));
    EXPECT_THAT(results, ::testing::Contains("20:"));
    EXPECT_THAT(client.Lines("Checking Show file existence"), IsEmpty());

    // The next day the show counts no more; the day itself it does.
    ScopedNowSource dayBefore([] { return DateTime::FromParts(2024, 6, 14, 23, 59, 59); });
    EXPECT_THAT(RunShowIsScheduled(), ElementsAre("Show file existence: /shows/past.lss"));
}

}  // namespace
}  // namespace vtr
