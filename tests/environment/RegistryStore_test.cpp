#include "environment/RegistryStore.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cctype>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <future>
#include <random>
#include <thread>

#include "engine/VtrError.h"
#include "environment/LibRegistryVTRShared.h"
#include "environment/RegistryFile.h"
#include "environment/StoreFile.h"
#include "support/Raised.h"
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

TEST_F(RegistryStoreTest, AGroupOfChangesIsWrittenOnceAtCommitAndNotAtAllWithoutIt) {
    const std::string original = BulkStore(3);
    WriteStore(original);
    {
        RegistryStore::Changes changes;
        SetSharedString("A", "1", "");
        SetSharedString("B", "2", "Group");
        // This thread sees its changes; the file and the other threads do not, yet.
        EXPECT_EQ(GetSharedString("A", "", "none"), "1");
        EXPECT_EQ(ReadStore(), original);
        std::string seenElsewhere;
        std::thread([&] { seenElsewhere = GetSharedString("A", "", "none"); }).join();
        EXPECT_EQ(seenElsewhere, "none");
        changes.Commit();
    }
    EXPECT_EQ(ReadStore(), original +
                               "\r\n[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
                               "\"A\"=\"1\"\r\n"
                               "\r\n[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Group]\r\n"
                               "\"B\"=\"2\"\r\n");
    const std::string committed = ReadStore();
    {
        RegistryStore::Changes changes;
        SetSharedString("A", "changed", "");
        // An error on the way: the changes are never committed.
    }
    EXPECT_EQ(ReadStore(), committed);
    EXPECT_EQ(GetSharedString("A", "", "none"), "1");
    EXPECT_TRUE(Leftovers(folder_.Path(), "registry.reg").empty());
}

TEST_F(RegistryStoreTest, AReadOnlyStoreFileIsRefusedAndLeftAsItIs) {
    const std::string original = BulkStore(2);
    WriteStore(original);
    const auto readOnly = fs::perms::owner_read | fs::perms::group_read | fs::perms::others_read;
    fs::permissions(StoreFile(), readOnly);
    // Judged by the file's own permissions, so it holds for the superuser too.
    const std::string expected = "the settings store is read-only: " + StoreFile() +
                                 " (its permissions do not allow writing; it was left as it is)";
    EXPECT_EQ(testsupport::RaisedDescription([] { RegistryStore::Changes changes; }), expected);
    EXPECT_THROW(SetSharedString("AppPath", "/x", ""), VtrError);
    EXPECT_EQ(RegistryStore::Current().Failure(), expected);
    EXPECT_EQ(ReadStore(), original);
    EXPECT_EQ(fs::status(StoreFile()).permissions() & fs::perms::all, readOnly);
    EXPECT_TRUE(RegistryStore::Describe().condition.readOnly);
    EXPECT_TRUE(Leftovers(folder_.Path(), "registry.reg").empty());
    EXPECT_FALSE(fs::exists(folder_.File(".registry.reg.lock"))) << "nothing made beside it";

    // Refused at once, not after waiting for a writer that holds the store's lock.
    std::future<std::string> refusal;
    bool answered = false;
    {
        vtr::StoreFile::Lock held(StoreFile(), vtr::StoreFile::Lock::On::StoreFile);
        ASSERT_TRUE(held.Held());
        refusal = std::async(std::launch::async, [] {
            return testsupport::RaisedDescription([] { RegistryStore::Changes changes; });
        });
        answered = refusal.wait_for(std::chrono::seconds(10)) == std::future_status::ready;
    }
    EXPECT_TRUE(answered) << "the refusal waited for the lock";
    EXPECT_EQ(refusal.get(), expected);
    EXPECT_EQ(ReadStore(), original);

    // Writable for its owner only: not read-only.
    fs::permissions(StoreFile(), fs::perms::owner_read | fs::perms::owner_write);
    SetSharedString("AppPath", "/x", "");
    EXPECT_EQ(GetSharedString("AppPath", "", ""), "/x");
    EXPECT_FALSE(RegistryStore::Describe().condition.readOnly);
}

#ifdef _WIN32
// On Windows the store's writers lock a file in the user's local application data named after
// the store, never one beside it: every name of one store file leads to the same lock file.
TEST_F(RegistryStoreTest,
       TheWritersLockFileIsInTheLocalApplicationDataAndOneForEveryNameOfTheStore) {
    const std::string lockFile = vtr::StoreFile::LockFileOf(StoreFile());
    const fs::path locks = fs::path(std::getenv("LOCALAPPDATA")) / "Vantori" / "locks";
    EXPECT_EQ(fs::path(lockFile).parent_path(), locks);
    // "store-", sixteen lower-case hexadecimal digits, ".lock" (GoogleTest's regular
    // expressions on Windows have no character classes).
    const std::string name = fs::path(lockFile).filename().string();
    ASSERT_EQ(name.size(), 27u) << name;
    EXPECT_EQ(name.substr(0, 6), "store-") << name;
    EXPECT_EQ(name.substr(22), ".lock") << name;
    EXPECT_EQ(name.find_first_not_of("0123456789abcdef", 6), 22u) << name;

    // Missing, then created: the same lock file.
    fs::remove(StoreFile());
    const std::string whileMissing = vtr::StoreFile::LockFileOf(StoreFile());
    SetSharedString("AppPath", "C:\\Vantori", "");
    EXPECT_EQ(vtr::StoreFile::LockFileOf(StoreFile()), whileMissing);
    EXPECT_TRUE(fs::exists(whileMissing)) << "the write locked it";
    EXPECT_TRUE(Leftovers(folder_.Path(), "registry.reg").empty());

    std::string upper = StoreFile();
    for (char& c : upper)
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    EXPECT_EQ(vtr::StoreFile::LockFileOf(upper), lockFile);
    EXPECT_EQ(vtr::StoreFile::LockFileOf(folder_.File("tmp\\..\\registry.reg")), lockFile);
    EXPECT_EQ(vtr::StoreFile::LockFileOf(folder_.File("tmp/../registry.reg")), lockFile);
    EXPECT_NE(vtr::StoreFile::LockFileOf(folder_.File("other.reg")), lockFile);
    EXPECT_NE(vtr::StoreFile::LockFileOf(folder_.File("tmp\\registry.reg")), lockFile);

    // Held under one name, the store is locked under the other.
    std::future<bool> other;
    {
        vtr::StoreFile::Lock held(StoreFile(), vtr::StoreFile::Lock::On::StoreFile);
        ASSERT_TRUE(held.Held());
        other = std::async(std::launch::async, [&upper] {
            return vtr::StoreFile::Lock(upper, vtr::StoreFile::Lock::On::StoreFile).Held();
        });
        EXPECT_EQ(other.wait_for(std::chrono::milliseconds(300)), std::future_status::timeout)
            << "a second holder while the first holds it";
    }
    EXPECT_TRUE(other.get());
}
#endif

TEST_F(RegistryStoreTest, TheDescriptionSaysWhichStoreHowItWasChosenAndWhatIsWrong) {
    testsupport::ScopedStore restore(RegistryStore::OpenFileStore(StoreFile()));
    testsupport::ScopedEnvironment named("VANTORI_REGISTRY", StoreFile());
    RegistryStore::Select(std::nullopt);
    RegistryStore::Description description = RegistryStore::Describe();
    EXPECT_EQ(description.file, StoreFile());
    EXPECT_EQ(description.OriginWord(), "environment");
    EXPECT_FALSE(description.condition.exists);
    EXPECT_EQ(description.Problem(),
              "the settings store " + StoreFile() +
                  " (named by VANTORI_REGISTRY) does not exist; verifying with no settings. "
                  "Name the suite's exported settings with --registry FILE or the environment "
                  "variable VANTORI_REGISTRY.");

    WriteStore("notes, not settings\n");
    RegistryStore::Select(StoreFile());
    description = RegistryStore::Describe();
    EXPECT_EQ(description.OriginWord(), "option");
    EXPECT_TRUE(description.condition.exists);
    EXPECT_FALSE(description.condition.understood);
    EXPECT_EQ(description.Problem(),
              "the settings store " + StoreFile() +
                  " (named with --registry) exists but could not be read as a registry export "
                  "(its first line is neither \"Windows Registry Editor Version 5.00\" nor "
                  "\"REGEDIT4\"); verifying with no settings. Export the suite's settings again, "
                  "or name another file with --registry FILE or VANTORI_REGISTRY.");

    WriteStore("REGEDIT4\n");
    EXPECT_EQ(RegistryStore::Describe().Problem(), "");
#ifndef _WIN32
    testsupport::ScopedEnvironment noStore("VANTORI_REGISTRY", std::nullopt);
    testsupport::ScopedEnvironment config("XDG_CONFIG_HOME", folder_.File("config"));
    RegistryStore::Select(std::nullopt);
    description = RegistryStore::Describe();
    EXPECT_EQ(description.OriginWord(), "default");
    EXPECT_THAT(
        description.Problem(),
        ::testing::StartsWith("the settings store " + folder_.File("config/vantori/registry.reg") +
                              " (the per-user default, as neither --registry nor "
                              "VANTORI_REGISTRY names one) does not exist"));
#endif
}

TEST_F(RegistryStoreTest, AReadScopeLooksAtTheStoreOnce) {
    WriteStore("REGEDIT4\n\n[HKCU\\Software\\Vantori\\Shared]\n\"A\"=\"1\"\n");
    {
        RegistryStore::ReadScope reading;
        EXPECT_EQ(GetSharedString("A", "", ""), "1");
        // Another program changes the file: not seen until the scope ends.
        WriteStore("REGEDIT4\n\n[HKCU\\Software\\Vantori\\Shared]\n\"A\"=\"2, longer\"\n");
        EXPECT_EQ(GetSharedString("A", "", ""), "1");
        // What this process writes is seen at once.
        SetSharedString("B", "mine", "");
        EXPECT_EQ(GetSharedString("B", "", ""), "mine");
        EXPECT_EQ(GetSharedString("A", "", ""), "2, longer");
    }
    WriteStore("REGEDIT4\n\n[HKCU\\Software\\Vantori\\Shared]\n\"A\"=\"3\"\n");
    RegistryStore::ReadScope again;
    EXPECT_EQ(GetSharedString("A", "", ""), "3");
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

TEST_F(RegistryStoreTest, AnotherProcessWaitsWhileAGroupOfChangesIsMade) {
    WriteStore(BulkStore(2));
    int go[2];
    int started[2];
    ASSERT_EQ(::pipe(go), 0);
    ASSERT_EQ(::pipe(started), 0);
    const pid_t child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        char byte;
        if (::read(go[0], &byte, 1) != 1)
            ::_exit(2);
        (void)!::write(started[1], "x", 1);
        const bool written = ResumeStep([] { SetSharedString("Second", "child", ""); });
        ::_exit(written ? 0 : 1);
    }
    {
        RegistryStore::Changes changes;
        SetSharedString("First", "parent", "");
        ASSERT_EQ(::write(go[1], "x", 1), 1);
        char byte;
        ASSERT_EQ(::read(started[0], &byte, 1), 1);
        std::this_thread::sleep_for(std::chrono::milliseconds(300));
        EXPECT_EQ(ReadStore(), BulkStore(2)) << "the other writer waits for the lock";
        changes.Commit();
    }
    int status = 0;
    ::waitpid(child, &status, 0);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
    EXPECT_EQ(GetSharedString("First", "", ""), "parent");
    EXPECT_EQ(GetSharedString("Second", "", ""), "child");
    for (int fd : {go[0], go[1], started[0], started[1]})
        ::close(fd);
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
