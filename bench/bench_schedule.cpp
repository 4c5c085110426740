// Loading the schedule files and reading the list notation.
//
// Judged by:
//   BM_LoadWeeklySchedule      load time of a 20,000-show weekly schedule file over a budget
//                              of one second (budget_ratio, must stay well below 1)
//   BM_ListFromText            reading time per byte of a 10 MB list over that of a 10 KB list
//                              (per_byte_ratio, near 1 when reading is linear)

#include <benchmark/benchmark.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <filesystem>
#include <random>
#include <string>
#include <vector>

#include "schedule/Schedule.h"
#include "schedule/YearSchedule.h"
#include "show/Serialize.h"
#include "show/WholeFile.h"

namespace {

using namespace vtr;

// A file in its own temporary folder, removed with the folder afterwards.
class TempFile {
  public:
    explicit TempFile(const std::string& name) {
        static std::atomic<unsigned> counter{0};
        folder_ = std::filesystem::temp_directory_path() /
                  ("vtr-bench-" +
                   std::to_string(std::chrono::steady_clock::now().time_since_epoch().count()) +
                   "-" + std::to_string(counter++));
        std::filesystem::create_directories(folder_);
        path_ = (folder_ / name).string();
    }
    ~TempFile() {
        std::error_code ignored;
        std::filesystem::remove_all(folder_, ignored);
    }
    const std::string& Path() const { return path_; }

  private:
    std::filesystem::path folder_;
    std::string path_;
};

// A weekly schedule text of `shows` shows spread evenly over the week, each filling two
// thirds of its slot, in week order or shuffled.
std::string WeeklyText(int shows, bool shuffled) {
    const int slot = TimeConstants::SecondsPerWeek / shows;
    std::vector<std::string> events;
    events.reserve(static_cast<std::size_t>(shows));
    for (int i = 0; i < shows; ++i) {
        const int start = i * slot;
        const int end = start + slot * 2 / 3;
        events.push_back("(" + std::to_string(end) + ",2,(,0,Show " + std::to_string(i) + ".lss)," +
                         std::to_string(start) + ")");
    }
    if (shuffled) {
        std::mt19937 random(42);
        std::shuffle(events.begin(), events.end(), random);
    }
    return Serialize::ListToText(events);
}

void LoadWeekly(benchmark::State& state, bool shuffled) {
    const int shows = static_cast<int>(state.range(0));
    TempFile file("weeksched.lsc");
    if (WriteWholeFile(file.Path(), WeeklyText(shows, shuffled)) != 0) {
        state.SkipWithError("cannot write the schedule file");
        return;
    }
    int32_t count = 0;
    for (auto _ : state) {
        const auto schedule = ScheduleFunctions::LoadSchedule(file.Path());
        count = schedule->Count();
        benchmark::DoNotOptimize(count);
    }
    if (count != 2 * shows) {
        state.SkipWithError("the schedule did not load every show");
        return;
    }
    state.counters["events"] = count;
    state.counters["budget_ratio"] =
        benchmark::Counter(static_cast<double>(state.iterations()),
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_LoadWeeklySchedule(benchmark::State& state) {
    LoadWeekly(state, false);
}
void BM_LoadWeeklyScheduleShuffled(benchmark::State& state) {
    LoadWeekly(state, true);
}
BENCHMARK(BM_LoadWeeklySchedule)->Arg(20000)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_LoadWeeklyScheduleShuffled)->Arg(20000)->Unit(benchmark::kMillisecond);

// A year of dates with 40 shows each.
void BM_LoadYearSchedule(benchmark::State& state) {
    const int dates = static_cast<int>(state.range(0));
    const std::string day = WeeklyText(40, false);
    std::vector<std::string> elements;
    DateTime date = DateTime::FromParts(2024, 1, 1);
    for (int i = 0; i < dates; ++i, date = date.AddDays(1)) {
        elements.push_back(Serialize::ListToText({date.DateString(), day}));
    }
    TempFile file("yearsched.lsc");
    if (WriteWholeFile(file.Path(), Serialize::ListToText(elements)) != 0) {
        state.SkipWithError("cannot write the schedule file");
        return;
    }
    std::size_t keys = 0;
    for (auto _ : state) {
        keys = YearScheduleFunctions::LoadYearSchedule(file.Path())->Keys().size();
        benchmark::DoNotOptimize(keys);
    }
    state.counters["dates"] = static_cast<double>(keys);
    state.counters["budget_ratio"] =
        benchmark::Counter(static_cast<double>(state.iterations()),
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}
BENCHMARK(BM_LoadYearSchedule)->Arg(365)->Unit(benchmark::kMillisecond);

// A list of nested records, about `bytes` long.
std::string NestedList(std::size_t bytes) {
    std::vector<std::string> items;
    std::size_t size = 0;
    for (int i = 0; size < bytes; ++i) {
        items.push_back("(" + std::to_string(i) + ",Name*S " + std::to_string(i) +
                        ",((a,b),(c,(d))),T)");
        size += items.back().size() + 1;
    }
    return Serialize::ListToText(items);
}

double SecondsPerByte(const std::string& text, int repeats) {
    const auto start = std::chrono::steady_clock::now();
    for (int i = 0; i < repeats; ++i) {
        benchmark::DoNotOptimize(Serialize::ListFromText(text, 1).Count());
    }
    const std::chrono::duration<double> spent = std::chrono::steady_clock::now() - start;
    return spent.count() / repeats / static_cast<double>(text.size());
}

void BM_ListFromText(benchmark::State& state) {
    const std::string large = NestedList(static_cast<std::size_t>(state.range(0)));
    const std::string small = NestedList(10000);
    for (auto _ : state) {
        benchmark::DoNotOptimize(Serialize::ListFromText(large, 1).Count());
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * large.size()));
    state.counters["per_byte_ratio"] = SecondsPerByte(large, 3) / SecondsPerByte(small, 3000);
}
BENCHMARK(BM_ListFromText)->Arg(10000000)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
