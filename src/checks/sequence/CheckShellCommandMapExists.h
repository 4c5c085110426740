#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Verifies that the shell-command map file exists (message 41).
class CheckShellCommandMapExists : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override;

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
