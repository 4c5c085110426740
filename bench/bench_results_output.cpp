// The command line's JSON and text of a run with a very large number of results, written
// straight from the list of results.
//
// Judged by (printed at the end):
//   JSON time per result     WriteJson of 100,000 results, per result: at most 3 us
//   JSON memory per result   the heap the writing takes beyond the results themselves, at its
//                            peak, per result: at most 1 KB
// The text output's figures and the results' own memory are printed beside them.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <new>
#include <ostream>
#include <streambuf>
#include <string>

#if defined(__GLIBC__)
#include <malloc.h>
#define VTR_BENCH_COUNTS_HEAP 1
#endif

#include "ResultsOutput.h"

#if defined(VTR_BENCH_COUNTS_HEAP)
// The heap in use by this program, and its peak, counted at every allocation.
namespace {
std::size_t heapInUse = 0;
std::size_t heapPeak = 0;
}  // namespace

void* operator new(std::size_t bytes) {
    void* memory = std::malloc(bytes == 0 ? 1 : bytes);
    if (memory == nullptr)
        throw std::bad_alloc();
    heapInUse += malloc_usable_size(memory);
    heapPeak = std::max(heapPeak, heapInUse);
    return memory;
}
// The replaced operator new takes its memory from malloc, so free is its match.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wmismatched-new-delete"
void operator delete(void* memory) noexcept {
    if (memory == nullptr)
        return;
    heapInUse -= malloc_usable_size(memory);
    std::free(memory);
}
#pragma GCC diagnostic pop
void operator delete(void* memory, std::size_t) noexcept {
    operator delete(memory);
}
#endif

namespace {

using namespace vtr;
using Clock = std::chrono::steady_clock;

constexpr std::size_t kResults = 100000;
constexpr double kTargetMicroseconds = 3.0;
constexpr double kTargetBytes = 1024.0;

class NullBuffer : public std::streambuf {
  protected:
    int_type overflow(int_type c) override { return traits_type::not_eof(c); }
    std::streamsize xsputn(const char*, std::streamsize count) override { return count; }
};

// A run's results as a large schedule gives them: mostly channel conflicts with nine detail
// lines, some shorter ones, one in ten ignored.
cli::RunRecord MakeRecord() {
    cli::RunRecord record;
    record.checksPerformed = 250000;
    record.results.reserve(kResults);
    for (std::size_t i = 0; i < kResults; ++i) {
        auto result = std::make_shared<Result>();
        const std::string n = std::to_string(i);
        if (i % 4 != 3) {
            result->SetSeverity(Severity::Warning);
            result->SetMessageNumber(43);
            result->SetHelpContextID(43);
            result->SetSummary("Channel conflict");
            for (const char* line :
                 {"[SHOW]: /shows/Evening", "[SECTION]: Background", "[SEQUENCE]: /seq/Glow",
                  "[TRACK]: Track 1: Garage", "[CHANNEL]: Star ", "[SECTION]: Musical",
                  "[SEQUENCE]: /seq/Song", "[TRACK]: Track 2: Roof", "[CHANNEL]: Star "})
                result->AddDetail(line + n);
        } else {
            result->SetSeverity(Severity::Error);
            result->SetMessageNumber(23);
            result->SetHelpContextID(23);
            result->SetSummary("Sequence file does not exist");
            result->AddDetail("[SEQUENCE]: /seq/Missing" + n + ".las");
            result->AddDetail("[SHOW]: show /shows/Evening" + n + ".lss");
        }
        record.results.push_back({result, i % 10 == 0});
    }
    return record;
}

struct Figures {
    double seconds = 0;
    double peakBytes = 0;
};
Figures jsonFigures;
Figures textFigures;
double resultBytes = 0;

template <typename Write>
void Measure(benchmark::State& state, Figures& figures, Write&& write) {
#if defined(VTR_BENCH_COUNTS_HEAP)
    const std::size_t before = heapInUse;
#endif
    const cli::RunRecord record = MakeRecord();
#if defined(VTR_BENCH_COUNTS_HEAP)
    // The results themselves, keys worked out (the driver asks for each one's key as it
    // arrives, to see whether it is ignored).
    for (const cli::RecordedResult& recorded : record.results)
        benchmark::DoNotOptimize(recorded.result->IgnoreKey().size());
    resultBytes = static_cast<double>(heapInUse - before) / kResults;
#endif
    NullBuffer buffer;
    std::ostream out(&buffer);
    figures.seconds = 1e9;
    for (auto _ : state) {
#if defined(VTR_BENCH_COUNTS_HEAP)
        const std::size_t start = heapInUse;
        heapPeak = start;
#endif
        const auto began = Clock::now();
        write(out, record);
        const double seconds = std::chrono::duration<double>(Clock::now() - began).count();
        state.SetIterationTime(seconds);
        figures.seconds = std::min(figures.seconds, seconds);
#if defined(VTR_BENCH_COUNTS_HEAP)
        figures.peakBytes = std::max(figures.peakBytes, static_cast<double>(heapPeak - start));
#endif
    }
    state.SetItemsProcessed(static_cast<int64_t>(state.iterations() * kResults));
    state.counters["us_per_result"] = figures.seconds * 1e6 / kResults;
    state.counters["peak_B_per_result"] = figures.peakBytes / kResults;
}

void BM_Json100000Results(benchmark::State& state) {
    Measure(state, jsonFigures,
            [](std::ostream& out, const cli::RunRecord& record) { cli::WriteJson(out, record); });
}
BENCHMARK(BM_Json100000Results)->UseManualTime()->Iterations(3)->Unit(benchmark::kMillisecond);

void BM_Text100000Results(benchmark::State& state) {
    Measure(state, textFigures,
            [](std::ostream& out, const cli::RunRecord& record) { cli::WriteText(out, record); });
}
BENCHMARK(BM_Text100000Results)->UseManualTime()->Iterations(3)->Unit(benchmark::kMillisecond);

void PrintPerResult(const char* what, const Figures& figures, bool judged) {
    const double microseconds = figures.seconds * 1e6 / kResults;
    const double bytes = figures.peakBytes / kResults;
    if (judged) {
        std::printf("%-48s %.2f us, ratio %.2f of %.0f us %s\n", what, microseconds,
                    microseconds / kTargetMicroseconds, kTargetMicroseconds,
                    microseconds <= kTargetMicroseconds ? "ok" : "ABOVE TARGET");
#if defined(VTR_BENCH_COUNTS_HEAP)
        std::printf("%-48s %.0f B, ratio %.2f of 1 KB %s\n",
                    "  peak memory of writing, per result:", bytes, bytes / kTargetBytes,
                    bytes <= kTargetBytes ? "ok" : "ABOVE TARGET");
#endif
    } else {
        std::printf("%-48s %.2f us, peak %.0f B\n", what, microseconds, bytes);
    }
}

}  // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    std::printf("\n");
    if (jsonFigures.seconds > 0 && jsonFigures.seconds < 1e9)
        PrintPerResult("JSON of 100,000 results, per result:", jsonFigures, true);
    if (textFigures.seconds > 0 && textFigures.seconds < 1e9)
        PrintPerResult("Text of 100,000 results, per result:", textFigures, false);
#if defined(VTR_BENCH_COUNTS_HEAP)
    if (resultBytes > 0)
        std::printf("%-48s %.0f B\n", "  the results themselves, per result:", resultBytes);
#endif
    benchmark::Shutdown();
    return 0;
}
