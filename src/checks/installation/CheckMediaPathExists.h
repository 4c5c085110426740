#pragma once

#include <string>

#include <cstdint>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"
#include "environment/SuitePathService.h"

namespace vtr {

// The media data folder exists.
class CheckMediaPathExists : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Media data path existence"; }

  private:
    static constexpr int32_t kMediaDataPath = 3;
    // Made with the check, as the suite's path service is.
    SuitePathService pathService_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
