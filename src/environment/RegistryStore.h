#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "environment/LibRegistry.h"

// Which settings store the process uses, chosen once at start-up:
//   - the file named by --registry (Select with a path);
//   - else the VANTORI_REGISTRY environment variable;
//   - else, on Windows, the real registry, and elsewhere the per-user
//     $XDG_CONFIG_HOME/vantori/registry.reg (~/.config when unset).
namespace vtr::RegistryStore {

using LibRegistry::KeyHandle;

void Select(const std::optional<std::string>& fileOption);

// The file in use, or nothing when the real registry is.
std::optional<std::string> CurrentFile();

// Status codes of the store's operations, with the values of the Windows API.
using Status = int32_t;
namespace StatusCode {
inline constexpr Status Success = 0;
inline constexpr Status FileNotFound = 2;
inline constexpr Status PathNotFound = 3;
inline constexpr Status AccessDenied = 5;
inline constexpr Status InvalidHandle = 6;
inline constexpr Status InvalidData = 13;
inline constexpr Status WriteFault = 29;
inline constexpr Status InvalidParameter = 87;
inline constexpr Status MoreData = 234;
inline constexpr Status NoMoreItems = 259;
inline constexpr Status BadDatabase = 1009;  // the store cannot be understood
inline constexpr Status KeyDeleted = 1018;
inline constexpr Status UnsupportedType = 1630;
}  // namespace StatusCode

// Value types, with the values of the Windows API.
namespace ValueType {
inline constexpr uint32_t String = 1;
inline constexpr uint32_t ExpandString = 2;
inline constexpr uint32_t Binary = 3;
inline constexpr uint32_t Dword = 4;
}  // namespace ValueType

// A per-user store of keys and values. Each operation behaves as its advapi32 counterpart
// (RegOpenKeyExA, RegCreateKeyExA, RegCloseKey, RegQueryValueExA, RegSetValueExA,
// RegQueryInfoKeyA, RegEnumKeyExA, RegDeleteKeyA), status codes included. Handles are
// opened relative to a parent handle, which may be the root LibRegistry::kCurrentUser.
class Backend {
  public:
    virtual ~Backend() = default;

    // The settings file behind the store, or nothing for the real registry.
    virtual std::optional<std::string> File() const = 0;

    virtual Status OpenKey(KeyHandle parent, const std::string& subKey, uint32_t access,
                           KeyHandle& result) = 0;
    // Opens the key, creating it (and any missing parent) when it does not exist.
    virtual Status CreateKey(KeyHandle parent, const std::string& subKey, KeyHandle& result) = 0;
    virtual Status CloseKey(KeyHandle key) = 0;
    // With data null, returns the value's type and stored length in bytes (a string's
    // length counts its terminating NUL). Otherwise *size is the buffer's size on entry and
    // the stored length on return; a buffer too small gives MoreData. type and size may be
    // null when not wanted (size only when data is null too).
    virtual Status QueryValue(KeyHandle key, const std::string& valueName, uint32_t* type,
                              uint8_t* data, uint32_t* size) = 0;
    virtual Status SetDwordValue(KeyHandle key, const std::string& valueName, uint32_t value) = 0;
    // Stores a string value with its terminating NUL.
    virtual Status SetStringValue(KeyHandle key, const std::string& valueName,
                                  const std::string& value) = 0;
    virtual Status QuerySubkeyCount(KeyHandle key, uint32_t& count) = 0;
    // The name of the subkey at index (in the store's order) into name, a buffer of
    // *nameChars characters; on success *nameChars is the name's length without the NUL.
    // Past the last subkey: NoMoreItems; a name that does not fit: MoreData.
    virtual Status EnumSubkey(KeyHandle key, uint32_t index, char* name, uint32_t* nameChars) = 0;
    // Deletes a subkey that has no subkeys of its own (AccessDenied otherwise).
    virtual Status DeleteSubkey(KeyHandle key, const std::string& subKey) = 0;
};

// The store in use; selected on first use as Select(nothing) would when nothing was chosen.
Backend& Current();

// Puts a store in place and returns the one that was (null when none had been chosen yet).
// Installing null returns to "not chosen yet". Tests use it to swap in a store of their own.
std::unique_ptr<Backend> Install(std::unique_ptr<Backend> backend);

// A store kept in a registry-export file (see RegistryFile.h for the format). The file need
// not exist: a missing file is an empty store, created with its folder on the first write.
std::unique_ptr<Backend> OpenFileStore(const std::string& path);

#ifdef _WIN32
// The current user's hive of the Windows registry.
std::unique_ptr<Backend> OpenWindowsRegistry();
#endif

// The per-user default store file: $XDG_CONFIG_HOME/vantori/registry.reg, with ~/.config
// when XDG_CONFIG_HOME is unset (or not an absolute path).
std::string DefaultStoreFile();

}  // namespace vtr::RegistryStore
