#include "report/WeekPicture.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "schedule/Schedule.h"
#include "schedule/WeekTime.h"
#include "schedule/YearSchedule.h"

namespace vtr::report {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using WeekTimeFunctions::NewWeekTime;

constexpr int Sun = 0, Mon = 1, Tue = 2, Wed = 3, Sat = 6;

void AddShow(Schedule& schedule, const std::string& show, int startDay, int startHour,
             int startMinute, int endDay, int endHour, int endMinute) {
    schedule.AddShowEventByFile(show, NewWeekTime(startDay, startHour, startMinute, 0),
                                NewWeekTime(endDay, endHour, endMinute, 0));
}

DateTime Date(int year, int month, int day, int hour = 0, int minute = 0) {
    return DateTime::FromParts(year, month, day, hour, minute, 0);
}

// A Wednesday.
DateTime Today() {
    return Date(2031, 3, 12);
}

TEST(WeekPicture, AShowAcrossSundayMidnightIsDrawnOnSaturdayAndOnSunday) {
    Schedule week;
    AddShow(week, "/s/Late.lss", Sat, 23, 0, Sun, 1, 30);
    const WeekPicture picture = DrawWeek(&week, nullptr, Today());
    const std::string times = "Sat 23:00 \u2013 Sun 01:30";
    EXPECT_THAT(picture.week,
                ElementsAre(DayBlock{Sun, 0, 5400, "/s/Late.lss", true, false, times},
                            DayBlock{Sat, 82800, 86400, "/s/Late.lss", false, true, times}));
}

TEST(WeekPicture, TwoShowsOnOneDayAndADayWithNone) {
    Schedule week;
    AddShow(week, "/s/Evening.lss", Mon, 18, 0, Mon, 22, 30);
    AddShow(week, "/s/Morning.lss", Mon, 7, 15, Mon, 8, 0);
    AddShow(week, "/s/Late.lss", Tue, 22, 0, Wed, 0, 0);
    const WeekPicture picture = DrawWeek(&week, nullptr, Today());
    EXPECT_THAT(
        picture.week,
        ElementsAre(
            DayBlock{Mon, 26100, 28800, "/s/Morning.lss", false, false, "Mon 07:15\u201308:00"},
            DayBlock{Mon, 64800, 81000, "/s/Evening.lss", false, false, "Mon 18:00\u201322:30"},
            // Ending at midnight is the end of its own day, not the next one.
            DayBlock{Tue, 79200, 86400, "/s/Late.lss", false, false, "Tue 22:00\u201324:00"}));
    for (const DayBlock& block : picture.week)
        EXPECT_NE(block.day, Wed);
    EXPECT_THAT(ShowsOf(picture), ElementsAre("/s/Morning.lss", "/s/Evening.lss", "/s/Late.lss"));
}

TEST(WeekPicture, AShowOverSeveralDaysAndOneForTheWholeWeek) {
    Schedule week;
    AddShow(week, "/s/Festival.lss", Mon, 20, 0, Wed, 2, 0);
    const WeekPicture picture = DrawWeek(&week, nullptr, Today());
    const std::string times = "Mon 20:00 \u2013 Wed 02:00";
    EXPECT_THAT(picture.week,
                ElementsAre(DayBlock{Mon, 72000, 86400, "/s/Festival.lss", false, true, times},
                            DayBlock{Tue, 0, 86400, "/s/Festival.lss", true, true, times},
                            DayBlock{Wed, 0, 7200, "/s/Festival.lss", true, false, times}));

    // A show whose start is its end covers the whole week.
    Schedule always;
    AddShow(always, "/s/Always.lss", Tue, 6, 0, Tue, 6, 0);
    const WeekPicture whole = DrawWeek(&always, nullptr, Today());
    ASSERT_EQ(whole.week.size(), 7u);
    for (int day = 0; day < 7; ++day) {
        EXPECT_EQ(whole.week[day],
                  (DayBlock{day, 0, 86400, "/s/Always.lss", true, true, "the whole week"}));
    }
}

TEST(WeekPicture, CalendarDatesFromTodayOnWithTheWeeklyShowsOfTheirWeekday) {
    Schedule week;
    AddShow(week, "/s/Evening.lss", Wed, 17, 30, Wed, 22, 30);
    AddShow(week, "/s/Weekend.lss", Sat, 17, 0, Sat, 23, 0);
    YearSchedule calendar;
    // Added out of date order, as a user might: drawn earliest first.
    calendar.AddShowEventByFile("/s/Holiday.lss", Date(2031, 12, 24, 18), Date(2031, 12, 24, 22));
    calendar.AddShowEventByFile("/s/Old.lss", Date(2031, 3, 11, 18), Date(2031, 3, 11, 22));
    calendar.AddShowEventByFile("/s/Today.lss", Date(2031, 3, 12, 23), Date(2031, 3, 13, 1));
    calendar.AddShowEventByFile("/s/Older.lss", Date(2030, 1, 1, 18), Date(2030, 1, 1, 19));

    const WeekPicture picture = DrawWeek(&week, &calendar, Today());
    EXPECT_EQ(picture.pastDates, 2);
    ASSERT_EQ(picture.dates.size(), 2u);

    const CalendarDate& today = picture.dates[0];
    EXPECT_EQ(today.key, "2031-03-12");
    EXPECT_EQ(today.date, Today());
    // Running past midnight: drawn to the end of the date, said in words.
    EXPECT_THAT(today.shows, ElementsAre(DayBlock{Wed, 82800, 86400, "/s/Today.lss", false, true,
                                                  "23:00 \u2013 Thu 01:00"}));
    EXPECT_THAT(today.weekly, ElementsAre(DayBlock{Wed, 63000, 81000, "/s/Evening.lss", false,
                                                   false, "Wed 17:30\u201322:30"}));

    const CalendarDate& christmasEve = picture.dates[1];
    EXPECT_EQ(christmasEve.key, "2031-12-24");  // a Wednesday too
    EXPECT_THAT(christmasEve.shows, ElementsAre(DayBlock{Wed, 64800, 79200, "/s/Holiday.lss", false,
                                                         false, "18:00\u201322:00"}));
    EXPECT_EQ(christmasEve.weekly.size(), 1u);

    EXPECT_THAT(ShowsOf(picture),
                ElementsAre("/s/Evening.lss", "/s/Weekend.lss", "/s/Today.lss", "/s/Holiday.lss"));
}

TEST(WeekPicture, NoSchedulesDrawNothing) {
    const WeekPicture picture = DrawWeek(nullptr, nullptr, Today());
    EXPECT_THAT(picture.week, IsEmpty());
    EXPECT_THAT(picture.dates, IsEmpty());
    Schedule empty;
    YearSchedule none;
    EXPECT_THAT(DrawWeek(&empty, &none, Today()).week, IsEmpty());
}

TEST(WeekPicture, ClockTexts) {
    EXPECT_EQ(ClockText(0), "00:00");
    EXPECT_EQ(ClockText(63000), "17:30");
    EXPECT_EQ(ClockText(3 * 3600 + 37), "03:00:37");
    EXPECT_EQ(ClockText(86400), "24:00");
}

}  // namespace
}  // namespace vtr::report
