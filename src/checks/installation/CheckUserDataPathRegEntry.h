#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The suite's user-data folder is configured.
class CheckUserDataPathRegEntry : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "User data path registry"; }

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
