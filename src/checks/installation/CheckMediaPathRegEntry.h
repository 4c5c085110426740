#pragma once

#include <string>

#include <cstdint>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"
#include "environment/SuitePathService.h"

namespace vtr {

// The media (audio and video) data folder is configured (the suite path service, kind 3).
class CheckMediaPathRegEntry : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Media path registry"; }

  private:
    static constexpr int32_t kMediaDataPath = 3;
    // Made with the check, as the suite's path service is.
    SuitePathService pathService_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
