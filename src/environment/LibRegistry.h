#pragma once

#include <cstdint>
#include <string>

// Typed access to keys of the per-user settings store (the registry on Windows, the
// registry-export file elsewhere; see RegistryStore.h).
namespace vtr::LibRegistry {

using RootKey = std::uintptr_t;
using KeyHandle = std::uintptr_t;

// The only root the program uses: the current user's hive.
inline constexpr RootKey kCurrentUser = 0x80000001u;

// The number of the errors raised here; the description tells which operation failed.
inline constexpr int32_t kRegistryErrorNumber = -2147221503;

// Access masks, with the values of the Windows API.
inline constexpr uint32_t kKeyRead = 0x20019;
inline constexpr uint32_t kKeyWrite = 0x20006;
inline constexpr uint32_t kKeyAllAccess = 0xF003F;

// Raises "RegOpenKeyEx failure"; with kKeyWrite a missing key is created first.
KeyHandle OpenRegistryKey(RootKey root, const std::string& keyPath, uint32_t access);
// Raises "RegCreateKeyEx failure".
void CreateRegistryKey(RootKey root, const std::string& keyPath);
// Closes a non-zero handle and sets it to 0.
void CloseRegistryKey(KeyHandle& handle);

// Readers never fail: any failure gives the default.
int32_t GetRegLong(RootKey root, const std::string& keyPath, const std::string& valueName,
                   int32_t defaultValue);
bool GetRegBool(RootKey root, const std::string& keyPath, const std::string& valueName,
                bool defaultValue);
std::string GetRegString(RootKey root, const std::string& keyPath, const std::string& valueName,
                         const std::string& defaultValue);

// True when the key exists (and can be opened for reading). Never fails.
bool KeyExists(RootKey root, const std::string& keyPath);

// Writers raise "RegSetValueEx failure" (after closing the key).
void SetRegLong(RootKey root, const std::string& keyPath, const std::string& valueName,
                int32_t value);
void SetRegBool(RootKey root, const std::string& keyPath, const std::string& valueName, bool value);
void SetRegString(RootKey root, const std::string& keyPath, const std::string& valueName,
                  const std::string& value);

// Raise "RegDeleteKey failure" (after closing the parent).
void DeleteRegistryKey(RootKey root, const std::string& parentPath, const std::string& subkeyName);
void DeleteRegistryKeyTree(RootKey root, const std::string& parentPath,
                           const std::string& subkeyName);

}  // namespace vtr::LibRegistry
