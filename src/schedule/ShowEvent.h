#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "schedule/DateTime.h"
#include "schedule/TimeRange.h"
#include "schedule/WeekTime.h"

namespace vtr {

// One event of a weekly schedule: a show file between a start and an end week time, or a
// wait (no show). The week times are held by reference: setting StartTime or EndTime stores
// the object given, so neighbouring events share their common bound.
class ShowEvent {
  public:
    static constexpr int32_t WaitEvent = 1;
    static constexpr int32_t ShowFileEvent = 2;

    // A wait with an empty file name, two new week times (Sunday 00:00:00) and an unknown
    // duration (-1).
    ShowEvent();

    int32_t EventType() const noexcept { return eventType_; }
    // Setting a wait empties the file name.
    void SetEventType(int32_t value);
    const std::string& Filename() const noexcept { return filename_; }
    // An empty name makes the event a wait, any other a show.
    void SetFilename(std::string value);
    const WeekTimePtr& StartTime() const noexcept { return startTime_; }
    // Stores the start; the duration becomes end minus start (or, with no end but a known
    // duration, the end is placed that far after the start).
    void SetStartTime(WeekTimePtr value);
    const WeekTimePtr& EndTime() const noexcept { return endTime_; }
    // Stores the end; the duration becomes end minus start. With no start but a known
    // duration it would derive the start backwards, which raises error 91.
    void SetEndTime(WeekTimePtr value);
    // Seconds from start to end; -1 while unknown.
    int32_t Duration() const noexcept { return duration_; }
    // The end becomes a new week time this far after the start; the duration is stored as
    // given (604800 stays 604800 while the end equals the start).
    void SetDuration(int32_t seconds);

    // The concrete occurrence that has not yet ended at the reference moment, in the
    // Sunday-based week that holds it. An event whose start equals its end has no bounds.
    TimeRange Range(const DateTime& reference) const;

  private:
    int32_t eventType_ = WaitEvent;
    std::string filename_;
    WeekTimePtr startTime_;
    WeekTimePtr endTime_;
    int32_t duration_ = -1;
};

using ShowEventPtr = std::shared_ptr<ShowEvent>;

namespace ShowEventFunctions {

ShowEventPtr NewWaitEvent(WeekTimePtr start, int32_t seconds);
// Type 2, then Filename, StartTime and EndTime set in that order.
ShowEventPtr NewShowEvent(std::string filename, WeekTimePtr start, WeekTimePtr end);
// (end,type,(,0,file name),start) with the week times as seconds since Sunday 00:00:00.
std::string ShowEventToText(const ShowEvent& event);
// Reads the end, the type, the file name and the start, in that order.
ShowEventPtr ShowEventFromText(std::string_view text);

}  // namespace ShowEventFunctions

}  // namespace vtr
