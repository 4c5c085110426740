#pragma once

#include <string>
#include <string_view>

#include "schedule/DateTime.h"

namespace vtr {

// An interval between two calendar date-times, either bound of which may be absent (open
// towards the past or the future). When both are present, start <= end.
// Errors are error 37 with no source: "Time range has no start", "Time range has no end",
// "Unexpected number of fields in serialized time range: " and the count.
class TimeRange {
  public:
    TimeRange() = default;

    // Clears a flag; the stored bound is kept but cannot be read.
    void ClearEnd() noexcept { hasEnd_ = false; }
    void ClearStart() noexcept { hasStart_ = false; }
    // Takes a new empty range when other is absent; then Deserialize(other.Serialize()).
    void CopyFrom(const TimeRange* other);
    void CopyFrom(const TimeRange& other) { CopyFrom(&other); }
    // Reads "(T,yyyy-mm-dd hh:mm:ss,T,yyyy-mm-dd hh:mm:ss)"; the range is left unchanged
    // when reading fails.
    void Deserialize(std::string_view serialized);

    const DateTime& EndTime() const;
    // Stores the end; a start later than the new end is cleared.
    void SetEndTime(const DateTime& value);
    const DateTime& StartTime() const;
    // Stores the start; an end earlier than the new start is cleared.
    void SetStartTime(const DateTime& value);
    bool HasEnd() const noexcept { return hasEnd_; }
    bool HasStart() const noexcept { return hasStart_; }

    // False when other is absent. Starts must agree (both absent or equal); ends must agree
    // too, except that this range having an end and other having none counts as equal.
    bool Equals(const TimeRange* other) const;
    bool Equals(const TimeRange& other) const { return Equals(&other); }

    bool Includes(const DateTime& time, bool startInclusive, bool endInclusive) const;
    // Whether a bound of another range lies in this one. An excluded bound is first moved by
    // one second (forward when adjustmentPositive); if the other bound is excluded too and
    // the moved time meets it, the answer is false.
    bool IncludesAdjustable(const DateTime& toCheck, const DateTime& otherBound,
                            bool toCheckInclusive, bool otherBoundInclusive,
                            bool adjustmentPositive, bool startInclusive, bool endInclusive) const;
    bool Overlaps(const TimeRange& other, bool thisStartInclusive, bool thisEndInclusive,
                  bool otherStartInclusive, bool otherEndInclusive) const;

    std::string Serialize() const;
    // True when other is absent, this range has no start or other has no end; otherwise
    // whether this start is before other's end.
    bool StartsBeforeOtherEnds(const TimeRange* other) const;

  private:
    DateTime end_;
    bool hasEnd_ = false;
    bool hasStart_ = false;
    DateTime start_;
};

}  // namespace vtr
