#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

// Runs a program (the command-line verifier) as a child process and measures it: wall and
// processor time, peak resident set and exit status. The peak is the child's own only when
// the process that starts it is small (a process started from a large one is charged the
// large one's resident set too), so the measurement goes through a fresh copy of the
// benchmark, started before it has read anything: the benchmark's main calls
// RunMeasuredIfAsked first.
namespace vtr::bench {

struct ChildRun {
    double wallSeconds = 0;
    double processorSeconds = 0;
    std::uint64_t peakBytes = 0;
    int status = -1;
};

// Runs the program with its output thrown away; nothing where this cannot be done.
std::optional<ChildRun> MeasureChild(const std::vector<std::string>& programArgs);

// The measuring copy's side: `--run-measured PROGRAM ARGS...` runs the program, prints its
// figures and returns true (the benchmark then exits).
bool RunMeasuredIfAsked(int argc, char** argv);

}  // namespace vtr::bench
