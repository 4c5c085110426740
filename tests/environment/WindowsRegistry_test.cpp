// The settings store on Windows: the real registry through advapi32. Every test works in a
// key of its own below HKEY_CURRENT_USER\Software, made fresh and deleted afterwards, and
// checks what LibRegistry does against what the registry itself then holds. The same
// sequence of store operations is also run on the registry-export file store, which must
// answer exactly as the registry does.
#ifdef _WIN32

#include <windows.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <filesystem>
#include <string>
#include <thread>
#include <vector>

#include "engine/VtrError.h"
#include "environment/LibRegistry.h"
#include "environment/RegistryStore.h"
#include "support/Raised.h"
#include "support/TempStore.h"

namespace vtr {
namespace {

using testsupport::RaisedDescription;
using namespace LibRegistry;
using RegistryStore::Backend;
namespace Status = RegistryStore::StatusCode;

// A key name no other test process (ctest runs several at once) uses.
std::string UniqueTestKey() {
    static int counter = 0;
    const auto* test = ::testing::UnitTest::GetInstance()->current_test_info();
    return "Software\\VantoriVerifierTest-" + std::to_string(GetCurrentProcessId()) + "-" +
           std::to_string(++counter) + "-" + (test != nullptr ? test->name() : "test");
}

// What the registry itself holds, read without the code under test.
struct RawValue {
    LONG status = 0;
    DWORD type = 0;
    std::string data;
};

RawValue ReadRaw(const std::string& keyPath, const std::string& name) {
    RawValue raw;
    HKEY key = nullptr;
    raw.status = RegOpenKeyExA(HKEY_CURRENT_USER, keyPath.c_str(), 0, KEY_READ, &key);
    if (raw.status != ERROR_SUCCESS)
        return raw;
    char buffer[512];
    DWORD size = sizeof buffer;
    raw.status = RegQueryValueExA(key, name.c_str(), nullptr, &raw.type,
                                  reinterpret_cast<BYTE*>(buffer), &size);
    if (raw.status == ERROR_SUCCESS)
        raw.data.assign(buffer, size);
    RegCloseKey(key);
    return raw;
}

bool KeyExists(const std::string& keyPath) {
    HKEY key = nullptr;
    if (RegOpenKeyExA(HKEY_CURRENT_USER, keyPath.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS)
        return false;
    RegCloseKey(key);
    return true;
}

void WriteRaw(const std::string& keyPath, const std::string& name, DWORD type,
              const std::string& data) {
    HKEY key = nullptr;
    ASSERT_EQ(RegCreateKeyExA(HKEY_CURRENT_USER, keyPath.c_str(), 0, nullptr, 0, KEY_ALL_ACCESS,
                              nullptr, &key, nullptr),
              ERROR_SUCCESS);
    ASSERT_EQ(RegSetValueExA(key, name.c_str(), 0, type, reinterpret_cast<const BYTE*>(data.data()),
                             static_cast<DWORD>(data.size())),
              ERROR_SUCCESS);
    RegCloseKey(key);
}

// The real registry is the store for the test (the file store of StoreTest is put back
// afterwards); the test's key is removed before and after.
class WindowsRegistryTest : public testsupport::StoreTest {
  protected:
    WindowsRegistryTest() : key_(UniqueTestKey()), registry_(RegistryStore::OpenWindowsRegistry()) {
        RegDeleteTreeA(HKEY_CURRENT_USER, key_.c_str());
    }
    ~WindowsRegistryTest() override {
        RegDeleteTreeA(HKEY_CURRENT_USER, key_.c_str());
        EXPECT_FALSE(KeyExists(key_)) << "the test key was left behind";
    }

    const std::string key_;

  private:
    testsupport::ScopedStore registry_;
};

TEST_F(WindowsRegistryTest, TheRealRegistryIsTheStoreUnlessAFileIsNamed) {
    testsupport::ScopedStore restore(RegistryStore::OpenWindowsRegistry());
    testsupport::ScopedEnvironment noStore("VANTORI_REGISTRY", std::nullopt);
    RegistryStore::Select(std::nullopt);
    EXPECT_EQ(RegistryStore::CurrentFile(), std::nullopt);
    RegistryStore::Select(std::string());
    EXPECT_EQ(RegistryStore::CurrentFile(), std::nullopt);
    RegistryStore::Select(StoreFile());
    EXPECT_EQ(RegistryStore::CurrentFile(), StoreFile());
    {
        testsupport::ScopedEnvironment named("VANTORI_REGISTRY", folder_.File("named.reg"));
        RegistryStore::Select(std::nullopt);
        EXPECT_EQ(RegistryStore::CurrentFile(), folder_.File("named.reg"));
    }
    RegistryStore::Install(nullptr);  // nothing chosen: the first use takes the registry
    EXPECT_EQ(RegistryStore::CurrentFile(), std::nullopt);
}

TEST_F(WindowsRegistryTest, AGroupOfChangesHoldsTheLockEveryWriterTakes) {
    testsupport::ScopedEnvironment profile("LOCALAPPDATA", folder_.File("profile"));
    const std::string sub = key_ + "\\Verifier";
    std::atomic<bool> secondBegan{false};
    std::thread other;
    {
        RegistryStore::Changes changes;
        SetRegString(kCurrentUser, sub, "CountIgnoreMsg", "1");
        // The registry takes each change as it is made.
        EXPECT_EQ(ReadRaw(sub, "CountIgnoreMsg").status, ERROR_SUCCESS);
        other = std::thread([&] {
            RegistryStore::Changes waiting;
            secondBegan = true;
            SetRegString(kCurrentUser, sub, "Second", "2");
            waiting.Commit();
        });
        Sleep(300);
        EXPECT_FALSE(secondBegan) << "the other writer waits for the lock";
        changes.Commit();
    }
    other.join();
    EXPECT_TRUE(secondBegan);
    EXPECT_EQ(GetRegString(kCurrentUser, sub, "Second", ""), "2");
    EXPECT_TRUE(std::filesystem::exists(folder_.File("profile/Vantori/registry.lock")));
}

TEST_F(WindowsRegistryTest, ValuesAreStoredWithTheirRegistryTypesAndReadBack) {
    const std::string sub = key_ + "\\Shared\\MonitorMemory";
    SetRegLong(kCurrentUser, sub, "Number", -2);
    SetRegBool(kCurrentUser, sub, "Flag", true);
    SetRegString(kCurrentUser, sub, "Text", "C:\\Shows\\Data");

    const RawValue number = ReadRaw(sub, "Number");
    ASSERT_EQ(number.status, ERROR_SUCCESS);
    EXPECT_EQ(number.type, static_cast<DWORD>(REG_DWORD));
    EXPECT_EQ(number.data, std::string("\xFE\xFF\xFF\xFF", 4));
    const RawValue flag = ReadRaw(sub, "Flag");
    EXPECT_EQ(flag.type, static_cast<DWORD>(REG_DWORD));
    EXPECT_EQ(flag.data, std::string("\x01\x00\x00\x00", 4));
    const RawValue text = ReadRaw(sub, "Text");
    EXPECT_EQ(text.type, static_cast<DWORD>(REG_SZ));
    EXPECT_EQ(text.data, std::string("C:\\Shows\\Data\0", 14));  // the NUL is stored

    EXPECT_EQ(GetRegLong(kCurrentUser, sub, "Number", 0), -2);
    EXPECT_TRUE(GetRegBool(kCurrentUser, sub, "Flag", false));
    EXPECT_EQ(GetRegString(kCurrentUser, sub, "Text", "d"), "C:\\Shows\\Data");

    // Any non-zero DWORD is True; False is stored as 0.
    WriteRaw(sub, "Five", REG_DWORD, std::string("\x05\x00\x00\x00", 4));
    EXPECT_TRUE(GetRegBool(kCurrentUser, sub, "Five", false));
    SetRegBool(kCurrentUser, sub, "Flag", false);
    EXPECT_EQ(ReadRaw(sub, "Flag").data, std::string(4, '\0'));
    EXPECT_FALSE(GetRegBool(kCurrentUser, sub, "Flag", true));
}

TEST_F(WindowsRegistryTest, ReadersGiveTheirDefaultAndStringsOfLengthZeroOrOneReadEmpty) {
    EXPECT_EQ(GetRegString(kCurrentUser, key_, "Missing", "dflt"), "dflt");  // no key
    EXPECT_EQ(GetRegLong(kCurrentUser, key_, "Missing", 7), 7);
    EXPECT_TRUE(GetRegBool(kCurrentUser, key_, "Missing", true));

    WriteRaw(key_, "Zero", REG_SZ, "");
    WriteRaw(key_, "One", REG_SZ, std::string(1, '\0'));
    WriteRaw(key_, "Text", REG_SZ, std::string("12\0", 3));
    WriteRaw(key_, "Short", REG_BINARY, "\x01\x02");
    EXPECT_EQ(GetRegString(kCurrentUser, key_, "Zero", "default"), "");
    EXPECT_EQ(GetRegString(kCurrentUser, key_, "One", "default"), "");
    EXPECT_EQ(GetRegString(kCurrentUser, key_, "Missing", "dflt"), "dflt");  // no value
    EXPECT_EQ(GetRegLong(kCurrentUser, key_, "Text", 3), 3);                 // not a DWORD
    EXPECT_EQ(GetRegLong(kCurrentUser, key_, "Short", 3), 3);                // not a DWORD either
    EXPECT_EQ(GetRegLong(kCurrentUser, key_, "Missing", 3), 3);
}

TEST_F(WindowsRegistryTest, WritingCreatesTheKeyButReadingNeverDoes) {
    const std::string deeper = key_ + "\\New\\Deeper";
    EXPECT_EQ(GetRegString(kCurrentUser, deeper, "X", "d"), "d");
    EXPECT_FALSE(KeyExists(key_));
    EXPECT_EQ(RaisedDescription([&] { OpenRegistryKey(kCurrentUser, deeper, kKeyRead); }),
              "RegOpenKeyEx failure");
    EXPECT_EQ(RaisedDescription([&] { OpenRegistryKey(kCurrentUser, deeper, kKeyAllAccess); }),
              "RegOpenKeyEx failure");
    EXPECT_FALSE(KeyExists(key_));

    SetRegString(kCurrentUser, deeper, "X", "v");
    EXPECT_TRUE(KeyExists(deeper));
    EXPECT_EQ(GetRegString(kCurrentUser, deeper, "X", "d"), "v");

    KeyHandle written = OpenRegistryKey(kCurrentUser, key_ + "\\Made", kKeyWrite);
    EXPECT_NE(written, 0u);
    CloseRegistryKey(written);
    EXPECT_EQ(written, 0u);
    EXPECT_TRUE(KeyExists(key_ + "\\Made"));
    CreateRegistryKey(kCurrentUser, key_ + "\\Made");  // an existing key is simply opened
    // Key and value names compare without regard to case.
    EXPECT_EQ(GetRegString(kCurrentUser, key_ + "\\NEW\\deeper", "x", "d"), "v");
}

TEST_F(WindowsRegistryTest, FailuresRaiseTheirOwnTexts) {
    CreateRegistryKey(kCurrentUser, key_ + "\\Parent\\Child");
    EXPECT_EQ(RaisedDescription([&] { DeleteRegistryKey(kCurrentUser, key_, "Parent"); }),
              "RegDeleteKey failure");  // it still has a subkey
    EXPECT_EQ(RaisedDescription([&] { DeleteRegistryKey(kCurrentUser, key_, "Gone"); }),
              "RegDeleteKey failure");
    EXPECT_EQ(RaisedDescription([&] { DeleteRegistryKey(kCurrentUser, key_ + "\\Gone", "X"); }),
              "RegOpenKeyEx failure");
    EXPECT_EQ(RaisedDescription([&] { DeleteRegistryKeyTree(kCurrentUser, key_, "Gone"); }),
              "RegOpenKeyEx failure");
    EXPECT_TRUE(KeyExists(key_ + "\\Parent\\Child"));

    // A value name beyond the registry's limit of 16383 characters cannot be written.
    const std::string tooLong(20000, 'v');
    EXPECT_EQ(RaisedDescription([&] { SetRegString(kCurrentUser, key_, tooLong, "x"); }),
              "RegSetValueEx failure");
    EXPECT_EQ(RaisedDescription([&] { SetRegLong(kCurrentUser, key_, tooLong, 1); }),
              "RegSetValueEx failure");
    try {
        SetRegBool(kCurrentUser, key_, tooLong, true);
        FAIL() << "nothing raised";
    } catch (const VtrError& error) {
        EXPECT_EQ(error.Number(), kRegistryErrorNumber);
        EXPECT_EQ(error.Source(), "LibRegistry.SetRegLong");
    }
}

TEST_F(WindowsRegistryTest, TreeDeletionRemovesThreeLevelsAndLeavesTheSiblings) {
    SetRegString(kCurrentUser, key_ + "\\Network1", "Comment", "top");
    SetRegString(kCurrentUser, key_ + "\\Network1\\AuxA\\Deep", "Comment", "deepest");
    CreateRegistryKey(kCurrentUser, key_ + "\\Network1\\AuxB");
    CreateRegistryKey(kCurrentUser, key_ + "\\Network1\\AuxC\\One\\Two");
    SetRegString(kCurrentUser, key_ + "\\Network2", "Comment", "kept");

    DeleteRegistryKeyTree(kCurrentUser, key_, "Network1");
    EXPECT_FALSE(KeyExists(key_ + "\\Network1"));
    EXPECT_TRUE(KeyExists(key_ + "\\Network2"));
    EXPECT_EQ(GetRegString(kCurrentUser, key_ + "\\Network2", "Comment", "gone"), "kept");
}

// One fixed sequence of store operations, each outcome written down: status codes, types,
// lengths, names. The registry-export file store is built to answer as the registry does.
std::vector<std::string> Trace(Backend& store, const std::string& base) {
    std::vector<std::string> log;
    auto note = [&](const std::string& what, RegistryStore::Status status) {
        log.push_back(what + " -> " + std::to_string(status));
    };
    KeyHandle top = 0;
    note("create base", store.CreateKey(kCurrentUser, base, top));
    for (const char* name : {"Alpha", "Beta\\Inner", "Gamma"}) {
        KeyHandle key = 0;
        note(std::string("create ") + name, store.CreateKey(top, name, key));
        store.CloseKey(key);
    }
    note("dword", store.SetDwordValue(top, "Number", 0x01020304u));
    note("string", store.SetStringValue(top, "Text", "hello"));
    note("empty string", store.SetStringValue(top, "Empty", ""));

    for (const char* name : {"Number", "Text", "Empty", "missing", "TEXT"}) {
        uint8_t data[64] = {};
        uint32_t type = 0;
        uint32_t size = sizeof data;
        const auto status = store.QueryValue(top, name, &type, data, &size);
        note(std::string("read ") + name + " type " + std::to_string(type) + " size " +
                 std::to_string(size) + " data " +
                 std::string(reinterpret_cast<char*>(data), status == 0 ? size : 0),
             status);
    }
    {
        // The size alone (exact for a DWORD; for strings the system may only give a bound),
        // and a buffer too small.
        uint32_t type = 0;
        uint32_t size = 0;
        note("size of number", store.QueryValue(top, "Number", &type, nullptr, &size));
        log.push_back("number size " + std::to_string(size) + " type " + std::to_string(type));
        uint8_t small[3] = {};
        size = sizeof small;
        note("text into 3 bytes", store.QueryValue(top, "Text", nullptr, small, &size));
    }

    uint32_t count = 0;
    note("count", store.QuerySubkeyCount(top, count));
    log.push_back("subkeys " + std::to_string(count));
    for (uint32_t index = 0; index <= count; ++index) {
        char name[255];
        uint32_t chars = sizeof name;
        const auto status = store.EnumSubkey(top, index, name, &chars);
        note("enum " + std::to_string(index) +
                 (status == 0 ? " " + std::string(name, chars) : std::string()),
             status);
    }
    {
        char name[3];
        uint32_t chars = sizeof name;
        note("enum into 3 chars", store.EnumSubkey(top, 0, name, &chars));
    }

    KeyHandle opened = 0;
    note("open missing", store.OpenKey(top, "Missing", kKeyRead, opened));
    note("open beta, other case", store.OpenKey(top, "BETA", kKeyRead, opened));
    if (opened != 0)
        store.CloseKey(opened);
    note("delete beta with subkey", store.DeleteSubkey(top, "Beta"));
    note("delete missing", store.DeleteSubkey(top, "Missing"));
    note("delete inner", store.DeleteSubkey(top, "Beta\\Inner"));
    note("delete beta", store.DeleteSubkey(top, "Beta"));
    note("count again", store.QuerySubkeyCount(top, count));
    log.push_back("subkeys " + std::to_string(count));
    for (const char* name : {"Alpha", "Gamma"})
        note(std::string("delete ") + name, store.DeleteSubkey(top, name));
    note("close", store.CloseKey(top));
    return log;
}

TEST_F(WindowsRegistryTest, TheFileStoreAnswersEveryOperationAsTheRegistryDoes) {
    const auto registry = RegistryStore::OpenWindowsRegistry();
    const std::vector<std::string> fromRegistry = Trace(*registry, key_);
    const auto file = RegistryStore::OpenFileStore(StoreFile());
    const std::vector<std::string> fromFile = Trace(*file, key_);
    EXPECT_EQ(fromFile, fromRegistry);
    // Spot checks that the sequence says what it is meant to.
    EXPECT_THAT(fromRegistry, ::testing::Contains("subkeys 3"));
    EXPECT_THAT(fromRegistry,
                ::testing::Contains("enum 3 -> " + std::to_string(Status::NoMoreItems)));
    EXPECT_THAT(fromRegistry, ::testing::Contains("delete beta with subkey -> " +
                                                  std::to_string(Status::AccessDenied)));
}

}  // namespace
}  // namespace vtr

#endif  // _WIN32
