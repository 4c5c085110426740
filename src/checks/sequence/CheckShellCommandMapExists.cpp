#include "checks/sequence/CheckShellCommandMapExists.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"
#include "sequencelib/ShellCommandMap.h"

namespace vtr {

void CheckShellCommandMapExists::Check() {
    const std::string path =
        ResumeOr(std::string(), [] { return seqlib::ShellCommandMap().MapFilePath(); });
    if (ResumeOr(false, [&] { return LibFile::FileExists(path); }))
        return;
    LibVerify::AddResult(Messages::ShellCommandMapMissing, {path});
}

std::string CheckShellCommandMapExists::CheckIdentifier() {
    return identifier_.Get(CheckType::ShellCommandMapExists, "");
}

std::string CheckShellCommandMapExists::Description() {
    return "Shell command map file existence";
}

}  // namespace vtr
