#pragma once

#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <string>

#include "engine/VtrError.h"
#include "support/TempStore.h"
#include "vtrsupport/SequenceGenerator.h"

// Fixture files for the sequence library's tests: a private temporary folder that is
// removed with everything in it, and gzip data made in memory.
namespace vtr::seqlib::testing {

class TempFolder {
  public:
    const std::filesystem::path& Path() const { return path_; }
    std::string File(const std::string& name) const { return (path_ / name).string(); }

    // Writes the bytes to a file of the folder and returns its path.
    std::string Write(const std::string& name, const std::string& bytes) const {
        const std::string file = File(name);
        std::ofstream out(file, std::ios::binary);
        out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
        if (!out)
            throw std::runtime_error("cannot write " + file);
        return file;
    }

  private:
    // Made exclusively, so that tests run side by side in other processes never share one.
    vtr::testsupport::TempFolder folder_;
    std::filesystem::path path_{folder_.Path()};
};

using SequenceGenerator::Gzip;

// The description of the VtrError that the call raises, or "(no error)".
template <typename F>
std::string ErrorOf(F&& call) {
    try {
        call();
    } catch (const VtrError& e) {
        return e.Description();
    }
    return "(no error)";
}

}  // namespace vtr::seqlib::testing
