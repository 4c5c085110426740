#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "schedule/DateTime.h"

namespace vtr {

namespace TimeConstants {
inline constexpr int32_t SecondsPerMinute = 60;
inline constexpr int32_t SecondsPerHour = 3600;
inline constexpr int32_t SecondsPerDay = 86400;
inline constexpr int32_t SecondsPerWeek = 604800;
}  // namespace TimeConstants

class WeekTime;
using WeekTimePtr = std::shared_ptr<WeekTime>;

// A moment within the repeating week: seconds since Sunday 00:00:00 (TimeVal) and the same
// moment as day, hour, minute and second. Whichever side is assigned, the other follows.
// Week times are shared by reference between neighbouring schedule events, so changing one
// in place moves the bound of both.
class WeekTime {
  public:
    WeekTime() = default;

    int32_t TimeVal() const noexcept { return timeVal_; }
    // Stores (v + 604800) mod 604800 (the remainder keeps the sign of the dividend) and
    // derives the parts with truncating division. Raises error 6 when v + 604800 overflows.
    void SetTimeVal(int32_t value);
    int32_t Day() const noexcept { return day_; }
    // Stores (v + 7) mod 7: -1 is Saturday, 7 is Sunday.
    void SetDay(int32_t value);
    int32_t Hour() const noexcept { return hour_; }
    // Clamped to 0..23.
    void SetHour(int32_t value);
    int32_t Minute() const noexcept { return minute_; }
    // Clamped to 0..59.
    void SetMinute(int32_t value);
    int32_t Second() const noexcept { return second_; }
    // Clamped to 0..59.
    void SetSecond(int32_t value);
    // Seconds since midnight of its own day.
    int32_t DaySecond() const noexcept;

    // Inside the arc that runs forward from a to b (across the week's end when b is not
    // after a). An arc whose ends coincide is the whole week.
    bool Between(const WeekTime& a, const WeekTime& b) const noexcept;        // both excluded
    bool BetweenEquals(const WeekTime& a, const WeekTime& b) const noexcept;  // both included
    bool InRange(const WeekTime& a, const WeekTime& b) const noexcept;        // a in, b out
    bool Equals(const WeekTime& other) const noexcept { return timeVal_ == other.timeVal_; }

    // A new week time this many seconds later, wrapped into the week; error 6 on overflow.
    WeekTimePtr PlusDuration(int32_t seconds) const;
    // Seconds to go forward from other to this, 0..604799.
    int32_t Minus(const WeekTime& other) const;
    // Always raises error 91: this operation never had a result object to assign to. Every
    // schedule event is built with both of its week times, so nothing reaches it.
    [[noreturn]] WeekTimePtr MinusDuration(int32_t seconds) const;

    // Day abbreviation and unpadded parts: Monday 09:05:00 gives "Mon950".
    std::string ToString() const;
    // 12-hour clock without the day: "12:00:00 AM", "1:07:09 PM".
    std::string DayTimeToString() const;

  private:
    void UpdateTimeVal();

    int32_t timeVal_ = 0;
    int32_t second_ = 0;
    int32_t minute_ = 0;
    int32_t hour_ = 0;
    int32_t day_ = 0;
};

namespace WeekTimeFunctions {

// A new week time with Day, Hour, Minute and Second set in that order (each wrapped or
// clamped by its setter).
WeekTimePtr NewWeekTime(int32_t day, int32_t hour, int32_t minute, int32_t second);
// The weekday (Sunday = 0) and time of day of a date-time.
WeekTimePtr WeekTimeFromDate(const DateTime& date);
// Unescapes the text, reads its leading decimal number (none gives 0), rounds it (halves to
// even) and sets TimeVal.
WeekTimePtr WeekTimeFromText(std::string_view text);
// TimeVal in decimal: Monday 08:30:00 is "117000".
std::string WeekTimeToText(const WeekTime& time);
// The moment of the week time in the Sunday-based week that holds the reference.
DateTime DateOfWeekTime(const WeekTime& time, const DateTime& reference);

}  // namespace WeekTimeFunctions

}  // namespace vtr
