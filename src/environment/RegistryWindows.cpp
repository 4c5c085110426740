// The settings store on Windows: the current user's hive, through advapi32.
#ifdef _WIN32

#include <windows.h>

#include <cstdlib>
#include <filesystem>
#include <memory>
#include <mutex>
#include <thread>

#include "environment/RegistryStore.h"
#include "environment/StoreFile.h"

namespace vtr::RegistryStore {
namespace {

// The program's root handle is the number 0x80000001; the system's HKEY_CURRENT_USER is
// that number sign-extended to a pointer.
HKEY ToKey(KeyHandle handle) {
    return handle == LibRegistry::kCurrentUser ? HKEY_CURRENT_USER : reinterpret_cast<HKEY>(handle);
}

KeyHandle ToHandle(HKEY key) {
    return reinterpret_cast<KeyHandle>(key);
}

class WindowsRegistry final : public Backend {
  public:
    std::optional<std::string> File() const override { return std::nullopt; }

    Status OpenKey(KeyHandle parent, const std::string& subKey, uint32_t access,
                   KeyHandle& result) override {
        HKEY key = nullptr;
        const LONG status = RegOpenKeyExA(ToKey(parent), subKey.c_str(), 0, access, &key);
        if (status == ERROR_SUCCESS)
            result = ToHandle(key);
        return status;
    }

    Status CreateKey(KeyHandle parent, const std::string& subKey, KeyHandle& result) override {
        HKEY key = nullptr;
        DWORD disposition = 0;
        const LONG status =
            RegCreateKeyExA(ToKey(parent), subKey.c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE,
                            KEY_ALL_ACCESS, nullptr, &key, &disposition);
        if (status == ERROR_SUCCESS)
            result = ToHandle(key);
        return status;
    }

    Status CloseKey(KeyHandle key) override {
        if (key == LibRegistry::kCurrentUser)
            return ERROR_SUCCESS;
        return RegCloseKey(ToKey(key));
    }

    Status QueryValue(KeyHandle key, const std::string& valueName, uint32_t* type, uint8_t* data,
                      uint32_t* size) override {
        DWORD valueType = 0;
        DWORD length = size != nullptr ? *size : 0;
        const LONG status = RegQueryValueExA(ToKey(key), valueName.c_str(), nullptr, &valueType,
                                             data, size != nullptr ? &length : nullptr);
        if (type != nullptr)
            *type = valueType;
        if (size != nullptr)
            *size = length;
        return status;
    }

    Status SetDwordValue(KeyHandle key, const std::string& valueName, uint32_t value) override {
        const DWORD number = value;
        return RegSetValueExA(ToKey(key), valueName.c_str(), 0, REG_DWORD,
                              reinterpret_cast<const BYTE*>(&number), sizeof number);
    }

    Status SetStringValue(KeyHandle key, const std::string& valueName,
                          const std::string& value) override {
        return RegSetValueExA(ToKey(key), valueName.c_str(), 0, REG_SZ,
                              reinterpret_cast<const BYTE*>(value.c_str()),
                              static_cast<DWORD>(value.size() + 1));
    }

    Status QuerySubkeyCount(KeyHandle key, uint32_t& count) override {
        DWORD subkeys = 0;
        const LONG status =
            RegQueryInfoKeyA(ToKey(key), nullptr, nullptr, nullptr, &subkeys, nullptr, nullptr,
                             nullptr, nullptr, nullptr, nullptr, nullptr);
        if (status == ERROR_SUCCESS)
            count = subkeys;
        return status;
    }

    Status EnumSubkey(KeyHandle key, uint32_t index, char* name, uint32_t* nameChars) override {
        if (nameChars == nullptr)
            return ERROR_INVALID_PARAMETER;
        DWORD chars = *nameChars;
        const LONG status =
            RegEnumKeyExA(ToKey(key), index, name, &chars, nullptr, nullptr, nullptr, nullptr);
        if (status == ERROR_SUCCESS)
            *nameChars = chars;
        return status;
    }

    Status DeleteSubkey(KeyHandle key, const std::string& subKey) override {
        return RegDeleteKeyA(ToKey(key), subKey.c_str());
    }

    // The registry takes each change as it is made; a group of changes holds the lock file
    // that every writer of this program takes, so that groups (an ignore list's rewrite,
    // its count last) never interleave.
    Status BeginChanges() override {
        {
            std::lock_guard lock(mutex_);
            if (depth_ > 0 && owner_ == std::this_thread::get_id()) {
                ++depth_;
                return ERROR_SUCCESS;
            }
        }
        const std::string lockFile = WindowsRegistryLockFile();
        auto fileLock = std::make_unique<StoreFile::Lock>(lockFile, StoreFile::Lock::On::LockFile);
        std::lock_guard lock(mutex_);
        if (!fileLock->Held()) {
            failure_ = "the registry's lock file " + lockFile + " could not be locked (" +
                       StoreFile::ErrorText(fileLock->Error()) + ")";
            return fileLock->Error() != 0 ? fileLock->Error() : ERROR_ACCESS_DENIED;
        }
        lock_ = std::move(fileLock);
        owner_ = std::this_thread::get_id();
        depth_ = 1;
        return ERROR_SUCCESS;
    }

    Status CommitChanges() override {
        std::lock_guard lock(mutex_);
        if (depth_ == 0 || owner_ != std::this_thread::get_id())
            return ERROR_INVALID_HANDLE;
        if (--depth_ == 0)
            lock_.reset();
        return ERROR_SUCCESS;
    }

    void AbortChanges() override {
        std::lock_guard lock(mutex_);
        if (depth_ > 0 && owner_ == std::this_thread::get_id()) {
            depth_ = 0;
            lock_.reset();
        }
    }

    Condition Examine() override { return Condition{}; }

    std::string Failure() const override {
        std::lock_guard lock(mutex_);
        return failure_;
    }

  private:
    mutable std::mutex mutex_;
    std::thread::id owner_;
    int depth_ = 0;
    std::unique_ptr<StoreFile::Lock> lock_;
    std::string failure_;
};

}  // namespace

std::unique_ptr<Backend> OpenWindowsRegistry() {
    return std::make_unique<WindowsRegistry>();
}

std::string WindowsRegistryLockFile() {
    return (std::filesystem::path(StoreFile::LockFolder()) / "registry.lock").string();
}

}  // namespace vtr::RegistryStore

#endif  // _WIN32
