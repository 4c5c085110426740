#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"
#include "show/Trigger.h"

namespace vtr {

// Reports message 54 when a trigger's network runs in the enhanced mode. Identified by the
// trigger object, as CheckTriggerDefinedNetwork.
class CheckTrigNetNotEnhanced : public ICheck {
  public:
    CheckTrigNetNotEnhanced() = default;
    CheckTrigNetNotEnhanced(std::string showFilename, TriggerPtr trig,
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
