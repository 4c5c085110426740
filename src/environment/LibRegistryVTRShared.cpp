#include "environment/LibRegistryVTRShared.h"

#include "environment/LibRegistry.h"
#include "environment/LibRegistryVTR.h"

namespace vtr::LibRegistryVTRShared {

std::string SharedKeyPath(const std::string& subkey) {
    std::string path = "Shared";
    if (!subkey.empty())
        path += "\\" + subkey;
    return path;
}

std::string SharedKeyFullPath(const std::string& subkey) {
    return LibRegistryVTR::SuiteKeyPath(SharedKeyPath(subkey));
}

bool SharedKeyExists(const std::string& subkey) {
    return LibRegistry::KeyExists(LibRegistry::kCurrentUser, SharedKeyFullPath(subkey));
}

bool GetSharedBool(const std::string& valueName, const std::string& subkey, bool defaultValue) {
    return LibRegistryVTR::GetSuiteBool(valueName, SharedKeyPath(subkey), defaultValue);
}

int32_t GetSharedLong(const std::string& valueName, const std::string& subkey,
                      int32_t defaultValue) {
    return LibRegistryVTR::GetSuiteLong(valueName, SharedKeyPath(subkey), defaultValue);
}

std::string GetSharedString(const std::string& valueName, const std::string& subkey,
                            const std::string& defaultValue) {
    return LibRegistryVTR::GetSuiteString(valueName, SharedKeyPath(subkey), defaultValue);
}

void SetSharedBool(const std::string& valueName, bool value, const std::string& subkey) {
    LibRegistryVTR::SetSuiteBool(valueName, value, SharedKeyPath(subkey));
}

void SetSharedLong(const std::string& valueName, int32_t value, const std::string& subkey) {
    LibRegistryVTR::SetSuiteLong(valueName, value, SharedKeyPath(subkey));
}

void SetSharedString(const std::string& valueName, const std::string& value,
                     const std::string& subkey) {
    LibRegistryVTR::SetSuiteString(valueName, value, SharedKeyPath(subkey));
}

}  // namespace vtr::LibRegistryVTRShared
