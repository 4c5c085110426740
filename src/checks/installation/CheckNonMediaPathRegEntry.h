#pragma once

#include <string>

#include <cstdint>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"
#include "environment/SuitePathService.h"

namespace vtr {

// The non-media data folder is configured (the suite path service, kind 2).
class CheckNonMediaPathRegEntry : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Non-media path registry"; }

  private:
    static constexpr int32_t kNonMediaDataPath = 2;
    // Made with the check, as the suite's path service is.
    SuitePathService pathService_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
