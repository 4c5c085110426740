#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The user-data folder exists; hands over to the schedule checks.
class CheckUserDataPathExists : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "User data path existence"; }

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
