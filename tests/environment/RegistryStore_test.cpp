#include "environment/RegistryStore.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <random>
#include <thread>

#include "engine/VtrError.h"
#include "environment/LibRegistryVTRShared.h"
#include "environment/RegistryFile.h"
#include "support/TempStore.h"

#ifndef _WIN32
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>
#endif

namespace vtr {
namespace {

namespace fs = std::filesystem;
using LibRegistryVTRShared::GetSharedString;
using LibRegistryVTRShared::SetSharedString;
using ::testing::HasSubstr;

// Names in the folder other than the store file itself.
std::vector<std::string> Leftovers(const std::string& folder, const std::string& storeName) {
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder)) {
        const std::string name = entry.path().filename().string();
        if (name != storeName && name != "tmp")
            names.push_back(name);
    }
    return names;
}

// A store of some size: many keys, other roots, comments, other value types.
std::string BulkStore(int keys) {
    std::string text = "Windows Registry Editor Version 5.00\r\n\r\n; exported\r\n";
    for (int k = 0; k < keys; ++k) {
        text += "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network\\DMX" + std::to_string(k) +
                "]\r\n\"Adapter\"=\"adapter " + std::to_string(k) +
                "\"\r\n\"Protocol\"=dword:00000002\r\n\"Raw\"=hex:de,ad,be,ef\r\n\r\n";
    }
    text += "[HKEY_LOCAL_MACHINE\\Software\\Other]\r\n\"Kept\"=\"yes\"\r\n";
    return text;
}

class RegistryStoreTest : public testsupport::StoreTest {};

TEST_F(RegistryStoreTest, TheStoreIsChosenByOptionThenEnvironmentThenPerUserDefault) {
    testsupport::ScopedStore restore(RegistryStore::OpenFileStore(StoreFile()));
    {
        testsupport::ScopedEnvironment named("VANTORI_REGISTRY", "/env/store.reg");
        RegistryStore::Select(std::string("/option/store.reg"));
        EXPECT_EQ(RegistryStore::CurrentFile(), "/option/store.reg");
        RegistryStore::Select(std::nullopt);
        EXPECT_EQ(RegistryStore::CurrentFile(), "/env/store.reg");
        RegistryStore::Select(std::string());  // an empty option names nothing
        EXPECT_EQ(RegistryStore::CurrentFile(), "/env/store.reg");
    }
#ifndef _WIN32
    testsupport::ScopedEnvironment noStore("VANTORI_REGISTRY", std::nullopt);
    {
        testsupport::ScopedEnvironment config("XDG_CONFIG_HOME", "/cfg");
        RegistryStore::Select(std::nullopt);
        EXPECT_EQ(RegistryStore::CurrentFile(), "/cfg/vantori/registry.reg");
    }
    testsupport::ScopedEnvironment config("XDG_CONFIG_HOME", std::nullopt);
    testsupport::ScopedEnvironment home("HOME", "/home/show");
    RegistryStore::Select(std::nullopt);
    EXPECT_EQ(RegistryStore::CurrentFile(), "/home/show/.config/vantori/registry.reg");
    // Nothing chosen yet: the first use chooses as Select(nothing) would.
    RegistryStore::Install(nullptr);
    EXPECT_EQ(RegistryStore::CurrentFile(), "/home/show/.config/vantori/registry.reg");
#endif
}

TEST_F(RegistryStoreTest, AMissingStoreIsEmptyAndTheFirstWriteCreatesItWithItsFolder) {
    const std::string nested = folder_.File("config/vantori/registry.reg");
    testsupport::ScopedStore store(nested);
    EXPECT_EQ(GetSharedString("AppPath", "", "none"), "none");
    EXPECT_FALSE(fs::exists(folder_.File("config")));
    SetSharedString("AppPath", "/opt/vantori", "");
    EXPECT_EQ(testsupport::ReadFileBytes(nested),
              "Windows Registry Editor Version 5.00\n\n"
              "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\n"
              "\"AppPath\"=\"/opt/vantori\"\n");
    EXPECT_EQ(GetSharedString("AppPath", "", "none"), "/opt/vantori");
    EXPECT_TRUE(Leftovers(folder_.File("config/vantori"), "registry.reg").empty());
}

TEST_F(RegistryStoreTest, AnExportReadChangedAndWrittenBackDiffersOnlyInTheChangedValue) {
    // UTF-16LE with a byte-order mark, as exported on the show computer.
    const std::string text = BulkStore(3);
    auto utf16 = [](const std::string& ascii) {
        std::string bytes = "\xFF\xFE";
        for (char c : ascii)
            bytes += std::string{c, '\0'};
        return bytes;
    };
    WriteStore(utf16(text));
    EXPECT_EQ(GetSharedString("Adapter", "Network\\DMX1", ""), "adapter 1");
    SetSharedString("Adapter", "eth0", "Network\\DMX1");
    std::string expected = text;
    expected.replace(expected.find("adapter 1"), 9, "eth0");
    EXPECT_EQ(ReadStore(), utf16(expected));
    EXPECT_EQ(GetSharedString("Adapter", "Network\\DMX1", ""), "eth0");
    EXPECT_TRUE(Leftovers(folder_.Path(), "registry.reg").empty());
}

TEST_F(RegistryStoreTest, ReadsSeeChangesMadeByOthersAndNeverFail) {
    WriteStore("REGEDIT4\n[HKCU\\Software\\Vantori\\Shared]\n\"AppPath\"=\"one\"\n");
    EXPECT_EQ(GetSharedString("AppPath", "", ""), "one");
    WriteStore("REGEDIT4\n[HKCU\\Software\\Vantori\\Shared]\n\"AppPath\"=\"two, longer\"\n");
    EXPECT_EQ(GetSharedString("AppPath", "", ""), "two, longer");
    // Partly malformed: what can be read is read; a write keeps the rest as it was.
    const std::string partly =
        "REGEDIT4\n[HKCU\\Software\\Vantori\\Shared]\n\x01\x02 junk\n\"UserDataPath\"=\"/d\"\n";
    WriteStore(partly);
    EXPECT_EQ(GetSharedString("UserDataPath", "", ""), "/d");
    SetSharedString("AppPath", "/a", "");
    EXPECT_EQ(ReadStore(), partly + "\"AppPath\"=\"/a\"\n");
    // A store that cannot be read at all (here a folder) reads as defaults, refuses writes.
    fs::remove(StoreFile());
    fs::create_directory(StoreFile());
    EXPECT_EQ(GetSharedString("UserDataPath", "", "default"), "default");
    EXPECT_THROW(SetSharedString("AppPath", "/a", ""), VtrError);
    EXPECT_TRUE(fs::is_directory(StoreFile()));
}

#ifndef _WIN32

TEST_F(RegistryStoreTest, AWriteKeepsTheFilesPermissionsAndALinkToIt) {
    const std::string real = folder_.File("real.reg");
    testsupport::WriteFileBytes(real, "REGEDIT4\n\n[HKCU\\K]\n");
    ::chmod(real.c_str(), 0640);
    fs::create_symlink(real, StoreFile());
    testsupport::ScopedStore store(StoreFile());
    LibRegistry::SetRegString(LibRegistry::kCurrentUser, "K", "V", "x");
    EXPECT_TRUE(fs::is_symlink(StoreFile()));
    EXPECT_EQ(testsupport::ReadFileBytes(real), "REGEDIT4\n\n[HKCU\\K]\n\"V\"=\"x\"\n");
    struct stat status;
    ASSERT_EQ(::stat(real.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777, 0640u);
}

TEST_F(RegistryStoreTest, TwoProcessesWritingAtOnceBothLandTheirChanges) {
    WriteStore(BulkStore(40));
    constexpr int kWriters = 3;
    constexpr int kWrites = 15;
    std::vector<pid_t> children;
    for (int w = 0; w < kWriters; ++w) {
        const pid_t child = ::fork();
        ASSERT_GE(child, 0);
        if (child == 0) {
            int failures = 0;
            for (int i = 0; i < kWrites; ++i) {
                const std::string name = "W" + std::to_string(w) + "_" + std::to_string(i);
                if (!ResumeStep([&] { SetSharedString(name, std::to_string(i), "Writers"); })) {
                    ++failures;
                }
            }
            ::_exit(failures);
        }
        children.push_back(child);
    }
    for (pid_t child : children) {
        int status = 0;
        ::waitpid(child, &status, 0);
        EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
    }
    for (int w = 0; w < kWriters; ++w) {
        for (int i = 0; i < kWrites; ++i) {
            EXPECT_EQ(GetSharedString("W" + std::to_string(w) + "_" + std::to_string(i), "Writers",
                                      "lost"),
                      std::to_string(i));
        }
    }
    EXPECT_EQ(GetSharedString("Adapter", "Network\\DMX39", ""), "adapter 39");
    EXPECT_THAT(ReadStore(), HasSubstr("\"Kept\"=\"yes\""));
    EXPECT_TRUE(Leftovers(folder_.Path(), "registry.reg").empty());
}

TEST_F(RegistryStoreTest, AWriterKilledAtAnyMomentLeavesTheOldOrTheNewStore) {
    const std::string original = BulkStore(300);  // large enough for a write to take a while
    WriteStore(original);
    const RegistryFile::Document before = RegistryFile::Document::Parse(original);
    const RegistryFile::KeyPath network =
        RegistryFile::SplitKeyPath("Software\\Vantori\\Shared\\Network");

    std::mt19937 random(12345);
    int lastSeen = -1;
    for (int round = 0; round < 25; ++round) {
        const pid_t child = ::fork();
        ASSERT_GE(child, 0);
        if (child == 0) {
            for (int i = 0;; ++i) {
                ResumeStep(
                    [&] { SetSharedString("Counter", std::to_string(round * 100000 + i), ""); });
            }
        }
        std::this_thread::sleep_for(std::chrono::microseconds(2000 + random() % 20000));
        ::kill(child, SIGKILL);
        ::waitpid(child, nullptr, 0);

        const RegistryFile::Document after = RegistryFile::Document::Parse(ReadStore());
        ASSERT_TRUE(after.Understood()) << "round " << round;
        ASSERT_TRUE(RegistryFile::SameContent(*before.FindKey(network), *after.FindKey(network)))
            << "round " << round;
        const std::string counter = GetSharedString("Counter", "", "-1");
        EXPECT_GE(std::stoi(counter), lastSeen) << "round " << round;
        lastSeen = std::stoi(counter);
    }
    // The next write clears away what the killed writers left half made.
    SetSharedString("Counter", "done", "");
    EXPECT_TRUE(Leftovers(folder_.Path(), "registry.reg").empty());
    EXPECT_EQ(GetSharedString("Counter", "", ""), "done");
}

#endif

}  // namespace
}  // namespace vtr
