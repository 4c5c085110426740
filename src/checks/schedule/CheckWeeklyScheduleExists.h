#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The weekly schedule file of the run exists.
class CheckWeeklyScheduleExists : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Weekly schedule file existence"; }

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
