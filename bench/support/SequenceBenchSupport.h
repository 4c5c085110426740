#pragma once

#include <benchmark/benchmark.h>

#include <cstdint>
#include <filesystem>
#include <map>
#include <optional>
#include <string>

// Shared pieces of the sequence benchmarks: a private temporary folder, a reporter that
// keeps each benchmark's time for the ratios printed at the end, and the measurement of
// a load's memory in a fresh child process.
namespace vtr::bench {

class BenchFolder {
  public:
    BenchFolder();
    ~BenchFolder();
    BenchFolder(const BenchFolder&) = delete;
    BenchFolder& operator=(const BenchFolder&) = delete;
    std::string File(const std::string& name) const { return (path_ / name).string(); }

  private:
    std::filesystem::path path_;
};

// The whole file as bytes.
std::string ReadAll(const std::string& path);

// Prints as the console does and keeps the processor time per iteration of each benchmark
// (steadier than the wall clock on a shared machine), from which the ratios are taken.
class TimeKeepingReporter : public benchmark::ConsoleReporter {
  public:
    void ReportRuns(const std::vector<Run>& runs) override;
    // Seconds per iteration of the named benchmark ("BM_Name/arg", without run settings).
    std::optional<double> Seconds(const std::string& name) const;

  private:
    std::map<std::string, double> seconds_;
};

// What loading one file cost, measured in a child process started for it.
struct LoadMemory {
    std::uint64_t peakBytes = 0;      // the growth of the resident set while loading
    std::uint64_t retainedBytes = 0;  // heap still in use by the loaded sequence
    std::uint64_t channels = 0;
};

// Runs this program again as `program --measure-load FILE` and reads what it reports;
// nothing where processes cannot be measured this way.
std::optional<LoadMemory> MeasureLoadInChild(const std::string& file);

// The child's side: when the arguments ask for it, loads the file, prints the figures
// and returns true (the program then exits).
bool RunLoadMeasurementIfAsked(int argc, char** argv);

}  // namespace vtr::bench
