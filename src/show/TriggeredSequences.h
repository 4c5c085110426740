#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "show/Trigger.h"

namespace vtr {

// One trigger bound to one or more sequence files of an interactive group.
class TriggeredSequences {
  public:
    void AddSequence(std::string name) { sequences_.push_back(std::move(name)); }
    // Steps the round-robin index; past the last sequence it returns to 0.
    void BumpRoundRobinIndex() noexcept;
    void ClearSequences() noexcept { sequences_.clear(); }
    // A new trigger copied from other's (none when other has none) and a copy of its sequences.
    void Copy(const TriggeredSequences& other);
    int32_t NumSequences() const noexcept { return static_cast<int32_t>(sequences_.size()); }
    int32_t RoundRobinIndex() const noexcept { return roundRobinIndex_; }
    // Entry index (from 0); outside 0 .. NumSequences() - 1 raises error 9.
    const std::string& Sequence(int32_t index) const;
    void SetSequence(int32_t index, std::string name);
    void SetSequences(std::vector<std::string> names) { sequences_ = std::move(names); }
    const std::vector<std::string>& Sequences() const noexcept { return sequences_; }
    const TriggerPtr& Trig() const noexcept { return trig_; }
    void SetTrig(TriggerPtr trigger) { trig_ = std::move(trigger); }

  private:
    TriggerPtr trig_;
    std::vector<std::string> sequences_;
    int32_t roundRobinIndex_ = 0;
};

using TriggeredSequencesPtr = std::shared_ptr<TriggeredSequences>;

namespace TriggeredSequencesFunctions {

TriggeredSequencesPtr CreateTriggeredSequences(TriggerPtr trigger, std::vector<std::string> names);
// (seq0,(trigger),seq1,seq2,...): the trigger sits in the second place. A set without
// sequences raises error 9, one without a trigger error 91.
std::string TriggeredSequencesToText(const TriggeredSequences& set);
// The trigger from field 2 (a text of one item has none and raises error 9), the names from
// field 1 and fields 3 onwards.
TriggeredSequencesPtr TriggeredSequencesFromText(std::string_view text);

}  // namespace TriggeredSequencesFunctions

}  // namespace vtr
