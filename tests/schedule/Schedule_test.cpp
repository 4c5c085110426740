#include "schedule/Schedule.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <random>
#include <sstream>
#include <vector>

#include "engine/VtrError.h"
#include "show/TempFolder.h"
#include "show/WholeFile.h"

namespace vtr {
namespace {

using namespace WeekTimeFunctions;
using namespace ShowEventFunctions;
using namespace ScheduleFunctions;

struct Span {
    int32_t start;
    int32_t end;
    std::string file;  // empty for a wait
    bool operator==(const Span&) const = default;
};

std::ostream& operator<<(std::ostream& out, const Span& span) {
    return out << "{" << span.start << "," << span.end << "," << span.file << "}";
}

std::vector<Span> Spans(const Schedule& schedule) {
    std::vector<Span> spans;
    for (Node* node = schedule.FirstNode(); node != nullptr; node = node->NextNode()) {
        const auto& event = *node->Obj();
        spans.push_back({event.StartTime()->TimeVal(), event.EndTime()->TimeVal(),
                         event.EventType() == ShowEvent::WaitEvent ? "" : event.Filename()});
    }
    return spans;
}

int32_t T(int day, int hour, int minute = 0, int second = 0) {
    return NewWeekTime(day, hour, minute, second)->TimeVal();
}

void Add(Schedule& schedule, const std::string& file, int32_t start, int32_t end) {
    auto s = std::make_shared<WeekTime>(), e = std::make_shared<WeekTime>();
    s->SetTimeVal(start);
    e->SetTimeVal(end);
    schedule.AddShowEventByFile(file, s, e);
}

int32_t ErrorOf(const std::function<void()>& step, std::string* description = nullptr,
                std::string* source = nullptr) {
    try {
        step();
    } catch (const VtrError& e) {
        if (description != nullptr) {
            *description = e.Description();
        }
        if (source != nullptr) {
            *source = e.Source();
        }
        return e.Number();
    }
    return 0;
}

TEST(ShowEvent, SettersKeepTypeNameAndDuration) {
    ShowEvent event;
    EXPECT_EQ(event.EventType(), ShowEvent::WaitEvent);
    EXPECT_EQ(event.Duration(), -1);
    event.SetFilename("Eve.lss");
    EXPECT_EQ(event.EventType(), ShowEvent::ShowFileEvent);
    event.SetEventType(ShowEvent::WaitEvent);
    EXPECT_EQ(event.Filename(), "");
    event.SetFilename("");
    EXPECT_EQ(event.EventType(), ShowEvent::WaitEvent);

    event.SetStartTime(NewWeekTime(6, 23, 0, 0));
    event.SetEndTime(NewWeekTime(0, 1, 0, 0));
    EXPECT_EQ(event.Duration(), 7200);
    event.SetDuration(604800);
    EXPECT_EQ(event.Duration(), 604800);
    EXPECT_TRUE(event.EndTime()->Equals(*event.StartTime()));

    // Week times are stored by reference, not copied.
    const auto shared = NewWeekTime(1, 8, 0, 0);
    event.SetStartTime(shared);
    EXPECT_EQ(event.StartTime(), shared);

    // With no start and a known duration the start would be derived backwards, which fails.
    ShowEvent orphan;
    orphan.SetStartTime(NewWeekTime(1, 0, 0, 0));
    orphan.SetDuration(60);
    EXPECT_EQ(ErrorOf([&] { orphan.SetEndTime(nullptr); }), ErrorNumbers::ObjectNotSet);
    // With no end, a known duration places the end after a new start.
    orphan.SetStartTime(NewWeekTime(2, 0, 0, 0));
    ASSERT_NE(orphan.EndTime(), nullptr);
    EXPECT_EQ(orphan.EndTime()->TimeVal(), T(2, 0, 1));
    EXPECT_EQ(ErrorOf([] { WeekTime().MinusDuration(1); }), ErrorNumbers::ObjectNotSet);
}

TEST(ShowEvent, TextAndOccurrence) {
    const auto event =
        NewShowEvent("Eve (late).lss", NewWeekTime(1, 18, 0, 0), NewWeekTime(1, 22, 0, 0));
    EXPECT_EQ(ShowEventToText(*event), "(165600,2,(,0,Eve *Olate*C.lss),151200)");
    const auto back = ShowEventFromText(ShowEventToText(*event));
    EXPECT_EQ(back->Filename(), "Eve (late).lss");
    EXPECT_EQ(back->StartTime()->TimeVal(), 151200);
    EXPECT_EQ(back->Duration(), 14400);
    // A show element with no file name is a wait.
    EXPECT_EQ(ShowEventFromText("(165600,2,(,0,),151200)")->EventType(), ShowEvent::WaitEvent);
    EXPECT_EQ(ErrorOf([] { ShowEventFromText("(165600,2,(,0))"); }),
              ErrorNumbers::SubscriptOutOfRange);

    const DateTime wednesday = DateTime::FromParts(2009, 12, 23, 12);
    auto range = event->Range(wednesday);  // Monday's has ended: next week's
    EXPECT_EQ(range.StartTime().ToString(), "2009-12-28 18:00:00");
    EXPECT_EQ(range.EndTime().ToString(), "2009-12-28 22:00:00");
    range = event->Range(DateTime::FromParts(2009, 12, 21, 20));  // still running
    EXPECT_EQ(range.StartTime().ToString(), "2009-12-21 18:00:00");

    const auto wraps = NewShowEvent("Late.lss", NewWeekTime(6, 23, 0, 0), NewWeekTime(0, 1, 0, 0));
    range = wraps->Range(DateTime::FromParts(2009, 12, 26, 12));  // Saturday noon
    EXPECT_EQ(range.StartTime().ToString(), "2009-12-26 23:00:00");
    EXPECT_EQ(range.EndTime().ToString(), "2009-12-27 01:00:00");
    range = wraps->Range(DateTime::FromParts(2009, 12, 27, 0, 30));  // Sunday, running
    EXPECT_EQ(range.StartTime().ToString(), "2009-12-26 23:00:00");
    EXPECT_EQ(range.EndTime().ToString(), "2009-12-27 01:00:00");

    const auto whole = NewShowEvent("All.lss", NewWeekTime(2, 0, 0, 0), NewWeekTime(2, 0, 0, 0));
    range = whole->Range(wednesday);
    EXPECT_FALSE(range.HasStart() || range.HasEnd());
}

TEST(Schedule, NewScheduleIsOneWaitOverTheWeek) {
    Schedule schedule;
    EXPECT_EQ(Spans(schedule), (std::vector<Span>{{0, 0, ""}}));
    EXPECT_EQ(schedule.FirstNode()->Obj()->Duration(), 604800);
    EXPECT_FALSE(schedule.Modified());
    for (int32_t t : {0, 1, 302400, 604799}) {
        auto time = std::make_shared<WeekTime>();
        time->SetTimeVal(t);
        EXPECT_EQ(schedule.GetNodeByTime(*time), schedule.FirstNode());
    }
    EXPECT_EQ(schedule.FirstShowEvent(), nullptr);
    EXPECT_EQ(schedule.LastShowEvent(), nullptr);
    EXPECT_EQ(ScheduleToText(schedule), "");
}

TEST(Schedule, InsertionSplitsShortensAndReplacesWaits) {
    Schedule schedule;
    Add(schedule, "Eve.lss", T(1, 18), T(1, 22));
    EXPECT_TRUE(schedule.Modified());
    EXPECT_EQ(
        Spans(schedule),
        (std::vector<Span>{{0, T(1, 18), ""}, {T(1, 18), T(1, 22), "Eve.lss"}, {T(1, 22), 0, ""}}));
    // Neighbours share their common bound.
    Node* show = schedule.FirstNode()->NextNode();
    EXPECT_EQ(schedule.FirstNode()->Obj()->EndTime(), show->Obj()->StartTime());
    EXPECT_EQ(show->Obj()->EndTime(), show->NextNode()->Obj()->StartTime());

    // Starting where a wait starts shortens it from the front and goes before it.
    Add(schedule, "Late.lss", T(1, 22), T(2, 1));
    EXPECT_EQ(Spans(schedule), (std::vector<Span>{{0, T(1, 18), ""},
                                                  {T(1, 18), T(1, 22), "Eve.lss"},
                                                  {T(1, 22), T(2, 1), "Late.lss"},
                                                  {T(2, 1), 0, ""}}));
    // Ending where a wait ends shortens it from the back and goes after it.
    Add(schedule, "Early.lss", T(1, 17), T(1, 18));
    EXPECT_EQ(Spans(schedule)[0], (Span{0, T(1, 17), ""}));
    EXPECT_EQ(Spans(schedule)[1], (Span{T(1, 17), T(1, 18), "Early.lss"}));
    // Filling a wait exactly replaces it.
    Add(schedule, "Morning.lss", 0, T(1, 17));
    EXPECT_EQ(Spans(schedule).front(), (Span{0, T(1, 17), "Morning.lss"}));
    EXPECT_EQ(schedule.Count(), 5);
    EXPECT_EQ(schedule.FirstShowEvent()->Filename(), "Morning.lss");
    EXPECT_EQ(schedule.LastShowEvent()->Filename(), "Late.lss");
}

TEST(Schedule, AShowMayWrapAcrossSundayMidnight) {
    Schedule schedule;
    Add(schedule, "Eve.lss", T(1, 18), T(1, 22));
    Add(schedule, "Party.lss", T(6, 23), T(0, 1));
    EXPECT_EQ(Spans(schedule), (std::vector<Span>{{T(0, 1), T(1, 18), ""},
                                                  {T(1, 18), T(1, 22), "Eve.lss"},
                                                  {T(1, 22), T(6, 23), ""},
                                                  {T(6, 23), T(0, 1), "Party.lss"}}));
    auto time = std::make_shared<WeekTime>();
    time->SetTimeVal(T(0, 0, 30));
    EXPECT_EQ(schedule.GetNodeByTime(*time)->Obj()->Filename(), "Party.lss");
    EXPECT_EQ(ScheduleToText(schedule),
              "((165600,2,(,0,Eve.lss),151200),(3600,2,(,0,Party.lss),601200))");

    // When the new end meets the first wait's end, that wait disappears.
    Schedule tight;
    Add(tight, "Dawn.lss", T(0, 1), T(0, 5));
    Add(tight, "Night.lss", T(6, 22), T(0, 1));
    EXPECT_EQ(Spans(tight), (std::vector<Span>{{T(0, 1), T(0, 5), "Dawn.lss"},
                                               {T(0, 5), T(6, 22), ""},
                                               {T(6, 22), T(0, 1), "Night.lss"}}));

    // A first event that is a show leaves no room at the wrap.
    std::string description;
    EXPECT_EQ(ErrorOf([&] { Add(tight, "More.lss", T(6, 23), T(0, 2)); }, &description), 1);
    // Into a new schedule a wrapping show simply splits the one wait.
    Schedule fresh;
    Add(fresh, "Party.lss", T(6, 23), T(0, 1));
    EXPECT_EQ(Spans(fresh),
              (std::vector<Span>{{T(0, 1), T(6, 23), ""}, {T(6, 23), T(0, 1), "Party.lss"}}));
}

TEST(Schedule, ConflictsAreRaisedAndCheckAddExplainsThem) {
    Schedule schedule;
    Add(schedule, "Eve.lss", T(1, 18), T(1, 22));
    const auto before = Spans(schedule);
    std::string description, source;
    EXPECT_EQ(ErrorOf([&] { Add(schedule, "X.lss", T(1, 19), T(1, 23)); }, &description, &source),
              1);
    EXPECT_EQ(description, "Can't add event -- event conflict");
    EXPECT_EQ(source, "Schedule.AddShowEvent");
    EXPECT_EQ(ErrorOf([&] { Add(schedule, "X.lss", T(1, 17), T(1, 19)); }), 1);
    EXPECT_EQ(Spans(schedule), before);

    auto w = [](int32_t t) {
        WeekTime time;
        time.SetTimeVal(t);
        return time;
    };
    EXPECT_EQ(schedule.CheckAdd(w(T(1, 19)), w(T(1, 23))), 1);  // starts inside a show
    EXPECT_EQ(schedule.CheckAdd(w(T(1, 17)), w(T(1, 19))), 2);  // runs into the next show
    EXPECT_EQ(schedule.CheckAdd(w(T(1, 17)), w(T(1, 16))), 3);  // ends before it starts
    EXPECT_EQ(schedule.CheckAdd(w(T(1, 10)), w(T(1, 18))), 0);
    EXPECT_EQ(schedule.CheckAdd(w(T(1, 22)), w(T(0, 0))), 0);
}

TEST(Schedule, RemovingShowsGivesTheirTimeBack) {
    Schedule schedule;
    Add(schedule, "A.lss", T(1, 18), T(1, 22));
    Add(schedule, "B.lss", T(1, 22), T(2, 1));
    Add(schedule, "C.lss", T(2, 5), T(2, 6));
    schedule.SetModified(false);

    std::string description, source;
    EXPECT_EQ(
        ErrorOf([&] { schedule.RemoveShowEvent(schedule.FirstNode()); }, &description, &source), 1);
    EXPECT_EQ(description, "Can not remove non-show event");
    EXPECT_EQ(source, "Schedule.RemoveShowEvent");

    // A wait before, a show after: the wait grows.
    schedule.RemoveShowEvent(schedule.FirstNode()->NextNode());
    EXPECT_TRUE(schedule.Modified());
    EXPECT_EQ(Spans(schedule), (std::vector<Span>{{0, T(1, 22), ""},
                                                  {T(1, 22), T(2, 1), "B.lss"},
                                                  {T(2, 1), T(2, 5), ""},
                                                  {T(2, 5), T(2, 6), "C.lss"},
                                                  {T(2, 6), 0, ""}}));
    // Waits on both sides merge into one.
    schedule.RemoveShowEvent(schedule.FirstNode()->NextNode());
    EXPECT_EQ(Spans(schedule),
              (std::vector<Span>{{0, T(2, 5), ""}, {T(2, 5), T(2, 6), "C.lss"}, {T(2, 6), 0, ""}}));
    // The last show gone, the schedule is new again.
    schedule.RemoveShowEvent(schedule.FirstNode()->NextNode());
    EXPECT_EQ(Spans(schedule), (std::vector<Span>{{0, 0, ""}}));
    EXPECT_EQ(schedule.FirstNode()->Obj()->Duration(), 604800);

    // Shows on both sides: the show becomes a wait in place.
    Schedule packed;
    Add(packed, "A.lss", 0, T(1, 0));
    Add(packed, "B.lss", T(1, 0), T(2, 0));
    Add(packed, "C.lss", T(2, 0), 0);
    // The first show split the week's wait at its start, so the list begins after it.
    ASSERT_EQ(Spans(packed),
              (std::vector<Span>{
                  {T(1, 0), T(2, 0), "B.lss"}, {T(2, 0), 0, "C.lss"}, {0, T(1, 0), "A.lss"}}));
    // The first node has no previous neighbour, whatever ends where it starts.
    packed.RemoveShowEvent(packed.FirstNode());
    EXPECT_EQ(
        Spans(packed),
        (std::vector<Span>{{T(1, 0), T(2, 0), ""}, {T(2, 0), 0, "C.lss"}, {0, T(1, 0), "A.lss"}}));
}

TEST(Schedule, DebugDumpListsTheEvents) {
    Schedule schedule;
    Add(schedule, "Eve.lss", T(1, 18), T(1, 22));
    std::ostringstream out;
    schedule.DebugDump(out);
    EXPECT_EQ(out.str(),
              "BEGIN SCHEDULE DUMP\nSun000 - Mon1800 - WAIT\nMon1800 - Mon2200 - Eve.lss\n"
              "Mon2200 - Sun000 - WAIT\nEND SCHEDULE DUMP\n");
}

TEST(ScheduleFile, ReadingSkipsWhatDoesNotFit) {
    // Two overlapping shows: the first stays, without any error.
    const auto schedule = ScheduleFromText(
        "((165600,2,(,0,Eve.lss),151200),(169200,2,(,0,Overlap.lss),154800),(bad),"
        "(180000,2,(,0,Later.lss),172800))");
    EXPECT_EQ(ScheduleToText(*schedule),
              "((165600,2,(,0,Eve.lss),151200),(180000,2,(,0,Later.lss),172800))");
    for (const char* text : {"", "garbage", "((1,2", "()", "(())", ")("}) {
        EXPECT_EQ(Spans(*ScheduleFromText(text)), (std::vector<Span>{{0, 0, ""}})) << text;
    }
}

TEST(ScheduleFile, SavedAndLoadedBackIsTheSame) {
    testing::TempFolder folder;
    Schedule schedule;
    Add(schedule, "Eve, late.lss", T(1, 18), T(1, 22));
    Add(schedule, "Party.lss", T(6, 23), T(0, 1));
    Add(schedule, "Noon.lss", T(3, 12), T(3, 13));
    const std::string path = folder.File("weeksched.lsc");
    schedule.Save(path);
    const auto loaded = LoadSchedule(path);
    EXPECT_FALSE(loaded->Modified());
    EXPECT_EQ(Spans(*loaded), Spans(schedule));
    EXPECT_EQ(ScheduleToText(*loaded), ScheduleToText(schedule));

    const auto missing = LoadSchedule(folder.File("none.lsc"));
    EXPECT_EQ(Spans(*missing), (std::vector<Span>{{0, 0, ""}}));
    EXPECT_FALSE(missing->Modified());

    Schedule waits;
    waits.Save(path);
    std::string text = "x";
    ASSERT_EQ(ReadWholeFile(path, text), 0);
    EXPECT_EQ(text, "");
    EXPECT_EQ(ErrorOf([&] { schedule.Save(folder.File("no/such/weeksched.lsc")); }),
              FileErrors::PathNotFound);
}

// The first node, from the start of the list, whose event holds the time.
Node* WalkFromFirst(const Schedule& schedule, const WeekTime& time) {
    for (Node* node = schedule.FirstNode(); node != nullptr; node = node->NextNode()) {
        if (time.InRange(*node->Obj()->StartTime(), *node->Obj()->EndTime())) {
            return node;
        }
    }
    return nullptr;
}

// Random additions and removals, empty (start = end) shows and waits among them: after every
// operation the lookup gives the node that a walk from the first node gives.
TEST(Schedule, LookupAgreesWithAWalkFromTheFirstNode) {
    std::mt19937 random(99);
    for (int round = 0; round < 300; ++round) {
        Schedule schedule;
        const int operations = 5 + static_cast<int>(random() % 60);
        const bool coarse = round % 3 == 0;  // few distinct times: many exact meetings
        auto pick = [&] {
            return coarse ? static_cast<int32_t>(random() % 8) * 86400
                          : static_cast<int32_t>(random() % 604800);
        };
        for (int op = 0; op < operations; ++op) {
            const int kind = static_cast<int>(random() % 10);
            if (kind < 7) {
                const int32_t start = pick();
                const int32_t length =
                    random() % 20 == 0 ? 0 : 1 + static_cast<int32_t>(random() % 90000);
                const std::string file = random() % 15 == 0 ? "" : "s" + std::to_string(op);
                ResumeStep([&] { Add(schedule, file, start, (start + length) % 604800); });
            } else {
                std::vector<Node*> shows;
                for (Node* n = schedule.FirstNode(); n != nullptr; n = n->NextNode()) {
                    if (n->Obj()->EventType() == ShowEvent::ShowFileEvent) {
                        shows.push_back(n);
                    }
                }
                if (!shows.empty()) {
                    schedule.RemoveShowEvent(shows[random() % shows.size()]);
                }
            }
            for (int probe = 0; probe < 40; ++probe) {
                WeekTime time;
                time.SetTimeVal(probe < 8 ? pick() : static_cast<int32_t>(random() % 604800));
                ASSERT_EQ(schedule.GetNodeByTime(time), WalkFromFirst(schedule, time))
                    << "round " << round << " operation " << op;
            }
        }
    }
}

TEST(Schedule, LoadsLargeSchedulesInAnyOrder) {
    // 6000 shows of 50 s every 100 s, written in week order and shuffled.
    std::vector<std::string> events;
    for (int i = 0; i < 6000; ++i) {
        events.push_back("(" + std::to_string(i * 100 + 50) + ",2,(,0,s" + std::to_string(i) +
                         ".lss)," + std::to_string(i * 100) + ")");
    }
    auto load = [&](const std::vector<std::string>& order) {
        std::string text = "(";
        for (const auto& event : order) {
            text += (text.size() > 1 ? "," : "") + event;
        }
        return ScheduleFromText(text + ")");
    };
    const auto ordered = load(events);
    std::mt19937 random(5);
    auto shuffled = events;
    std::shuffle(shuffled.begin(), shuffled.end(), random);
    const auto mixed = load(shuffled);
    EXPECT_EQ(ordered->Count(), 12000);
    EXPECT_EQ(mixed->Count(), 12000);
    // The same events; the list may start elsewhere in the ring.
    auto sorted = [](const Schedule& schedule) {
        auto spans = Spans(schedule);
        std::sort(spans.begin(), spans.end(),
                  [](const Span& a, const Span& b) { return a.start < b.start; });
        return spans;
    };
    EXPECT_TRUE(sorted(*mixed) == sorted(*ordered));
    // A show from Sunday 00:00:00 into a new schedule turns the week's wait round, so it
    // ends the list.
    const std::string text = ScheduleToText(*ordered);
    EXPECT_EQ(text.substr(0, 24), "((150,2,(,0,s1.lss),100)");
    EXPECT_EQ(text.substr(text.size() - 22), ",(50,2,(,0,s0.lss),0))");
}

TEST(LinkedList, TheOnlyNodeCannotBeDeleted) {
    LinkedList list(std::make_shared<ShowEvent>());
    std::string description, source;
    EXPECT_EQ(ErrorOf([&] { list.DeleteNode(list.FirstNode()); }, &description, &source), 1);
    EXPECT_EQ(description, "Can't delete only node");
    EXPECT_EQ(source, "LinkedList.DeleteNode");
    Node* second = list.InsertAfter(list.FirstNode(), std::make_shared<ShowEvent>());
    Node* zeroth = list.InsertBefore(list.FirstNode(), std::make_shared<ShowEvent>());
    EXPECT_EQ(list.FirstNode(), zeroth);
    EXPECT_EQ(list.LastNode(), second);
    list.DeleteNode(zeroth);
    EXPECT_EQ(list.Count(), 2);
    EXPECT_EQ(list.FirstNode()->NextNode(), second);
    EXPECT_EQ(list.FirstNode()->PreviousNode(), nullptr);
}

}  // namespace
}  // namespace vtr
