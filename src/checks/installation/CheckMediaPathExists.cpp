#include "checks/installation/CheckMediaPathExists.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"

namespace vtr {

void CheckMediaPathExists::Check() {
    const std::string path =
        ResumeOr(std::string{}, [&] { return pathService_.GetPath(kMediaDataPath); });
    const bool exists = ResumeOr(false, [&] { return LibFile::DirectoryExists(path); });
    if (!exists)
        LibVerify::AddResult(Messages::MediaDirectoryMissing, {path});
}

std::string CheckMediaPathExists::CheckIdentifier() {
    return identifier_.Get(CheckType::MediaPathExists, "");
}

}  // namespace vtr
