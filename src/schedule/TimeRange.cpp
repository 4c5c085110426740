#include "schedule/TimeRange.h"

#include "engine/VtrError.h"
#include "show/Serialize.h"

namespace vtr {

namespace {

namespace lists = vtr::Serialize;

[[noreturn]] void RaiseRange(std::string description) {
    Raise(ErrorNumbers::UserMessage, "", std::move(description));
}

}  // namespace

void TimeRange::CopyFrom(const TimeRange* other) {
    const TimeRange empty;
    Deserialize((other != nullptr ? *other : empty).Serialize());
}

void TimeRange::Deserialize(std::string_view serialized) {
    const auto fields = lists::ListFromText(serialized, 1);
    if (fields.Count() != 4) {
        RaiseRange("Unexpected number of fields in serialized time range: " +
                   std::to_string(fields.Count()));
    }
    const bool hasStart = lists::TextToBool(fields[1]);
    DateTime start;
    if (hasStart) {
        start = DateTime::FromText(lists::UnescapeText(fields[2]));
    }
    const bool hasEnd = lists::TextToBool(fields[3]);
    DateTime end;
    if (hasEnd) {
        end = DateTime::FromText(lists::UnescapeText(fields[4]));
    }
    if (hasStart) {
        SetStartTime(start);
    } else {
        ClearStart();
    }
    if (hasEnd) {
        SetEndTime(end);
    } else {
        ClearEnd();
    }
}

const DateTime& TimeRange::EndTime() const {
    if (!hasEnd_) {
        RaiseRange("Time range has no end");
    }
    return end_;
}

void TimeRange::SetEndTime(const DateTime& value) {
    end_ = value;
    hasEnd_ = true;
    if (hasStart_ && end_ < start_) {
        hasStart_ = false;
    }
}

const DateTime& TimeRange::StartTime() const {
    if (!hasStart_) {
        RaiseRange("Time range has no start");
    }
    return start_;
}

void TimeRange::SetStartTime(const DateTime& value) {
    start_ = value;
    hasStart_ = true;
    if (hasEnd_ && end_ < start_) {
        hasEnd_ = false;
    }
}

bool TimeRange::Equals(const TimeRange* other) const {
    if (other == nullptr) {
        return false;
    }
    if (hasStart_) {
        if (!other->hasStart_ || other->start_ != start_) {
            return false;
        }
    } else if (other->hasStart_) {
        return false;
    }
    if (hasEnd_) {
        // An open end on the other side is accepted on purpose.
        return !other->hasEnd_ || other->end_ == end_;
    }
    return !other->hasEnd_;
}

bool TimeRange::Includes(const DateTime& time, bool startInclusive, bool endInclusive) const {
    if (!hasStart_ && !hasEnd_) {
        return true;
    }
    if (hasStart_ && (startInclusive ? time < start_ : time <= start_)) {
        return false;
    }
    if (hasEnd_ && (endInclusive ? time > end_ : time >= end_)) {
        return false;
    }
    return true;
}

bool TimeRange::IncludesAdjustable(const DateTime& toCheck, const DateTime& otherBound,
                                   bool toCheckInclusive, bool otherBoundInclusive,
                                   bool adjustmentPositive, bool startInclusive,
                                   bool endInclusive) const {
    DateTime time = toCheck;
    if (!toCheckInclusive) {
        time = time.AddSeconds(adjustmentPositive ? 1 : -1);
        if (!otherBoundInclusive && time == otherBound) {
            return false;
        }
    }
    return Includes(time, startInclusive, endInclusive);
}

bool TimeRange::Overlaps(const TimeRange& other, bool thisStartInclusive, bool thisEndInclusive,
                         bool otherStartInclusive, bool otherEndInclusive) const {
    if (!hasStart_ && !hasEnd_) {
        return true;
    }
    if (!other.hasStart_ && !other.hasEnd_) {
        return true;
    }
    if (!hasStart_ && !other.hasStart_) {
        return true;
    }
    if (!hasEnd_ && !other.hasEnd_) {
        return true;
    }
    if (!hasStart_) {
        // This range has only an end, so other has a start.
        return other.start_ < end_ ||
               (thisEndInclusive && otherStartInclusive && other.start_ == end_);
    }
    if (other.hasStart_ && hasEnd_) {
        if (!other.hasEnd_) {
            return other.start_ < end_ || (thisEndInclusive && other.start_ == end_);
        }
        return other.IncludesAdjustable(start_, end_, thisStartInclusive, thisEndInclusive, true,
                                        otherStartInclusive, otherEndInclusive) ||
               other.IncludesAdjustable(end_, start_, thisEndInclusive, thisStartInclusive, false,
                                        otherStartInclusive, otherEndInclusive) ||
               IncludesAdjustable(other.start_, other.end_, otherStartInclusive, otherEndInclusive,
                                  true, thisStartInclusive, thisEndInclusive) ||
               IncludesAdjustable(other.end_, other.start_, otherEndInclusive, otherStartInclusive,
                                  false, thisStartInclusive, thisEndInclusive);
    }
    // This range has a start, and other has no start or this range has no end; other has an
    // end either way.
    return start_ < other.end_ || (otherEndInclusive && thisStartInclusive && start_ == other.end_);
}

std::string TimeRange::Serialize() const {
    return lists::ListToText(
        {lists::BoolToText(hasStart_), hasStart_ ? lists::EscapeText(start_.ToString()) : "",
         lists::BoolToText(hasEnd_), hasEnd_ ? lists::EscapeText(end_.ToString()) : ""});
}

bool TimeRange::StartsBeforeOtherEnds(const TimeRange* other) const {
    if (other == nullptr || !hasStart_ || !other->hasEnd_) {
        return true;
    }
    return start_ < other->end_;
}

}  // namespace vtr
