#include "schedule/WeekTime.h"

#include <algorithm>
#include <limits>

#include "show/ModelErrors.h"
#include "show/Serialize.h"

namespace vtr {

namespace {

using namespace TimeConstants;

int32_t Narrow(int64_t value, const char* source) {
    if (value < std::numeric_limits<int32_t>::min() ||
        value > std::numeric_limits<int32_t>::max()) {
        ModelErrors::Overflow(source);
    }
    return static_cast<int32_t>(value);
}

}  // namespace

void WeekTime::SetTimeVal(int32_t value) {
    const int32_t shifted =
        Narrow(static_cast<int64_t>(value) + SecondsPerWeek, "WeekTime.TimeVal");
    const int32_t t = shifted % SecondsPerWeek;
    timeVal_ = t;
    day_ = t / SecondsPerDay;
    hour_ = (t % SecondsPerDay) / SecondsPerHour;
    minute_ = (t % SecondsPerHour) / SecondsPerMinute;
    second_ = t % SecondsPerMinute;
}

void WeekTime::SetDay(int32_t value) {
    day_ = Narrow(static_cast<int64_t>(value) + 7, "WeekTime.Day") % 7;
    UpdateTimeVal();
}

void WeekTime::SetHour(int32_t value) {
    hour_ = std::clamp(value, 0, 23);
    UpdateTimeVal();
}

void WeekTime::SetMinute(int32_t value) {
    minute_ = std::clamp(value, 0, 59);
    UpdateTimeVal();
}

void WeekTime::SetSecond(int32_t value) {
    second_ = std::clamp(value, 0, 59);
    UpdateTimeVal();
}

void WeekTime::UpdateTimeVal() {
    timeVal_ = Narrow(static_cast<int64_t>(day_) * SecondsPerDay +
                          static_cast<int64_t>(hour_) * SecondsPerHour +
                          static_cast<int64_t>(minute_) * SecondsPerMinute + second_,
                      "WeekTime.UpdateTimeVal");
}

int32_t WeekTime::DaySecond() const noexcept {
    return timeVal_ - day_ * SecondsPerDay;
}

bool WeekTime::Between(const WeekTime& a, const WeekTime& b) const noexcept {
    const int32_t t = timeVal_, lo = a.timeVal_, hi = b.timeVal_;
    if (lo < hi) {
        return lo < t && t < hi;
    }
    if (lo > hi) {
        return t > lo || t < hi;
    }
    return true;
}

bool WeekTime::BetweenEquals(const WeekTime& a, const WeekTime& b) const noexcept {
    const int32_t t = timeVal_, lo = a.timeVal_, hi = b.timeVal_;
    if (lo < hi) {
        return lo <= t && t <= hi;
    }
    if (lo > hi) {
        return t >= lo || t <= hi;
    }
    return true;
}

bool WeekTime::InRange(const WeekTime& a, const WeekTime& b) const noexcept {
    const int32_t t = timeVal_, lo = a.timeVal_, hi = b.timeVal_;
    if (lo < hi) {
        return lo <= t && t < hi;
    }
    if (lo > hi) {
        return t >= lo || t < hi;
    }
    return true;
}

WeekTimePtr WeekTime::PlusDuration(int32_t seconds) const {
    auto result = std::make_shared<WeekTime>();
    result->SetTimeVal(Narrow(static_cast<int64_t>(timeVal_) + seconds, "WeekTime.PlusDuration"));
    return result;
}

int32_t WeekTime::Minus(const WeekTime& other) const {
    return Narrow(
        (static_cast<int64_t>(timeVal_) - other.timeVal_ + SecondsPerWeek) % SecondsPerWeek,
        "WeekTime.Minus");
}

WeekTimePtr WeekTime::MinusDuration(int32_t) const {
    ModelErrors::ObjectNotSet("WeekTime.MinusDuration");
}

std::string WeekTime::ToString() const {
    static constexpr const char* kDays[] = {"Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};
    if (day_ < 0 || day_ > 6) {
        ModelErrors::SubscriptOutOfRange("WeekTime.ToString");
    }
    return std::string(kDays[day_]) + std::to_string(hour_) + std::to_string(minute_) +
           std::to_string(second_);
}

std::string WeekTime::DayTimeToString() const {
    const int32_t hour = (hour_ == 0 || hour_ == 12) ? 12 : hour_ % 12;
    auto padded = [](int32_t value) { return (value < 10 ? "0" : "") + std::to_string(value); };
    return std::to_string(hour) + ":" + padded(minute_) + ":" + padded(second_) +
           (hour_ >= 12 ? " PM" : " AM");
}

namespace WeekTimeFunctions {

WeekTimePtr NewWeekTime(int32_t day, int32_t hour, int32_t minute, int32_t second) {
    auto time = std::make_shared<WeekTime>();
    time->SetDay(day);
    time->SetHour(hour);
    time->SetMinute(minute);
    time->SetSecond(second);
    return time;
}

WeekTimePtr WeekTimeFromDate(const DateTime& date) {
    return NewWeekTime(date.Weekday(), date.Hour(), date.Minute(), date.Second());
}

WeekTimePtr WeekTimeFromText(std::string_view text) {
    auto time = std::make_shared<WeekTime>();
    time->SetTimeVal(Serialize::RoundToLong(Serialize::LeadingNumber(Serialize::UnescapeText(text)),
                                            "WeekTimeFunctions.WeekTimeFromText"));
    return time;
}

std::string WeekTimeToText(const WeekTime& time) {
    return std::to_string(time.TimeVal());
}

DateTime DateOfWeekTime(const WeekTime& time, const DateTime& reference) {
    const DateTime sunday = reference.Date().AddDays(-reference.Weekday());
    return sunday.AddDays(time.Day())
        .AddSeconds(static_cast<int64_t>(time.Hour()) * SecondsPerHour +
                    static_cast<int64_t>(time.Minute()) * SecondsPerMinute + time.Second());
}

}  // namespace WeekTimeFunctions

}  // namespace vtr
