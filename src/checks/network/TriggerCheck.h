#pragma once

#include <cstdint>
#include <string>
#include <utility>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"
#include "show/Trigger.h"

namespace vtr {

// The decimal number that names a trigger object while it lives (its address): the
// identifier text of the trigger checks. "0" for none.
std::string TriggerIdentityText(const Trigger* trigger);

// The shape shared by the checks about one trigger of a show. The identifier names the
// trigger object, not its contents: two equal triggers in two places are both checked, one
// object queued twice is checked once. Setting a property clears the kept identifier.
class TriggerCheck : public ICheck {
  public:
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

    std::string CheckIdentifier() override {
        return identifier_.Get(checkType_, TriggerIdentityText(trig_.get()));
    }
    std::string Description() override { return descriptionPrefix_ + triggerDescription_; }

  protected:
    TriggerCheck(int32_t checkType, const char* descriptionPrefix, std::string showFilename,
                 TriggerPtr trig, std::string triggerDescription)
        : showFilename_(std::move(showFilename)),
          trig_(std::move(trig)),
          triggerDescription_(std::move(triggerDescription)),
          checkType_(checkType),
          descriptionPrefix_(descriptionPrefix) {}

    std::string showFilename_;
    TriggerPtr trig_;
    std::string triggerDescription_;

  private:
    int32_t checkType_;
    const char* descriptionPrefix_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
