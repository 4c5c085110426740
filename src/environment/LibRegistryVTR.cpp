#include "environment/LibRegistryVTR.h"

#include "environment/LibRegistry.h"

namespace vtr::LibRegistryVTR {
namespace {
constexpr LibRegistry::RootKey kRoot = LibRegistry::kCurrentUser;
}

std::string SuiteKeyPath(const std::string& subkey) {
    std::string path = "Software\\Vantori";
    if (!subkey.empty())
        path += "\\" + subkey;
    return path;
}

bool GetSuiteBool(const std::string& valueName, const std::string& subkey, bool defaultValue) {
    return LibRegistry::GetRegBool(kRoot, SuiteKeyPath(subkey), valueName, defaultValue);
}

int32_t GetSuiteLong(const std::string& valueName, const std::string& subkey,
                     int32_t defaultValue) {
    return LibRegistry::GetRegLong(kRoot, SuiteKeyPath(subkey), valueName, defaultValue);
}

std::string GetSuiteString(const std::string& valueName, const std::string& subkey,
                           const std::string& defaultValue) {
    return LibRegistry::GetRegString(kRoot, SuiteKeyPath(subkey), valueName, defaultValue);
}

void SetSuiteBool(const std::string& valueName, bool value, const std::string& subkey) {
    LibRegistry::SetRegBool(kRoot, SuiteKeyPath(subkey), valueName, value);
}

void SetSuiteLong(const std::string& valueName, int32_t value, const std::string& subkey) {
    LibRegistry::SetRegLong(kRoot, SuiteKeyPath(subkey), valueName, value);
}

void SetSuiteString(const std::string& valueName, const std::string& value,
                    const std::string& subkey) {
    LibRegistry::SetRegString(kRoot, SuiteKeyPath(subkey), valueName, value);
}

}  // namespace vtr::LibRegistryVTR
