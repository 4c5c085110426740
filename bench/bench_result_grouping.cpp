// Filtering, ordering and grouping the results of a large run.
//
// Judged by:
//   budget_ratio  the processor time of one step over 50,000 results, over the 200 ms the
//                 window may take to fill its lists, change the filter or regroup (a ratio
//                 well below 1; the window adds its own drawing on top):
//     BM_AddResults          taking in 50,000 results (each one's details read once)
//     BM_View/<grouping>     one view, errors first, filtered by a text, for each grouping
//     BM_Statistics          the per-message statistics of all 50,000
//
// The results look like those of a generated installation: mostly channel conflicts
// between the background sequence of a show and its other sequences, with some findings of
// other kinds and a few errors.

#include <benchmark/benchmark.h>

#include <ctime>
#include <memory>
#include <string>
#include <vector>

#include "engine/ResultGrouping.h"

namespace {

using namespace vtr;

constexpr int kResults = 50000;
constexpr double kBudgetSeconds = 0.2;

std::vector<ResultPtr> MakeResults() {
    std::vector<ResultPtr> results;
    results.reserve(kResults);
    const std::string data = "/home/designer/Vantori/User Data/";
    const char* sections[] = {"Startup", "Animation", "Musical", "Shutdown"};
    for (int i = 0; i < kResults; ++i) {
        auto result = std::make_shared<Result>();
        const std::string show = data + "Show" + std::to_string(i / 800) + ".lss";
        const std::string other = data + "sequences/Anim-" + std::to_string(i / 800) + "-" +
                                  std::to_string(i / 8 % 100) + ".las";
        if (i % 97 == 0) {
            result->SetSeverity(Severity::Error);
            result->SetMessageNumber(23);
            result->SetSummary("Sequence file does not exist");
            result->AddDetail("[SEQUENCE]: " + other);
            result->AddDetail("[SHOW]: show " + show);
        } else if (i % 13 == 0) {
            result->SetSeverity(Severity::Warning);
            result->SetMessageNumber(30);
            result->SetSummary("Channel is missing settings");
            result->AddDetail("[SEQUENCE]: " + other);
            result->AddDetail("[TRACK]: Track 1: Roof line");
            result->AddDetail("[CHANNEL]: Channel " + std::to_string(i % 64));
        } else {
            result->SetSeverity(Severity::Warning);
            result->SetMessageNumber(43);
            result->SetSummary("Channel conflict");
            const std::string channel = "[CHANNEL]: Channel " + std::to_string(i % 8 + 1);
            result->AddDetail("[SHOW]: " + show);
            result->AddDetail(std::string("[SECTION]: ") + sections[i % 4]);
            result->AddDetail("[SEQUENCE]: " + other);
            result->AddDetail("[TRACK]: Track 1: Track 1");
            result->AddDetail(channel);
            result->AddDetail("[SECTION]: Background");
            result->AddDetail("[SEQUENCE]: " + data + "sequences/Glow.las");
            result->AddDetail("[TRACK]: Track 1: Track 1");
            result->AddDetail(channel);
        }
        results.push_back(std::move(result));
    }
    return results;
}

const std::vector<ResultPtr>& Results() {
    static const std::vector<ResultPtr> results = MakeResults();
    return results;
}

const ResultGrouping& Filled() {
    static const ResultGrouping grouping = [] {
        ResultGrouping filled;
        for (const ResultPtr& result : Results())
            filled.Add(result);
        return filled;
    }();
    return grouping;
}

// Times the loop of a benchmark in processor time (on a shared machine it varies much less
// than the time on the wall) and reports one step over the budget.
class BudgetTimer {
  public:
    explicit BudgetTimer(benchmark::State& state) : state_(state) {}
    ~BudgetTimer() {
        const double elapsed = static_cast<double>(std::clock() - start_) / CLOCKS_PER_SEC;
        const auto iterations = static_cast<double>(state_.iterations());
        state_.counters["budget_ratio"] =
            iterations > 0 ? elapsed / iterations / kBudgetSeconds : 0.0;
    }

  private:
    benchmark::State& state_;
    std::clock_t start_ = std::clock();
};

void BM_AddResults(benchmark::State& state) {
    const std::vector<ResultPtr>& results = Results();
    BudgetTimer timer(state);
    for (auto _ : state) {
        ResultGrouping grouping;
        for (const ResultPtr& result : results)
            grouping.Add(result);
        benchmark::DoNotOptimize(grouping.Size());
    }
}
BENCHMARK(BM_AddResults)->Unit(benchmark::kMillisecond);

void BM_View(benchmark::State& state) {
    const ResultGrouping& grouping = Filled();
    ResultQuery query;
    query.groupBy = static_cast<GroupBy>(state.range(0));
    query.order = ResultOrder::ErrorsFirst;
    query.filter.text = "anim-";
    std::size_t shown = 0;
    BudgetTimer timer(state);
    for (auto _ : state) {
        const ResultView view = grouping.View(query);
        shown = view.shown.size();
        benchmark::DoNotOptimize(view.groups.data());
    }
    state.counters["shown"] = static_cast<double>(shown);
}
BENCHMARK(BM_View)
    ->ArgName("grouping")
    ->DenseRange(static_cast<int>(GroupBy::None), static_cast<int>(GroupBy::SequencePair))
    ->Unit(benchmark::kMillisecond);

void BM_Statistics(benchmark::State& state) {
    const ResultGrouping& grouping = Filled();
    const std::vector<std::size_t> all = grouping.View(ResultQuery{}).shown;
    BudgetTimer timer(state);
    for (auto _ : state)
        benchmark::DoNotOptimize(grouping.Statistics(all).data());
}
BENCHMARK(BM_Statistics)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
