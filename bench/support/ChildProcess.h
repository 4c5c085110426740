#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

// Programs run as child processes by the benchmarks, with what each run cost.
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

// The middle value of the figures (0 for none).
double Median(std::vector<double> values);

}  // namespace vtr::bench
