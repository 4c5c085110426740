// A verification of the entire schedule of a large generated installation, and the
// intersequence check as its shows grow.
//
// Judged by (printed at the end):
//   verification / bare parse   the command-line verifier (vantori-verify --schedule
//                               --registry FILE --format json, a child process) over a bare
//                               pugixml parse of every sequence file's bytes, measured in the
//                               same run, the verifier loading on one processor (--jobs 1):
//                               at most 1.50. Both are single-threaded; the ratio
//                               of their processor times is judged, since on a shared machine
//                               the wall-clock ratio mostly measures the other processes (it
//                               is printed too).
//   every processor / bare parse the same verification loading on every processor (the
//                               default --jobs) over the serial bare parse, in wall-clock
//                               time: at most 0.60
//   peak memory, every processor the verifier's peak with the default jobs over (jobs + 1)
//                               times the largest sequence file plus 300 bytes per loaded
//                               channel: below 1.00
//   intersequence doubling      CheckIntersequenceConflicts of a show with 2N sequences over
//                               the same show with N: at most 2.00 (work grows with channels
//                               times overlapping sections, never with the square)
//   peak memory                 the verifier's peak resident set over twice the largest
//                               sequence file plus 300 bytes per loaded channel: below 1.00
//   memory per channel          what one more loaded channel adds to the verifier's peak,
//                               from two installations of many small channels that differ
//                               only in their number of shows: about 300 bytes at most
//
// --shows=N --sequences=N --channels=N --events=N choose the installation's size.

#include <benchmark/benchmark.h>
#include <pugixml.hpp>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "checks/conflicts/CheckIntersequenceConflicts.h"
#include "engine/LibVerify.h"
#include "environment/RegistryStore.h"
#include "environment/VTRCommon.h"
#include "sequencelib/Sequence.h"
#include "show/Show.h"
#include "show/TriggeredSequences.h"
#include "show/WholeFile.h"
#include "support/ChildProcess.h"
#include "support/SequenceBenchSupport.h"
#include "vtrsupport/InstallationGenerator.h"
#include "vtrsupport/PeImage.h"
#include "vtrsupport/SequenceGenerator.h"

#if defined(__unix__)
#define VTR_BENCH_CHILD_PROCESS 1
#endif

namespace {

using namespace vtr;
using bench::ChildRun;
using Clock = std::chrono::steady_clock;

// The installation's size: sequences of a three-minute show, a thousand events per channel
// (some 270 MB of sequence text).
struct Size {
    int32_t shows = 4;
    int32_t sequencesPerShow = 8;
    int32_t channels = 128;
    int32_t events = 1000;
};
Size size;
constexpr double kBytesPerChannel = 300;

// The doubling: an animation section of N, then 2N, sequences of 1,000 channels over a
// background of 64, with an interactive group.
constexpr int32_t kDoublingSequences = 12;

// Processor seconds used by this process so far.
double ProcessorSeconds() {
    return static_cast<double>(std::clock()) / CLOCKS_PER_SEC;
}

struct Fixture {
    bench::BenchFolder folder;
    gen::Installation installation;
    std::vector<std::string> sequenceBytes;
    double parseWall = 0;  // per parse of all the bytes
    double parseProcessor = 0;
    double loadWall = 0;  // per load of every sequence file
    double loadProcessor = 0;
    std::optional<ChildRun> child;  // the fastest run
    std::uint64_t childPeakBytes = 0;
    std::optional<ChildRun> parallel;  // the fastest run loading on every processor
    std::uint64_t parallelPeakBytes = 0;
    std::uint64_t baselinePeakBytes = 0;  // the verifier doing nothing (--version)
    double bytesPerChannel = 0;           // the peak's growth per loaded channel
};
Fixture* fixture = nullptr;

gen::Installation Install(const std::string& folder, const Size& of) {
    gen::InstallationOptions options;
    options.shows = of.shows;
    options.sequencesPerShow = of.sequencesPerShow;
    options.channelsPerSequence = of.channels;
    options.eventsPerChannel = of.events;
    options.backgroundChannels = 4;
    options.writeApplicationFile = [](const std::string& path, const std::string& version) {
        testsupport::WritePeImage(path, version);
    };
    return gen::MakeInstallation(fixture->folder.File(folder), options);
}

void Prepare() {
    fixture = new Fixture;
    fixture->installation = Install("install", size);
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

// Times the body over several rounds; the fastest round's wall and processor seconds.
template <typename Body>
void TimeRounds(benchmark::State& state, double& wall, double& processor, Body&& body) {
    wall = processor = 1e9;
    for (auto _ : state) {
        const auto start = Clock::now();
        const double cpu = ProcessorSeconds();
        body();
        const double roundWall = std::chrono::duration<double>(Clock::now() - start).count();
        state.SetIterationTime(roundWall);
        wall = std::min(wall, roundWall);
        processor = std::min(processor, ProcessorSeconds() - cpu);
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                            static_cast<int64_t>(fixture->installation.sequenceXmlBytes));
    state.counters["cpu_ms"] = processor * 1e3;
}

void BM_BarePugixmlParse(benchmark::State& state) {
    TimeRounds(state, fixture->parseWall, fixture->parseProcessor, [&] {
        for (const std::string& bytes : fixture->sequenceBytes) {
            pugi::xml_document doc;
            if (!doc.load_buffer(bytes.data(), bytes.size(), pugi::parse_default,
                                 pugi::encoding_utf8)) {
                state.SkipWithError("bare parse failed");
            }
            benchmark::DoNotOptimize(doc.first_child());
        }
    });
}
BENCHMARK(BM_BarePugixmlParse)->UseManualTime()->Iterations(5)->Unit(benchmark::kMillisecond);

// The part of the verification that reading the sequences takes: each file loaded once.
void BM_LoadEverySequence(benchmark::State& state) {
    TimeRounds(state, fixture->loadWall, fixture->loadProcessor, [&] {
        for (const std::string& file : fixture->installation.sequenceFiles) {
            seqlib::Sequence sequence;
            sequence.Load(file);
            benchmark::DoNotOptimize(sequence.Channels().data());
        }
    });
}
BENCHMARK(BM_LoadEverySequence)->UseManualTime()->Iterations(3)->Unit(benchmark::kMillisecond);

#if defined(VTR_BENCH_CHILD_PROCESS) && defined(VTR_VERIFY_PROGRAM)

// Verifies the installation's schedule once per iteration, with the extra arguments, and
// keeps the best run (by processor time, or by wall-clock time) and the highest peak.
enum class Best { ProcessorTime, WallTime };
void MeasureVerifications(benchmark::State& state, const std::vector<std::string>& extra, Best by,
                          std::optional<ChildRun>& best, std::uint64_t& peakBytes) {
    std::vector<std::string> args = {VTR_VERIFY_PROGRAM, "--schedule",
                                     "--registry",       fixture->installation.registryFile,
                                     "--format",         "json"};
    args.insert(args.end(), extra.begin(), extra.end());
    const auto cost = [by](const ChildRun& run) {
        return by == Best::ProcessorTime ? run.processorSeconds : run.wallSeconds;
    };
    for (auto _ : state) {
        const auto run = bench::MeasureChild(args);
        if (!run) {
            state.SkipWithError("the verifier could not be run");
            break;
        }
        state.SetIterationTime(run->wallSeconds);
        if (!best || cost(*run) < cost(*best))
            best = run;
        peakBytes = std::max(peakBytes, run->peakBytes);
    }
    if (best) {
        state.counters["cpu_ms"] = best->processorSeconds * 1e3;
        state.counters["peak_MB"] = static_cast<double>(peakBytes) / 1e6;
    }
}

void BM_VerifyEntireSchedule(benchmark::State& state) {
    MeasureVerifications(state, {"--jobs", "1"}, Best::ProcessorTime, fixture->child,
                         fixture->childPeakBytes);
    if (const auto baseline = bench::MeasureChild({VTR_VERIFY_PROGRAM, "--version"}))
        fixture->baselinePeakBytes = baseline->peakBytes;
    if (fixture->child)
        state.counters["exit_status"] = fixture->child->status;
}
BENCHMARK(BM_VerifyEntireSchedule)->UseManualTime()->Iterations(3)->Unit(benchmark::kMillisecond);

// The same verification with the sequence files loaded on every processor (the default).
void BM_VerifyEntireScheduleEveryProcessor(benchmark::State& state) {
    MeasureVerifications(state, {}, Best::WallTime, fixture->parallel, fixture->parallelPeakBytes);
}
BENCHMARK(BM_VerifyEntireScheduleEveryProcessor)
    ->UseManualTime()
    ->Iterations(3)
    ->Unit(benchmark::kMillisecond);

// Two installations of 2,000-channel sequences that differ only in their number of shows:
// the growth of the peak per loaded channel between them.
void BM_PeakPerChannel(benchmark::State& state) {
    const Size small{2, 8, 2000, 8};
    const Size large{4, 8, 2000, 8};
    const auto smaller = Install("small", small);
    const auto larger = Install("large", large);
    for (auto _ : state) {
        const auto a = bench::MeasureChild({VTR_VERIFY_PROGRAM, "--schedule", "--registry",
                                            smaller.registryFile, "--format", "json"});
        const auto b = bench::MeasureChild({VTR_VERIFY_PROGRAM, "--schedule", "--registry",
                                            larger.registryFile, "--format", "json"});
        if (!a || !b) {
            state.SkipWithError("the verifier could not be run");
            break;
        }
        state.SetIterationTime(b->wallSeconds);
        fixture->bytesPerChannel =
            (static_cast<double>(b->peakBytes) - static_cast<double>(a->peakBytes)) /
            static_cast<double>(larger.channels - smaller.channels);
        state.counters["channels_small"] = static_cast<double>(smaller.channels);
        state.counters["channels_large"] = static_cast<double>(larger.channels);
        state.counters["peak_MB_small"] = static_cast<double>(a->peakBytes) / 1e6;
        state.counters["peak_MB_large"] = static_cast<double>(b->peakBytes) / 1e6;
    }
}
BENCHMARK(BM_PeakPerChannel)->UseManualTime()->Iterations(1)->Unit(benchmark::kMillisecond);

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
        options.channels = 1000;
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

// The processor time of `repeat` checks of the show in a row (the results cleared after
// each, outside the time).
double IntersequenceSample(const std::string& showFile, int repeat, std::size_t& results) {
    double seconds = 0;
    for (int run = 0; run < repeat; ++run) {
        CheckIntersequenceConflicts check;
        check.SetShowFilename(showFile);
        const double start = ProcessorSeconds();
        check.Check();
        seconds += ProcessorSeconds() - start;
        results = LibVerify::GetResults().size();
        LibVerify::ClearResults();
    }
    return seconds;
}

double doublingRatio = 0;

void BM_IntersequenceDoubling(benchmark::State& state) {
    DoublingShow shows;
    for (auto _ : state) {
        // The 2N show's sequences take in the N show's, so both shows are checked from the
        // same cache. Samples of equal length, taken in turn: two checks of the N show
        // against one of the 2N show (the fastest of short runs escapes the machine's
        // pauses more often than the fastest of long ones). Each side is the fastest of its
        // samples.
        const std::string showN = shows.Show(kDoublingSequences);
        const std::string show2N = shows.Show(2 * kDoublingSequences);
        std::size_t resultsN = 0, results2N = 0;
        double n = 1e9, twoN = 1e9;
        for (int sample = 0; sample < 25; ++sample) {
            n = std::min(n, IntersequenceSample(showN, 2, resultsN) / 2);
            twoN = std::min(twoN, IntersequenceSample(show2N, 1, results2N));
        }
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

// Takes this benchmark's own options (--shows=N and so on) out of the arguments.
void TakeSizeOptions(int& argc, char** argv) {
    int kept = 1;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        int32_t* target = nullptr;
        std::string name;
        for (auto [option, field] :
             {std::pair{"--shows=", &size.shows}, std::pair{"--sequences=", &size.sequencesPerShow},
              std::pair{"--channels=", &size.channels}, std::pair{"--events=", &size.events}}) {
            if (arg.rfind(option, 0) == 0) {
                target = field;
                name = option;
            }
        }
        if (target != nullptr) {
            *target = std::max(1, std::atoi(arg.c_str() + name.size()));
        } else {
            argv[kept++] = argv[i];
        }
    }
    argc = kept;
}

void PrintRatio(const char* what, double ratio, double target, const std::string& detail) {
    std::printf("%-62s %.2f (%s; target <= %.2f) %s\n", what, ratio, detail.c_str(), target,
                ratio <= target ? "ok" : "ABOVE TARGET");
}

std::string Milliseconds(double a, double b) {
    char text[64];
    std::snprintf(text, sizeof text, "%.0f ms / %.0f ms", a * 1e3, b * 1e3);
    return text;
}

}  // namespace

int main(int argc, char** argv) {
    if (bench::RunMeasuredIfAsked(argc, argv))
        return 0;
    TakeSizeOptions(argc, argv);
    benchmark::Initialize(&argc, argv);
    Prepare();
    benchmark::RunSpecifiedBenchmarks();
    std::printf("\n");

    const Fixture& f = *fixture;
    if (f.parseProcessor > 0 && f.loadProcessor > 0) {
        std::printf("%-62s %.2f (%s, processor time)\n",
                    "  loading every sequence / bare parse:", f.loadProcessor / f.parseProcessor,
                    Milliseconds(f.loadProcessor, f.parseProcessor).c_str());
    }
    if (f.child && f.parseProcessor > 0) {
        PrintRatio("Verification of the entire schedule / bare pugixml parse:",
                   f.child->processorSeconds / f.parseProcessor, 1.5,
                   Milliseconds(f.child->processorSeconds, f.parseProcessor) + ", processor time");
        std::printf("%-62s %.2f (%s)\n",
                    "  the same in wall-clock time:", f.child->wallSeconds / f.parseWall,
                    Milliseconds(f.child->wallSeconds, f.parseWall).c_str());
        std::printf("%-62s %d (0 clean, 1 warnings, 2 errors)\n",
                    "  verifier exit status:", f.child->status);
    } else {
        std::printf("Verification of the entire schedule: not measured (no verifier program)\n");
    }
    if (f.childPeakBytes > 0) {
        const auto& i = f.installation;
        const double budget = 2.0 * static_cast<double>(i.largestSequenceFileBytes) +
                              kBytesPerChannel * static_cast<double>(i.channels);
        const double ratio = static_cast<double>(f.childPeakBytes) / budget;
        char detail[96];
        std::snprintf(detail, sizeof detail, "%.1f MB / %.1f MB",
                      static_cast<double>(f.childPeakBytes) / 1e6, budget / 1e6);
        std::printf("%-62s %.2f (%s; target < 1.00) %s\n",
                    "Peak memory / (2 x largest file + 300 B per loaded channel):", ratio, detail,
                    ratio < 1.0 ? "ok" : "ABOVE TARGET");
        std::printf("%-62s %.1f MB\n", "  the verifier's own peak doing nothing (--version):",
                    static_cast<double>(f.baselinePeakBytes) / 1e6);
    }
    if (f.parallel && f.parseWall > 0) {
        const int jobs = std::max(1, static_cast<int>(std::thread::hardware_concurrency()));
        PrintRatio("Every processor: verification / serial bare parse (wall):",
                   f.parallel->wallSeconds / f.parseWall, 0.6,
                   Milliseconds(f.parallel->wallSeconds, f.parseWall) + ", " +
                       std::to_string(jobs) + " jobs");
        const auto& i = f.installation;
        const double budget = (jobs + 1.0) * static_cast<double>(i.largestSequenceFileBytes) +
                              kBytesPerChannel * static_cast<double>(i.channels);
        const double ratio = static_cast<double>(f.parallelPeakBytes) / budget;
        char detail[96];
        std::snprintf(detail, sizeof detail, "%.1f MB / %.1f MB",
                      static_cast<double>(f.parallelPeakBytes) / 1e6, budget / 1e6);
        std::printf("%-62s %.2f (%s; target < 1.00) %s\n",
                    "  peak / ((jobs + 1) x largest file + 300 B per channel):", ratio, detail,
                    ratio < 1.0 ? "ok" : "ABOVE TARGET");
    }
    if (f.bytesPerChannel > 0) {
        std::printf("%-62s %.0f bytes (target <= 300) %s\n",
                    "Peak growth per loaded channel:", f.bytesPerChannel,
                    f.bytesPerChannel <= kBytesPerChannel ? "ok" : "ABOVE TARGET");
    }
    if (doublingRatio > 0) {
        PrintRatio("CheckIntersequenceConflicts, 2N sequences / N:", doublingRatio, 2.0,
                   "processor time");
    }
    delete fixture;
    benchmark::Shutdown();
    return 0;
}
