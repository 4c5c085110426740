#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "show/TriggeredSequences.h"

namespace vtr {

// A group of triggered-sequence sets. Its type (name and description) follows from the
// Independent and Interruptible flags and is recomputed whenever either changes.
class InteractiveGroup {
  public:
    InteractiveGroup();

    bool LightsOffAtEnd() const noexcept { return lightsOffAtEnd_; }
    void SetLightsOffAtEnd(bool value) noexcept { lightsOffAtEnd_ = value; }
    const std::string& TypeName() const noexcept { return typeName_; }
    const std::string& TypeDesc() const noexcept { return typeDesc_; }
    bool Independent() const noexcept { return independent_; }
    void SetIndependent(bool value);
    bool Interruptible() const noexcept { return interruptible_; }
    void SetInterruptible(bool value);
    bool MusicalAllowed() const noexcept { return musicalAllowed_; }
    void SetMusicalAllowed(bool value) noexcept { musicalAllowed_ = value; }
    const std::string& Name() const noexcept { return name_; }
    void SetName(std::string value) { name_ = std::move(value); }
    const std::string& Description() const noexcept { return description_; }
    void SetDescription(std::string value) { description_ = std::move(value); }

    // Set index (from 0); outside 0 .. Count() - 1 raises error 9.
    const TriggeredSequencesPtr& GetTriggeredSequences(int32_t index) const;
    void AddTriggeredSequences(TriggeredSequencesPtr set) { sets_.push_back(std::move(set)); }
    // Removes set index and closes the gap; outside the range raises error 9.
    void DeleteTriggeredSequence(int32_t index);
    int32_t Count() const noexcept { return static_cast<int32_t>(sets_.size()); }
    const std::vector<TriggeredSequencesPtr>& TriggeredSets() const noexcept { return sets_; }
    // Copies every property of other, with copies of its sets (and of their triggers).
    void Copy(const InteractiveGroup& other);

  private:
    void UpdateType();

    bool lightsOffAtEnd_ = true;
    std::string typeName_;
    std::string typeDesc_;
    bool independent_ = false;
    bool interruptible_ = false;
    bool musicalAllowed_ = true;
    std::string name_;
    std::string description_;
    std::vector<TriggeredSequencesPtr> sets_;
};

using InteractiveGroupPtr = std::shared_ptr<InteractiveGroup>;

namespace InteractiveGroupFunctions {

// Eight fields: count, description, independent, interruptible, musical allowed, name, the
// list of sets, lights off at end. A group without sets raises error 9.
std::string InteractiveGroupToText(const InteractiveGroup& group);
// Reads a group; errors of the fields or of any set reach the caller. A group whose set
// list is empty raises error 9.
InteractiveGroupPtr InteractiveGroupFromText(std::string_view text);

}  // namespace InteractiveGroupFunctions

}  // namespace vtr
