#pragma once

#include <cstdint>
#include <string>

// The suite's settings below HKEY_CURRENT_USER "Software\Vantori".
namespace vtr::LibRegistryVTR {

// "Software\Vantori", then "\" and the subkey when it is not empty.
std::string SuiteKeyPath(const std::string& subkey);

bool GetSuiteBool(const std::string& valueName, const std::string& subkey, bool defaultValue);
int32_t GetSuiteLong(const std::string& valueName, const std::string& subkey,
                     int32_t defaultValue);
std::string GetSuiteString(const std::string& valueName, const std::string& subkey,
                           const std::string& defaultValue);

void SetSuiteBool(const std::string& valueName, bool value, const std::string& subkey);
void SetSuiteLong(const std::string& valueName, int32_t value, const std::string& subkey);
void SetSuiteString(const std::string& valueName, const std::string& value,
                    const std::string& subkey);

}  // namespace vtr::LibRegistryVTR
