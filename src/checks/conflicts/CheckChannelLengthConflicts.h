#pragma once

#include <string>

#include "checks/common/FileCheck.h"

namespace vtr {

// Reports message 32 for a channel object listed by two tracks of different lengths (the
// later track against the first that listed it).
class CheckChannelLengthConflicts : public FileCheck {
  public:
    explicit CheckChannelLengthConflicts(std::string filename = {});

    void Check() override;
};

}  // namespace vtr
