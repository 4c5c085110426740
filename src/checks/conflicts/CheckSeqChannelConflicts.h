#pragma once

#include <string>

#include "checks/common/FileCheck.h"

namespace vtr {

// Finds device addresses claimed twice within one sequence: by two channels (message 27), by
// a channel and an intensity file (45), by two intensity files or two devices of one (46).
// Reports its progress as "Channel conflict check progress: " and a percent.
class CheckSeqChannelConflicts : public FileCheck {
  public:
    explicit CheckSeqChannelConflicts(std::string filename = {});

    void Check() override;
};

}  // namespace vtr
