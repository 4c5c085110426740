#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// A sequence in a section of a show that cannot play audio (the background and animation
// sections, independent interactive groups) is not a musical ("lms") sequence.
class CheckSequenceIsNonmusical : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Sequence nonmusical: " + ReferenceText(); }

    // The sequence file.
    const std::string& Filename() const { return filename_; }
    void SetFilename(const std::string& filename);
    // The show that refers to it, and the label of the section it sits in.
    const std::string& InShowFile() const { return inShowFile_; }
    void SetInShowFile(const std::string& showFile);
    const std::string& InShowSection() const { return inShowSection_; }
    void SetInShowSection(const std::string& section);

    // The file, then " (referenced in " section " of show " show ")": the check's parameter.
    std::string ReferenceText() const;

  private:
    std::string filename_;
    std::string inShowFile_;
    std::string inShowSection_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
