#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The calendar schedule file of the run exists.
class CheckYearlyScheduleExists : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Yearly schedule file existence"; }

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
