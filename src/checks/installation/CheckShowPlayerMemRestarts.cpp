#include "checks/installation/CheckShowPlayerMemRestarts.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibRegistryVTRShared.h"

namespace vtr {

void CheckShowPlayerMemRestarts::Check() {
    const bool enabled = ResumeOr(true, [] {
        return LibRegistryVTRShared::GetSharedBool("MonitorRestart", "MonitorMemory", true);
    });
    if (!enabled)
        LibVerify::AddResult(Messages::MemoryRestartsDisabled);
}

std::string CheckShowPlayerMemRestarts::CheckIdentifier() {
    return identifier_.Get(CheckType::ShowPlayerMemRestarts, "");
}

}  // namespace vtr
