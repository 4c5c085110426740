#pragma once

#include <string>

#include "checks/common/FileCheck.h"

namespace vtr {

class Show;

// A show plays at least one sequence: in one of its five sections (a list entry or a
// clean-up sequence) or in a triggered set of an interactive group.
class CheckShowHasSequence : public FileCheck {
  public:
    explicit CheckShowHasSequence(std::string filename = {});

    void Check() override;

    static bool HasSequence(const Show& show);
};

}  // namespace vtr
