#include "checks/installation/CheckAppPathRegEntry.h"

#include <memory>

#include "checks/installation/CheckAppPathExists.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/VTRCommon.h"

namespace vtr {

void CheckAppPathRegEntry::Check() {
    const std::string appPath = ResumeOr(std::string{}, [] { return VTRCommon::GetAppPath(); });
    if (appPath.empty()) {
        LibVerify::AddResult(Messages::NoAppPathRegEntry);
    } else {
        LibVerify::AddCheck(std::make_shared<CheckAppPathExists>());
    }
}

std::string CheckAppPathRegEntry::CheckIdentifier() {
    return identifier_.Get(CheckType::AppPathRegEntry, "");
}

}  // namespace vtr
