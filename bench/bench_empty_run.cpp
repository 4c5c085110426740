// A verification of an empty installation against the program doing nothing at all, both as
// the user runs them: `vantori-verify --schedule` with no settings store (every setting is
// absent; the network preferences alone ask for seven values of each of 999 DMX universes)
// and `vantori-verify --version`, each a child process.
//
// Judged by (printed at the end):
//   empty installation / --version   the processor time of the run over that of --version
//                                    (medians): at most 2.00. The wall-clock ratio is
//                                    printed too; on a shared machine it mostly measures
//                                    the other processes.

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "support/ChildProcess.h"
#include "support/SequenceBenchSupport.h"

#ifndef VTR_VERIFY_PROGRAM
#define VTR_VERIFY_PROGRAM "vantori-verify"
#endif

namespace {

void SetEnvironment(const char* name, const std::string& value) {
#ifdef _WIN32
    _putenv_s(name, value.c_str());
#else
    setenv(name, value.c_str(), 1);
#endif
}

struct Figures {
    std::vector<double> processor;
    std::vector<double> wall;
};
Figures version;
Figures emptyRun;

void Run(benchmark::State& state, const std::vector<std::string>& args, Figures& figures) {
    for (auto _ : state) {
        const auto run = vtr::bench::RunChild(args);
        if (!run || run->status < 0) {
            state.SkipWithError("the verifier could not be run");
            break;
        }
        state.SetIterationTime(run->wallSeconds);
        figures.processor.push_back(run->processorSeconds);
        figures.wall.push_back(run->wallSeconds);
    }
    state.counters["cpu_ms"] = vtr::bench::Median(figures.processor) * 1e3;
}

void BM_Version(benchmark::State& state) {
    Run(state, {VTR_VERIFY_PROGRAM, "--version"}, version);
}

void BM_EmptyInstallation(benchmark::State& state) {
    Run(state, {VTR_VERIFY_PROGRAM, "--schedule", "--quiet"}, emptyRun);
}

BENCHMARK(BM_Version)->UseManualTime()->Iterations(40)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_EmptyInstallation)->UseManualTime()->Iterations(40)->Unit(benchmark::kMillisecond);

}  // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    // No settings store at all: a file that does not exist, in a folder of the benchmark's
    // own, so that nothing of the machine's own settings is read.
    vtr::bench::BenchFolder folder;
    const std::string store = folder.File("no-such-store.reg");
    SetEnvironment("VANTORI_REGISTRY", store);
    SetEnvironment("TMPDIR", folder.File(""));
    benchmark::RunSpecifiedBenchmarks();
    const double versionCpu = vtr::bench::Median(version.processor);
    const double emptyCpu = vtr::bench::Median(emptyRun.processor);
    if (versionCpu > 0 && emptyCpu > 0) {
        const double ratio = emptyCpu / versionCpu;
        std::printf(
            "\nvantori-verify --version:           %.2f ms of processor time (%.2f ms wall)\n",
            versionCpu * 1e3, vtr::bench::Median(version.wall) * 1e3);
        std::printf(
            "empty installation (--schedule):    %.2f ms of processor time (%.2f ms wall)\n",
            emptyCpu * 1e3, vtr::bench::Median(emptyRun.wall) * 1e3);
        std::printf(
            "empty installation / --version:     %.2f (target at most 2.00: %s); wall %.2f\n",
            ratio, ratio <= 2.0 ? "met" : "NOT met",
            vtr::bench::Median(emptyRun.wall) / vtr::bench::Median(version.wall));
    }
    benchmark::Shutdown();
    return 0;
}
