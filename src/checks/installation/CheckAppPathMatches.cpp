#include "checks/installation/CheckAppPathMatches.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"
#include "environment/VTRCommon.h"

namespace vtr {
namespace {

std::string ToLower(std::string text) {
    for (char& c : text) {
        if (c >= 'A' && c <= 'Z')
            c = static_cast<char>(c - 'A' + 'a');
    }
    return text;
}

}  // namespace

void CheckAppPathMatches::Check() {
    const std::string appPath = ResumeOr(std::string{}, [] { return VTRCommon::GetAppPath(); });
    const std::string ownFolder = ResumeOr(
        std::string{}, [] { return LibFile::AddTrailingBackslash(VTRCommon::GetProgramFolder()); });
    if (ToLower(appPath) != ToLower(ownFolder)) {
        LibVerify::AddResult(Messages::NotRunningFromAppPath,
                             {"[APPLICATION]: " + appPath, "[VERIFIER]: " + ownFolder});
    }
}

std::string CheckAppPathMatches::CheckIdentifier() {
    return identifier_.Get(CheckType::AppPathMatches, "");
}

}  // namespace vtr
