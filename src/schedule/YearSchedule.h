#pragma once

#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "schedule/DateTime.h"
#include "schedule/Schedule.h"
#include "schedule/ShowEvent.h"
#include "schedule/TimeRange.h"
#include "schedule/VTRDictionary.h"

namespace vtr {

// One show event placed on the calendar.
struct ShowOccurrence {
    ShowEventPtr Event;
    TimeRange Range;
};

// The calendar schedule: one weekly schedule per date, holding the shows that start on that
// date (a show may run past midnight into the next day, not further). Dates are keyed
// "yyyy-mm-dd" and kept in the order they were added.
class YearSchedule {
  public:
    // Splits the text at "-"; anything but three parts raises error 37 "Unexpected date
    // string format: " and the text. The parts are read as 16-bit whole numbers and out-of-
    // range months and days roll over.
    static DateTime DateStringToDate(std::string_view text);
    // Among the show events of the dates near the range, the occurrence that overlaps the
    // range (half-open, start included) with the earliest start; none when there is none.
    std::optional<ShowOccurrence> FirstShowWithinRange(const TimeRange& range) const;
    bool Modified() const noexcept { return modified_; }
    void SetModified(bool value) noexcept { modified_ = value; }
    // Removes the show of that node from the date's schedule; a date left with only free
    // time is removed. A date without a schedule raises error 91.
    void RemoveShowEvent(const DateTime& date, Node* node);
    // Adds a show to the schedule of its start date. Refusals (source
    // "Schedule.AddShowEventByFile"): 1 "End time precedes start time", 2 "Event spans more
    // than two days", 3 "End time conficts with event in next day", 4 "Start time conflicts
    // with event in previous day", 4 "Event conflict".
    void AddShowEventByFile(const std::string& filename, const DateTime& start,
                            const DateTime& end);
    static std::string DateToString(const DateTime& date);
    // The schedule under the key; none when the key is absent.
    SchedulePtr ScheduleByKey(const std::string& key) const;
    SchedulePtr DateSchedule(const DateTime& date) const;
    // Stores the schedule under the date's key; an existing key raises error 457.
    void AddSchedule(const DateTime& date, SchedulePtr schedule);
    const std::vector<std::string>& Keys() const noexcept { return schedules_.Keys(); }
    // Writes YearScheduleToText as the file's whole content; raises the file error on failure.
    void Save(const std::string& path) const;

  private:
    VTRDictionary<SchedulePtr> schedules_;
    bool modified_ = false;
};

using YearSchedulePtr = std::shared_ptr<YearSchedule>;

namespace YearScheduleFunctions {

// Reads the calendar schedule file; a file that cannot be read gives an empty one. Either
// way the result is not modified.
YearSchedulePtr LoadYearSchedule(const std::string& path);
// ((yyyy-mm-dd,(weekly schedule text)),...); no dates give the empty text.
std::string YearScheduleToText(const YearSchedule& schedule);
// Adds each date in order; elements that cannot be read or repeat a date are left out.
YearSchedulePtr YearScheduleFromText(std::string_view text);

}  // namespace YearScheduleFunctions

}  // namespace vtr
