#pragma once

#include <filesystem>
#include <string>

#include "support/TempStore.h"

namespace vtr::testing {

// A fresh folder below the system's temporary folder, removed with everything in it when
// the test is done.
class TempFolder {
  public:
    // The path of a file (not created) inside the folder.
    std::string File(const std::string& name) const { return (path_ / name).string(); }
    const std::filesystem::path& Path() const { return path_; }

  private:
    // Made exclusively, so that tests run side by side in other processes never share one.
    vtr::testsupport::TempFolder folder_;
    std::filesystem::path path_{folder_.Path()};
};

}  // namespace vtr::testing
