#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The suite's application folder is configured.
class CheckAppPathRegEntry : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Application path registry"; }

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
