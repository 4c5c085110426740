#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "schedule/TimeRange.h"

namespace vtr {

// One occurrence of a show as the show player watches it run: the show file, its stretch of
// calendar time, the kind of schedule that started it and whether it is shutting down.
class MonitoredShowEvent {
  public:
    // An absent other counts as a new, empty one.
    void CopyFrom(const MonitoredShowEvent* other);
    // Reads (file name,(time range),schedule type,shutting down). Any other number of fields
    // raises error 37 "Unexpected number of fields in serialized monitored show event: " and
    // the count; the object is left as it was when reading fails.
    void Deserialize(std::string_view text);
    const std::string& Filename() const noexcept { return filename_; }
    void SetFilename(std::string value) { filename_ = std::move(value); }
    // True exactly when both serialize to the same text; an absent other counts as new.
    bool MemberwiseEquals(const MonitoredShowEvent* other) const;
    const TimeRange& Range() const noexcept { return range_; }
    TimeRange& Range() noexcept { return range_; }
    // No range stores a new, empty one.
    void SetRange(const TimeRange* value) { range_ = value != nullptr ? *value : TimeRange(); }
    void SetRange(const TimeRange& value) { range_ = value; }
    int32_t ScheduleType() const noexcept { return scheduleType_; }
    void SetScheduleType(int32_t value) noexcept { scheduleType_ = value; }
    std::string Serialize() const;
    bool ShuttingDown() const noexcept { return shuttingDown_; }
    void SetShuttingDown(bool value) noexcept { shuttingDown_ = value; }

  private:
    std::string filename_;
    TimeRange range_;
    int32_t scheduleType_ = 0;
    bool shuttingDown_ = false;
};

using MonitoredShowEventPtr = std::shared_ptr<MonitoredShowEvent>;

}  // namespace vtr
