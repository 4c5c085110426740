#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Verifies that a sequence file exists (message 23). An existing edit file ("vtredit",
// "vtrprot", any case) is not loaded: its playback file is checked instead. Any other
// sequence goes on to CheckSequenceLoads.
class CheckSequenceFileExists : public ICheck {
  public:
    CheckSequenceFileExists() = default;
    CheckSequenceFileExists(std::string filename, std::string referencedIn)
        : filename_(std::move(filename)), referencedIn_(std::move(referencedIn)) {}

    const std::string& Filename() const { return filename_; }
    void SetFilename(std::string filename) {
        filename_ = std::move(filename);
        identifier_ = {};
    }
    // Where the sequence is referenced: "show " + a show path, "sequence " + a sequence path.
    const std::string& ReferencedIn() const { return referencedIn_; }
    void SetReferencedIn(std::string referencedIn) {
        referencedIn_ = std::move(referencedIn);
        identifier_ = {};
    }
    // Filename + " (referenced in " + ReferencedIn + ")".
    std::string ReferenceText() const;

    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override;

    // True for an edit file of the newer sequence format: the extension "vtredit" or
    // "vtrprot" in any letter case.
    static bool IsEditFile(const std::string& filename);

  private:
    std::string filename_;
    std::string referencedIn_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
