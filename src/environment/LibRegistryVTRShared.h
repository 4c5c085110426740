#pragma once

#include <cstdint>
#include <string>

// The suite's shared settings below "Software\Vantori\Shared".
namespace vtr::LibRegistryVTRShared {

// "Shared", then "\" and the subkey when it is not empty.
std::string SharedKeyPath(const std::string& subkey);
// The full path below HKEY_CURRENT_USER.
std::string SharedKeyFullPath(const std::string& subkey);

// True when the shared key (or its subkey) exists. Never fails.
bool SharedKeyExists(const std::string& subkey);

bool GetSharedBool(const std::string& valueName, const std::string& subkey, bool defaultValue);
int32_t GetSharedLong(const std::string& valueName, const std::string& subkey,
                      int32_t defaultValue);
std::string GetSharedString(const std::string& valueName, const std::string& subkey,
                            const std::string& defaultValue);

void SetSharedBool(const std::string& valueName, bool value, const std::string& subkey);
void SetSharedLong(const std::string& valueName, int32_t value, const std::string& subkey);
void SetSharedString(const std::string& valueName, const std::string& value,
                     const std::string& subkey);

}  // namespace vtr::LibRegistryVTRShared
