#pragma once

#include <string>

#include "checks/common/FileCheck.h"

namespace vtr {

// Reports message 29 when no channel of any track is ever on and the sequence has no
// Gridcraft intensity file with a device.
class CheckSequenceHasEvents : public FileCheck {
  public:
    explicit CheckSequenceHasEvents(std::string filename = {});

    void Check() override;
};

}  // namespace vtr
