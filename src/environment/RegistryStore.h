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

// How the store in use was chosen.
enum class Origin {
    Option,       // --registry FILE (or a store the program put in place itself)
    Environment,  // VANTORI_REGISTRY
    UserDefault,  // the per-user default file
    Registry,     // the Windows registry
};

// Status codes of the store's operations, with the values of the Windows API.
using Status = int32_t;
namespace StatusCode {
inline constexpr Status Success = 0;
inline constexpr Status FileNotFound = 2;
inline constexpr Status PathNotFound = 3;
inline constexpr Status AccessDenied = 5;
inline constexpr Status InvalidHandle = 6;
inline constexpr Status InvalidData = 13;
inline constexpr Status WriteProtect = 19;  // the store file is read-only
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

    // Several changes made as one by the calling thread (see Changes below). Begin takes the
    // store's lock; until Commit or Abort the thread's reads see the store as it was then
    // with the thread's changes. A store file is written once, at Commit, or not at all; the
    // registry takes each change as it is made. Begin and Commit nest: only the outermost
    // Commit writes. Abort forgets whatever was not written and ends every level.
    virtual Status BeginChanges() = 0;
    virtual Status CommitChanges() = 0;
    virtual void AbortChanges() = 0;

    // While a thread reads inside BeginReading .. EndReading (nested), a store file is
    // examined once rather than on every read (see ReadScope below).
    virtual void BeginReading() {}
    virtual void EndReading() {}

    // The store as it is now.
    struct Condition {
        bool exists = true;      // false: a missing file, read as an empty store
        bool understood = true;  // false: a file that is not a registry export, or unreadable
        bool readOnly = false;   // the file's permissions forbid writing it
        std::string problem;     // why it cannot be read, in words ("" when it can)
    };
    virtual Condition Examine() = 0;

    // Why the last change that failed failed, in words that name the store ("the settings
    // store is read-only: /home/ann/.config/vantori/registry.reg"); "" when none failed.
    virtual std::string Failure() const = 0;
};

// The store in use; selected on first use as Select(nothing) would when nothing was chosen.
Backend& Current();

// Puts a store in place and returns the one that was (null when none had been chosen yet).
// Installing null returns to "not chosen yet". Tests use it to swap in a store of their own.
std::unique_ptr<Backend> Install(std::unique_ptr<Backend> backend, Origin origin = Origin::Option);

// What the front ends show about the store in use: which it is, how it was chosen, and what
// state it is in. No Qt, so that the command line, the window and the reports share it.
struct Description {
    std::optional<std::string> file;  // nothing for the registry
    Origin origin = Origin::Option;
    Backend::Condition condition;

    // "the settings store /x/registry.reg" or "the Windows registry (HKEY_CURRENT_USER)".
    std::string Name() const;
    // How it was chosen: "named with --registry", "named by VANTORI_REGISTRY", "the per-user
    // default", "the Windows registry".
    std::string HowChosen() const;
    // "option", "environment", "default", "registry" (the JSON output's words).
    std::string OriginWord() const;
    // The setup problem a verification should report before its results, or "" when there
    // is none: a missing file, or one that cannot be read as a registry export. It names
    // the store, how it was chosen, and what to do.
    std::string Problem() const;
};
Description Describe();

// Several changes of the store made as one, by the thread that creates the object: the
// store's lock (an operating-system lock that the writers of other processes wait for) is
// held from construction to Commit, reads see the store as it was when the lock was taken
// plus the changes made since, and a store file is written once, at Commit, so that no other
// writer's change is lost and no reader sees half of the change. Without Commit (an error
// on the way) a store file is left as it was. Both raise a VtrError whose description says
// what went wrong and names the store (the store's Failure()).
class Changes {
  public:
    Changes();
    ~Changes();
    Changes(const Changes&) = delete;
    Changes& operator=(const Changes&) = delete;
    void Commit();

  private:
    Backend* store_ = nullptr;  // while open
};

// While the object lives, the reads of the creating thread take the store as it was at the
// first of them: a store file is examined once, not once per value (changes this process
// makes meanwhile are seen). For a burst of reads, such as the network preferences.
class ReadScope {
  public:
    ReadScope();
    ~ReadScope();
    ReadScope(const ReadScope&) = delete;
    ReadScope& operator=(const ReadScope&) = delete;

  private:
    Backend* store_;
};

// The number of the errors raised by Changes.
inline constexpr int32_t kStoreErrorNumber = LibRegistry::kRegistryErrorNumber;

// A store kept in a registry-export file (see RegistryFile.h for the format). The file need
// not exist: a missing file is an empty store, created with its folder on the first write.
std::unique_ptr<Backend> OpenFileStore(const std::string& path);

#ifdef _WIN32
// The current user's hive of the Windows registry. Its writers (of this program) lock the
// file WindowsRegistryLockFile() names for their changes.
std::unique_ptr<Backend> OpenWindowsRegistry();
// StoreFile::LockFolder()\registry.lock: %LOCALAPPDATA%\Vantori\registry.lock as a rule.
std::string WindowsRegistryLockFile();
#endif

// The per-user default store file: $XDG_CONFIG_HOME/vantori/registry.reg, with ~/.config
// when XDG_CONFIG_HOME is unset (or not an absolute path).
std::string DefaultStoreFile();

}  // namespace vtr::RegistryStore
