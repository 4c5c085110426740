#include "checks/installation/CheckUserDataPathRegEntry.h"

#include <memory>

#include "checks/installation/CheckUserDataPathExists.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/VTRCommon.h"

namespace vtr {

void CheckUserDataPathRegEntry::Check() {
    const std::string path = ResumeOr(std::string{}, [] { return VTRCommon::GetUserDataPath(); });
    if (path.empty()) {
        LibVerify::AddResult(Messages::NoUserDataPathRegEntry);
    } else {
        LibVerify::AddCheck(std::make_shared<CheckUserDataPathExists>());
    }
}

std::string CheckUserDataPathRegEntry::CheckIdentifier() {
    return identifier_.Get(CheckType::UserDataPathRegEntry, "");
}

}  // namespace vtr
