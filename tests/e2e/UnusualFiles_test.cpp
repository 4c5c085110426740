// Every reader of the suite's files given something that is not a file of the suite: a
// pipe (whose open would wait for a writer that never comes), an endless device, and a file
// far larger than any the suite writes. Each answers at once with its own failure, reads
// nothing it cannot hold, and a whole verification of such a target ends normally.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <string>
#include <thread>

#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/LibRegistry.h"
#include "schedule/Schedule.h"
#include "schedule/YearSchedule.h"
#include "sequencelib/Sequence.h"
#include "sequencelib/SequenceInfo.h"
#include "sequencelib/ShellCommandMap.h"
#include "show/Show.h"
#include "show/WholeFile.h"
#include "support/TempStore.h"
#include "support/VerifierFixture.h"

#ifndef _WIN32
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#endif

namespace vtr {
namespace {

#ifndef _WIN32

namespace fs = std::filesystem;
using ::testing::Contains;
using ::testing::HasSubstr;

// Runs the body. Should it still be running after a few seconds, something is waiting on
// the pipe's open: a writer then opens the pipe and leaves at once, which lets the body come
// back, and the test fails instead of hanging.
template <typename Body>
void WithoutWaitingOn(const std::string& pipe, Body&& body) {
    std::atomic<bool> done{false};
    std::atomic<bool> rescued{false};
    std::thread watchdog([&] {
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(5);
        while (!done && std::chrono::steady_clock::now() < deadline)
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
        while (!done) {
            const int fd = ::open(pipe.c_str(), O_WRONLY | O_NONBLOCK);
            if (fd >= 0) {
                rescued = true;
                ::close(fd);
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
        }
    });
    body();
    done = true;
    watchdog.join();
    EXPECT_FALSE(rescued) << "waited for a writer of the pipe " << pipe;
}

class UnusualFiles : public testsupport::SuiteTest {
  protected:
    UnusualFiles()
        : pipe_(folder_.File("pipe")), huge_(folder_.File("huge")), device_("/dev/zero") {
        EXPECT_EQ(::mkfifo(pipe_.c_str(), 0600), 0);
        // One byte more than is ever read whole; the file has no blocks on disk.
        std::ofstream(huge_).close();
        fs::resize_file(huge_, kMaxWholeFileBytes + 1);
    }

    ~UnusualFiles() override {
        LibVerify::DeleteTempFiles();
        LibVerify::ClearResults();
    }

    std::string pipe_;
    std::string huge_;
    std::string device_;
};

TEST_F(UnusualFiles, WholeFilesAreOnlyReadFromFilesTheSuiteCouldHaveWritten) {
    std::string text = "stale";
    WithoutWaitingOn(pipe_, [&] { EXPECT_EQ(ReadWholeFile(pipe_, text), 75); });
    EXPECT_EQ(text, "");
    text = "stale";
    EXPECT_EQ(ReadWholeFile(device_, text), 75);
    EXPECT_EQ(text, "");
    text = "stale";
    EXPECT_EQ(ReadWholeFile(huge_, text), FileErrors::OutOfMemory);
    EXPECT_EQ(text, "");
    EXPECT_EQ(FileErrorDescription(FileErrors::OutOfMemory), "Out of memory");

    // The readers built on it treat each as a file they cannot read.
    for (const std::string& path : {pipe_, device_, huge_}) {
        WithoutWaitingOn(pipe_, [&] {
            EXPECT_EQ(ShowFunctions::LoadShowFile(path), nullptr) << path;
            const SchedulePtr week = ScheduleFunctions::LoadSchedule(path);
            EXPECT_EQ(ScheduleFunctions::ScheduleToText(*week), "") << path;
            EXPECT_FALSE(week->Modified());
            EXPECT_TRUE(YearScheduleFunctions::LoadYearSchedule(path)->Keys().empty()) << path;
            EXPECT_EQ(seqlib::ShellCommandMap::CommandTextIn(path, "12"), "") << path;
        });
    }
}

TEST_F(UnusualFiles, ASequenceOrEditFileThatIsNoFileFailsToLoadAtOnce) {
    for (const std::string& path : {pipe_, device_}) {
        WithoutWaitingOn(pipe_, [&] {
            try {
                seqlib::Sequence().Load(path);
                ADD_FAILURE() << "loaded " << path;
            } catch (const VtrError& error) {
                EXPECT_EQ(error.Description(),
                          "Cannot load sequence file \"" + path +
                              "\": the file cannot be read (it is not a regular file)");
            }
            EXPECT_FALSE(seqlib::SequenceInfoService().GetSequenceInfo(path)) << path;
        });
    }
}

TEST_F(UnusualFiles, ASettingsStoreThatIsAPipeReadsAsUnreadableAndIsNeverReplaced) {
    testsupport::ScopedStore store(pipe_);
    WithoutWaitingOn(pipe_, [&] {
        EXPECT_EQ(LibRegistry::GetRegString(LibRegistry::kCurrentUser, "Software\\Vantori\\Shared",
                                            "AppPath", "default"),
                  "default");
        EXPECT_THROW(LibRegistry::SetRegString(LibRegistry::kCurrentUser,
                                               "Software\\Vantori\\Verifier", "IgnoreMsg1", "x"),
                     VtrError);
    });
    EXPECT_TRUE(fs::is_fifo(pipe_));
}

TEST_F(UnusualFiles, VerifyingAPipeAsShowOrSequenceEndsWithItsFindings) {
    InstallApplicationFiles();
    WithoutWaitingOn(pipe_, [&] {
        LibVerify::VerifyShowFile(pipe_);
        LibVerify::RunVerification();
    });
    EXPECT_EQ(client.log.back(), "ChecksCompleted false");
    EXPECT_THAT(testsupport::ResultTexts(), Contains("22: " + pipe_));

    client.Clear();
    WithoutWaitingOn(pipe_, [&] {
        LibVerify::VerifySequenceFile(pipe_);
        LibVerify::RunVerification();
    });
    EXPECT_EQ(client.log.back(), "ChecksCompleted false");
    EXPECT_THAT(testsupport::ResultTexts(), Contains("24: " + pipe_));
}

#endif  // !_WIN32

}  // namespace
}  // namespace vtr
