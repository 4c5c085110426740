#include <gtest/gtest.h>

#include <functional>

#include "engine/VtrError.h"
#include "schedule/DateTime.h"
#include "schedule/MonitoredShowEvent.h"
#include "schedule/TimeRange.h"
#include "schedule/WeekTime.h"

namespace vtr {
namespace {

using namespace WeekTimeFunctions;

int32_t ErrorOf(const std::function<void()>& step, std::string* description = nullptr) {
    try {
        step();
    } catch (const VtrError& e) {
        if (description != nullptr) {
            *description = e.Description();
        }
        return e.Number();
    }
    return 0;
}

DateTime At(int y, int m, int d, int h = 0, int mi = 0, int s = 0) {
    return DateTime::FromParts(y, m, d, h, mi, s);
}

TEST(DateTime, CalendarArithmeticAndText) {
    const DateTime eve = At(2009, 12, 24, 23, 0, 5);
    EXPECT_EQ(eve.ToString(), "2009-12-24 23:00:05");
    EXPECT_EQ(eve.DateString(), "2009-12-24");
    EXPECT_EQ(eve.Weekday(), 4);  // Thursday
    EXPECT_EQ(eve.Date().ToString(), "2009-12-24 00:00:00");
    EXPECT_EQ(eve.AddSeconds(3600).ToString(), "2009-12-25 00:00:05");
    EXPECT_EQ(eve.AddDays(8).ToString(), "2010-01-01 23:00:05");
    EXPECT_EQ(At(2010, 1, 1).DaysSince(eve), 8);
    EXPECT_EQ(At(2009, 12, 25, 1).SecondsSince(eve), 7195);
    EXPECT_LT(eve, At(2009, 12, 25));
    // Parts beyond their range roll over.
    EXPECT_EQ(At(2009, 13, 1).DateString(), "2010-01-01");
    EXPECT_EQ(At(2012, 3, 0).DateString(), "2012-02-29");
    EXPECT_EQ(At(2009, 1, 1, 0, 0, 60).ToString(), "2009-01-01 00:01:00");
    EXPECT_EQ(At(7, 2, 3).DateString(), "0007-02-03");
    EXPECT_EQ(ErrorOf([] { At(10000, 1, 1); }), ErrorNumbers::Overflow);
    EXPECT_EQ(ErrorOf([] { At(9999, 12, 31, 23, 59, 59).AddSeconds(1); }), ErrorNumbers::Overflow);
}

TEST(DateTime, ParsesTheGeneralForms) {
    EXPECT_EQ(DateTime::Parse("2009-12-24 23:00:00"), At(2009, 12, 24, 23));
    EXPECT_EQ(DateTime::Parse("2009-12-24T23:00:01"), At(2009, 12, 24, 23, 0, 1));
    EXPECT_EQ(DateTime::Parse(" 2009-12-24 "), At(2009, 12, 24));
    EXPECT_EQ(DateTime::Parse("2009/1/2 3:04"), At(2009, 1, 2, 3, 4));
    for (const char* bad : {"", "2009-12", "2009-02-30", "2009-13-01", "2009-12-24 24:00:00",
                            "2009-12-24x", "2009-12/24", "12/24/2009", "2009-12-24 23:00:00 PM"}) {
        EXPECT_FALSE(DateTime::Parse(bad).has_value()) << bad;
    }
    EXPECT_EQ(ErrorOf([] { DateTime::FromText("soon"); }), ErrorNumbers::TypeMismatch);
}

TEST(DateTime, TodayComesFromTheInstalledSource) {
    {
        ScopedNowSource fixed([] { return At(2009, 12, 24, 18, 30); });
        EXPECT_EQ(DateTime::Now(), At(2009, 12, 24, 18, 30));
        EXPECT_EQ(DateTime::Today(), At(2009, 12, 24));
    }
    // Back on the system clock: some real date.
    EXPECT_GT(DateTime::Today(), At(2020, 1, 1));
}

TEST(WeekTime, SettersWrapAndClamp) {
    WeekTime time;
    time.SetTimeVal(-1);
    EXPECT_EQ(time.Day(), 6);
    EXPECT_EQ(time.Hour(), 23);
    EXPECT_EQ(time.Minute(), 59);
    EXPECT_EQ(time.Second(), 59);
    time.SetTimeVal(604800);
    EXPECT_EQ(time.TimeVal(), 0);
    time.SetDay(-1);
    EXPECT_EQ(time.Day(), 6);
    time.SetDay(9);
    EXPECT_EQ(time.Day(), 2);
    time.SetHour(25);
    EXPECT_EQ(time.Hour(), 23);
    time.SetMinute(-5);
    EXPECT_EQ(time.Minute(), 0);
    time.SetSecond(61);
    EXPECT_EQ(time.TimeVal(), 2 * 86400 + 23 * 3600 + 59);
    EXPECT_EQ(time.DaySecond(), 23 * 3600 + 59);
    EXPECT_EQ(ErrorOf([&] { time.SetTimeVal(2147483647); }), ErrorNumbers::Overflow);
    EXPECT_EQ(ErrorOf([&] { time.MinusDuration(5); }), ErrorNumbers::ObjectNotSet);
}

TEST(WeekTime, ArcsAndDurations) {
    const auto sat2330 = NewWeekTime(6, 23, 30, 0);
    const auto sun0030 = sat2330->PlusDuration(3600);
    EXPECT_EQ(sun0030->TimeVal(), 1800);
    EXPECT_EQ(sat2330->TimeVal(), 6 * 86400 + 23 * 3600 + 1800);  // unchanged
    EXPECT_EQ(sun0030->Minus(*sat2330), 3600);
    EXPECT_EQ(sat2330->Minus(*sun0030), 601200);
    EXPECT_EQ(ErrorOf([&] { sat2330->PlusDuration(2147483647); }), ErrorNumbers::Overflow);

    const auto x = NewWeekTime(3, 12, 0, 0);
    EXPECT_TRUE(x->Between(*x, *x));
    EXPECT_TRUE(NewWeekTime(0, 0, 0, 0)->Between(*x, *x));
    const auto eight = NewWeekTime(1, 8, 0, 0), nine = NewWeekTime(1, 9, 0, 0);
    EXPECT_TRUE(eight->InRange(*eight, *nine));
    EXPECT_FALSE(nine->InRange(*eight, *nine));
    EXPECT_FALSE(eight->Between(*eight, *nine));
    EXPECT_TRUE(nine->BetweenEquals(*eight, *nine));
    // Across the week's end.
    EXPECT_TRUE(NewWeekTime(0, 0, 10, 0)->InRange(*sat2330, *sun0030));
    EXPECT_TRUE(sat2330->InRange(*sat2330, *sun0030));
    EXPECT_FALSE(sun0030->InRange(*sat2330, *sun0030));
    EXPECT_FALSE(NewWeekTime(3, 0, 0, 0)->BetweenEquals(*sat2330, *sun0030));
}

TEST(WeekTime, TextsAndDates) {
    EXPECT_EQ(NewWeekTime(1, 9, 5, 0)->ToString(), "Mon950");
    EXPECT_EQ(NewWeekTime(0, 0, 0, 0)->ToString(), "Sun000");
    EXPECT_EQ(NewWeekTime(3, 13, 0, 5)->ToString(), "Wed1305");
    EXPECT_EQ(NewWeekTime(0, 0, 0, 0)->DayTimeToString(), "12:00:00 AM");
    EXPECT_EQ(NewWeekTime(0, 12, 0, 0)->DayTimeToString(), "12:00:00 PM");
    EXPECT_EQ(NewWeekTime(0, 13, 7, 9)->DayTimeToString(), "1:07:09 PM");
    EXPECT_EQ(WeekTimeToText(*NewWeekTime(1, 8, 30, 0)), "117000");
    EXPECT_EQ(WeekTimeFromText("117000")->Hour(), 8);
    EXPECT_EQ(WeekTimeFromText(" 12.5x")->TimeVal(), 12);
    EXPECT_EQ(WeekTimeFromText("13.5")->TimeVal(), 14);
    EXPECT_EQ(WeekTimeFromText("none")->TimeVal(), 0);
    EXPECT_EQ(WeekTimeFromText("-1")->TimeVal(), 604799);

    const auto thursday = WeekTimeFromDate(At(2009, 12, 24, 23, 0, 0));
    EXPECT_EQ(thursday->Day(), 4);
    EXPECT_EQ(thursday->Hour(), 23);
    // The week of the reference runs from the Sunday on or before it.
    EXPECT_EQ(DateOfWeekTime(*NewWeekTime(1, 7, 0, 37), At(2009, 12, 24, 12)),
              At(2009, 12, 21, 7, 0, 37));
    EXPECT_EQ(DateOfWeekTime(*NewWeekTime(6, 0, 0, 0), At(2009, 12, 20)), At(2009, 12, 26));
}

TEST(TimeRange, BoundsAndTheirInvariant) {
    TimeRange range;
    std::string description;
    EXPECT_EQ(ErrorOf([&] { range.StartTime(); }, &description), ErrorNumbers::UserMessage);
    EXPECT_EQ(description, "Time range has no start");
    EXPECT_EQ(ErrorOf([&] { range.EndTime(); }, &description), ErrorNumbers::UserMessage);
    EXPECT_EQ(description, "Time range has no end");

    range.SetStartTime(At(2009, 12, 24, 18));
    range.SetEndTime(At(2009, 12, 24, 18));
    EXPECT_TRUE(range.HasStart());
    EXPECT_TRUE(range.HasEnd());
    range.SetEndTime(At(2009, 12, 24, 17));  // before the start: the start goes
    EXPECT_FALSE(range.HasStart());
    range.SetStartTime(At(2009, 12, 25));  // after the end: the end goes
    EXPECT_FALSE(range.HasEnd());
}

TEST(TimeRange, EqualsIsAsymmetricOnPurpose) {
    TimeRange closed, open;
    closed.SetStartTime(At(2009, 12, 24));
    closed.SetEndTime(At(2009, 12, 25));
    open.SetStartTime(At(2009, 12, 24));
    EXPECT_TRUE(closed.Equals(open));
    EXPECT_FALSE(open.Equals(closed));
    EXPECT_FALSE(closed.Equals(nullptr));
    EXPECT_TRUE(TimeRange().Equals(TimeRange()));
    TimeRange other = closed;
    other.SetEndTime(At(2009, 12, 26));
    EXPECT_FALSE(closed.Equals(other));
}

TEST(TimeRange, IncludesAndOverlaps) {
    TimeRange day;
    day.SetStartTime(At(2009, 12, 24));
    day.SetEndTime(At(2009, 12, 25));
    EXPECT_TRUE(day.Includes(At(2009, 12, 24), true, false));
    EXPECT_FALSE(day.Includes(At(2009, 12, 24), false, false));
    EXPECT_FALSE(day.Includes(At(2009, 12, 25), true, false));
    EXPECT_TRUE(day.Includes(At(2009, 12, 25), true, true));
    EXPECT_TRUE(TimeRange().Includes(At(1900, 1, 1), false, false));

    TimeRange next;
    next.SetStartTime(At(2009, 12, 25));
    next.SetEndTime(At(2009, 12, 26));
    EXPECT_FALSE(day.Overlaps(next, true, false, true, false));  // they only touch
    EXPECT_TRUE(day.Overlaps(next, true, true, true, true));
    EXPECT_FALSE(next.Overlaps(day, true, false, true, false));
    TimeRange inside;
    inside.SetStartTime(At(2009, 12, 24, 10));
    inside.SetEndTime(At(2009, 12, 24, 11));
    EXPECT_TRUE(day.Overlaps(inside, true, false, true, false));
    EXPECT_TRUE(inside.Overlaps(day, false, false, false, false));

    // Only a start against only an end: they overlap when the start is before the end.
    TimeRange from, until;
    from.SetStartTime(At(2009, 12, 24));
    until.SetEndTime(At(2009, 12, 25));
    EXPECT_TRUE(from.Overlaps(until, true, false, true, false));
    until.SetEndTime(At(2009, 12, 24));
    EXPECT_FALSE(from.Overlaps(until, true, false, true, false));
    EXPECT_TRUE(from.Overlaps(until, true, false, true, true));
    EXPECT_TRUE(until.Overlaps(from, true, true, true, false));
    EXPECT_FALSE(until.Overlaps(from, true, true, false, false));
    EXPECT_TRUE(TimeRange().Overlaps(day, false, false, false, false));

    // An excluded bound behaves as the neighbouring second.
    EXPECT_FALSE(day.IncludesAdjustable(At(2009, 12, 23, 23, 59, 59), At(2009, 12, 24), false,
                                        false, true, true, false));
    EXPECT_TRUE(day.IncludesAdjustable(At(2009, 12, 23, 23, 59, 59), At(2009, 12, 25), false, true,
                                       true, true, false));

    EXPECT_TRUE(day.StartsBeforeOtherEnds(&next));
    EXPECT_FALSE(next.StartsBeforeOtherEnds(&day));
    EXPECT_TRUE(next.StartsBeforeOtherEnds(nullptr));
}

TEST(TimeRange, SerializedText) {
    TimeRange range;
    EXPECT_EQ(range.Serialize(), "(F,,F,)");
    range.SetStartTime(At(2009, 12, 24, 23));
    range.SetEndTime(At(2009, 12, 25, 1));
    EXPECT_EQ(range.Serialize(), "(T,2009-12-24 23:00:00,T,2009-12-25 01:00:00)");
    TimeRange back;
    back.Deserialize(range.Serialize());
    EXPECT_TRUE(back.Equals(range) && range.Equals(back));
    back.CopyFrom(nullptr);
    EXPECT_FALSE(back.HasStart() || back.HasEnd());

    // An end before the start clears the start again.
    back.Deserialize("(t,2009-12-25,T,2009-12-24)");
    EXPECT_FALSE(back.HasStart());
    EXPECT_EQ(back.EndTime(), At(2009, 12, 24));

    std::string description;
    EXPECT_EQ(ErrorOf([&] { back.Deserialize("(T,2009-12-24,F)"); }, &description), 37);
    EXPECT_EQ(description, "Unexpected number of fields in serialized time range: 3");
    EXPECT_EQ(ErrorOf([&] { back.Deserialize("(T,someday,F,)"); }), ErrorNumbers::TypeMismatch);
    EXPECT_EQ(back.EndTime(), At(2009, 12, 24));  // unchanged by the failed reads
}

TEST(MonitoredShowEvent, ComparesAndCopiesThroughItsText) {
    MonitoredShowEvent a, b;
    EXPECT_TRUE(a.MemberwiseEquals(&b));
    EXPECT_TRUE(a.MemberwiseEquals(nullptr));
    EXPECT_EQ(a.Serialize(), "(,(F,,F,),0,F)");
    b.SetShuttingDown(true);
    EXPECT_FALSE(a.MemberwiseEquals(&b));

    b.SetFilename("Eve (late).lss");
    TimeRange range;
    range.SetStartTime(At(2009, 12, 24, 18));
    b.SetRange(range);
    b.SetScheduleType(2);
    a.CopyFrom(&b);
    EXPECT_TRUE(a.MemberwiseEquals(&b));
    EXPECT_EQ(a.Filename(), "Eve (late).lss");
    a.CopyFrom(nullptr);
    EXPECT_TRUE(a.MemberwiseEquals(nullptr));
    a.SetRange(nullptr);
    EXPECT_FALSE(a.Range().HasStart());

    std::string description;
    EXPECT_EQ(ErrorOf([&] { b.Deserialize("(a,(F,,F,),0,F,x)"); }, &description), 37);
    EXPECT_EQ(description, "Unexpected number of fields in serialized monitored show event: 5");
    EXPECT_EQ(b.Filename(), "Eve (late).lss");
    b.Deserialize("(x.lss,(F,,F,), 3.7,t)");
    EXPECT_EQ(b.ScheduleType(), 3);
    EXPECT_TRUE(b.ShuttingDown());
}

}  // namespace
}  // namespace vtr
