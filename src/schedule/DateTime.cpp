#include "schedule/DateTime.h"

#include <ctime>

#include "show/ModelErrors.h"

namespace vtr {

namespace {

using namespace std::chrono;

constexpr int64_t kSecondsPerDay = 86400;

int64_t DaysFromCivil(int32_t year, unsigned month, unsigned day) {
    return local_days{std::chrono::year{year} / std::chrono::month{month} / std::chrono::day{day}}
        .time_since_epoch()
        .count();
}

const int64_t kMinSeconds = DaysFromCivil(1, 1, 1) * kSecondsPerDay;
const int64_t kMaxSeconds = (DaysFromCivil(9999, 12, 31) + 1) * kSecondsPerDay - 1;

int64_t FloorDiv(int64_t a, int64_t b) {
    return a / b - ((a % b != 0) && ((a < 0) != (b < 0)));
}

year_month_day Civil(local_seconds value) {
    return year_month_day{floor<days>(value)};
}

DateTime::NowSource& InstalledNowSource() {
    static DateTime::NowSource source;
    return source;
}

DateTime SystemNow() {
    const std::time_t now = std::time(nullptr);
    std::tm local{};
#if defined(_WIN32)
    localtime_s(&local, &now);
#else
    localtime_r(&now, &local);
#endif
    return DateTime::FromParts(local.tm_year + 1900, local.tm_mon + 1, local.tm_mday, local.tm_hour,
                               local.tm_min, std::min(local.tm_sec, 59));
}

// Reads 1 to maxDigits decimal digits at pos; advances pos.
std::optional<int32_t> Digits(std::string_view text, std::size_t& pos, std::size_t maxDigits) {
    std::size_t start = pos;
    int32_t value = 0;
    while (pos < text.size() && pos - start < maxDigits && text[pos] >= '0' && text[pos] <= '9') {
        value = value * 10 + (text[pos] - '0');
        ++pos;
    }
    if (pos == start) {
        return std::nullopt;
    }
    return value;
}

std::string TwoDigits(int32_t value) {
    std::string text(2, '0');
    text[0] = static_cast<char>('0' + value / 10);
    text[1] = static_cast<char>('0' + value % 10);
    return text;
}

}  // namespace

DateTime::DateTime(Seconds value) : value_(value) {}

DateTime DateTime::Checked(int64_t secondsSinceEpoch) {
    if (secondsSinceEpoch < kMinSeconds || secondsSinceEpoch > kMaxSeconds) {
        ModelErrors::Overflow("DateTime");
    }
    return DateTime(Seconds{seconds{secondsSinceEpoch}});
}

DateTime DateTime::FromParts(int32_t year, int32_t month, int32_t day, int32_t hour, int32_t minute,
                             int32_t second) {
    const int64_t months = static_cast<int64_t>(year) * 12 + (static_cast<int64_t>(month) - 1);
    const int64_t wholeYear = FloorDiv(months, 12);
    if (wholeYear < -30000 || wholeYear > 30000) {
        ModelErrors::Overflow("DateTime");
    }
    const auto monthOfYear = static_cast<unsigned>(months - wholeYear * 12 + 1);
    const int64_t days = DaysFromCivil(static_cast<int32_t>(wholeYear), monthOfYear, 1) +
                         (static_cast<int64_t>(day) - 1);
    const int64_t total = days * kSecondsPerDay + static_cast<int64_t>(hour) * 3600 +
                          static_cast<int64_t>(minute) * 60 + second;
    return Checked(total);
}

std::optional<DateTime> DateTime::Parse(std::string_view text) {
    while (!text.empty() && (text.front() == ' ' || text.front() == '\t')) {
        text.remove_prefix(1);
    }
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t')) {
        text.remove_suffix(1);
    }
    std::size_t pos = 0;
    const auto year = Digits(text, pos, 4);
    if (!year || pos != 4 || pos >= text.size() || (text[pos] != '-' && text[pos] != '/')) {
        return std::nullopt;
    }
    const char separator = text[pos++];
    const auto month = Digits(text, pos, 2);
    if (!month || pos >= text.size() || text[pos] != separator) {
        return std::nullopt;
    }
    ++pos;
    const auto day = Digits(text, pos, 2);
    if (!day) {
        return std::nullopt;
    }
    int32_t hour = 0, minute = 0, second = 0;
    if (pos < text.size()) {
        if (text[pos] == 'T') {
            ++pos;
        } else if (text[pos] == ' ') {
            while (pos < text.size() && text[pos] == ' ') {
                ++pos;
            }
        } else {
            return std::nullopt;
        }
        const auto h = Digits(text, pos, 2);
        if (!h || pos >= text.size() || text[pos] != ':') {
            return std::nullopt;
        }
        ++pos;
        const auto m = Digits(text, pos, 2);
        if (!m) {
            return std::nullopt;
        }
        std::optional<int32_t> s = 0;
        if (pos < text.size() && text[pos] == ':') {
            ++pos;
            s = Digits(text, pos, 2);
            if (!s) {
                return std::nullopt;
            }
        }
        if (pos != text.size() || *h > 23 || *m > 59 || *s > 59) {
            return std::nullopt;
        }
        hour = *h;
        minute = *m;
        second = *s;
    }
    if (*year < 1 || *month < 1 || *month > 12 || *day < 1) {
        return std::nullopt;
    }
    const year_month_day date{std::chrono::year{*year}, std::chrono::month{unsigned(*month)},
                              std::chrono::day{unsigned(*day)}};
    if (!date.ok()) {
        return std::nullopt;
    }
    return FromParts(*year, *month, *day, hour, minute, second);
}

DateTime DateTime::FromText(std::string_view text) {
    auto value = Parse(text);
    if (!value) {
        ModelErrors::TypeMismatch("DateTime");
    }
    return *value;
}

DateTime DateTime::Now() {
    const auto& source = InstalledNowSource();
    return source ? source() : SystemNow();
}

DateTime DateTime::Today() {
    return Now().Date();
}

DateTime::NowSource DateTime::SetNowSource(NowSource source) {
    auto previous = std::move(InstalledNowSource());
    InstalledNowSource() = std::move(source);
    return previous;
}

int32_t DateTime::Year() const {
    return static_cast<int>(Civil(value_).year());
}
int32_t DateTime::Month() const {
    return static_cast<int32_t>(static_cast<unsigned>(Civil(value_).month()));
}
int32_t DateTime::Day() const {
    return static_cast<int32_t>(static_cast<unsigned>(Civil(value_).day()));
}
int32_t DateTime::Hour() const {
    return SecondOfDay() / 3600;
}
int32_t DateTime::Minute() const {
    return SecondOfDay() % 3600 / 60;
}
int32_t DateTime::Second() const {
    return SecondOfDay() % 60;
}

int32_t DateTime::Weekday() const {
    return static_cast<int32_t>(weekday{floor<days>(value_)}.c_encoding());
}

int32_t DateTime::SecondOfDay() const {
    return static_cast<int32_t>((value_ - floor<days>(value_)).count());
}

DateTime DateTime::Date() const {
    return DateTime(Seconds{floor<days>(value_)});
}

DateTime DateTime::AddDays(int64_t days) const {
    if (days > 4000000 || days < -4000000) {
        ModelErrors::Overflow("DateTime");
    }
    return Checked(value_.time_since_epoch().count() + days * kSecondsPerDay);
}

DateTime DateTime::AddSeconds(int64_t seconds) const {
    constexpr int64_t limit = int64_t{400000000000};
    if (seconds > limit || seconds < -limit) {
        ModelErrors::Overflow("DateTime");
    }
    return Checked(value_.time_since_epoch().count() + seconds);
}

int64_t DateTime::SecondsSince(const DateTime& other) const noexcept {
    return (value_ - other.value_).count();
}

int64_t DateTime::DaysSince(const DateTime& other) const noexcept {
    return (floor<days>(value_) - floor<days>(other.value_)).count();
}

std::string DateTime::DateString() const {
    const auto civil = Civil(value_);
    std::string year = std::to_string(static_cast<int>(civil.year()));
    if (year.size() < 4) {
        year.insert(0, 4 - year.size(), '0');
    }
    return year + "-" + TwoDigits(static_cast<int32_t>(static_cast<unsigned>(civil.month()))) +
           "-" + TwoDigits(static_cast<int32_t>(static_cast<unsigned>(civil.day())));
}

std::string DateTime::ToString() const {
    return DateString() + " " + TwoDigits(Hour()) + ":" + TwoDigits(Minute()) + ":" +
           TwoDigits(Second());
}

}  // namespace vtr
