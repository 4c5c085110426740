#include <gtest/gtest.h>

#include <functional>

#include "engine/VtrError.h"
#include "show/InteractiveGroup.h"
#include "show/Trigger.h"
#include "show/TriggeredSequences.h"
#include "support/Raised.h"

namespace vtr {
namespace {

using testsupport::RaisedNumber;
using namespace TriggerFunctions;
using namespace TriggeredSequencesFunctions;
using namespace InteractiveGroupFunctions;

TEST(Trigger, EqualityIgnoresTheName) {
    const auto a = CreateTrigger(1, 3, 2, "Front door");
    const auto b = CreateTrigger(1, 3, 2, "Porch");
    EXPECT_TRUE(a->Equals(b));
    EXPECT_FALSE(a->Equals(nullptr));
    EXPECT_FALSE(a->Equals(CreateTrigger(2, 3, 2, "Front door")));
    EXPECT_FALSE(a->Equals(CreateTrigger(1, 4, 2, "Front door")));
    EXPECT_FALSE(a->Equals(CreateTrigger(1, 3, 5, "Front door")));

    EXPECT_EQ(TriggerToText(a), "( 2,Front door, 3, 1)");
    EXPECT_EQ(TriggerToText(CreateTrigger(-1, 0, 7, "a,b")), "( 7,a*Sb, 0,-1)");
    const auto read = TriggerFromText("( 2,Front door, 3, 0)");
    EXPECT_EQ(read->InputNumber(), 2);
    EXPECT_EQ(read->Name(), "Front door");
    EXPECT_EQ(read->UnitId(), 3);
    EXPECT_EQ(read->Network(), 0);
    EXPECT_EQ(RaisedNumber([] { TriggerFromText("( 2,Front door, 3)"); }),
              ErrorNumbers::SubscriptOutOfRange);
    EXPECT_EQ(RaisedNumber([] { TriggerFromText("( 2,Front door, x, 0)"); }),
              ErrorNumbers::TypeMismatch);
    EXPECT_EQ(RaisedNumber([] { TriggerToText(TriggerPtr()); }), ErrorNumbers::ObjectNotSet);
}

TEST(TriggeredSequences, ReadsTheTriggerFromTheSecondPlace) {
    const auto set = TriggeredSequencesFromText("(Intro.lms,(2,Front door, 3, 0),Outro.lms)");
    ASSERT_NE(set->Trig(), nullptr);
    EXPECT_EQ(set->Trig()->InputNumber(), 2);
    EXPECT_EQ(set->Trig()->Name(), "Front door");
    EXPECT_EQ(set->Trig()->UnitId(), 3);
    EXPECT_EQ(set->Trig()->Network(), 0);
    ASSERT_EQ(set->NumSequences(), 2);
    EXPECT_EQ(set->Sequence(0), "Intro.lms");
    EXPECT_EQ(set->Sequence(1), "Outro.lms");
    EXPECT_EQ(TriggeredSequencesToText(*set), "(Intro.lms,( 2,Front door, 3, 0),Outro.lms)");

    EXPECT_EQ(RaisedNumber([] { TriggeredSequencesFromText("(Intro.lms)"); }),
              ErrorNumbers::SubscriptOutOfRange);
    TriggeredSequences empty;
    empty.SetTrig(CreateTrigger(0, 1, 1, ""));
    EXPECT_EQ(RaisedNumber([&] { TriggeredSequencesToText(empty); }),
              ErrorNumbers::SubscriptOutOfRange);
    TriggeredSequences untriggered;
    untriggered.AddSequence("a.lms");
    EXPECT_EQ(RaisedNumber([&] { TriggeredSequencesToText(untriggered); }),
              ErrorNumbers::ObjectNotSet);
    EXPECT_EQ(RaisedNumber([&] { untriggered.Sequence(1); }), ErrorNumbers::SubscriptOutOfRange);
    EXPECT_EQ(RaisedNumber([&] { untriggered.SetSequence(-1, "x"); }),
              ErrorNumbers::SubscriptOutOfRange);
}

TEST(TriggeredSequences, RoundRobinAndCopy) {
    TriggeredSequences set;
    set.BumpRoundRobinIndex();
    EXPECT_EQ(set.RoundRobinIndex(), 0);  // no sequences: stays 0
    set.SetSequences({"a", "b", "c"});
    set.BumpRoundRobinIndex();
    set.BumpRoundRobinIndex();
    EXPECT_EQ(set.RoundRobinIndex(), 2);
    set.BumpRoundRobinIndex();
    EXPECT_EQ(set.RoundRobinIndex(), 0);

    set.SetTrig(CreateTrigger(1, 2, 3, "t"));
    TriggeredSequences copy;
    copy.Copy(set);
    EXPECT_NE(copy.Trig(), set.Trig());  // a trigger of its own
    EXPECT_TRUE(copy.Trig()->Equals(set.Trig()));
    EXPECT_EQ(copy.Sequences(), set.Sequences());
    set.SetSequence(0, "z");
    EXPECT_EQ(copy.Sequence(0), "a");
}

TEST(InteractiveGroup, TypeFollowsTheFlags) {
    InteractiveGroup group;
    EXPECT_EQ(group.TypeName(), "Jukebox");
    EXPECT_EQ(group.TypeDesc(),
              "Only one sequence from this group can be playing at any given time.  If a "
              "unit/circuit from this group is triggered, but a sequence from this group is "
              "already playing, the trigger will be ignored.\r\n\r\nIf a unit/circuit in this "
              "group is associated with more than one sequence, then every time it is "
              "triggered, the next such sequence will be played, in a round-robin fashion "
              "(unless it is ignored because a sequence from this group is already playing).");
    group.SetInterruptible(true);
    EXPECT_EQ(group.TypeName(), "Soundboard");
    EXPECT_EQ(group.TypeDesc(),
              "Only one sequence from this group can be playing at any given time.  If a "
              "unit/circuit from this group is triggered, but a sequence from this group is "
              "already playing, the playing sequence will immediately stop, and the sequence "
              "associated with the triggered unit/circuit will be played.\r\n\r\nIf a "
              "unit/circuit in this group is associated with more than once sequence, then "
              "every time it is triggered, the next such sequence will be played, in a "
              "round-robin fashion.");
    group.SetIndependent(true);
    EXPECT_EQ(group.TypeName(), "Magic Toy");
    EXPECT_EQ(group.TypeDesc(),
              "Any unit/circuit in this group can be associated with any number of sequences, "
              "all of which will play simultaneously whenever that Unit/circuit is triggered.  "
              "If any sequences from this group were already playing, they will immediately "
              "stop.\r\n\r\nOnly animation sequences can be used in this group - musical "
              "sequences cannot be used.");
    const std::string magic = group.TypeDesc();
    group.SetInterruptible(false);  // independent only: no type of its own
    EXPECT_EQ(group.TypeName(), "Interactive Group");
    EXPECT_EQ(group.TypeDesc(), magic);
}

TEST(InteractiveGroup, TextRoundTrips) {
    InteractiveGroup group;
    group.SetName("Yard (north)");
    group.SetDescription("Kids' buttons");
    group.SetMusicalAllowed(false);
    group.SetLightsOffAtEnd(false);
    group.AddTriggeredSequences(CreateTriggeredSequences(CreateTrigger(0, 1, 1, "A"), {"a.lms"}));
    group.AddTriggeredSequences(
        CreateTriggeredSequences(CreateTrigger(0, 1, 2, "B"), {"b.lms", "c.lms"}));
    const std::string text = InteractiveGroupToText(group);
    EXPECT_EQ(text,
              "( 2,Kids' buttons,F,F,F,Yard *Onorth*C,((a.lms,( 1,A, 1, 0)),"
              "(b.lms,( 2,B, 1, 0),c.lms)),F)");
    const auto back = InteractiveGroupFromText(text);
    EXPECT_EQ(InteractiveGroupToText(*back), text);
    EXPECT_EQ(back->Count(), 2);
    EXPECT_EQ(back->GetTriggeredSequences(1)->Sequence(1), "c.lms");

    back->DeleteTriggeredSequence(0);
    EXPECT_EQ(back->Count(), 1);
    EXPECT_EQ(back->GetTriggeredSequences(0)->Trig()->Name(), "B");
    EXPECT_EQ(RaisedNumber([&] { back->GetTriggeredSequences(1); }),
              ErrorNumbers::SubscriptOutOfRange);

    InteractiveGroup copy;
    copy.Copy(group);
    EXPECT_EQ(InteractiveGroupToText(copy), text);
    EXPECT_NE(copy.GetTriggeredSequences(0), group.GetTriggeredSequences(0));
    EXPECT_NE(copy.GetTriggeredSequences(0)->Trig(), group.GetTriggeredSequences(0)->Trig());
}

TEST(InteractiveGroup, ReadingRules) {
    const auto noField8 = InteractiveGroupFromText("( 1,,T,T,T,n,((a,( 1,, 1, 0))))");
    EXPECT_TRUE(noField8->LightsOffAtEnd());
    EXPECT_EQ(noField8->TypeName(), "Magic Toy");
    // The count field is ignored: the list of sets decides.
    EXPECT_EQ(InteractiveGroupFromText("( 9,,F,F,T,n,((a,( 1,, 1, 0))),F)")->Count(), 1);
    EXPECT_EQ(RaisedNumber([] { InteractiveGroupFromText("( 0,,F,F,T,n,,T)"); }),
              ErrorNumbers::SubscriptOutOfRange);
    EXPECT_EQ(RaisedNumber([] { InteractiveGroupFromText("( 1,,F,F,T,n,((a)),T)"); }),
              ErrorNumbers::SubscriptOutOfRange);
    EXPECT_EQ(RaisedNumber([] { InteractiveGroupToText(InteractiveGroup()); }),
              ErrorNumbers::SubscriptOutOfRange);
}

}  // namespace
}  // namespace vtr
