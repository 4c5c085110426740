#pragma once

#include <string>

#include "schedule/Schedule.h"

// Properties of a weekly schedule read from any text, shared by the weekly and calendar
// schedule targets. Each stops the run with a message when broken.
namespace vtr::fuzz {

// GetNodeByTime answers as a walk from the first node does (the first event in list order
// whose arc holds the time), at every event's bounds and their neighbours and at the
// extra times given.
void CheckLookups(const Schedule& schedule, const std::string& context,
                  std::initializer_list<int32_t> extraTimes = {});

// The show events of the schedule, ordered by start: what the schedule means, whichever
// event its list happens to begin with.
std::string Content(const Schedule& schedule);

// True when the events tile the week: each starts where the one before it ends (the first
// where the last ends) and together they cover the week once. Adding a show whose end comes
// before its start inside the wait that holds it, or of one whose ends meet (the whole week)
// beside other events, is not refused by the insertion, which then leaves the ring
// overlapping itself; such a schedule does not read back the same.
bool TilesTheWeek(const Schedule& schedule);

// Writing the schedule and reading the text gives the same show events, when the schedule
// tiles the week.
void CheckRewrite(const Schedule& schedule, const std::string& context);

}  // namespace vtr::fuzz
