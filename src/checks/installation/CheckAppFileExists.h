#pragma once

#include <string>

#include "checks/installation/AppFileCheck.h"

namespace vtr {

// One application file exists in the application folder; queues its version check. The
// version check has the same identifier (type 4 and the file name): it still runs because
// it is queued from inside this check, while this one is neither queued nor done.
class CheckAppFileExists : public AppFileCheck {
  public:
    explicit CheckAppFileExists(std::string filename = {});

    void Check() override;
};

}  // namespace vtr
