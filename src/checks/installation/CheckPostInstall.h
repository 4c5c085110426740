#pragma once

#include <string>

#include <cstdint>
#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The suite's post-install step has completed for this version; grows the rest of the
// installation tree.
class CheckPostInstall : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Vantori installation"; }

  private:
    // The first post-install version that this verifier knows.
    static constexpr int32_t kMinimumPostInstallVersion = 53;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
