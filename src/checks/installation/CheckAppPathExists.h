#pragma once

#include <array>
#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// One file that the suite installs into its application folder, and the version it must
// carry; nullptr means the verifier's own version (DefaultExpectedVersion()).
struct ApplicationFile {
    const char* name;
    const char* expectedVersion;
};

// The application folder exists; queues the folder comparison and the existence check of
// every application file.
class CheckAppPathExists : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Application path existence"; }

    // Every executable, library and control that the suite installs into its application
    // folder, in case-insensitive alphabetical order of the shipped names.
    static const std::array<ApplicationFile, 28>& ApplicationFiles();

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
