#include "environment/AtomicFile.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "support/Raised.h"
#include "support/TempStore.h"

#ifndef _WIN32
#include <fcntl.h>
#include <signal.h>
#include <sys/file.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>
#endif

namespace vtr {
namespace {

namespace fs = std::filesystem;

class AtomicFileTest : public testsupport::StoreTest {
  protected:
    AtomicFileTest() : folder(folder_.File("reports")) { fs::create_directories(folder); }

    std::string File(const std::string& name) const { return folder + "/" + name; }
    void Write(const std::string& name, const std::string& bytes) const {
        AtomicFile::Write(File(name), bytes, "results file", "Test.Write");
    }
    // What the folder holds, by name.
    std::vector<std::string> Names() const {
        std::vector<std::string> names;
        for (const auto& entry : fs::directory_iterator(folder))
            names.push_back(entry.path().filename().string());
        std::sort(names.begin(), names.end());
        return names;
    }

    std::string folder;
};

TEST_F(AtomicFileTest, WritesANewFileAndReplacesAnOldOneWhole) {
    Write("report.txt", "first\r\n");
    EXPECT_EQ(testsupport::ReadFileBytes(File("report.txt")), "first\r\n");
    Write("report.txt", "");
    EXPECT_EQ(testsupport::ReadFileBytes(File("report.txt")), "");
    const std::string large(3'000'000, 'x');
    Write("report.txt", large);
    EXPECT_EQ(testsupport::ReadFileBytes(File("report.txt")), large);
    EXPECT_EQ(Names(), std::vector<std::string>{"report.txt"});

#ifndef _WIN32
    // A new file gets what the user's mask allows; a replaced one keeps its permissions.
    const mode_t mask = ::umask(022);
    Write("new.txt", "x");
    EXPECT_EQ(fs::status(File("new.txt")).permissions(),
              fs::perms::owner_read | fs::perms::owner_write | fs::perms::group_read |
                  fs::perms::others_read);
    fs::permissions(File("report.txt"),
                    fs::perms::owner_read | fs::perms::owner_write | fs::perms::group_read);
    Write("report.txt", "second");
    EXPECT_EQ(fs::status(File("report.txt")).permissions(),
              fs::perms::owner_read | fs::perms::owner_write | fs::perms::group_read);
    ::umask(mask);

    // A link is followed: the file it names gets the bytes and the link stays.
    fs::create_directories(folder_.File("elsewhere"));
    fs::create_symlink(folder_.File("elsewhere/real.txt"), File("link.txt"));
    Write("link.txt", "through the link");
    EXPECT_TRUE(fs::is_symlink(File("link.txt")));
    EXPECT_EQ(testsupport::ReadFileBytes(folder_.File("elsewhere/real.txt")), "through the link");
    Write("link.txt", "again");
    EXPECT_TRUE(fs::is_symlink(File("link.txt")));
    EXPECT_EQ(testsupport::ReadFileBytes(folder_.File("elsewhere/real.txt")), "again");
#endif
}

TEST_F(AtomicFileTest, AFailureLeavesTheOldFileAndNothingBesideIt) {
    const auto missingFolder = testsupport::Raised([&] { Write("none/report.txt", "x"); });
    ASSERT_TRUE(missingFolder);
    EXPECT_EQ(missingFolder->Number(), 75);
    EXPECT_EQ(missingFolder->Source(), "Test.Write");
    EXPECT_EQ(missingFolder->Description(), "Cannot create the results file " +
                                                File("none/report.txt") +
                                                ": No such file or directory");

    fs::create_directories(File("sub"));
    EXPECT_EQ(testsupport::RaisedDescription([&] { Write("sub", "x"); }),
              "Cannot create the results file " + File("sub") + ": Is a directory");

    // A read-only file stays as it is, even for the superuser.
    testsupport::WriteFileBytes(File("kept.txt"), "old report");
    fs::permissions(File("kept.txt"), fs::perms::owner_read | fs::perms::group_read);
    EXPECT_EQ(testsupport::RaisedDescription([&] { Write("kept.txt", "new report"); }),
              "Cannot create the results file " + File("kept.txt") + ": Permission denied");
    EXPECT_EQ(testsupport::ReadFileBytes(File("kept.txt")), "old report");
    fs::permissions(File("kept.txt"), fs::perms::owner_read | fs::perms::owner_write);
    EXPECT_EQ(Names(), (std::vector<std::string>{"kept.txt", "sub"}));

#ifdef __linux__
    // A device takes the bytes in place, or fails to.
    EXPECT_EQ(testsupport::RaisedDescription(
                  [&] { AtomicFile::Write("/dev/full", "x", "results file", "Test.Write"); }),
              "Cannot write the results file /dev/full: No space left on device");
    AtomicFile::Write("/dev/null", "x", "results file", "Test.Write");
#endif
}

#ifndef _WIN32

TEST_F(AtomicFileTest, OnAFullDiskTheOldReportIsUntouchedAndNoPartOfTheNewOneIsLeft) {
    testsupport::WriteFileBytes(File("report.txt"), "the previous report\r\n");
    // A child process whose files may not grow past 4 KiB, as on a disk that is full.
    int pipeFds[2];
    ASSERT_EQ(::pipe(pipeFds), 0);
    const pid_t child = ::fork();
    if (child == 0) {
        ::close(pipeFds[0]);
        ::signal(SIGXFSZ, SIG_IGN);
        const rlimit limit{4096, 4096};
        ::setrlimit(RLIMIT_FSIZE, &limit);
        const std::string description =
            testsupport::RaisedDescription([&] { Write("report.txt", std::string(100000, 'r')); });
        (void)!::write(pipeFds[1], description.data(), description.size());
        ::_exit(0);
    }
    ::close(pipeFds[1]);
    std::string description;
    char buffer[512];
    for (ssize_t n; (n = ::read(pipeFds[0], buffer, sizeof buffer)) > 0;)
        description.append(buffer, static_cast<std::size_t>(n));
    ::close(pipeFds[0]);
    int status = 0;
    ::waitpid(child, &status, 0);
    ASSERT_TRUE(WIFEXITED(status));
    EXPECT_EQ(description,
              "Cannot write the results file " + File("report.txt") + ": File too large");
    EXPECT_EQ(testsupport::ReadFileBytes(File("report.txt")), "the previous report\r\n");
    EXPECT_EQ(Names(), std::vector<std::string>{"report.txt"});
}

TEST_F(AtomicFileTest, WhatAKilledWriterLeftIsRemovedButNotAWriterAtWork) {
    const std::string stale = File(".report.txt.vtrnew-abc123");
    const std::string live = File(".report.txt.vtrnew-live42");
    const std::string other = File(".other.txt.vtrnew-abc123");
    for (const std::string& path : {stale, live, other})
        testsupport::WriteFileBytes(path, "part of a report");
    // A writer at work holds its new version locked.
    const int liveFd = ::open(live.c_str(), O_RDONLY);
    ASSERT_GE(liveFd, 0);
    ASSERT_EQ(::flock(liveFd, LOCK_EX), 0);

    Write("report.txt", "whole");
    EXPECT_EQ(testsupport::ReadFileBytes(File("report.txt")), "whole");
    EXPECT_EQ(Names(), (std::vector<std::string>{".other.txt.vtrnew-abc123",
                                                 ".report.txt.vtrnew-live42", "report.txt"}));
    ::close(liveFd);
    Write("report.txt", "whole again");
    EXPECT_EQ(Names(), (std::vector<std::string>{".other.txt.vtrnew-abc123", "report.txt"}));
}

#endif

}  // namespace
}  // namespace vtr
