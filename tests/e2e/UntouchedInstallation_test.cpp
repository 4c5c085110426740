// Whole verifications of real installations (the demo and a large generated one) as a
// schedule, as a show and as a sequence: run to the end, cancelled half way, and with a
// temporary folder that cannot be written. After every one of them every file of the
// installation has its bytes and its time of last change, nothing is added to it, no
// temporary file of the verifier is left, and the settings store differs from what it was
// only by the ignore entries the user added while the run went on.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <map>
#include <optional>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "DemoInstance.h"
#include "engine/IgnoreLists.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/RegistryFile.h"
#include "environment/VTRCommon.h"
#include "schedule/DateTime.h"
#include "support/TempStore.h"
#include "support/VerifierFixture.h"
#include "vtrsupport/InstallationGenerator.h"
#include "vtrsupport/PeImage.h"

#ifndef _WIN32
#include <sys/stat.h>
#include <unistd.h>
#endif

namespace vtr {
namespace {

namespace fs = std::filesystem;
using ::testing::IsEmpty;
using ::testing::StartsWith;

constexpr const char* kTempPrefixes[] = {"VTRVer-Show-", "VTRVer-WS-", "VTRVer-YS-"};

// Every file and folder below a root: a file with its bytes and time of last change.
struct Snapshot {
    std::map<std::string, std::pair<std::string, fs::file_time_type>> files;
    std::set<std::string> folders;
    bool operator==(const Snapshot&) const = default;
};

Snapshot Take(const std::string& root, const std::string& except) {
    Snapshot snapshot;
    // Compared as normal paths: on Windows the store's name may mix both separators.
    const fs::path skipped = fs::path(except).lexically_normal();
    for (const auto& entry : fs::recursive_directory_iterator(root)) {
        const std::string path = entry.path().string();
        if (entry.is_directory()) {
            snapshot.folders.insert(path);
        } else if (entry.path().lexically_normal() != skipped) {
            snapshot.files[path] = {testsupport::ReadFileBytes(path), entry.last_write_time()};
        }
    }
    return snapshot;
}

// What differs between two snapshots, for the failure message.
std::string Differences(const Snapshot& before, const Snapshot& after) {
    std::string out;
    for (const auto& [path, file] : before.files) {
        auto other = after.files.find(path);
        if (other == after.files.end())
            out += "removed " + path + "\n";
        else if (other->second.first != file.first)
            out += "changed " + path + "\n";
        else if (other->second.second != file.second)
            out += "touched " + path + "\n";
    }
    for (const auto& [path, file] : after.files) {
        if (!before.files.count(path))
            out += "added " + path + "\n";
    }
    for (const auto& folder : after.folders) {
        if (!before.folders.count(folder))
            out += "added folder " + folder + "\n";
    }
    return out;
}

// The files of a folder whose names begin with one of the verifier's temporary prefixes.
std::vector<std::string> VerifierTempFiles(const std::string& folder) {
    std::vector<std::string> found;
    std::error_code error;
    for (const auto& entry : fs::directory_iterator(folder, error)) {
        const std::string name = entry.path().filename().string();
        for (const char* prefix : kTempPrefixes) {
            if (name.rfind(prefix, 0) == 0)
                found.push_back(name);
        }
    }
    return found;
}

// A line of the store that belongs to the ignore lists (their values, and the section
// that holds them), or a blank line.
bool IsIgnoreListLine(const std::string& line) {
    static const std::vector<std::string> names = {"\"CountIgnoreMsgNum\"=", "\"IgnoreMsgNum",
                                                   "\"CountIgnoreMsg\"=", "\"IgnoreMsg"};
    for (const std::string& name : names) {
        if (line.rfind(name, 0) == 0)
            return true;
    }
    return line.empty() || line == "\r" ||
           line.rfind("[HKEY_CURRENT_USER\\Software\\Vantori\\Verifier]", 0) == 0;
}

std::vector<std::string> OtherLines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        if (!IsIgnoreListLine(line))
            lines.push_back(line);
    }
    return lines;
}

// The store's content without the ignore lists' key.
RegistryFile::Key WithoutIgnoreLists(const std::string& bytes) {
    RegistryFile::Key root = RegistryFile::Document::Parse(bytes).Root();
    const RegistryFile::KeyPath vantori = {"Software", "Vantori"};
    RegistryFile::Key* key = &root;
    for (const std::string& name : vantori) {
        auto it = key->subkeys.find(RegistryFile::Fold(name));
        if (it == key->subkeys.end())
            return root;
        key = &it->second;
    }
    key->subkeys.erase(RegistryFile::Fold("Verifier"));
    return root;
}

// The two ignore lists as the store holds them.
std::pair<std::vector<std::string>, std::vector<std::string>> StoredIgnoreLists() {
    LibVerify::IgnoredMessageNumbers().Clear();
    LibVerify::IgnoredResultKeys().Clear();
    IgnoreLists::LoadIgnoreLists();
    return {LibVerify::IgnoredMessageNumbers().Entries(), LibVerify::IgnoredResultKeys().Entries()};
}

enum class Target { Schedule, Show, Sequence };
enum class Mode { Whole, Cancelled, NoTempFolder };

const char* Name(Target target) {
    switch (target) {
        case Target::Schedule:
            return "schedule";
        case Target::Show:
            return "show";
        default:
            return "sequence";
    }
}

const char* Name(Mode mode) {
    switch (mode) {
        case Mode::Whole:
            return "whole";
        case Mode::Cancelled:
            return "cancelled";
        default:
            return "no temporary folder";
    }
}

// The user at the window: ignores the first finding that can be ignored, and every result
// with the message number of the next one, while the run goes on.
class IgnoringUser : public testsupport::RecordingClient {
  public:
    void ResultAdded(const ResultPtr& result) override {
        RecordingClient::ResultAdded(result);
        // Ignorable() tells whether the result is ignored already.
        if (result->Ignorable() || result->Severity() == Severity::Info)
            return;
        if (ignoredKeys.empty()) {
            IgnoreLists::IgnoreResult(*result);
            ignoredKeys.push_back(result->IgnoreKey());
            firstNumber_ = result->MessageNumber();
        } else if (ignoredNumbers.empty() && result->MessageNumber() != firstNumber_) {
            IgnoreLists::IgnoreMessageNumber(result->MessageNumber());
            ignoredNumbers.push_back(std::to_string(result->MessageNumber()));
        }
    }

    std::vector<std::string> ignoredKeys;
    std::vector<std::string> ignoredNumbers;

  private:
    int32_t firstNumber_ = 0;
};

class UntouchedInstallation : public testsupport::StoreTest {
  protected:
    static DateTime Now() { return DateTime::FromParts(2031, 3, 14, 19, 30, 0); }

    UntouchedInstallation() : clock_([] { return Now(); }) { fs::create_directories(TempDir()); }

    ~UntouchedInstallation() override {
        LibVerify::SetEventPump({});
        LibVerify::DeleteTempFiles();
        LibVerify::IgnoredMessageNumbers().Clear();
        LibVerify::IgnoredResultKeys().Clear();
        LibVerify::ClearResults();
    }

    void UseDemo() {
        root_ = folder_.File("demo");
        demo::InstanceOptions options;
        options.today = Now().Date();
        options.writeAppFile = [](const std::string& path, const std::string& version) {
            testsupport::WritePeImage(path, version);
        };
        demo::Instantiate(VTR_SOURCE_DIR "/examples/demo", root_, options);
        storeFile_ = root_ + "/registry.reg";
        showFile_ = root_ + "/data/shows/Weekend.lss";
        sequenceFile_ = root_ + "/data/sequences/Goodnight.las";  // on a universe not set up
    }

    void UseGenerated() {
        root_ = folder_.File("generated");
        gen::InstallationOptions options;
        options.shows = 8;
        options.sequencesPerShow = 8;
        options.channelsPerSequence = 48;
        options.eventsPerChannel = 8;
        options.calendarDays = 3;
        options.calendarStart = Now().Date();
        options.faults = true;
        options.writeApplicationFile = [](const std::string& path, const std::string& version) {
            testsupport::WritePeImage(path, version);
        };
        const gen::Installation installation = gen::MakeInstallation(root_, options);
        storeFile_ = installation.registryFile;
        showFile_ = installation.showFiles.back();  // the show of deliberate faults
        // A subsequence cycle and a channel on a network that is not defined.
        sequenceFile_ = installation.nonMediaFolder + "CycleA.las";
        ASSERT_TRUE(fs::exists(sequenceFile_));
    }

    // Selects the target as the front ends do; false (with the reason) when it cannot be set
    // up, which is the outcome without a temporary folder for a show or a sequence.
    bool Select(Target target, std::string& failure) {
        try {
            switch (target) {
                case Target::Schedule:
                    LibVerify::SetScheduleFiles(VTRCommon::GetWeeklyScheduleFile(),
                                                VTRCommon::GetYearlyScheduleFile());
                    break;
                case Target::Show:
                    LibVerify::VerifyShowFile(showFile_);
                    break;
                case Target::Sequence:
                    LibVerify::VerifySequenceFile(sequenceFile_);
                    break;
            }
        } catch (const VtrError& error) {
            EXPECT_EQ(error.Number(), ErrorNumbers::UserMessage);
            failure = error.Description();
            return false;
        }
        return true;
    }

    // One run of the target in the mode, followed by every check of what it left.
    void RunAndCheck(Target target, Mode mode, int checksOfWholeRun) {
        SCOPED_TRACE(std::string(Name(target)) + ", " + Name(mode));
        const Snapshot before = Take(root_, storeFile_);
        const std::string storeBefore = testsupport::ReadFileBytes(storeFile_);
        const auto storeTimeBefore = fs::last_write_time(storeFile_);
        const auto listsBefore = StoredIgnoreLists();

        // Without a temporary folder that can be written: TMPDIR names a folder that does not
        // take new files (read-only; or, for a user whom permissions do not stop, a path
        // below a plain file).
        std::string tempFolder = TempDir();
        // Windows takes its temporary folder from TMP.
        std::optional<testsupport::ScopedEnvironment> noTemp, noWindowsTemp;
        if (mode == Mode::NoTempFolder) {
            tempFolder = UnwritableFolder();
            noTemp.emplace("TMPDIR", tempFolder);
            noWindowsTemp.emplace("TMP", tempFolder);
        }

        IgnoringUser user;
        std::vector<std::string> tempFilesDuringRun;
        int pumps = 0;
        LibVerify::SetEventPump([&] {
            if (++pumps == 1)
                tempFilesDuringRun = VerifierTempFiles(tempFolder);
            if (mode == Mode::Cancelled && pumps == checksOfWholeRun / 2)
                LibVerify::CancelVerification();
        });
        std::string failure;
        const bool selected = Select(target, failure);
        if (selected)
            LibVerify::RunVerification();
        LibVerify::SetEventPump({});

        // How the run went.
        if (mode == Mode::NoTempFolder && target != Target::Schedule) {
            EXPECT_FALSE(selected);
            EXPECT_THAT(failure, StartsWith("Cannot get temp file, error "));
            EXPECT_THAT(user.log, IsEmpty());
        } else {
            ASSERT_TRUE(selected) << failure;
            ASSERT_FALSE(user.log.empty());
            EXPECT_EQ(user.log.back(), std::string("ChecksCompleted ") +
                                           (mode == Mode::Cancelled ? "true" : "false"));
            if (mode == Mode::Cancelled) {
                EXPECT_LT(LibVerify::ChecksPerformedCount(), checksOfWholeRun);
                EXPECT_THAT(user.Lines("Cancelled"), ::testing::SizeIs(1));
            } else {
                EXPECT_EQ(LibVerify::ChecksPerformedCount(), checksOfWholeRun);
            }
            // The wrapping files were where the check below looks for them.
            const std::size_t wrapping = target == Target::Sequence ? 3
                                         : target == Target::Show   ? 2
                                                                    : 0;
            EXPECT_EQ(tempFilesDuringRun.size(), wrapping);
        }

        // Every file of the installation as it was, and nothing added to it.
        const Snapshot after = Take(root_, storeFile_);
        EXPECT_TRUE(after == before) << Differences(before, after);
        // No temporary file of the verifier, wherever the temporary folder was.
        EXPECT_THAT(VerifierTempFiles(TempDir()), IsEmpty());
        EXPECT_THAT(VerifierTempFiles(tempFolder), IsEmpty());
        EXPECT_THAT(VerifierTempFiles(fs::path(storeFile_).parent_path().string()), IsEmpty());

        // The store changed only by the ignore entries made during the run.
        const std::string storeAfter = testsupport::ReadFileBytes(storeFile_);
        if (user.ignoredKeys.empty() && user.ignoredNumbers.empty()) {
            EXPECT_EQ(storeAfter, storeBefore);
            EXPECT_EQ(fs::last_write_time(storeFile_), storeTimeBefore);
        } else {
            EXPECT_NE(storeAfter, storeBefore);
            EXPECT_TRUE(RegistryFile::SameContent(WithoutIgnoreLists(storeAfter),
                                                  WithoutIgnoreLists(storeBefore)));
            EXPECT_EQ(OtherLines(storeAfter), OtherLines(storeBefore));
            auto expected = listsBefore;
            expected.first.insert(expected.first.end(), user.ignoredNumbers.begin(),
                                  user.ignoredNumbers.end());
            expected.second.insert(expected.second.end(), user.ignoredKeys.begin(),
                                   user.ignoredKeys.end());
            EXPECT_EQ(StoredIgnoreLists(), expected);
        }
        // Only the store's own file is in its folder: no half-written copy of it.
        for (const auto& entry : fs::directory_iterator(fs::path(storeFile_).parent_path())) {
            EXPECT_EQ(entry.path().filename().string().find(".vtrtmp-"), std::string::npos)
                << entry.path();
        }
    }

    // The number of checks of a whole run of the target, on a copy of the settings store so
    // that the installation's own store sees only the runs under test.
    int ChecksOfWholeRun(Target target) {
        const std::string copy = folder_.File("store-copy.reg");
        // Removed first: the Windows build's library refuses to overwrite even when asked to.
        fs::remove(copy);
        fs::copy_file(storeFile_, copy);
        testsupport::ScopedStore store(copy);
        std::string failure;
        EXPECT_TRUE(Select(target, failure)) << failure;
        LibVerify::RunVerification();
        return LibVerify::ChecksPerformedCount();
    }

    void VerifyEveryWay() {
        testsupport::ScopedStore store(storeFile_);
        for (const Target target : {Target::Schedule, Target::Show, Target::Sequence}) {
            const int checks = ChecksOfWholeRun(target);
            ASSERT_GT(checks, 10) << Name(target);
            for (const Mode mode : {Mode::Whole, Mode::Cancelled, Mode::NoTempFolder})
                RunAndCheck(target, mode, checks);
        }
    }

    std::string UnwritableFolder() {
        const std::string folder = folder_.File("read-only tmp");
        fs::create_directories(folder);
#ifndef _WIN32
        ::chmod(folder.c_str(), 0555);
        if (::access(folder.c_str(), W_OK) != 0)
            return folder;
#endif
        // Permissions do not stop this user: a folder path below a plain file.
        const std::string file = folder_.File("plain file");
        testsupport::WriteFileBytes(file, "");
        return file + "/tmp";
    }

    std::string root_;
    std::string storeFile_;
    std::string showFile_;
    std::string sequenceFile_;

  private:
    ScopedNowSource clock_;
};

TEST_F(UntouchedInstallation, TheDemoAsScheduleShowAndSequence) {
    UseDemo();
    VerifyEveryWay();
}

TEST_F(UntouchedInstallation, ALargeGeneratedInstallationAsScheduleShowAndSequence) {
    UseGenerated();
    VerifyEveryWay();
}

}  // namespace
}  // namespace vtr
