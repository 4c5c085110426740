#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"
#include "show/Trigger.h"

namespace vtr {

// The decimal number that names a trigger object while it lives (its address): the
// identifier text of the two trigger checks. "0" for none.
std::string TriggerIdentityText(const Trigger* trigger);

// Verifies that a trigger of a show uses a defined network of the suite's own controllers
// (message 53); when it does, queues CheckTrigNetNotEnhanced for the same trigger. The
// identifier names the trigger object, not its contents: two equal triggers in two places
// are both checked, one object queued twice is checked once.
class CheckTriggerDefinedNetwork : public ICheck {
  public:
    CheckTriggerDefinedNetwork() = default;
    CheckTriggerDefinedNetwork(std::string showFilename, TriggerPtr trig,
                               std::string triggerDescription)
        : showFilename_(std::move(showFilename)),
          trig_(std::move(trig)),
          triggerDescription_(std::move(triggerDescription)) {}

    const std::string& ShowFilename() const { return showFilename_; }
    void SetShowFilename(std::string showFilename) {
        showFilename_ = std::move(showFilename);
        identifier_ = {};
    }
    const TriggerPtr& Trig() const { return trig_; }
    void SetTrig(TriggerPtr trig) {
        trig_ = std::move(trig);
        identifier_ = {};
    }
    // What the trigger starts, e.g. "Startup trigger" or "Interactive group (Name)".
    const std::string& TriggerDescription() const { return triggerDescription_; }
    void SetTriggerDescription(std::string triggerDescription) {
        triggerDescription_ = std::move(triggerDescription);
        identifier_ = {};
    }

    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override;

  private:
    std::string showFilename_;
    TriggerPtr trig_;
    std::string triggerDescription_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
