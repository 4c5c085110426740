// The verification driver and the file-version reader.
//
// Judged by:
//   BM_CheckQueue       time per check of a run of 100,000 checks (each queueing a child
//                       and two repeats that the queue drops) over that of a run of 1,000
//                       (per_check_ratio: a few at most, from caches; a scan of the queue
//                       per added check would make it about 100)
//   BM_VerifySchedule   a whole run over a schedule of 300 shows drawing on 1,000 sequences
//                       (about 3,900 checks), over a budget of one second
//                       (budget_ratio, must stay well below 1)
//   BM_FileVersionHuge  reading the version of a 6 GiB file over reading it from the same
//                       image at its real size (size_ratio, near 1: the reader never reads
//                       more than its few pieces)

#include <benchmark/benchmark.h>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "engine/LibVerify.h"
#include "environment/FileVersion.h"
#include "environment/RegistryStore.h"
#include "environment/VTRCommon.h"
#include "schedule/Schedule.h"
#include "show/Show.h"
#include "show/WholeFile.h"
#include "vtrsupport/PeImage.h"

namespace {

using namespace vtr;
using Clock = std::chrono::steady_clock;

// A temporary folder with an empty settings store selected, removed afterwards.
class Workspace {
  public:
    Workspace() {
        static std::atomic<unsigned> counter{0};
        folder_ = std::filesystem::temp_directory_path() /
                  ("vtr-bench-driver-" + std::to_string(Clock::now().time_since_epoch().count()) +
                   "-" + std::to_string(counter++));
        std::filesystem::create_directories(folder_);
        previous_ = RegistryStore::Install(RegistryStore::OpenFileStore(File("registry.reg")));
        VTRCommon::ResetCachedFolders();
    }
    ~Workspace() {
        RegistryStore::Install(std::move(previous_));
        VTRCommon::ResetCachedFolders();
        std::error_code ignored;
        std::filesystem::remove_all(folder_, ignored);
    }
    std::string File(const std::string& name) const { return (folder_ / name).string(); }
    void Write(const std::string& name, const std::string& text) const {
        WriteWholeFile(File(name), text);
    }

  private:
    std::filesystem::path folder_;
    std::unique_ptr<RegistryStore::Backend> previous_;
};

class BodyCheck : public ICheck {
  public:
    BodyCheck(std::string id, std::function<void()> body)
        : id_(std::move(id)), body_(std::move(body)) {}
    void Check() override {
        if (body_)
            body_();
    }
    std::string CheckIdentifier() override { return id_; }
    std::string Description() override { return id_; }

  private:
    std::string id_;
    std::function<void()> body_;
};

// Starts the test's checks when the first root check is announced and times the run from
// then to ChecksCompleted.
class Timer : public INotificationClient {
  public:
    explicit Timer(std::function<void()> seed) : seed_(std::move(seed)) {
        LibVerify::AddNotificationClient(this);
    }
    ~Timer() override { LibVerify::RemoveNotificationClient(this); }
    void CheckAdded(ICheck&) override {}
    void CheckCompleted(ICheck&) override {}
    void Checking(ICheck&) override {
        if (!seeded_) {
            seeded_ = true;
            start_ = Clock::now();
            seed_();
        }
    }
    void ChecksCompleted(bool) override { end_ = Clock::now(); }
    void Initializing() override {}
    void ResultAdded(const ResultPtr&) override {}
    void TransientMessage(const std::string&) override {}
    void VerificationCancelled() override {}
    double Seconds() const { return std::chrono::duration<double>(end_ - start_).count(); }

  private:
    std::function<void()> seed_;
    bool seeded_ = false;
    Clock::time_point start_;
    Clock::time_point end_;
};

// One run of `parents` checks, each queueing one child and one repeat of an earlier
// parent; the seconds from the first check to the end of the run.
double QueueRun(int parents) {
    Timer timer([parents] {
        for (int i = 0; i < parents; ++i) {
            const std::string id = "p" + std::to_string(i);
            LibVerify::AddCheck(std::make_shared<BodyCheck>(id, [i] {
                LibVerify::AddCheck(std::make_shared<BodyCheck>("c" + std::to_string(i), nullptr));
                LibVerify::AddCheck(
                    std::make_shared<BodyCheck>("p" + std::to_string(i / 2), nullptr));
                LibVerify::AddCheck(
                    std::make_shared<BodyCheck>("c" + std::to_string(i / 2), nullptr));
            }));
        }
    });
    LibVerify::RunVerification();
    return timer.Seconds();
}

void BM_CheckQueue(benchmark::State& state) {
    Workspace workspace;
    const int large = static_cast<int>(state.range(0));
    const int small = large / 100;
    double largeSeconds = 0;
    double smallSeconds = 0;
    for (auto _ : state) {
        largeSeconds = QueueRun(large);
        smallSeconds = QueueRun(small);
        state.SetIterationTime(largeSeconds);
    }
    state.counters["checks"] = static_cast<double>(LibVerify::ChecksPerformedCount());
    state.counters["per_check_ratio"] = (largeSeconds / large) / (smallSeconds / small);
}
BENCHMARK(BM_CheckQueue)
    ->Arg(100000)
    ->UseManualTime()
    ->Iterations(3)
    ->Unit(benchmark::kMillisecond);

void BM_VerifySchedule(benchmark::State& state) {
    Workspace workspace;
    const int shows = static_cast<int>(state.range(0));
    constexpr int kSequences = 1000;
    constexpr int kPerSection = 5;
    workspace.Write("registry.reg",
                    "Windows Registry Editor Version 5.00\r\n\r\n"
                    "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
                    "\"PostInstall\"=dword:00000001\r\n\"PostInstallVer\"=dword:00000035\r\n"
                    "\"UserDataPath\"=\"" +
                        workspace.File("") + "\"\r\n");
    Schedule weekly;
    const int slot = TimeConstants::SecondsPerWeek / shows;
    int next = 0;
    for (int i = 0; i < shows; ++i) {
        Show show;
        for (const PlaylistPtr* section : {&show.Background(), &show.Main(), &show.Musical()}) {
            for (int k = 0; k < kPerSection; ++k) {
                const int n = next++ % kSequences;
                (*section)->List().push_back(
                    workspace.File("Seq" + std::to_string(n) + (n % 3 == 0 ? ".lms" : ".las")));
            }
        }
        const std::string name = "Show" + std::to_string(i) + ".lss";
        workspace.Write(name, ShowFunctions::ShowToText(show));
        auto start = std::make_shared<WeekTime>();
        start->SetTimeVal(i * slot);
        auto end = std::make_shared<WeekTime>();
        end->SetTimeVal(i * slot + slot / 2);
        weekly.AddShowEventByFile(workspace.File(name), start, end);
    }
    weekly.Save(workspace.File("weeksched.lsc"));
    LibVerify::SetScheduleFiles(workspace.File("weeksched.lsc"), workspace.File("yearsched.lsc"));

    for (auto _ : state)
        LibVerify::RunVerification();
    state.counters["checks"] = static_cast<double>(LibVerify::ChecksPerformedCount());
    state.counters["show_reads"] = static_cast<double>(LibVerify::GetFileLoadCounts().showReads);
    state.counters["budget_ratio"] =
        benchmark::Counter(static_cast<double>(state.iterations()),
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}
BENCHMARK(BM_VerifySchedule)->Arg(300)->Unit(benchmark::kMillisecond);

double VersionSeconds(const std::string& path, int repeats) {
    const auto start = Clock::now();
    for (int i = 0; i < repeats; ++i)
        benchmark::DoNotOptimize(FileVersionText(path));
    return std::chrono::duration<double>(Clock::now() - start).count() / repeats;
}

void BM_FileVersionHuge(benchmark::State& state) {
    Workspace workspace;
    const std::string small = workspace.File("small.dll");
    const std::string huge = workspace.File("huge.dll");
    workspace.Write("small.dll", testsupport::PeImageBytes("9.2.3.1"));
    workspace.Write("huge.dll", testsupport::PeImageBytes("9.2.3.1"));
    std::error_code error;
    std::filesystem::resize_file(huge, std::uintmax_t{6} << 30, error);
    if (error) {
        state.SkipWithError("no room for a sparse file");
        return;
    }
    double hugeSeconds = 0;
    for (auto _ : state)
        hugeSeconds = VersionSeconds(huge, 1000);
    state.counters["version_found"] = FileVersionText(huge) == "9.2.3.1" ? 1 : 0;
    state.counters["size_ratio"] = hugeSeconds / VersionSeconds(small, 1000);
}
BENCHMARK(BM_FileVersionHuge)->Iterations(3)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
