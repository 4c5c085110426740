#include "checks/installation/CheckPostInstall.h"

#include <memory>

#include "checks/installation/CheckAppPathRegEntry.h"
#include "checks/installation/CheckMediaPathRegEntry.h"
#include "checks/installation/CheckNonMediaPathRegEntry.h"
#include "checks/installation/CheckShowPlayerMemRestarts.h"
#include "checks/installation/CheckUseCompressedSequences.h"
#include "checks/installation/CheckUserDataPathRegEntry.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibRegistryVTRShared.h"

namespace vtr {

void CheckPostInstall::Check() {
    // Complete once the post-install step of version 53 or later has run.
    const int32_t version = ResumeOr(
        int32_t{0}, [] { return LibRegistryVTRShared::GetSharedLong("PostInstallVer", "", 0); });
    const bool done = ResumeOr(
        false, [] { return LibRegistryVTRShared::GetSharedBool("PostInstall", "", false); });
    if (version >= kMinimumPostInstallVersion && done) {
        LibVerify::AddCheck(std::make_shared<CheckAppPathRegEntry>());
        LibVerify::AddCheck(std::make_shared<CheckUserDataPathRegEntry>());
        LibVerify::AddCheck(std::make_shared<CheckNonMediaPathRegEntry>());
        LibVerify::AddCheck(std::make_shared<CheckMediaPathRegEntry>());
        LibVerify::AddCheck(std::make_shared<CheckUseCompressedSequences>());
        LibVerify::AddCheck(std::make_shared<CheckShowPlayerMemRestarts>());
    } else {
        LibVerify::AddResult(Messages::NotFullyInstalled);
    }
}

std::string CheckPostInstall::CheckIdentifier() {
    return identifier_.Get(CheckType::PostInstall, "");
}

}  // namespace vtr
