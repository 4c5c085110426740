#include "environment/SuitePathService.h"

#include "environment/LibRegistryVTRShared.h"

namespace vtr {

std::string SuitePathService::GetPath(int32_t kind) const {
    switch (kind) {
        case 2:
            return LibRegistryVTRShared::GetSharedString("NonMediaDataPath", "", "");
        case 3:
            return LibRegistryVTRShared::GetSharedString("MediaDataPath", "", "");
        default:
            return "";
    }
}

}  // namespace vtr
