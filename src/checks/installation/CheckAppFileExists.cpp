#include "checks/installation/CheckAppFileExists.h"

#include <memory>
#include <utility>

#include "VtrVersion.h"
#include "checks/installation/CheckAppFileVersion.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"
#include "environment/VTRCommon.h"

namespace vtr {

CheckAppFileExists::CheckAppFileExists(std::string filename)
    : AppFileCheck(CheckType::AppFileExists, "Application file existence: ", std::move(filename)) {}

std::string DefaultExpectedVersion() {
    return std::to_string(kVersionMajor) + "." + std::to_string(kVersionMinor) + ".0." +
           std::to_string(kVersionPatch);
}

void CheckAppFileExists::Check() {
    const std::string path =
        ResumeOr(std::string{}, [&] { return VTRCommon::GetAppPath() + filename_; });
    const bool exists = ResumeOr(false, [&] { return LibFile::FileExists(path); });
    if (!exists) {
        LibVerify::AddResult(Messages::AppFileMissing, {path});
        return;
    }
    ResumeStep([&] {
        auto version = std::make_shared<CheckAppFileVersion>();
        version->SetFilename(filename_);
        version->SetExpectedVersion(expectedVersion_);
        LibVerify::AddCheck(version);
    });
}

}  // namespace vtr
