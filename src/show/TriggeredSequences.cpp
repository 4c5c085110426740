#include "show/TriggeredSequences.h"

#include "show/ModelErrors.h"
#include "show/Serialize.h"

namespace vtr {

void TriggeredSequences::BumpRoundRobinIndex() noexcept {
    ++roundRobinIndex_;
    if (roundRobinIndex_ < 0 || roundRobinIndex_ >= NumSequences()) {
        roundRobinIndex_ = 0;
    }
}

void TriggeredSequences::Copy(const TriggeredSequences& other) {
    TriggerPtr trigger;
    if (other.trig_) {
        trigger = std::make_shared<Trigger>();
        trigger->Copy(*other.trig_);
    }
    trig_ = std::move(trigger);
    sequences_ = other.sequences_;
}

const std::string& TriggeredSequences::Sequence(int32_t index) const {
    if (index < 0 || index >= NumSequences()) {
        ModelErrors::SubscriptOutOfRange("TriggeredSequences.Sequence");
    }
    return sequences_[static_cast<std::size_t>(index)];
}

void TriggeredSequences::SetSequence(int32_t index, std::string name) {
    if (index < 0 || index >= NumSequences()) {
        ModelErrors::SubscriptOutOfRange("TriggeredSequences.Sequence");
    }
    sequences_[static_cast<std::size_t>(index)] = std::move(name);
}

namespace TriggeredSequencesFunctions {

TriggeredSequencesPtr CreateTriggeredSequences(TriggerPtr trigger, std::vector<std::string> names) {
    auto set = std::make_shared<TriggeredSequences>();
    set->SetTrig(std::move(trigger));
    set->SetSequences(std::move(names));
    return set;
}

std::string TriggeredSequencesToText(const TriggeredSequences& set) {
    std::vector<std::string> fields;
    fields.reserve(static_cast<std::size_t>(set.NumSequences()) + 1);
    fields.push_back(Serialize::EscapeText(set.Sequence(0)));
    fields.push_back(TriggerFunctions::TriggerToText(set.Trig()));
    for (int32_t i = 1; i < set.NumSequences(); ++i) {
        fields.push_back(Serialize::EscapeText(set.Sequence(i)));
    }
    return Serialize::ListToText(fields);
}

TriggeredSequencesPtr TriggeredSequencesFromText(std::string_view text) {
    const auto fields = Serialize::ListFromText(text, 1);
    auto trigger = TriggerFunctions::TriggerFromText(fields[2]);
    std::vector<std::string> names;
    names.reserve(static_cast<std::size_t>(fields.Count()));
    names.push_back(Serialize::UnescapeText(fields[1]));
    for (int32_t i = 3; i <= fields.UpperBound(); ++i) {
        names.push_back(Serialize::UnescapeText(fields[i]));
    }
    return CreateTriggeredSequences(std::move(trigger), std::move(names));
}

}  // namespace TriggeredSequencesFunctions

}  // namespace vtr
