#include "report/WeekPicture.h"

#include <algorithm>
#include <set>

#include "engine/VtrError.h"
#include "schedule/LinkedList.h"
#include "schedule/Schedule.h"
#include "schedule/ShowEvent.h"
#include "schedule/WeekTime.h"
#include "schedule/YearSchedule.h"

namespace vtr::report {
namespace {

using TimeConstants::SecondsPerWeek;

std::string TwoDigits(int32_t value) {
    return (value < 10 ? "0" : "") + std::to_string(value);
}

// A show event of a schedule: its start in the week and how long it lasts (0: the whole week).
struct Span {
    std::string show;
    int32_t start = 0;
    int32_t duration = 0;
};

std::vector<Span> ShowSpans(const Schedule& schedule) {
    std::vector<Span> spans;
    // The ring is walked once: never more nodes than the schedule holds.
    int32_t left = schedule.Count();
    for (const Node* node = schedule.FirstNode(); node != nullptr && left > 0;
         node = node->NextNode(), --left) {
        const ShowEventPtr& event = node->Obj();
        if (!event || event->EventType() != ShowEvent::ShowFileEvent || !event->StartTime() ||
            !event->EndTime())
            continue;
        Span span;
        span.show = event->Filename();
        span.start = event->StartTime()->TimeVal();
        span.duration = event->EndTime()->Minus(*event->StartTime());
        spans.push_back(std::move(span));
    }
    return spans;
}

std::string WeekTimeText(int32_t timeVal) {
    return std::string(DayAbbreviation(timeVal / kSecondsPerDay)) + " " +
           ClockText(timeVal % kSecondsPerDay);
}

// "Mon 17:30–22:30", "Mon 20:00–24:00", "Sat 23:00 – Sun 01:00", "the whole week".
std::string WeeklyTimes(const Span& span) {
    if (span.duration == 0)
        return "the whole week";
    const int32_t from = span.start % kSecondsPerDay;
    if (from + span.duration <= kSecondsPerDay) {
        return WeekTimeText(span.start) + "\u2013" + ClockText(from + span.duration);
    }
    return WeekTimeText(span.start) + " \u2013 " +
           WeekTimeText((span.start + span.duration) % SecondsPerWeek);
}

// "18:00–22:00", "23:00 – Thu 01:00".
std::string DateTimes(const Span& span) {
    const int32_t from = span.start % kSecondsPerDay;
    if (span.duration == 0)
        return ClockText(from) + ", for a whole week";
    if (from + span.duration <= kSecondsPerDay)
        return ClockText(from) + "\u2013" + ClockText(from + span.duration);
    return ClockText(from) + " \u2013 " +
           WeekTimeText((span.start + span.duration) % SecondsPerWeek);
}

void AddWeekBlocks(const Span& span, std::vector<DayBlock>& blocks) {
    const std::string times = WeeklyTimes(span);
    if (span.duration == 0) {
        for (int32_t day = 0; day < 7; ++day)
            blocks.push_back(DayBlock{day, 0, kSecondsPerDay, span.show, true, true, times});
        return;
    }
    int32_t cursor = span.start;
    int32_t remaining = span.duration;
    bool first = true;
    while (remaining > 0) {
        const int32_t from = cursor % kSecondsPerDay;
        const int32_t length = std::min(remaining, kSecondsPerDay - from);
        remaining -= length;
        blocks.push_back(DayBlock{cursor / kSecondsPerDay, from, from + length, span.show, !first,
                                  remaining > 0, times});
        cursor = (cursor + length) % SecondsPerWeek;
        first = false;
    }
}

}  // namespace

const char* DayAbbreviation(int32_t day) {
    static constexpr const char* kDays[] = {"Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};
    return kDays[((day % 7) + 7) % 7];
}

std::string ClockText(int32_t secondOfDay) {
    const int32_t hours = secondOfDay / 3600;
    const int32_t minutes = secondOfDay % 3600 / 60;
    const int32_t seconds = secondOfDay % 60;
    std::string text = TwoDigits(hours) + ":" + TwoDigits(minutes);
    if (seconds != 0)
        text += ":" + TwoDigits(seconds);
    return text;
}

WeekPicture DrawWeek(const Schedule* weekly, const YearSchedule* calendar, const DateTime& today) {
    WeekPicture picture;
    if (weekly != nullptr) {
        for (const Span& span : ShowSpans(*weekly))
            AddWeekBlocks(span, picture.week);
        std::stable_sort(picture.week.begin(), picture.week.end(),
                         [](const DayBlock& a, const DayBlock& b) {
                             return std::pair(a.day, a.from) < std::pair(b.day, b.from);
                         });
    }
    if (calendar == nullptr)
        return picture;

    // Dates are compared as their keys, "yyyy-mm-dd", which sort as the dates do.
    const std::string todayKey = YearSchedule::DateToString(today);
    std::set<std::string> keys(calendar->Keys().begin(), calendar->Keys().end());
    for (const std::string& key : keys) {
        const SchedulePtr schedule = calendar->ScheduleByKey(key);
        if (!schedule)
            continue;
        const std::vector<Span> spans = ShowSpans(*schedule);
        if (spans.empty())
            continue;
        if (key < todayKey) {
            ++picture.pastDates;
            continue;
        }
        const std::optional<DateTime> date = ResumeOr(std::optional<DateTime>{}, [&] {
            return std::optional(YearSchedule::DateStringToDate(key));
        });
        if (!date)
            continue;
        CalendarDate entry;
        entry.key = key;
        entry.date = *date;
        const int32_t weekday = date->Weekday();
        for (const Span& span : spans) {
            const int32_t from = span.start % kSecondsPerDay;
            const int32_t end = span.duration == 0 ? from + SecondsPerWeek : from + span.duration;
            entry.shows.push_back(DayBlock{weekday, from, std::min(end, kSecondsPerDay), span.show,
                                           false, end > kSecondsPerDay, DateTimes(span)});
        }
        std::stable_sort(entry.shows.begin(), entry.shows.end(),
                         [](const DayBlock& a, const DayBlock& b) { return a.from < b.from; });
        for (const DayBlock& block : picture.week) {
            if (block.day == weekday)
                entry.weekly.push_back(block);
        }
        picture.dates.push_back(std::move(entry));
    }
    return picture;
}

std::vector<std::string> ShowsOf(const WeekPicture& picture) {
    std::vector<std::string> shows;
    std::set<std::string> seen;
    auto add = [&](const DayBlock& block) {
        if (seen.insert(block.show).second)
            shows.push_back(block.show);
    };
    for (const DayBlock& block : picture.week)
        add(block);
    for (const CalendarDate& date : picture.dates) {
        for (const DayBlock& block : date.shows)
            add(block);
    }
    return shows;
}

}  // namespace vtr::report
