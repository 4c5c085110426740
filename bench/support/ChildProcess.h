#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

// Programs run as child processes by the benchmarks, with what each run cost.
//
// The peak resident set measured is the child's own only when the process that starts it is
// small (a process started from a large one is charged the large one's resident set too), so
// MeasureChild goes through a fresh copy of the benchmark, started before it has read
// anything: a benchmark that uses it calls RunMeasuredIfAsked first thing in its main.
namespace vtr::bench {

struct ChildRun {
    double wallSeconds = 0;
    double processorSeconds = 0;  // user and system time of the child
    std::uint64_t peakBytes = 0;  // its peak resident set
    int status = -1;              // its exit status; -1 when it did not exit
};

// Runs the program (args[0] is its path) with its output thrown away and waits for it.
// Nothing where programs cannot be run and measured this way.
std::optional<ChildRun> RunChild(const std::vector<std::string>& args);

// Runs the program through a measuring copy of this benchmark (see above).
std::optional<ChildRun> MeasureChild(const std::vector<std::string>& programArgs);

// The measuring copy's side: `--run-measured PROGRAM ARGS...` runs the program, prints its
// figures and returns true (the benchmark then exits).
bool RunMeasuredIfAsked(int argc, char** argv);

// The middle value of the figures (0 for none).
double Median(std::vector<double> values);

}  // namespace vtr::bench
