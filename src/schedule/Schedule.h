#pragma once

#include <cstdint>
#include <iosfwd>
#include <map>
#include <memory>
#include <string>
#include <string_view>

#include "schedule/LinkedList.h"
#include "schedule/ShowEvent.h"
#include "schedule/WeekTime.h"

namespace vtr {

// The weekly schedule: a ring of consecutive events (shows and waits) that together cover
// the repeating week without gaps, walked from FirstNode along NextNode. The last event's
// end meets the first event's start across the week's end.
//
// Finding the event at a week time (GetNodeByTime, and the insertions built on it) gives the
// first event in list order whose start..end arc holds the time, as a walk from the first
// node would; an ordered index answers it in logarithmic time while the events tile the week,
// and the plain walk takes over in any other state. The week times of a scheduled event are
// changed through the schedule only.
class Schedule {
  public:
    // One wait from Sunday 00:00:00 that lasts the whole week; not modified.
    Schedule();
    Schedule(const Schedule&) = delete;
    Schedule& operator=(const Schedule&) = delete;

    bool Modified() const noexcept { return modified_; }
    void SetModified(bool value) noexcept { modified_ = value; }
    Node* FirstNode() const noexcept { return list_->FirstNode(); }
    Node* LastNode() const noexcept { return list_->LastNode(); }
    int32_t Count() const noexcept { return list_->Count(); }

    // Gives a show's time back to the free time, merging it with neighbouring waits (the
    // first node has no previous neighbour, the last none after it). A node that is not a
    // show raises "Can not remove non-show event" (source "Schedule.RemoveShowEvent").
    void RemoveShowEvent(Node* node);
    void AddShowEventByFile(const std::string& filename, WeekTimePtr start, WeekTimePtr end);
    // Inserts the event into the wait that holds its start, splitting or replacing it; an
    // event may also wrap across Sunday 00:00:00 when the first and the last events are waits
    // with room for it. Raises error 1 "Can't add event -- event conflict" (source
    // "Schedule.AddShowEvent") when it does not fit.
    void AddShowEvent(ShowEventPtr event);
    // Writes ScheduleToText as the file's whole content; raises the file error on failure.
    void Save(const std::string& path) const;
    // The events between "BEGIN SCHEDULE DUMP" and "END SCHEDULE DUMP" on the developer's
    // debug output; a release build writes nothing.
    void DebugDump() const;
    void DebugDump(std::ostream& out) const;
    // The first node whose event holds the time (start included, end excluded); none when no
    // event holds it.
    Node* GetNodeByTime(const WeekTime& time) const;
    // 0 when an event from start to end fits; 1 when its start is not in a wait, 2 when its
    // end runs out of that wait, 3 when the end comes before the start within the wait.
    int32_t CheckAdd(const WeekTime& start, const WeekTime& end) const;
    ShowEventPtr FirstShowEvent() const;
    ShowEventPtr LastShowEvent() const;

  private:
    void Reset();
    Node* Walk(const WeekTime& time) const;
    Node* Locate(const WeekTime& time) const;
    Node* CyclicNext(Node* node) const noexcept;
    Node* InsertAfter(Node* node, ShowEventPtr event);
    Node* InsertBefore(Node* node, ShowEventPtr event);
    void DeleteNode(Node* node);
    void Touch(Node* node) const;
    void Refresh(Node* node) const;
    void Index(Node* node) const;
    void Unindex(Node* node) const;
    void Reindex() const;

    std::unique_ptr<LinkedList> list_;
    bool modified_ = false;

    // Lookup index: non-empty arcs and empty (start = end) events by start TimeVal, the sum
    // of the arc lengths, and the number of events that do not start where the previous one
    // ends (or whose times are missing or outside the week).
    mutable std::multimap<int32_t, Node*> arcs_;
    mutable std::multimap<int32_t, Node*> degenerates_;
    mutable int64_t arcSum_ = 0;
    mutable int64_t breaks_ = 0;
    mutable bool dirty_ = true;
};

using SchedulePtr = std::shared_ptr<Schedule>;

namespace ScheduleFunctions {

// Reads the weekly schedule file; a file that cannot be read gives a new schedule. Either
// way the result is not modified.
SchedulePtr LoadSchedule(const std::string& path);
// The show events (waits are not written) as one list; no shows give the empty text.
std::string ScheduleToText(const Schedule& schedule);
// Adds each element's event in order; elements that cannot be read or that conflict with
// the ones before are left out without an error.
SchedulePtr ScheduleFromText(std::string_view text);

}  // namespace ScheduleFunctions

}  // namespace vtr
