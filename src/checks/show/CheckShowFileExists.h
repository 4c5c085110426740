#pragma once

#include <string>

#include "checks/common/FileCheck.h"

namespace vtr {

// A scheduled show file exists (and is not a folder); queues the show's load check.
class CheckShowFileExists : public FileCheck {
  public:
    explicit CheckShowFileExists(std::string filename = {});

    void Check() override;
};

}  // namespace vtr
