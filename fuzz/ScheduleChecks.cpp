#include "ScheduleChecks.h"

#include <algorithm>
#include <tuple>
#include <vector>

#include "FuzzSupport.h"

namespace vtr::fuzz {

namespace {

Node* WalkTo(const Schedule& schedule, const WeekTime& time) {
    for (Node* node = schedule.FirstNode(); node != nullptr; node = node->NextNode()) {
        const ShowEventPtr& event = node->Obj();
        if (event && event->StartTime() && event->EndTime() &&
            time.InRange(*event->StartTime(), *event->EndTime())) {
            return node;
        }
    }
    return nullptr;
}

std::string Describe(const Schedule& schedule) {
    std::string out;
    for (Node* node = schedule.FirstNode(); node != nullptr; node = node->NextNode()) {
        const ShowEventPtr& event = node->Obj();
        if (!event || !event->StartTime() || !event->EndTime()) {
            out += " (no times)";
            continue;
        }
        out += " [" + std::to_string(event->StartTime()->TimeVal()) + "," +
               std::to_string(event->EndTime()->TimeVal()) + ")" +
               (event->EventType() == ShowEvent::WaitEvent ? "w" : "s");
    }
    return out;
}

}  // namespace

void CheckLookups(const Schedule& schedule, const std::string& context,
                  std::initializer_list<int32_t> extraTimes) {
    std::vector<int32_t> times(extraTimes);
    times.push_back(0);
    times.push_back(TimeConstants::SecondsPerWeek - 1);
    int counted = 0;
    for (Node* node = schedule.FirstNode(); node != nullptr && counted < 64;
         node = node->NextNode(), ++counted) {
        const ShowEventPtr& event = node->Obj();
        if (!event || !event->StartTime() || !event->EndTime())
            continue;
        for (const int32_t bound : {event->StartTime()->TimeVal(), event->EndTime()->TimeVal()}) {
            for (const int32_t offset : {-1, 0, 1}) {
                const int64_t t = int64_t{bound} + offset;
                if (t >= 0 && t < TimeConstants::SecondsPerWeek)
                    times.push_back(static_cast<int32_t>(t));
            }
        }
    }
    for (const int32_t t : times) {
        WeekTime time;
        time.SetTimeVal(t);
        Node* expected = WalkTo(schedule, time);
        Node* found = schedule.GetNodeByTime(time);
        VTR_FUZZ_CHECK(found == expected,
                       context + "\nat " + std::to_string(t) + " in" + Describe(schedule));
    }
}

std::string Content(const Schedule& schedule) {
    std::vector<std::tuple<int32_t, int32_t, std::string>> events;
    for (Node* node = schedule.FirstNode(); node != nullptr; node = node->NextNode()) {
        const ShowEventPtr& event = node->Obj();
        if (event && event->EventType() == ShowEvent::ShowFileEvent && event->StartTime() &&
            event->EndTime()) {
            events.emplace_back(event->StartTime()->TimeVal(), event->EndTime()->TimeVal(),
                                event->Filename());
        }
    }
    std::sort(events.begin(), events.end());
    std::string out;
    for (const auto& [start, end, file] : events)
        out += "[" + std::to_string(start) + "," + std::to_string(end) + ") " + file + "\n";
    return out;
}

bool TilesTheWeek(const Schedule& schedule) {
    constexpr int64_t kWeek = TimeConstants::SecondsPerWeek;
    const Node* previous = schedule.LastNode();
    int64_t covered = 0;
    for (Node* node = schedule.FirstNode(); node != nullptr; node = node->NextNode()) {
        const ShowEventPtr& event = node->Obj();
        const ShowEventPtr& before = previous->Obj();
        if (!event || !before || !event->StartTime() || !event->EndTime() || !before->EndTime())
            return false;
        const int64_t start = event->StartTime()->TimeVal();
        const int64_t end = event->EndTime()->TimeVal();
        if (start < 0 || start >= kWeek || end < 0 || end >= kWeek ||
            before->EndTime()->TimeVal() != start) {
            return false;
        }
        // An event whose ends meet covers the whole week: alone, it is the week; beside
        // others, it overlaps them.
        const int64_t length = (end - start + kWeek) % kWeek;
        if (length == 0 && schedule.Count() != 1)
            return false;
        covered += length == 0 ? kWeek : length;
        previous = node;
    }
    return covered == kWeek;
}

void CheckRewrite(const Schedule& schedule, const std::string& context) {
    if (!TilesTheWeek(schedule))
        return;
    const std::string written = ScheduleFunctions::ScheduleToText(schedule);
    const SchedulePtr again = ScheduleFunctions::ScheduleFromText(written);
    VTR_FUZZ_CHECK(Content(*again) == Content(schedule),
                   context + "\nwritten: " + Printable(written) + "\nschedule" +
                       Describe(schedule) + "\nread again" + Describe(*again));
}

}  // namespace vtr::fuzz
