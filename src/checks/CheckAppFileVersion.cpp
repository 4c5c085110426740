#include "checks/CheckAppFileVersion.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/FileVersion.h"
#include "environment/VTRCommon.h"

namespace vtr {

void CheckAppFileVersion::SetFilename(const std::string& filename) {
    filename_ = filename;
    identifier_ = {};
}

void CheckAppFileVersion::SetExpectedVersion(const std::string& version) {
    expectedVersion_ = version;
    identifier_ = {};
}

void CheckAppFileVersion::Check() {
    const std::string path =
        ResumeOr(std::string{}, [&] { return VTRCommon::GetAppPath() + filename_; });
    const std::string found = ResumeOr(std::string{}, [&] { return FileVersionText(path); });
    if (found != expectedVersion_) {
        ResumeStep([&] {
            LibVerify::AddResult(
                Messages::AppFileUnexpectedVersion,
                {"[FILE]: " + path, "[EXPECTED]: " + expectedVersion_, "[FOUND]: " + found});
        });
    }
}

std::string CheckAppFileVersion::CheckIdentifier() {
    // The same identifier as the file's existence check, on purpose.
    return identifier_.Get(CheckType::AppFileVersion, filename_);
}

}  // namespace vtr
