#include "schedule/Schedule.h"

#include <iostream>
#include <ostream>
#include <vector>

#include "engine/VtrError.h"
#include "show/ModelErrors.h"
#include "show/Serialize.h"
#include "show/WholeFile.h"

namespace vtr {

namespace {

constexpr int32_t kWeek = TimeConstants::SecondsPerWeek;
constexpr const char* kAddSource = "Schedule.AddShowEvent";

[[noreturn]] void RaiseConflict() {
    Raise(1, kAddSource, "Can't add event -- event conflict");
}

const ShowEvent& EventOf(const Node* node, const char* source) {
    if (node == nullptr || !node->Obj() || !node->Obj()->StartTime() || !node->Obj()->EndTime()) {
        ModelErrors::ObjectNotSet(source);
    }
    return *node->Obj();
}

bool IsWait(const Node* node) {
    return node->Obj() && node->Obj()->EventType() == ShowEvent::WaitEvent;
}

bool InWeek(int32_t value) {
    return value >= 0 && value < kWeek;
}

ShowEventPtr NewWait(WeekTimePtr start, WeekTimePtr end) {
    auto wait = std::make_shared<ShowEvent>();
    wait->SetEventType(ShowEvent::WaitEvent);
    wait->SetStartTime(std::move(start));
    wait->SetEndTime(std::move(end));
    return wait;
}

}  // namespace

Schedule::Schedule() {
    Reset();
}

void Schedule::Reset() {
    list_ = LinkedListFunctions::NewLinkedList(
        ShowEventFunctions::NewWaitEvent(std::make_shared<WeekTime>(), kWeek));
    dirty_ = true;
}

// ---- lookup ------------------------------------------------------------------------------

Node* Schedule::Walk(const WeekTime& time) const {
    for (Node* node = list_->FirstNode(); node != nullptr; node = node->NextNode()) {
        const ShowEvent& event = EventOf(node, "Schedule.GetNodeByTime");
        if (time.InRange(*event.StartTime(), *event.EndTime())) {
            return node;
        }
    }
    return nullptr;
}

Node* Schedule::Locate(const WeekTime& time) const {
    Node* first = list_->FirstNode();
    const ShowEvent& firstEvent = EventOf(first, "Schedule.GetNodeByTime");
    if (firstEvent.StartTime()->Equals(*firstEvent.EndTime())) {
        return first;  // an event whose ends coincide holds every time
    }
    if (dirty_) {
        Reindex();
    }
    const int32_t t = time.TimeVal();
    if (breaks_ != 0 || arcSum_ != kWeek || arcs_.empty() || !InWeek(t)) {
        return Walk(time);
    }
    // The non-empty events tile the week once: exactly one of them holds the time.
    auto next = arcs_.upper_bound(t);
    Node* holder = (next == arcs_.begin() ? std::prev(arcs_.end()) : std::prev(next))->second;
    const ShowEvent& held = *holder->Obj();
    if (!time.InRange(*held.StartTime(), *held.EndTime())) {
        return Walk(time);
    }
    if (degenerates_.empty()) {
        return holder;
    }
    // An empty event holds every time, so the answer is the first of them when it comes
    // before the holder in list order. The list runs contiguously from the first event's
    // start, so its order is the order of the offsets from that start; empty events that
    // start where the list starts stand at its very end.
    const int32_t origin = firstEvent.StartTime()->TimeVal();
    auto empty = degenerates_.upper_bound(origin);
    if (empty == degenerates_.end()) {
        empty = degenerates_.begin();
        if (empty->first >= origin) {
            return holder;
        }
    }
    if (degenerates_.count(empty->first) != 1) {
        return Walk(time);
    }
    const int32_t emptyOffset = (empty->first - origin + kWeek) % kWeek;
    const int32_t holderOffset = (held.StartTime()->TimeVal() - origin + kWeek) % kWeek;
    return emptyOffset <= holderOffset ? empty->second : holder;
}

Node* Schedule::GetNodeByTime(const WeekTime& time) const {
    return Locate(time);
}

// ---- index bookkeeping -------------------------------------------------------------------

Node* Schedule::CyclicNext(Node* node) const noexcept {
    return node->NextNode() != nullptr ? node->NextNode() : list_->FirstNode();
}

void Schedule::Index(Node* node) const {
    Node* previous = node->PreviousNode() != nullptr ? node->PreviousNode() : list_->LastNode();
    const ShowEventPtr& event = node->Obj();
    const WeekTime* start = event ? event->StartTime().get() : nullptr;
    const WeekTime* end = event ? event->EndTime().get() : nullptr;
    const WeekTime* previousEnd = previous->Obj() ? previous->Obj()->EndTime().get() : nullptr;
    const bool valid =
        start != nullptr && end != nullptr && InWeek(start->TimeVal()) && InWeek(end->TimeVal());
    node->length_ = valid ? (end->TimeVal() - start->TimeVal() + kWeek) % kWeek : 0;
    node->degenerate_ = valid && node->length_ == 0;
    node->broken_ = !valid || previousEnd == nullptr || previousEnd->TimeVal() != start->TimeVal();
    const int32_t key = valid ? start->TimeVal() : 0;
    node->position_ = (node->degenerate_ ? degenerates_ : arcs_).emplace(key, node);
    node->indexed_ = true;
    arcSum_ += node->length_;
    breaks_ += node->broken_ ? 1 : 0;
}

void Schedule::Unindex(Node* node) const {
    if (dirty_ || !node->indexed_) {
        return;
    }
    (node->degenerate_ ? degenerates_ : arcs_).erase(node->position_);
    arcSum_ -= node->length_;
    breaks_ -= node->broken_ ? 1 : 0;
    node->indexed_ = false;
}

void Schedule::Refresh(Node* node) const {
    if (dirty_ || node == nullptr) {
        return;
    }
    Unindex(node);
    Index(node);
}

void Schedule::Touch(Node* node) const {
    Refresh(node);
    Refresh(CyclicNext(node));
}

void Schedule::Reindex() const {
    arcs_.clear();
    degenerates_.clear();
    arcSum_ = 0;
    breaks_ = 0;
    for (Node* node = list_->FirstNode(); node != nullptr; node = node->NextNode()) {
        Index(node);
    }
    dirty_ = false;
}

Node* Schedule::InsertAfter(Node* node, ShowEventPtr event) {
    Node* added = list_->InsertAfter(node, std::move(event));
    Touch(added);
    return added;
}

Node* Schedule::InsertBefore(Node* node, ShowEventPtr event) {
    Node* added = list_->InsertBefore(node, std::move(event));
    Touch(added);
    return added;
}

void Schedule::DeleteNode(Node* node) {
    Node* follower = CyclicNext(node);
    if (list_->Count() > 1) {
        Unindex(node);
    }
    list_->DeleteNode(node);
    Refresh(follower);
}

// ---- operations --------------------------------------------------------------------------

void Schedule::AddShowEvent(ShowEventPtr event) {
    if (!event || !event->StartTime() || !event->EndTime()) {
        ModelErrors::ObjectNotSet(kAddSource);
    }
    const WeekTimePtr newStart = event->StartTime();
    const WeekTimePtr newEnd = event->EndTime();

    Node* gap = Locate(*newStart);
    if (gap == nullptr) {
        ModelErrors::ObjectNotSet(kAddSource);
    }
    ShowEvent& gapEvent = *gap->Obj();
    if (gapEvent.EventType() != ShowEvent::WaitEvent) {
        RaiseConflict();
    }
    modified_ = true;

    if (!newEnd->BetweenEquals(*gapEvent.StartTime(), *gapEvent.EndTime())) {
        // The event may still fit across the week's end, where the free time before and
        // after Sunday 00:00:00 is held by the last and the first events.
        Node* first = list_->FirstNode();
        Node* last = list_->LastNode();
        const ShowEvent& firstEvent = EventOf(first, kAddSource);
        const ShowEvent& lastEvent = EventOf(last, kAddSource);
        if (!(IsWait(first) && IsWait(last) &&
              newStart->BetweenEquals(*lastEvent.StartTime(), *lastEvent.EndTime()) &&
              newEnd->BetweenEquals(*firstEvent.StartTime(), *firstEvent.EndTime()))) {
            RaiseConflict();
        }
        // Re-divide the free time in place: the shared week-time objects move, so both the
        // first wait's start and the last wait's end now sit at the new end.
        firstEvent.StartTime()->SetTimeVal(newEnd->TimeVal());
        lastEvent.EndTime()->SetTimeVal(newEnd->TimeVal());
        dirty_ = true;
        if (firstEvent.StartTime()->Equals(*firstEvent.EndTime())) {
            DeleteNode(first);
        }
    }

    // The event inside the gap: the wait before it, the event, and a new wait after it.
    auto splitGap = [&] {
        auto wait = NewWait(newEnd, gapEvent.EndTime());
        gapEvent.SetEndTime(newStart);
        Touch(gap);
        Node* added = InsertAfter(gap, std::move(event));
        InsertAfter(added, std::move(wait));
    };

    if (list_->Count() == 1) {
        // One wait covering the whole week.
        if (gapEvent.StartTime()->BetweenEquals(*newStart, *newEnd)) {
            gapEvent.SetStartTime(newEnd);
            gapEvent.SetEndTime(newStart);
            Touch(gap);
            InsertAfter(gap, std::move(event));
        } else {
            splitGap();
        }
        return;
    }

    const bool sameStart = newStart->Equals(*gapEvent.StartTime());
    const bool sameEnd = newEnd->Equals(*gapEvent.EndTime());
    if (sameStart && sameEnd) {
        InsertAfter(gap, std::move(event));
        DeleteNode(gap);
    } else if (sameStart) {
        gapEvent.SetStartTime(newEnd);
        Touch(gap);
        InsertBefore(gap, std::move(event));
    } else if (sameEnd) {
        gapEvent.SetEndTime(newStart);
        Touch(gap);
        InsertAfter(gap, std::move(event));
    } else {
        splitGap();
    }
}

void Schedule::AddShowEventByFile(const std::string& filename, WeekTimePtr start, WeekTimePtr end) {
    AddShowEvent(ShowEventFunctions::NewShowEvent(filename, std::move(start), std::move(end)));
}

void Schedule::RemoveShowEvent(Node* node) {
    const ShowEvent& event = EventOf(node, "Schedule.RemoveShowEvent");
    if (event.EventType() != ShowEvent::ShowFileEvent) {
        Raise(1, "Schedule.RemoveShowEvent", "Can not remove non-show event");
    }
#ifndef NDEBUG
    std::clog << "Entering Remove Show Event\n";
#endif
    DebugDump();
    modified_ = true;

    Node* previous = node->PreviousNode();
    Node* next = node->NextNode();
    const bool previousWait = previous != nullptr && IsWait(previous);
    const bool nextWait = next != nullptr && IsWait(next);
    if (previousWait && nextWait) {
        previous->Obj()->SetEndTime(EventOf(next, "Schedule.RemoveShowEvent").EndTime());
        Touch(previous);
        DeleteNode(node);
        DeleteNode(next);
    } else if (previousWait) {
        previous->Obj()->SetEndTime(event.EndTime());
        Touch(previous);
        DeleteNode(node);
    } else if (nextWait) {
        next->Obj()->SetStartTime(event.StartTime());
        Touch(next);
        DeleteNode(node);
    } else {
        node->Obj()->SetEventType(ShowEvent::WaitEvent);
    }
    if (list_->Count() == 1) {
        Reset();
    }
    DebugDump();
}

int32_t Schedule::CheckAdd(const WeekTime& start, const WeekTime& end) const {
    Node* node = Locate(start);
    const ShowEvent& wait = EventOf(node, "Schedule.CheckAdd");
    if (wait.EventType() != ShowEvent::WaitEvent) {
        return 1;
    }
    if (!start.BetweenEquals(*wait.StartTime(), *wait.EndTime())) {
        return 1;
    }
    if (!end.BetweenEquals(*wait.StartTime(), *wait.EndTime())) {
        return 2;
    }
    if (!start.BetweenEquals(*wait.StartTime(), end)) {
        return 3;
    }
    return 0;
}

ShowEventPtr Schedule::FirstShowEvent() const {
    for (Node* node = list_->FirstNode(); node != nullptr; node = node->NextNode()) {
        if (node->Obj() && node->Obj()->EventType() == ShowEvent::ShowFileEvent) {
            return node->Obj();
        }
    }
    return nullptr;
}

ShowEventPtr Schedule::LastShowEvent() const {
    for (Node* node = list_->LastNode(); node != nullptr; node = node->PreviousNode()) {
        if (node->Obj() && node->Obj()->EventType() == ShowEvent::ShowFileEvent) {
            return node->Obj();
        }
    }
    return nullptr;
}

void Schedule::Save(const std::string& path) const {
    const int32_t error = WriteWholeFile(path, ScheduleFunctions::ScheduleToText(*this));
    if (error != 0) {
        Raise(error, "Schedule.Save", FileErrorDescription(error));
    }
}

void Schedule::DebugDump(std::ostream& out) const {
    out << "BEGIN SCHEDULE DUMP\n";
    for (Node* node = list_->FirstNode(); node != nullptr; node = node->NextNode()) {
        const ShowEvent& event = EventOf(node, "Schedule.DebugDump");
        out << event.StartTime()->ToString() << " - " << event.EndTime()->ToString() << " - "
            << (event.EventType() == ShowEvent::WaitEvent ? std::string("WAIT") : event.Filename())
            << '\n';
    }
    out << "END SCHEDULE DUMP\n";
}

void Schedule::DebugDump() const {
#ifndef NDEBUG
    ResumeStep([&] { DebugDump(std::clog); });
#endif
}

namespace ScheduleFunctions {

SchedulePtr LoadSchedule(const std::string& path) {
    std::string text;
    SchedulePtr schedule =
        ReadWholeFile(path, text) != 0 ? std::make_shared<Schedule>() : ScheduleFromText(text);
    schedule->SetModified(false);
    return schedule;
}

std::string ScheduleToText(const Schedule& schedule) {
    std::vector<std::string> events;
    for (Node* node = schedule.FirstNode(); node != nullptr; node = node->NextNode()) {
        if (node->Obj() && node->Obj()->EventType() == ShowEvent::ShowFileEvent) {
            events.push_back(ShowEventFunctions::ShowEventToText(*node->Obj()));
        }
    }
    return events.empty() ? std::string() : Serialize::ListToText(events);
}

SchedulePtr ScheduleFromText(std::string_view text) {
    auto schedule = std::make_shared<Schedule>();
    const auto elements =
        ResumeOr(Serialize::List(), [&] { return Serialize::ListFromText(text, 1); });
    for (const auto& element : elements) {
        ResumeStep([&] { schedule->AddShowEvent(ShowEventFunctions::ShowEventFromText(element)); });
    }
    return schedule;
}

}  // namespace ScheduleFunctions

}  // namespace vtr
