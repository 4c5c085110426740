#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "schedule/DateTime.h"

namespace vtr {
class Schedule;
class YearSchedule;
}  // namespace vtr

// The week at a glance: where each show of the weekly schedule and of the calendar dates to
// come falls on a 24-hour day, as the HTML report draws it. Only reads the schedules.
namespace vtr::report {

inline constexpr int32_t kSecondsPerDay = 86400;

// A show's time on one day. A show that runs past midnight is one block on each day it
// touches: the first continues to the next day, the next one continues from the day before
// (across Sunday midnight too: a show from Saturday 23:00 to Sunday 01:00 is the last hour of
// Saturday and the first hour of Sunday).
struct DayBlock {
    int32_t day = 0;   // 0 = Sunday .. 6 = Saturday
    int32_t from = 0;  // seconds since that day's midnight
    int32_t to = 0;    // up to kSecondsPerDay
    std::string show;  // the show file, as the schedule names it
    bool fromPreviousDay = false;
    bool toNextDay = false;
    // The whole show, for its label: "Sat 23:00 – Sun 01:00", "Mon 17:30–22:30", "the whole
    // week" for a show whose start is its end.
    std::string times;

    bool operator==(const DayBlock&) const = default;
};

// A calendar date from today on with the shows that start on it, drawn on that day alone (a
// show that runs past midnight continues to the next day); with them the weekly schedule's
// shows of the same weekday, when there are any. The report draws both and does not say
// which the show player runs.
struct CalendarDate {
    std::string key;  // "yyyy-mm-dd"
    DateTime date;
    std::vector<DayBlock> shows;
    std::vector<DayBlock> weekly;
};

struct WeekPicture {
    std::vector<DayBlock> week;       // the weekly schedule, by day, then by time
    std::vector<CalendarDate> dates;  // from today on, earliest first
    int32_t pastDates = 0;            // dates before today, not drawn
};

// The weekly schedule and the calendar dates from today's on. Either schedule may be absent.
WeekPicture DrawWeek(const Schedule* weekly, const YearSchedule* calendar, const DateTime& today);

// Every show file of the picture, each once, in order of first appearance.
std::vector<std::string> ShowsOf(const WeekPicture& picture);

// "17:30", "03:00:37" (seconds only when there are any); 86400 is "24:00".
std::string ClockText(int32_t secondOfDay);

// "Sun" .. "Sat".
const char* DayAbbreviation(int32_t day);

}  // namespace vtr::report
