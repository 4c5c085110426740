// How a run of the built program ends when it is interrupted: by a signal, a second Ctrl-C,
// its output closing, a full disk, an error that escapes. Whatever the end, the exit status
// says what happened, no temporary file is left and no file of the user's is changed.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <filesystem>
#include <fstream>
#include <functional>
#include <string>
#include <vector>

#include "cli/DemoFixture.h"
#include "cli/Interrupt.h"
#include "environment/LibFile.h"

#ifdef __linux__
#include <fcntl.h>
#include <signal.h>
#include <sys/ioctl.h>
#include <sys/resource.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <thread>
#endif

namespace vtr::cli {
namespace {

namespace fs = std::filesystem;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::SizeIs;

#ifdef __linux__

// The built program, run as a child process: standard output to a file, standard error to a
// pipe of one page that the test reads as it likes. While the test does not read, the
// program's --log fills the pipe and then waits in its write, in the middle of the run.
class ProgramRun {
  public:
    ProgramRun(const std::vector<std::string>& arguments, const std::string& outFile,
               const std::function<void()>& inChild = {}) {
        int err[2];
        if (::pipe2(err, O_CLOEXEC) != 0)
            return;
        ::fcntl(err[0], F_SETPIPE_SZ, 4096);
        std::vector<std::string> strings = {VTR_BINARY_DIR "/src/cli/vantori-verify"};
        strings.insert(strings.end(), arguments.begin(), arguments.end());
        pid_ = ::fork();
        if (pid_ == 0) {
            // As a shell starts a program: default dispositions, nothing blocked.
            for (int signalNumber : {SIGINT, SIGTERM, SIGHUP, SIGPIPE, SIGXFSZ})
                ::signal(signalNumber, SIG_DFL);
            sigset_t none;
            sigemptyset(&none);
            ::sigprocmask(SIG_SETMASK, &none, nullptr);
            const int out = ::open(outFile.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0644);
            ::dup2(out, 1);
            ::dup2(err[1], 2);
            if (inChild)
                inChild();
            std::vector<char*> argv;
            for (std::string& s : strings)
                argv.push_back(s.data());
            argv.push_back(nullptr);
            ::execv(argv[0], argv.data());
            ::_exit(127);
        }
        ::close(err[1]);
        errFd_ = err[0];
    }
    ~ProgramRun() {
        CloseErr();
        if (pid_ > 0 && !waited_) {
            ::kill(pid_, SIGKILL);
            Wait();
        }
    }
    ProgramRun(const ProgramRun&) = delete;
    ProgramRun& operator=(const ProgramRun&) = delete;

    bool Started() const { return pid_ > 0 && errFd_ >= 0; }

    // Reads standard error until it holds the text; false when it ended first.
    bool ReadUntil(const std::string& text) {
        while (err_.find(text) == std::string::npos) {
            if (!ReadSome())
                return false;
        }
        return true;
    }
    // Reads standard error to its end.
    const std::string& ReadRest() {
        while (ReadSome()) {
        }
        return err_;
    }
    void CloseErr() {
        if (errFd_ >= 0)
            ::close(errFd_);
        errFd_ = -1;
    }

    // True once the program waits in a write to the full pipe (nothing of the run can go on
    // until the test reads); false when that cannot be told on this system or never happens.
    bool WaitUntilBlockedInWrite() {
        for (int i = 0; i < 20000; ++i) {
            std::ifstream syscall("/proc/" + std::to_string(pid_) + "/syscall");
            if (!syscall)
                return false;
            // A number while it waits in a system call; "running" otherwise.
            long number = -1;
            syscall >> number;
            int pending = 0;
            if (number == SYS_write && ::ioctl(errFd_, FIONREAD, &pending) == 0 && pending > 3000)
                return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        return false;
    }

    // Sends the signal and waits until the program has taken it (it is no longer pending).
    void Send(int signalNumber) {
        ASSERT_EQ(::kill(pid_, signalNumber), 0);
        const unsigned long long bit = 1ull << (signalNumber - 1);
        for (int i = 0; i < 20000; ++i) {
            std::ifstream status("/proc/" + std::to_string(pid_) + "/status");
            unsigned long long pending = 0;
            for (std::string line; std::getline(status, line);) {
                if (line.rfind("SigPnd:", 0) == 0 || line.rfind("ShdPnd:", 0) == 0)
                    pending |= std::stoull(line.substr(7), nullptr, 16);
            }
            if ((pending & bit) == 0)
                return;
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        FAIL() << "signal " << signalNumber << " never taken";
    }

    // The status waitpid gives.
    int Wait() {
        int status = 0;
        while (::waitpid(pid_, &status, 0) < 0 && errno == EINTR) {
        }
        waited_ = true;
        return status;
    }

  private:
    bool ReadSome() {
        char buffer[4096];
        for (;;) {
            const ssize_t n = ::read(errFd_, buffer, sizeof buffer);
            if (n < 0 && errno == EINTR)
                continue;
            if (n <= 0)
                return false;
            err_.append(buffer, static_cast<std::size_t>(n));
            return true;
        }
    }

    pid_t pid_ = -1;
    int errFd_ = -1;
    bool waited_ = false;
    std::string err_;
};

class EndingsTest : public testing::DemoTest {
  protected:
    // The driver's temporary files in the test's TMPDIR, which the program inherits.
    std::vector<std::string> VerifierTempFiles() const {
        std::vector<std::string> names;
        for (const std::string& name : TempFiles()) {
            if (name.rfind("VTRVer-", 0) == 0)
                names.push_back(name);
        }
        return names;
    }
    // The show run, with its log on standard error and its JSON on standard output.
    std::vector<std::string> ShowRun() const {
        return {
            "--show",   Demo("data/shows/Evening.lss"), "--log", "--format", "json", "--registry",
            DemoStore()};
    }
    std::string OutFile() const { return folder_.File("out.json"); }
    nlohmann::json Out() const {
        return nlohmann::json::parse(testsupport::ReadFileBytes(OutFile()));
    }
};

TEST_F(EndingsTest, ASignalCancelsTheRunWhichSaysSoExits130AndLeavesNoTemporaryFile) {
    const std::vector<std::pair<int, std::string>> signals = {
        {SIGINT,
         "vantori-verify: Ctrl-C: cancelling. The check that is running finishes first; press "
         "Ctrl-C again to stop at once.\n"},
        {SIGTERM, "vantori-verify: terminated (SIGTERM): cancelling the verification.\n"},
        {SIGHUP, "vantori-verify: hang-up (SIGHUP): cancelling the verification.\n"}};
    const auto before = Snapshot();
    for (const auto& [signalNumber, notice] : signals) {
        ProgramRun run(ShowRun(), OutFile());
        ASSERT_TRUE(run.Started());
        ASSERT_TRUE(run.ReadUntil(": Checking: ")) << signalNumber;
        // The show is verified through two temporary schedules, there while the run goes on.
        EXPECT_THAT(VerifierTempFiles(), SizeIs(2)) << signalNumber;
        run.Send(signalNumber);
        const std::string err = run.ReadRest();
        const int status = run.Wait();
        ASSERT_TRUE(WIFEXITED(status)) << signalNumber;
        EXPECT_EQ(WEXITSTATUS(status), 130) << signalNumber;
        EXPECT_THAT(err, HasSubstr(notice));
        EXPECT_THAT(err, HasSubstr(": Verification cancelled\n"));
        const nlohmann::json out = Out();
        EXPECT_EQ(out["cancelled"], true) << signalNumber;
        EXPECT_THAT(VerifierTempFiles(), IsEmpty()) << signalNumber;
    }
    EXPECT_EQ(Snapshot(), before);
}

TEST_F(EndingsTest, OutputThatClosesCancelsTheRunToo) {
    // As in: vantori-verify --show Evening.lss --log 2>&1 | head -1
    ProgramRun run(ShowRun(), OutFile());
    ASSERT_TRUE(run.Started());
    ASSERT_TRUE(run.ReadUntil(": Checking: "));
    EXPECT_THAT(VerifierTempFiles(), SizeIs(2));
    run.CloseErr();
    const int status = run.Wait();
    ASSERT_TRUE(WIFEXITED(status)) << (WIFSIGNALED(status) ? WTERMSIG(status) : 0);
    EXPECT_EQ(WEXITSTATUS(status), 130);
    EXPECT_EQ(Out()["cancelled"], true);
    EXPECT_THAT(VerifierTempFiles(), IsEmpty());
}

TEST_F(EndingsTest, ASecondCtrlCEndsTheRunAtOnceAndStillRemovesTheTemporaryFiles) {
    ProgramRun run(ShowRun(), OutFile());
    ASSERT_TRUE(run.Started());
    ASSERT_TRUE(run.ReadUntil(": Checking: "));
    // The run stands still in the middle, in a write of its log, so it cannot finish (and
    // remove its temporary files) on its own between the two signals.
    if (!run.WaitUntilBlockedInWrite())
        GTEST_SKIP() << "cannot tell here when the program waits in a write";
    ASSERT_THAT(VerifierTempFiles(), SizeIs(2));
    run.Send(SIGINT);
    ASSERT_THAT(VerifierTempFiles(), SizeIs(2));
    run.Send(SIGINT);
    run.ReadRest();  // had the run gone on, it would have needed this
    const int status = run.Wait();
    ASSERT_TRUE(WIFSIGNALED(status));
    EXPECT_EQ(WTERMSIG(status), SIGINT);
    EXPECT_THAT(VerifierTempFiles(), IsEmpty());
    // It ended before it printed anything.
    EXPECT_EQ(testsupport::ReadFileBytes(OutFile()), "");
}

TEST_F(EndingsTest, OnAFullDiskTheReportBeforeStaysAndNothingIsLeftBesideIt) {
    const std::string report = folder_.File("reports/report.txt");
    fs::create_directories(folder_.File("reports"));
    testsupport::WriteFileBytes(report, "the report of yesterday\r\n");
    // Files of the program may not grow past 1 KiB, as on a disk with 1 KiB left; the
    // program is not told to ignore the signal such a write raises.
    ProgramRun run({"--schedule", "--quiet", "--output", report, "--registry", DemoStore()},
                   "/dev/null", [] {
                       const rlimit limit{1024, 1024};
                       ::setrlimit(RLIMIT_FSIZE, &limit);
                   });
    ASSERT_TRUE(run.Started());
    const std::string err = run.ReadRest();
    const int status = run.Wait();
    ASSERT_TRUE(WIFEXITED(status)) << (WIFSIGNALED(status) ? WTERMSIG(status) : 0);
    EXPECT_EQ(WEXITSTATUS(status), 3);
    EXPECT_EQ(err,
              "vantori-verify: Cannot write the results file " + report + ": File too large\n");
    EXPECT_EQ(testsupport::ReadFileBytes(report), "the report of yesterday\r\n");
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder_.File("reports")))
        names.push_back(entry.path().filename().string());
    EXPECT_EQ(names, std::vector<std::string>{"report.txt"});

    // With room, the same run replaces it.
    ProgramRun roomy({"--schedule", "--quiet", "--output", report, "--registry", DemoStore()},
                     "/dev/null");
    roomy.ReadRest();
    const int roomyStatus = roomy.Wait();
    EXPECT_TRUE(WIFEXITED(roomyStatus) && WEXITSTATUS(roomyStatus) == 2);
    EXPECT_THAT(testsupport::ReadFileBytes(report),
                ::testing::StartsWith("Message Number: 16\r\n"));
}

TEST(LastResortCleanUp, AnErrorThatEndsTheProgramRemovesTheTemporaryFilesFirst) {
    testsupport::TempFolder folder;
    const std::string temp = folder.File("VTRVer-WS-test.tmp");
    testsupport::WriteFileBytes(temp, "");
    const pid_t child = ::fork();
    if (child == 0) {
        ::signal(SIGABRT, SIG_DFL);
        ::close(2);  // what terminate says is not the test's business
        InstallLastResortCleanUp();
        LibFile::RegisterTempFile(temp);
        std::terminate();
    }
    int status = 0;
    ::waitpid(child, &status, 0);
    EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGABRT);
    EXPECT_FALSE(fs::exists(temp));
}

#endif  // __linux__

}  // namespace
}  // namespace vtr::cli
