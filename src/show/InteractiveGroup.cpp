#include "show/InteractiveGroup.h"

#include "show/ModelErrors.h"
#include "show/Serialize.h"

namespace vtr {

namespace {

constexpr const char* kMagicToyDesc =
    "Any unit/circuit in this group can be associated with any number of sequences, all of "
    "which will play simultaneously whenever that Unit/circuit is triggered.  If any sequences "
    "from this group were already playing, they will immediately stop.\r\n\r\nOnly animation "
    "sequences can be used in this group - musical sequences cannot be used.";

constexpr const char* kSoundboardDesc =
    "Only one sequence from this group can be playing at any given time.  If a unit/circuit "
    "from this group is triggered, but a sequence from this group is already playing, the "
    "playing sequence will immediately stop, and the sequence associated with the triggered "
    "unit/circuit will be played.\r\n\r\nIf a unit/circuit in this group is associated with "
    "more than once sequence, then every time it is triggered, the next such sequence will be "
    "played, in a round-robin fashion.";

constexpr const char* kJukeboxDesc =
    "Only one sequence from this group can be playing at any given time.  If a unit/circuit "
    "from this group is triggered, but a sequence from this group is already playing, the "
    "trigger will be ignored.\r\n\r\nIf a unit/circuit in this group is associated with more "
    "than one sequence, then every time it is triggered, the next such sequence will be "
    "played, in a round-robin fashion (unless it is ignored because a sequence from this group "
    "is already playing).";

}  // namespace

InteractiveGroup::InteractiveGroup() {
    UpdateType();
}

void InteractiveGroup::SetIndependent(bool value) {
    independent_ = value;
    UpdateType();
}

void InteractiveGroup::SetInterruptible(bool value) {
    interruptible_ = value;
    UpdateType();
}

void InteractiveGroup::UpdateType() {
    typeName_ = "Interactive Group";
    if (independent_ && interruptible_) {
        typeName_ = "Magic Toy";
        typeDesc_ = kMagicToyDesc;
    } else if (!independent_ && interruptible_) {
        typeName_ = "Soundboard";
        typeDesc_ = kSoundboardDesc;
    } else if (!independent_ && !interruptible_) {
        typeName_ = "Jukebox";
        typeDesc_ = kJukeboxDesc;
    }
    // Independent but not interruptible has no type of its own: the description stays.
}

const TriggeredSequencesPtr& InteractiveGroup::GetTriggeredSequences(int32_t index) const {
    if (index < 0 || index >= Count()) {
        ModelErrors::SubscriptOutOfRange("InteractiveGroup.GetTriggeredSequences");
    }
    return sets_[static_cast<std::size_t>(index)];
}

void InteractiveGroup::DeleteTriggeredSequence(int32_t index) {
    if (index < 0 || index >= Count()) {
        ModelErrors::SubscriptOutOfRange("InteractiveGroup.DeleteTriggeredSequence");
    }
    sets_.erase(sets_.begin() + index);
}

void InteractiveGroup::Copy(const InteractiveGroup& other) {
    lightsOffAtEnd_ = other.lightsOffAtEnd_;
    musicalAllowed_ = other.musicalAllowed_;
    name_ = other.name_;
    description_ = other.description_;
    typeDesc_ = other.typeDesc_;
    independent_ = other.independent_;
    interruptible_ = other.interruptible_;
    UpdateType();
    std::vector<TriggeredSequencesPtr> sets;
    sets.reserve(other.sets_.size());
    for (const auto& set : other.sets_) {
        TriggeredSequencesPtr copy;
        if (set) {
            copy = std::make_shared<TriggeredSequences>();
            copy->Copy(*set);
        }
        sets.push_back(std::move(copy));
    }
    sets_ = std::move(sets);
}

namespace InteractiveGroupFunctions {

std::string InteractiveGroupToText(const InteractiveGroup& group) {
    if (group.Count() == 0) {
        ModelErrors::SubscriptOutOfRange("InteractiveGroupFunctions.InteractiveGroupToText");
    }
    std::vector<std::string> sets;
    sets.reserve(static_cast<std::size_t>(group.Count()));
    for (int32_t i = 0; i < group.Count(); ++i) {
        const auto& set = group.GetTriggeredSequences(i);
        if (!set) {
            ModelErrors::ObjectNotSet("InteractiveGroupFunctions.InteractiveGroupToText");
        }
        sets.push_back(TriggeredSequencesFunctions::TriggeredSequencesToText(*set));
    }
    return Serialize::ListToText(
        {Serialize::LongToText(group.Count()), Serialize::EscapeText(group.Description()),
         Serialize::BoolToText(group.Independent()), Serialize::BoolToText(group.Interruptible()),
         Serialize::BoolToText(group.MusicalAllowed()), Serialize::EscapeText(group.Name()),
         Serialize::ListToText(sets), Serialize::BoolToText(group.LightsOffAtEnd())});
}

InteractiveGroupPtr InteractiveGroupFromText(std::string_view text) {
    const auto fields = Serialize::ListFromText(text, 1);
    auto group = std::make_shared<InteractiveGroup>();
    group->SetDescription(Serialize::UnescapeText(fields[2]));
    group->SetIndependent(Serialize::TextToBool(fields[3]));
    group->SetInterruptible(Serialize::TextToBool(fields[4]));
    group->SetMusicalAllowed(Serialize::TextToBool(fields[5]));
    group->SetName(Serialize::UnescapeText(fields[6]));
    const auto sets = Serialize::ListFromText(fields[7], 1);
    if (sets.Empty()) {
        // The sets are counted from the list: an empty one has nothing to count.
        ModelErrors::SubscriptOutOfRange("InteractiveGroupFunctions.InteractiveGroupFromText");
    }
    for (const auto& item : sets) {
        group->AddTriggeredSequences(TriggeredSequencesFunctions::TriggeredSequencesFromText(item));
    }
    if (fields.Count() >= 8) {
        group->SetLightsOffAtEnd(Serialize::TextToBool(fields[8]));
    }
    return group;
}

}  // namespace InteractiveGroupFunctions

}  // namespace vtr
