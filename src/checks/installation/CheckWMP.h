#pragma once

#include <string>

#include <cstdint>
#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The media player that the suite plays audio through is of major version 9 or later.
class CheckWMP : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Windows Media Player version"; }

  private:
    static constexpr int32_t kMinimumMajorVersion = 9;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
