#include "checks/sequence/CheckSequenceIsNonmusical.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"

namespace vtr {
namespace {

// The text after the last ".", in lower case; "" when there is no ".".
std::string LowerExtension(const std::string& file) {
    const auto dot = file.rfind('.');
    if (dot == std::string::npos)
        return "";
    std::string extension = file.substr(dot + 1);
    for (char& c : extension) {
        if (c >= 'A' && c <= 'Z')
            c = static_cast<char>(c - 'A' + 'a');
    }
    return extension;
}

}  // namespace

void CheckSequenceIsNonmusical::SetFilename(const std::string& filename) {
    filename_ = filename;
    identifier_ = {};
}

void CheckSequenceIsNonmusical::SetInShowFile(const std::string& showFile) {
    inShowFile_ = showFile;
    identifier_ = {};
}

void CheckSequenceIsNonmusical::SetInShowSection(const std::string& section) {
    inShowSection_ = section;
    identifier_ = {};
}

std::string CheckSequenceIsNonmusical::ReferenceText() const {
    return filename_ + " (referenced in " + inShowSection_ + " of show " + inShowFile_ + ")";
}

void CheckSequenceIsNonmusical::Check() {
    // Musical sequences are the "lms" files.
    if (LowerExtension(filename_) != "lms")
        return;
    LibVerify::AddResult(
        Messages::MusicalInNonAudioSection,
        {"[SEQUENCE]: " + filename_, "[SHOW]: " + inShowFile_, "[SECTION]: " + inShowSection_});
}

std::string CheckSequenceIsNonmusical::CheckIdentifier() {
    return identifier_.Get(CheckType::SequenceIsNonmusical, ReferenceText());
}

}  // namespace vtr
