// How the cost of a whole-schedule verification grows with the number of shows.
//
// Judged by (printed at the end):
//   800 shows / 50 shows   the processor time per show of verifying a schedule of 800 shows
//                          over that of the same installation with 50: within 10% (at most
//                          1.10). Every show has its own sequences, media files and shell
//                          commands, so each one should cost the same however many there are.
//                          Processor time, since on a shared machine the wall clock mostly
//                          measures the other processes (the wall-clock ratio is printed too).
//
// Both figures are the fastest of eight samples of the same length: a sample is one run of 800
// shows, or sixteen runs of 50 in a row. The fastest of many short runs would be compared with
// the fastest of a few long ones, and a short run escapes the machine's pauses far more often.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <ctime>
#include <memory>
#include <string>

#include "engine/AllocatorSettings.h"
#include "engine/LibVerify.h"
#include "environment/RegistryStore.h"
#include "environment/VTRCommon.h"
#include "support/SequenceBenchSupport.h"
#include "vtrsupport/InstallationGenerator.h"
#include "vtrsupport/PeImage.h"

namespace {

using namespace vtr;
using Clock = std::chrono::steady_clock;

constexpr int32_t kFewShows = 50;
constexpr int32_t kManyShows = 800;
constexpr double kTarget = 1.10;

double ProcessorSeconds() {
    return static_cast<double>(std::clock()) / CLOCKS_PER_SEC;
}

struct PerShow {
    double processor = 0;  // seconds per show, the fastest run
    double wall = 0;
    std::size_t results = 0;
};
PerShow few;
PerShow many;

// An installation of that many shows with small sequences: what is measured is the work per
// show, not the reading of large files.
gen::Installation Install(const bench::BenchFolder& folder, int32_t shows) {
    gen::InstallationOptions options;
    options.shows = shows;
    options.sequencesPerShow = 2;
    options.channelsPerSequence = 16;
    options.eventsPerChannel = 4;
    options.calendarDays = 0;
    options.writeApplicationFile = [](const std::string& path, const std::string& version) {
        testsupport::WritePeImage(path, version);
    };
    return gen::MakeInstallation(folder.File("shows" + std::to_string(shows)), options);
}

void Verify(benchmark::State& state, int32_t shows, PerShow& figures) {
    bench::BenchFolder folder;
    const gen::Installation installation = Install(folder, shows);
    auto previous = RegistryStore::Install(RegistryStore::OpenFileStore(installation.registryFile));
    VTRCommon::ResetCachedFolders();
    figures.processor = figures.wall = 1e9;
    const int32_t runsPerSample = kManyShows / shows;
    int32_t runs = 0;
    double sampleProcessor = 0;
    double sampleWall = 0;
    for (auto _ : state) {
        const auto start = Clock::now();
        const double processor = ProcessorSeconds();
        LibVerify::SetScheduleFiles(VTRCommon::GetWeeklyScheduleFile(),
                                    VTRCommon::GetYearlyScheduleFile());
        LibVerify::RunVerification();
        const double wall = std::chrono::duration<double>(Clock::now() - start).count();
        state.SetIterationTime(wall);
        sampleProcessor += ProcessorSeconds() - processor;
        sampleWall += wall;
        if (++runs == runsPerSample) {
            figures.processor = std::min(figures.processor, sampleProcessor / kManyShows);
            figures.wall = std::min(figures.wall, sampleWall / kManyShows);
            runs = 0;
            sampleProcessor = sampleWall = 0;
        }
        figures.results = LibVerify::GetResults().size();
    }
    LibVerify::ClearResults();
    RegistryStore::Install(std::move(previous));
    VTRCommon::ResetCachedFolders();
    state.counters["cpu_ms_per_show"] = figures.processor * 1e3;
    state.counters["results"] = static_cast<double>(figures.results);
}

void BM_VerifyFewShows(benchmark::State& state) {
    Verify(state, kFewShows, few);
}
// Eight samples of sixteen runs.
BENCHMARK(BM_VerifyFewShows)
    ->UseManualTime()
    ->Iterations(8 * kManyShows / kFewShows)
    ->Unit(benchmark::kMillisecond);

void BM_VerifyManyShows(benchmark::State& state) {
    Verify(state, kManyShows, many);
}
BENCHMARK(BM_VerifyManyShows)->UseManualTime()->Iterations(8)->Unit(benchmark::kMillisecond);

}  // namespace

int main(int argc, char** argv) {
    SettleAllocator();  // as the verifier's programs do
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    if (few.processor > 0 && few.processor < 1e9 && many.processor < 1e9) {
        const double ratio = many.processor / few.processor;
        std::printf(
            "\n%-56s %.2f (%.2f ms / %.2f ms per show, processor time; target <= %.2f) %s\n",
            "Cost per show, 800 shows / 50 shows:", ratio, many.processor * 1e3,
            few.processor * 1e3, kTarget, ratio <= kTarget ? "ok" : "ABOVE TARGET");
        std::printf("%-56s %.2f\n", "  the same in wall-clock time:", many.wall / few.wall);
    }
    benchmark::Shutdown();
    return 0;
}
