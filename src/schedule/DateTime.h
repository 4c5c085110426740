#pragma once

#include <chrono>
#include <compare>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>

namespace vtr {

// A local calendar date with a time of day, at one-second resolution, with no time zone.
// Years run from 1 to 9999; leaving that range raises error 6 (overflow).
class DateTime {
  public:
    // 1970-01-01 00:00:00.
    constexpr DateTime() = default;

    // The moment of the given parts. Parts beyond their range roll over as calendar
    // arithmetic does: month 13 is January of the next year, day 0 the last day of the
    // previous month, second 60 the next minute.
    static DateTime FromParts(int32_t year, int32_t month, int32_t day, int32_t hour = 0,
                              int32_t minute = 0, int32_t second = 0);

    // Reads "yyyy-mm-dd hh:mm:ss", "yyyy-mm-ddThh:mm:ss", "yyyy-mm-dd hh:mm" and
    // "yyyy-mm-dd" (one- or two-digit month, day and time parts accepted, "/" as well as "-"
    // between the date parts, blanks around the whole). Nothing for anything else, including
    // dates that do not exist.
    static std::optional<DateTime> Parse(std::string_view text);
    // Parse, raising error 13 (type mismatch) when the text is not a date.
    static DateTime FromText(std::string_view text);

    // The current local date and time, from the installed source (the system clock unless a
    // test installed another); Today() is its date at midnight.
    static DateTime Now();
    static DateTime Today();
    using NowSource = std::function<DateTime()>;
    // Installs the source of Now(); an empty function restores the system clock. Returns the
    // source that was installed before.
    static NowSource SetNowSource(NowSource source);

    int32_t Year() const;
    int32_t Month() const;
    int32_t Day() const;
    int32_t Hour() const;
    int32_t Minute() const;
    int32_t Second() const;
    // Day of the week, 0 = Sunday .. 6 = Saturday.
    int32_t Weekday() const;
    // Seconds since midnight.
    int32_t SecondOfDay() const;

    // This date at midnight.
    DateTime Date() const;
    DateTime AddDays(int64_t days) const;
    DateTime AddSeconds(int64_t seconds) const;
    // Whole seconds from other to this (negative when this is earlier).
    int64_t SecondsSince(const DateTime& other) const noexcept;
    // Calendar days from other's date to this date, times of day ignored.
    int64_t DaysSince(const DateTime& other) const noexcept;

    // "yyyy-mm-dd hh:mm:ss", 24-hour clock.
    std::string ToString() const;
    // "yyyy-mm-dd".
    std::string DateString() const;

    // clang-tidy takes the 0 that a defaulted <=> is compared with for a null pointer.
    auto operator<=>(const DateTime&) const = default;  // NOLINT(modernize-use-nullptr)
    bool operator==(const DateTime&) const = default;

  private:
    using Seconds = std::chrono::local_seconds;
    explicit DateTime(Seconds value);
    static DateTime Checked(int64_t secondsSinceEpoch);

    Seconds value_{};
};

// Restores the previous source of DateTime::Now() when it goes out of scope.
class ScopedNowSource {
  public:
    explicit ScopedNowSource(DateTime::NowSource source)
        : previous_(DateTime::SetNowSource(std::move(source))) {}
    ~ScopedNowSource() { DateTime::SetNowSource(std::move(previous_)); }
    ScopedNowSource(const ScopedNowSource&) = delete;
    ScopedNowSource& operator=(const ScopedNowSource&) = delete;

  private:
    DateTime::NowSource previous_;
};

}  // namespace vtr
