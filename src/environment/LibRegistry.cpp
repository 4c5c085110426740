#include "environment/LibRegistry.h"

#include "engine/SavedErr.h"
#include "engine/VtrError.h"
#include "environment/RegistryStore.h"

namespace vtr::LibRegistry {
namespace {

using RegistryStore::Backend;

Backend& Store() {
    return RegistryStore::Current();
}

[[noreturn]] void Fail(const char* operation, const char* description) {
    Raise(kRegistryErrorNumber, std::string("LibRegistry.") + operation, description);
}

// Runs a change with the key it opens; on failure the key is closed before the error goes
// on to the caller, which sees the first error and not one from the clean-up.
template <typename Body>
void WithKeyThenClose(KeyHandle& key, Body&& body) {
    try {
        body();
    } catch (...) {
        SavedErr saved;
        CloseRegistryKey(key);
        saved.Raise();
    }
    CloseRegistryKey(key);
}

}  // namespace

KeyHandle OpenRegistryKey(RootKey root, const std::string& keyPath, uint32_t access) {
    KeyHandle key = 0;
    RegistryStore::Status status = Store().OpenKey(root, keyPath, access, key);
    if (status != 0 && access == kKeyWrite) {
        // A writer's key is created when missing.
        CreateRegistryKey(root, keyPath);
        status = Store().OpenKey(root, keyPath, kKeyWrite, key);
    }
    if (status != 0)
        Fail("OpenRegistryKey", "RegOpenKeyEx failure");
    return key;
}

void CreateRegistryKey(RootKey root, const std::string& keyPath) {
    KeyHandle key = 0;
    if (Store().CreateKey(root, keyPath, key) != 0) {
        Fail("CreateRegistryKey", "RegCreateKeyEx failure");
    }
    CloseRegistryKey(key);
}

void CloseRegistryKey(KeyHandle& handle) {
    if (handle == 0)
        return;
    Store().CloseKey(handle);
    handle = 0;
}

// The readers answer a missing key or value with the default straight away: a run reads
// thousands of absent settings (the network preferences alone ask for 7 values of each of
// 999 universes), and none of them is an error.

int32_t GetRegLong(RootKey root, const std::string& keyPath, const std::string& valueName,
                   int32_t defaultValue) {
    KeyHandle key = 0;
    const int32_t value = ResumeOr(defaultValue, [&] {
        if (Store().OpenKey(root, keyPath, kKeyRead, key) != 0) {
            key = 0;
            return defaultValue;
        }
        uint8_t buffer[4] = {0, 0, 0, 0};
        uint32_t type = 0;
        uint32_t size = sizeof buffer;
        if (Store().QueryValue(key, valueName, &type, buffer, &size) != 0 ||
            type != RegistryStore::ValueType::Dword) {
            return defaultValue;
        }
        return static_cast<int32_t>(
            static_cast<uint32_t>(buffer[0]) | static_cast<uint32_t>(buffer[1]) << 8 |
            static_cast<uint32_t>(buffer[2]) << 16 | static_cast<uint32_t>(buffer[3]) << 24);
    });
    CloseRegistryKey(key);
    return value;
}

bool GetRegBool(RootKey root, const std::string& keyPath, const std::string& valueName,
                bool defaultValue) {
    return GetRegLong(root, keyPath, valueName, defaultValue ? 1 : 0) != 0;
}

std::string GetRegString(RootKey root, const std::string& keyPath, const std::string& valueName,
                         const std::string& defaultValue) {
    KeyHandle key = 0;
    std::string value = ResumeOr(defaultValue, [&] {
        if (Store().OpenKey(root, keyPath, kKeyRead, key) != 0) {
            key = 0;
            return defaultValue;
        }
        uint32_t length = 0;
        if (Store().QueryValue(key, valueName, nullptr, nullptr, &length) != 0)
            return defaultValue;
        if (length == 0)
            return std::string();
        std::string buffer(length, ' ');
        if (Store().QueryValue(key, valueName, nullptr, reinterpret_cast<uint8_t*>(buffer.data()),
                               &length) != 0) {
            return defaultValue;
        }
        // The stored length counts the terminating NUL, which is dropped.
        buffer.resize(length == 0 ? 0 : length - 1);
        return buffer;
    });
    CloseRegistryKey(key);
    return value;
}

bool KeyExists(RootKey root, const std::string& keyPath) {
    KeyHandle key = 0;
    if (Store().OpenKey(root, keyPath, kKeyRead, key) != 0)
        return false;
    CloseRegistryKey(key);
    return true;
}

void SetRegLong(RootKey root, const std::string& keyPath, const std::string& valueName,
                int32_t value) {
    KeyHandle key = 0;
    WithKeyThenClose(key, [&] {
        key = OpenRegistryKey(root, keyPath, kKeyWrite);
        if (Store().SetDwordValue(key, valueName, static_cast<uint32_t>(value)) != 0) {
            Fail("SetRegLong", "RegSetValueEx failure");
        }
    });
}

void SetRegBool(RootKey root, const std::string& keyPath, const std::string& valueName,
                bool value) {
    SetRegLong(root, keyPath, valueName, value ? 1 : 0);
}

void SetRegString(RootKey root, const std::string& keyPath, const std::string& valueName,
                  const std::string& value) {
    KeyHandle key = 0;
    WithKeyThenClose(key, [&] {
        key = OpenRegistryKey(root, keyPath, kKeyWrite);
        if (Store().SetStringValue(key, valueName, value) != 0) {
            Fail("SetRegString", "RegSetValueEx failure");
        }
    });
}

void DeleteRegistryKey(RootKey root, const std::string& parentPath, const std::string& subkeyName) {
    KeyHandle parent = 0;
    WithKeyThenClose(parent, [&] {
        parent = OpenRegistryKey(root, parentPath, kKeyAllAccess);
        if (Store().DeleteSubkey(parent, subkeyName) != 0) {
            Fail("DeleteRegistryKey", "RegDeleteKey failure");
        }
    });
}

void DeleteRegistryKeyTree(RootKey root, const std::string& parentPath,
                           const std::string& subkeyName) {
    const std::string keyPath = parentPath + "\\" + subkeyName;
    KeyHandle key = 0;
    WithKeyThenClose(key, [&] {
        key = OpenRegistryKey(root, keyPath, kKeyAllAccess);
        uint32_t subkeys = 0;
        if (Store().QuerySubkeyCount(key, subkeys) != 0) {
            Fail("DeleteRegistryKeyTree", "RegDeleteKey failure");
        }
        // Always the subkey at index 0: each deletion moves the others down.
        for (uint32_t i = 1; i <= subkeys; ++i) {
            char name[255];
            uint32_t chars = sizeof name;
            if (Store().EnumSubkey(key, 0, name, &chars) != 0) {
                Fail("DeleteRegistryKeyTree", "RegDeleteKey failure");
            }
            DeleteRegistryKeyTree(root, keyPath, std::string(name, chars));
        }
        DeleteRegistryKey(root, parentPath, subkeyName);
    });
}

}  // namespace vtr::LibRegistry
