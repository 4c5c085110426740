#pragma once

#include <string>

#include "checks/common/FileCheck.h"

namespace vtr {

// Loads a sequence (through the run's cache) and, when it loads, queues the checks of its
// content, of its media file, of the subsequences it plays and of its shell command.
// Reports message 24 when it cannot be loaded.
class CheckSequenceLoads : public FileCheck {
  public:
    explicit CheckSequenceLoads(std::string filename = {});

    void Check() override;
};

}  // namespace vtr
