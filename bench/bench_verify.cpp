// A verification of the entire schedule of a large generated installation, and the
// intersequence check as its shows grow.
//
// Judged by (printed at the end):
//   verification / bare parse   the command-line verifier (vantori-verify --schedule
//                               --registry FILE --format json, a child process) over a bare
//                               pugixml parse of every sequence file's bytes, measured in the
//                               same run: at most 1.50
//   intersequence doubling      CheckIntersequenceConflicts of a show with 2N sequences over
//                               the same show with N: at most 2.00 (work grows with channels
//                               times overlapping sections, never with the square)
//   peak memory                 the verifier's peak resident set over twice the largest
//                               sequence file plus 300 bytes per loaded channel: below 1.00

#include <benchmark/benchmark.h>
#include <pugixml.hpp>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "checks/CheckIntersequenceConflicts.h"
#include "engine/LibVerify.h"
#include "environment/RegistryStore.h"
#include "environment/VTRCommon.h"
#include "sequencelib/SequenceGenerator.h"
#include "show/Show.h"
#include "show/TriggeredSequences.h"
#include "show/WholeFile.h"
#include "support/SequenceBenchSupport.h"
#include "vtrgen/InstallationGenerator.h"

#if defined(__unix__)
#include <fcntl.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>
#define VTR_BENCH_CHILD_PROCESS 1
extern char** environ;
#endif

namespace {

using namespace vtr;
using Clock = std::chrono::steady_clock;

// The installation: eight shows of ten sequences of 1,000 channels (with the startup,
// shutdown, interactive and background sequences, some 130 MB of sequence text).
constexpr int32_t kShows = 8;
constexpr int32_t kSequencesPerShow = 10;
constexpr int32_t kChannels = 1000;
constexpr int32_t kEvents = 24;
constexpr double kBytesPerChannel = 300;

// The doubling: an animation section of N, then 2N, sequences of 1,000 channels over a
// background of 64, with an interactive group.
constexpr int32_t kDoublingSequences = 12;

struct Fixture {
    bench::BenchFolder folder;
    gen::Installation installation;
    std::vector<std::string> sequenceBytes;
    // The child's figures, from its last run.
    double childSeconds = 0;
    std::uint64_t childPeakBytes = 0;
    int childStatus = -1;
};
Fixture* fixture = nullptr;

void Prepare() {
    fixture = new Fixture;
    gen::InstallationOptions options;
    options.shows = kShows;
    options.sequencesPerShow = kSequencesPerShow;
    options.channelsPerSequence = kChannels;
    options.eventsPerChannel = kEvents;
    options.backgroundChannels = 16;
    fixture->installation = gen::MakeInstallation(fixture->folder.File("install"), options);
    for (const std::string& file : fixture->installation.sequenceFiles)
        fixture->sequenceBytes.push_back(bench::ReadAll(file));
    const auto& i = fixture->installation;
    std::printf(
        "Installation: %zu shows, %zu sequence files, %lld channels, %lld events, "
        "%.1f MB of sequence text (largest file %.1f MB)\n",
        i.showFiles.size(), i.sequenceFiles.size(), static_cast<long long>(i.channels),
        static_cast<long long>(i.events), static_cast<double>(i.sequenceXmlBytes) / 1e6,
        static_cast<double>(i.largestSequenceFileBytes) / 1e6);
}

void BM_BarePugixmlParse(benchmark::State& state) {
    for (auto _ : state) {
        for (const std::string& bytes : fixture->sequenceBytes) {
            pugi::xml_document doc;
            if (!doc.load_buffer(bytes.data(), bytes.size(), pugi::parse_default,
                                 pugi::encoding_utf8)) {
                state.SkipWithError("bare parse failed");
            }
            benchmark::DoNotOptimize(doc.first_child());
        }
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                            static_cast<int64_t>(fixture->installation.sequenceXmlBytes));
}
BENCHMARK(BM_BarePugixmlParse)->Unit(benchmark::kMillisecond)->MinTime(2.0);

#if defined(VTR_BENCH_CHILD_PROCESS) && defined(VTR_VERIFY_PROGRAM)

// Runs the verifier on the installation as a child process, its output thrown away; the
// wall time, the child's peak resident set and its exit status.
bool RunVerifier(double& seconds, std::uint64_t& peakBytes, int& status) {
    const std::string program = VTR_VERIFY_PROGRAM;
    std::vector<std::string> args = {program,      "--schedule",
                                     "--registry", fixture->installation.registryFile,
                                     "--format",   "json"};
    std::vector<char*> argv;
    for (std::string& arg : args)
        argv.push_back(arg.data());
    argv.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, 1, "/dev/null", O_WRONLY, 0);
    posix_spawn_file_actions_addopen(&actions, 2, "/dev/null", O_WRONLY, 0);
    const auto start = Clock::now();
    pid_t pid = 0;
    const int spawned = posix_spawn(&pid, program.c_str(), &actions, nullptr, argv.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    if (spawned != 0)
        return false;
    int waitStatus = 0;
    struct rusage usage {};
    if (wait4(pid, &waitStatus, 0, &usage) != pid)
        return false;
    seconds = std::chrono::duration<double>(Clock::now() - start).count();
    peakBytes = static_cast<std::uint64_t>(usage.ru_maxrss) * 1024;
    status = WIFEXITED(waitStatus) ? WEXITSTATUS(waitStatus) : -1;
    return true;
}

void BM_VerifyEntireSchedule(benchmark::State& state) {
    for (auto _ : state) {
        double seconds = 0;
        std::uint64_t peak = 0;
        int status = -1;
        if (!RunVerifier(seconds, peak, status)) {
            state.SkipWithError("the verifier could not be run");
            break;
        }
        state.SetIterationTime(seconds);
        fixture->childSeconds = seconds;
        fixture->childPeakBytes = std::max(fixture->childPeakBytes, peak);
        fixture->childStatus = status;
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                            static_cast<int64_t>(fixture->installation.sequenceXmlBytes));
    state.counters["exit_status"] = fixture->childStatus;
    state.counters["peak_MB"] = static_cast<double>(fixture->childPeakBytes) / 1e6;
}
BENCHMARK(BM_VerifyEntireSchedule)->UseManualTime()->Iterations(3)->Unit(benchmark::kMillisecond);

#endif

// A show of `count` animation sequences over a background, with an interactive group, in a
// settings store of its own; the sequences loaded into the run's cache beforehand.
class DoublingShow {
  public:
    DoublingShow() {
        previous_ = RegistryStore::Install(RegistryStore::OpenFileStore(folder_.File("none.reg")));
        VTRCommon::ResetCachedFolders();
        namespace seqgen = seqlib::SequenceGenerator;
        seqgen::Options options;
        options.channels = kChannels;
        options.eventsPerChannel = 2;
        options.tracks = 2;
        options.sharedChannels = 2;
        for (int32_t i = 0; i < 2 * kDoublingSequences; ++i) {
            options.gridcraftDevices = i % 2 == 0 ? 3 : -1;
            sequences_.push_back(folder_.File("Anim" + std::to_string(i) + ".las"));
            seqgen::WriteFile(sequences_.back(), options);
        }
        options.gridcraftDevices = -1;
        options.channels = 64;
        seqgen::WriteFile(folder_.File("Glow.las"), options);
        seqgen::WriteFile(folder_.File("Door.las"), options);
    }
    ~DoublingShow() {
        RegistryStore::Install(std::move(previous_));
        VTRCommon::ResetCachedFolders();
    }

    // The show file of the first `count` sequences, its sequences in the run's cache.
    std::string Show(int32_t count) {
        vtr::Show show;
        show.Background()->List() = {folder_.File("Glow.las")};
        show.Main()->List().assign(sequences_.begin(), sequences_.begin() + count);
        auto group = std::make_shared<InteractiveGroup>();
        group->AddTriggeredSequences(TriggeredSequencesFunctions::CreateTriggeredSequences(
            TriggerFunctions::CreateTrigger(0, 1, 1, "Door"), {folder_.File("Door.las")}));
        show.InteractiveGroups().push_back(group);
        const std::string file = folder_.File("Show" + std::to_string(count) + ".lss");
        WriteWholeFile(file, ShowFunctions::ShowToText(show));
        LibVerify::BeginVerification();
        for (const std::string& name : show.Main()->List())
            LibVerify::LoadSequence(name);
        LibVerify::LoadSequence(folder_.File("Glow.las"));
        LibVerify::LoadSequence(folder_.File("Door.las"));
        return file;
    }

  private:
    bench::BenchFolder folder_;
    std::unique_ptr<RegistryStore::Backend> previous_;
    std::vector<std::string> sequences_;
};

// The fastest of a few runs of the check, the results of each run dropped afterwards.
double IntersequenceSeconds(const std::string& showFile, std::size_t& results) {
    double best = 1e9;
    for (int run = 0; run < 7; ++run) {
        CheckIntersequenceConflicts check;
        check.SetShowFilename(showFile);
        const auto start = Clock::now();
        check.Check();
        best = std::min(best, std::chrono::duration<double>(Clock::now() - start).count());
        results = LibVerify::GetResults().size();
        LibVerify::ClearResults();
    }
    return best;
}

double doublingRatio = 0;

void BM_IntersequenceDoubling(benchmark::State& state) {
    DoublingShow shows;
    for (auto _ : state) {
        std::size_t resultsN = 0, results2N = 0;
        const double n = IntersequenceSeconds(shows.Show(kDoublingSequences), resultsN);
        const double twoN = IntersequenceSeconds(shows.Show(2 * kDoublingSequences), results2N);
        state.SetIterationTime(twoN);
        doublingRatio = twoN / n;
        state.counters["N_ms"] = n * 1e3;
        state.counters["2N_ms"] = twoN * 1e3;
        state.counters["results_N"] = static_cast<double>(resultsN);
        state.counters["results_2N"] = static_cast<double>(results2N);
    }
    state.counters["ratio"] = doublingRatio;
}
BENCHMARK(BM_IntersequenceDoubling)->UseManualTime()->Iterations(1)->Unit(benchmark::kMillisecond);

}  // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    Prepare();
    bench::TimeKeepingReporter times;
    benchmark::RunSpecifiedBenchmarks(&times);
    std::printf("\n");

    const auto bare = times.Seconds("BM_BarePugixmlParse");
    const auto verify = times.Seconds("BM_VerifyEntireSchedule");
    if (bare && verify) {
        const double ratio = *verify / *bare;
        std::printf("%-62s %.2f (%.0f ms / %.0f ms; target <= 1.50) %s\n",
                    "Verification of the entire schedule / bare pugixml parse:", ratio,
                    *verify * 1e3, *bare * 1e3, ratio <= 1.5 ? "ok" : "ABOVE TARGET");
        std::printf("%-62s %d (0 clean, 1 warnings, 2 errors)\n",
                    "  verifier exit status:", fixture->childStatus);
    } else {
        std::printf("Verification of the entire schedule: not measured (no verifier program)\n");
    }
    if (fixture->childPeakBytes > 0) {
        const auto& i = fixture->installation;
        const double budget = 2.0 * static_cast<double>(i.largestSequenceFileBytes) +
                              kBytesPerChannel * static_cast<double>(i.channels);
        const double ratio = static_cast<double>(fixture->childPeakBytes) / budget;
        std::printf("%-62s %.2f (%.1f MB / %.1f MB; target < 1.00) %s\n",
                    "Peak memory / (2 x largest file + 300 B per loaded channel):", ratio,
                    static_cast<double>(fixture->childPeakBytes) / 1e6, budget / 1e6,
                    ratio < 1.0 ? "ok" : "ABOVE TARGET");
    }
    if (doublingRatio > 0) {
        std::printf("%-62s %.2f (target <= 2.00) %s\n",
                    "CheckIntersequenceConflicts, 2N sequences / N:", doublingRatio,
                    doublingRatio <= 2.0 ? "ok" : "ABOVE TARGET");
    }
    delete fixture;
    benchmark::Shutdown();
    return 0;
}
