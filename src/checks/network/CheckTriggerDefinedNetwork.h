#pragma once

#include <string>

#include "checks/network/TriggerCheck.h"

namespace vtr {

// Verifies that a trigger of a show uses a defined network of the suite's own controllers
// (message 53); when it does, queues CheckTrigNetNotEnhanced for the same trigger. The
// identifier names the trigger object (see TriggerCheck).
class CheckTriggerDefinedNetwork : public TriggerCheck {
  public:
    explicit CheckTriggerDefinedNetwork(std::string showFilename = {}, TriggerPtr trig = nullptr,
                                        std::string triggerDescription = {});

    void Check() override;
};

}  // namespace vtr
