#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// No network of the suite's own controllers that is attached to a port runs in the
// compatibility mode for old KR-P controllers; one result per such network.
class CheckOldKRP : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Old KR-P compatibility"; }

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
