#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The show player restarts itself when its memory grows ("MonitorRestart" of the
// "MonitorMemory" subkey, on when absent).
class CheckShowPlayerMemRestarts : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Show Player Memory Restarts"; }

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
