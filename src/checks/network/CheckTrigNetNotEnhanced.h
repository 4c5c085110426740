#pragma once

#include <string>

#include "checks/network/TriggerCheck.h"

namespace vtr {

// Reports message 54 when a trigger's network runs in the enhanced mode. Identified by the
// trigger object, as CheckTriggerDefinedNetwork.
class CheckTrigNetNotEnhanced : public TriggerCheck {
  public:
    explicit CheckTrigNetNotEnhanced(std::string showFilename = {}, TriggerPtr trig = nullptr,
                                     std::string triggerDescription = {});

    void Check() override;
};

}  // namespace vtr
