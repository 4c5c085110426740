#pragma once

#include <string>

#include "checks/installation/AppFileCheck.h"

namespace vtr {

// One application file carries the expected version (exact text comparison with what its
// version resource says; a file without one reads as "").
class CheckAppFileVersion : public AppFileCheck {
  public:
    explicit CheckAppFileVersion(std::string filename = {});

    void Check() override;
};

}  // namespace vtr
