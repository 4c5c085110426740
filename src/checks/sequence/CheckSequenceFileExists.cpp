#include "checks/sequence/CheckSequenceFileExists.h"

#include <algorithm>
#include <cctype>
#include <memory>

#include "checks/sequence/CheckMediaFileExists.h"
#include "checks/sequence/CheckSequenceLoads.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"
#include "environment/SequenceUtils.h"

namespace vtr {

namespace {

// The text after the last "." of the file's own name, in lower case; "" without one.
std::string LowerExtension(const std::string& filename) {
    const std::size_t dot = filename.find_last_of('.');
    const std::size_t separator = filename.find_last_of("/\\");
    if (dot == std::string::npos || (separator != std::string::npos && dot < separator))
        return {};
    std::string extension = filename.substr(dot + 1);
    std::transform(extension.begin(), extension.end(), extension.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return extension;
}

}  // namespace

bool CheckSequenceFileExists::IsEditFile(const std::string& filename) {
    const std::string extension = LowerExtension(filename);
    return extension == "vtredit" || extension == "vtrprot";
}

std::string CheckSequenceFileExists::ReferenceText() const {
    return filename_ + " (referenced in " + referencedIn_ + ")";
}

void CheckSequenceFileExists::Check() {
    if (!ResumeOr(false, [&] { return LibFile::FileExists(filename_); })) {
        LibVerify::AddResult(Messages::SequenceFileMissing,
                             {"[SEQUENCE]: " + filename_, "[SHOW]: " + referencedIn_});
        return;
    }
    if (IsEditFile(filename_)) {
        // The newer format is never loaded here: only the file it plays is checked.
        const std::string playback =
            ResumeOr(std::string(), [&] { return SequenceUtils::GetR9PlaybackFile(filename_); });
        LibVerify::AddCheck(std::make_shared<CheckMediaFileExists>(playback, filename_));
    } else {
        LibVerify::AddCheck(std::make_shared<CheckSequenceLoads>(filename_));
    }
}

std::string CheckSequenceFileExists::CheckIdentifier() {
    return identifier_.Get(CheckType::SequenceFileExists, ReferenceText());
}

std::string CheckSequenceFileExists::Description() {
    return "Sequence file existence: " + ReferenceText();
}

}  // namespace vtr
