#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Verifies that the media file a sequence plays exists (message 26). An empty name is a file
// that does not exist.
class CheckMediaFileExists : public ICheck {
  public:
    CheckMediaFileExists() = default;
    CheckMediaFileExists(std::string filename, std::string inSequenceFile)
        : filename_(std::move(filename)), inSequenceFile_(std::move(inSequenceFile)) {}

    const std::string& Filename() const { return filename_; }
    void SetFilename(std::string filename) {
        filename_ = std::move(filename);
        identifier_ = {};
    }
    const std::string& InSequenceFile() const { return inSequenceFile_; }
    void SetInSequenceFile(std::string inSequenceFile) {
        inSequenceFile_ = std::move(inSequenceFile);
        identifier_ = {};
    }
    // Filename + " (referenced in sequence " + InSequenceFile + ")".
    std::string ReferenceText() const;

    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override;

  private:
    std::string filename_;
    std::string inSequenceFile_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
