#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The verifier runs from the suite's application folder (compared without regard to
// letter case, each with a trailing separator).
class CheckAppPathMatches : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Verifier running from application path"; }

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
