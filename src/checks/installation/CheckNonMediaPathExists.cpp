#include "checks/installation/CheckNonMediaPathExists.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"

namespace vtr {

void CheckNonMediaPathExists::Check() {
    const std::string path =
        ResumeOr(std::string{}, [&] { return pathService_.GetPath(kNonMediaDataPath); });
    const bool exists = ResumeOr(false, [&] { return LibFile::DirectoryExists(path); });
    if (!exists)
        LibVerify::AddResult(Messages::NonMediaDirectoryMissing, {path});
}

std::string CheckNonMediaPathExists::CheckIdentifier() {
    return identifier_.Get(CheckType::NonMediaPathExists, "");
}

}  // namespace vtr
