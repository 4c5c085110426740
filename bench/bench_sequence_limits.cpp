// The sequence reader on hostile shapes: its cost against the depth of nesting, how long a
// load works between two questions whether to go on (how soon a cancellation is seen), and
// what a load holds while it reads text that is large only once expanded.
//
// Judged by (printed at the end):
//   nesting 100k / 10k levels, 1M / 100k    processor time of a load over the one ten times
//                                           smaller: linear is 10, judged at most 20; a
//                                           reader that scanned a piece per level would be
//                                           near 100. The cost per level grows a little
//                                           with depth (more levels are entered one by one
//                                           rather than parsed whole in a piece, and the
//                                           open elements outgrow the caches), so the time
//                                           per level is printed too. The loads lift the
//                                           depth limit, 100,000 by default, to measure the
//                                           reader itself
//   longest work between two questions      at most 1000 ms of processor time, whatever the
//                                           shape (the verifier asks every 40 ms)
//   peak memory of a 2 MB compressed file that expands to 2 GB of blanks before its root,
//   and of 99,000 levels of nesting         at most 64 MB each

#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <ctime>
#include <fstream>
#include <string>

#include "engine/VtrError.h"
#include "sequencelib/Sequence.h"
#include "vtrsupport/SequenceGenerator.h"
#include "support/SequenceBenchSupport.h"

namespace {

using namespace vtr;
using Clock = std::chrono::steady_clock;

constexpr int kDepths[] = {10000, 100000, 1000000};

bench::BenchFolder* folder = nullptr;
std::string nested[3];
std::string deepest;  // as deep as the limit allows
std::string heavy;    // a data-heavy sequence
std::string blanks;   // compressed blanks before the root element
double nestedSeconds[3] = {};
double longestGap[3] = {};  // processor seconds between two questions, per shape
const char* const kGapShapes[] = {"1,000,000 levels of nesting", "a data-heavy sequence",
                                  "2 GB of blanks, compressed"};

// Processor seconds used by this process so far.
double ProcessorSeconds() {
    return static_cast<double>(std::clock()) / CLOCKS_PER_SEC;
}

void Write(const std::string& path, const std::string& bytes) {
    std::ofstream(path, std::ios::binary)
        .write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
}

// A sequence of two channels with `depth` levels of elements between them.
std::string Nested(int depth) {
    std::string text = "<sequence length=\"10\"><channels><channel id=\"1\"/>";
    text.reserve(text.size() + std::size_t(depth) * 7 + 64);
    for (int i = 0; i < depth; ++i)
        text += "<a>";
    for (int i = 0; i < depth; ++i)
        text += "</a>";
    return text + "<channel id=\"2\"/></channels></sequence>\n";
}

void Prepare() {
    folder = new bench::BenchFolder;
    for (int d = 0; d < 3; ++d) {
        nested[d] = folder->File("nested" + std::to_string(kDepths[d]) + ".las");
        Write(nested[d], Nested(kDepths[d]));
    }
    deepest = folder->File("deepest.las");
    Write(deepest, Nested(99000));
    seqlib::SequenceGenerator::Options options;
    options.channels = 500;
    options.eventsPerChannel =
        seqlib::SequenceGenerator::EventsPerChannelFor(std::uint64_t{40} << 20, 500);
    heavy = folder->File("heavy.lms");
    seqlib::SequenceGenerator::WriteFile(heavy, options);
    // 2 GB of blanks, compressed a megabyte at a time.
    blanks = folder->File("blanks.las");
    std::string compressed;
    const std::string block(std::size_t{1} << 20, ' ');
    const std::string onceBlock = seqlib::SequenceGenerator::Gzip(block, 9);
    compressed = seqlib::SequenceGenerator::Gzip("<?xml version=\"1.0\"?>\n", 9);
    for (int i = 0; i < 2000; ++i)
        compressed += onceBlock;  // gzip members one after the other read as one text
    compressed += seqlib::SequenceGenerator::Gzip("<sequence/>", 9);
    Write(blanks, compressed);
    std::printf("blanks.las: %.1f MB that expand to %.0f MB\n",
                static_cast<double>(compressed.size()) / 1e6, 2000.0 * (1 << 20) / 1e6);
}

void BM_LoadNested(benchmark::State& state) {
    const int d = static_cast<int>(state.range(0));
    seqlib::LoadOptions options;
    options.maxDepth = 2000000;
    double best = 1e9;
    for (auto _ : state) {
        const double start = ProcessorSeconds();
        seqlib::Sequence sequence;
        sequence.Load(nested[d], {}, options);
        const double seconds = ProcessorSeconds() - start;
        if (sequence.Channels().size() != 2)
            state.SkipWithError("the nested sequence did not load");
        state.SetIterationTime(seconds);
        best = std::min(best, seconds);
    }
    nestedSeconds[d] = best;
    state.counters["levels"] = kDepths[d];
}
BENCHMARK(BM_LoadNested)
    ->DenseRange(0, 2)
    ->UseManualTime()
    ->Iterations(3)
    ->Unit(benchmark::kMillisecond);

// A million levels with the depth limit as it is: refused where the limit is passed.
void BM_RefuseTooDeep(benchmark::State& state) {
    for (auto _ : state) {
        seqlib::Sequence sequence;
        bool refused = false;
        try {
            sequence.Load(nested[2]);
        } catch (const VtrError&) {
            refused = true;
        }
        if (!refused)
            state.SkipWithError("a million levels were accepted");
    }
}
BENCHMARK(BM_RefuseTooDeep)->Iterations(3)->Unit(benchmark::kMillisecond);

// The longest processor time between two questions while the shape loads, asked every
// 40 ms of work as the verifier does.
void BM_LongestWorkBetweenQuestions(benchmark::State& state) {
    const int shape = static_cast<int>(state.range(0));
    const std::string& file = shape == 0 ? nested[2] : shape == 1 ? heavy : blanks;
    seqlib::LoadOptions options;
    options.maxDepth = 2000000;
    options.pollInterval = std::chrono::milliseconds(40);
    double longest = 0;
    for (auto _ : state) {
        double last = ProcessorSeconds();
        options.keepGoing = [&] {
            const double now = ProcessorSeconds();
            longest = std::max(longest, now - last);
            last = now;
            return true;
        };
        seqlib::Sequence sequence;
        sequence.Load(file, {}, options);
        longest = std::max(longest, ProcessorSeconds() - last);
    }
    longestGap[shape] = longest;
    state.counters["longest_ms"] = longest * 1e3;
}
BENCHMARK(BM_LongestWorkBetweenQuestions)
    ->DenseRange(0, 2)
    ->Iterations(1)
    ->Unit(benchmark::kMillisecond);

void PrintMemory(const char* what, const std::string& file) {
    const auto memory = bench::MeasureLoadInChild(file);
    if (!memory) {
        std::printf("  %-52s not measured on this platform\n", what);
        return;
    }
    const double megabytes = static_cast<double>(memory->peakBytes) / 1e6;
    std::printf("  %-52s %.1f MB (target <= 64) %s\n", what, megabytes,
                megabytes <= 64 ? "ok" : "ABOVE TARGET");
}

}  // namespace

int main(int argc, char** argv) {
    if (bench::RunLoadMeasurementIfAsked(argc, argv))
        return 0;
    benchmark::Initialize(&argc, argv);
    Prepare();
    benchmark::RunSpecifiedBenchmarks();

    std::printf("\nLoading nested elements (processor time, the depth limit lifted):\n");
    for (int d = 0; d < 3; ++d) {
        std::printf("  %8d levels: %8.1f ms (%.0f ns a level)\n", kDepths[d],
                    nestedSeconds[d] * 1e3, nestedSeconds[d] * 1e9 / kDepths[d]);
    }
    for (int d = 1; d < 3; ++d) {
        if (nestedSeconds[d - 1] <= 0)
            continue;
        const double ratio = nestedSeconds[d] / nestedSeconds[d - 1];
        std::printf("  %dk / %dk levels: %.2f (linear is 10; target <= 20) %s\n", kDepths[d] / 1000,
                    kDepths[d - 1] / 1000, ratio, ratio <= 20 ? "ok" : "ABOVE TARGET");
    }
    std::printf("\nThe longest work between two questions whether to go on:\n");
    for (int s = 0; s < 3; ++s) {
        std::printf("  %-52s %.0f ms (target <= 1000) %s\n", kGapShapes[s], longestGap[s] * 1e3,
                    longestGap[s] <= 1.0 ? "ok" : "ABOVE TARGET");
    }
    std::printf("\nPeak memory of a load:\n");
    PrintMemory("2 GB of blanks before the root, compressed:", blanks);
    PrintMemory("99,000 levels of nesting:", deepest);
    delete folder;
    benchmark::Shutdown();
    return 0;
}
