#include "checks/installation/CheckAppFileVersion.h"

#include <utility>

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/FileVersion.h"
#include "environment/VTRCommon.h"

namespace vtr {

CheckAppFileVersion::CheckAppFileVersion(std::string filename)
    : AppFileCheck(CheckType::AppFileVersion, "Application file version: ", std::move(filename)) {}

void CheckAppFileVersion::Check() {
    const std::string path =
        ResumeOr(std::string{}, [&] { return VTRCommon::GetAppPath() + filename_; });
    const std::string found = ResumeOr(std::string{}, [&] { return FileVersionText(path); });
    if (found != expectedVersion_) {
        LibVerify::AddResult(
            Messages::AppFileUnexpectedVersion,
            {"[FILE]: " + path, "[EXPECTED]: " + expectedVersion_, "[FOUND]: " + found});
    }
}

}  // namespace vtr
