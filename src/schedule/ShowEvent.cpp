#include "schedule/ShowEvent.h"

#include "show/ModelErrors.h"
#include "show/Serialize.h"

namespace vtr {

ShowEvent::ShowEvent()
    : startTime_(std::make_shared<WeekTime>()), endTime_(std::make_shared<WeekTime>()) {}

void ShowEvent::SetEventType(int32_t value) {
    eventType_ = value;
    if (value == WaitEvent) {
        filename_.clear();
    }
}

void ShowEvent::SetFilename(std::string value) {
    filename_ = std::move(value);
    eventType_ = filename_.empty() ? WaitEvent : ShowFileEvent;
}

void ShowEvent::SetStartTime(WeekTimePtr value) {
    startTime_ = std::move(value);
    if (!endTime_ && duration_ != -1) {
        if (!startTime_) {
            ModelErrors::ObjectNotSet("ShowEvent.StartTime");
        }
        endTime_ = startTime_->PlusDuration(duration_);
        return;
    }
    if (!startTime_ || !endTime_) {
        ModelErrors::ObjectNotSet("ShowEvent.StartTime");
    }
    duration_ = endTime_->Minus(*startTime_);
}

void ShowEvent::SetEndTime(WeekTimePtr value) {
    endTime_ = std::move(value);
    if (!startTime_ && duration_ != -1) {
        if (!endTime_) {
            ModelErrors::ObjectNotSet("ShowEvent.EndTime");
        }
        startTime_ = endTime_->MinusDuration(duration_);
        return;
    }
    if (!startTime_ || !endTime_) {
        ModelErrors::ObjectNotSet("ShowEvent.EndTime");
    }
    duration_ = endTime_->Minus(*startTime_);
}

void ShowEvent::SetDuration(int32_t seconds) {
    if (!startTime_) {
        ModelErrors::ObjectNotSet("ShowEvent.SetDuration");
    }
    endTime_ = startTime_->PlusDuration(seconds);
    duration_ = seconds;
}

TimeRange ShowEvent::Range(const DateTime& reference) const {
    if (!startTime_ || !endTime_) {
        ModelErrors::ObjectNotSet("ShowEvent.Range");
    }
    TimeRange range;
    if (startTime_->Equals(*endTime_)) {
        return range;
    }
    DateTime start = WeekTimeFunctions::DateOfWeekTime(*startTime_, reference);
    DateTime end = WeekTimeFunctions::DateOfWeekTime(*endTime_, reference);
    if (start >= end) {
        // The event wraps across the end of the week.
        if (end >= reference) {
            start = start.AddDays(-7);
        } else {
            end = end.AddDays(7);
        }
    } else if (end < reference) {
        start = start.AddDays(7);
        end = end.AddDays(7);
    }
    range.SetStartTime(start);
    range.SetEndTime(end);
    return range;
}

namespace ShowEventFunctions {

ShowEventPtr NewWaitEvent(WeekTimePtr start, int32_t seconds) {
    auto event = std::make_shared<ShowEvent>();
    event->SetEventType(ShowEvent::WaitEvent);
    event->SetStartTime(std::move(start));
    event->SetDuration(seconds);
    return event;
}

ShowEventPtr NewShowEvent(std::string filename, WeekTimePtr start, WeekTimePtr end) {
    auto event = std::make_shared<ShowEvent>();
    event->SetEventType(ShowEvent::ShowFileEvent);
    event->SetFilename(std::move(filename));
    event->SetStartTime(std::move(start));
    event->SetEndTime(std::move(end));
    return event;
}

std::string ShowEventToText(const ShowEvent& event) {
    if (!event.StartTime() || !event.EndTime()) {
        ModelErrors::ObjectNotSet("ShowEventFunctions.ShowEventToText");
    }
    return Serialize::ListToText(
        {WeekTimeFunctions::WeekTimeToText(*event.EndTime()), std::to_string(event.EventType()),
         Serialize::ListToText({"", "0", Serialize::EscapeText(event.Filename())}),
         WeekTimeFunctions::WeekTimeToText(*event.StartTime())});
}

ShowEventPtr ShowEventFromText(std::string_view text) {
    const auto fields = Serialize::ListFromText(text, 1);
    auto event = std::make_shared<ShowEvent>();
    event->SetEndTime(WeekTimeFunctions::WeekTimeFromText(fields[1]));
    event->SetEventType(
        Serialize::RoundToLong(Serialize::LeadingNumber(Serialize::UnescapeText(fields[2])),
                               "ShowEventFunctions.ShowEventFromText"));
    event->SetFilename(Serialize::UnescapeText(Serialize::ListFromText(fields[3], 1)[3]));
    event->SetStartTime(WeekTimeFunctions::WeekTimeFromText(fields[4]));
    return event;
}

}  // namespace ShowEventFunctions

}  // namespace vtr
