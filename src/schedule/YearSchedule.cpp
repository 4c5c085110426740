#include "schedule/YearSchedule.h"

#include <cmath>
#include <limits>

#include "engine/VtrError.h"
#include "show/ModelErrors.h"
#include "show/Serialize.h"
#include "show/WholeFile.h"

namespace vtr {

namespace {

constexpr const char* kAddSource = "Schedule.AddShowEventByFile";

int32_t ShortPart(std::string_view text) {
    constexpr const char* source = "YearSchedule.DateStringToDate";
    const double rounded = std::nearbyint(Serialize::TextToNumber(text, source));
    if (!(rounded >= std::numeric_limits<int16_t>::min() &&
          rounded <= std::numeric_limits<int16_t>::max())) {
        ModelErrors::Overflow(source);
    }
    return static_cast<int32_t>(rounded);
}

}  // namespace

DateTime YearSchedule::DateStringToDate(std::string_view text) {
    std::vector<std::string_view> parts;
    std::size_t begin = 0;
    for (;;) {
        const auto dash = text.find('-', begin);
        parts.push_back(text.substr(begin, dash == std::string_view::npos ? dash : dash - begin));
        if (dash == std::string_view::npos) {
            break;
        }
        begin = dash + 1;
    }
    if (parts.size() != 3) {
        Raise(ErrorNumbers::UserMessage, "YearSchedule.DateStringToDate",
              "Unexpected date string format: " + std::string(text));
    }
    return DateTime::FromParts(ShortPart(parts[0]), ShortPart(parts[1]), ShortPart(parts[2]));
}

std::optional<ShowOccurrence> YearSchedule::FirstShowWithinRange(const TimeRange& range) const {
    std::optional<ShowOccurrence> best;
    for (const auto& key : schedules_.Keys()) {
        const DateTime date = DateStringToDate(key);
        TimeRange span;
        span.SetStartTime(date);
        span.SetEndTime(date.AddDays(2));
        if (!span.Overlaps(range, true, false, true, false)) {
            continue;
        }
        const auto& schedule = schedules_.Item(key);
        for (Node* node = schedule->FirstNode(); node != nullptr; node = node->NextNode()) {
            const auto& event = node->Obj();
            if (!event || event->EventType() != ShowEvent::ShowFileEvent) {
                continue;
            }
            TimeRange occurrence = event->Range(date);
            if (!occurrence.Overlaps(range, true, false, true, false)) {
                continue;
            }
            const bool earlier =
                !best ||
                (occurrence.HasStart() &&
                 (!best->Range.HasStart() || occurrence.StartTime() < best->Range.StartTime()));
            if (earlier) {
                best = ShowOccurrence{event, occurrence};
            }
        }
    }
    return best;
}

void YearSchedule::RemoveShowEvent(const DateTime& date, Node* node) {
    modified_ = true;
    const std::string key = DateToString(date);
    SchedulePtr schedule = ScheduleByKey(key);
    if (!schedule) {
        ModelErrors::ObjectNotSet("YearSchedule.RemoveShowEvent");
    }
    schedule->RemoveShowEvent(node);
    if (schedule->Count() == 1) {
        schedules_.Remove(key);
    }
}

void YearSchedule::AddShowEventByFile(const std::string& filename, const DateTime& start,
                                      const DateTime& end) {
    const WeekTimePtr newStart = WeekTimeFunctions::WeekTimeFromDate(start);
    const WeekTimePtr newEnd = WeekTimeFunctions::WeekTimeFromDate(end);
    if (!(start < end)) {
        Raise(1, kAddSource, "End time precedes start time");
    }
    modified_ = true;

    const int64_t days = end.DaysSince(start);
    if (days == 1) {
        if (const auto next = DateSchedule(end)) {
            if (const auto firstShow = next->FirstShowEvent()) {
                if (!newEnd->BetweenEquals(*newStart, *firstShow->StartTime())) {
                    Raise(3, kAddSource, "End time conficts with event in next day");
                }
            }
        }
        if (const auto same = DateSchedule(start)) {
            if (const auto lastShow = same->LastShowEvent()) {
                if (!newStart->BetweenEquals(*lastShow->EndTime(), *newEnd)) {
                    Raise(4, kAddSource, "Start time conflicts with event in previous day");
                }
            }
        }
    } else if (days >= 2) {
        Raise(2, kAddSource, "Event spans more than two days");
    }

    if (SchedulePtr schedule = DateSchedule(start)) {
        if (schedule->CheckAdd(*newStart, *newEnd) != 0) {
            Raise(4, kAddSource, "Event conflict");
        }
        schedule->AddShowEventByFile(filename, newStart, newEnd);
    } else {
        auto created = std::make_shared<Schedule>();
        created->AddShowEventByFile(filename, newStart, newEnd);
        AddSchedule(start, std::move(created));
    }
}

std::string YearSchedule::DateToString(const DateTime& date) {
    return date.DateString();
}

SchedulePtr YearSchedule::ScheduleByKey(const std::string& key) const {
    return schedules_.Exists(key) ? schedules_.Item(key) : nullptr;
}

SchedulePtr YearSchedule::DateSchedule(const DateTime& date) const {
    return ScheduleByKey(DateToString(date));
}

void YearSchedule::AddSchedule(const DateTime& date, SchedulePtr schedule) {
    modified_ = true;
    schedules_.Add(DateToString(date), std::move(schedule));
}

void YearSchedule::Save(const std::string& path) const {
    const int32_t error = WriteWholeFile(path, YearScheduleFunctions::YearScheduleToText(*this));
    if (error != 0) {
        Raise(error, "YearSchedule.Save", FileErrorDescription(error));
    }
}

namespace YearScheduleFunctions {

YearSchedulePtr LoadYearSchedule(const std::string& path) {
    std::string text;
    YearSchedulePtr schedule = ReadWholeFile(path, text) != 0 ? std::make_shared<YearSchedule>()
                                                              : YearScheduleFromText(text);
    schedule->SetModified(false);
    return schedule;
}

std::string YearScheduleToText(const YearSchedule& schedule) {
    std::vector<std::string> dates;
    dates.reserve(schedule.Keys().size());
    for (const auto& key : schedule.Keys()) {
        const auto day = schedule.ScheduleByKey(key);
        dates.push_back(Serialize::ListToText(
            {Serialize::EscapeText(key), day ? ScheduleFunctions::ScheduleToText(*day) : ""}));
    }
    return dates.empty() ? std::string() : Serialize::ListToText(dates);
}

YearSchedulePtr YearScheduleFromText(std::string_view text) {
    auto schedule = std::make_shared<YearSchedule>();
    const auto elements =
        ResumeOr(Serialize::List(), [&] { return Serialize::ListFromText(text, 1); });
    for (const auto& element : elements) {
        ResumeStep([&] {
            const auto fields = Serialize::ListFromText(element, 1);
            const DateTime date = DateTime::FromText(Serialize::UnescapeText(fields[1]));
            auto day = ScheduleFunctions::ScheduleFromText(fields[2]);
            schedule->AddSchedule(date, std::move(day));
        });
    }
    return schedule;
}

}  // namespace YearScheduleFunctions

}  // namespace vtr
