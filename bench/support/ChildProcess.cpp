#include "support/ChildProcess.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <filesystem>

#if defined(__unix__)
#include <fcntl.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>
extern char** environ;
#endif

namespace vtr::bench {

#if defined(__unix__)

std::optional<ChildRun> RunChild(const std::vector<std::string>& args) {
    std::vector<char*> argv;
    for (const std::string& arg : args)
        argv.push_back(const_cast<char*>(arg.c_str()));
    argv.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, 1, "/dev/null", O_WRONLY, 0);
    posix_spawn_file_actions_addopen(&actions, 2, "/dev/null", O_WRONLY, 0);
    const auto start = std::chrono::steady_clock::now();
    pid_t pid = 0;
    const int spawned = posix_spawn(&pid, argv[0], &actions, nullptr, argv.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    if (spawned != 0)
        return std::nullopt;
    int waitStatus = 0;
    struct rusage usage {};
    if (wait4(pid, &waitStatus, 0, &usage) != pid)
        return std::nullopt;
    ChildRun run;
    run.wallSeconds =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    run.processorSeconds =
        static_cast<double>(usage.ru_utime.tv_sec + usage.ru_stime.tv_sec) +
        static_cast<double>(usage.ru_utime.tv_usec + usage.ru_stime.tv_usec) / 1e6;
    run.peakBytes = static_cast<std::uint64_t>(usage.ru_maxrss) * 1024;
    run.status = WIFEXITED(waitStatus) ? WEXITSTATUS(waitStatus) : -1;
    return run;
}

bool RunMeasuredIfAsked(int argc, char** argv) {
    if (argc < 3 || std::strcmp(argv[1], "--run-measured") != 0)
        return false;
    const auto run = RunChild(std::vector<std::string>(argv + 2, argv + argc));
    if (run) {
        std::printf("%.6f %.6f %llu %d\n", run->wallSeconds, run->processorSeconds,
                    static_cast<unsigned long long>(run->peakBytes), run->status);
    }
    return true;
}

std::optional<ChildRun> MeasureChild(const std::vector<std::string>& programArgs) {
    const std::string self = std::filesystem::read_symlink("/proc/self/exe").string();
    std::string command = "'" + self + "' --run-measured";
    for (const std::string& arg : programArgs)
        command += " '" + arg + "'";
    std::FILE* measuring = popen(command.c_str(), "r");
    if (measuring == nullptr)
        return std::nullopt;
    ChildRun run;
    unsigned long long peak = 0;
    const int read = std::fscanf(measuring, "%lf %lf %llu %d", &run.wallSeconds,
                                 &run.processorSeconds, &peak, &run.status);
    if (pclose(measuring) != 0 || read != 4)
        return std::nullopt;
    run.peakBytes = peak;
    return run;
}

#else

std::optional<ChildRun> RunChild(const std::vector<std::string>&) {
    return std::nullopt;
}

std::optional<ChildRun> MeasureChild(const std::vector<std::string>&) {
    return std::nullopt;
}

bool RunMeasuredIfAsked(int, char**) {
    return false;
}

#endif

double Median(std::vector<double> values) {
    if (values.empty())
        return 0;
    std::sort(values.begin(), values.end());
    const std::size_t middle = values.size() / 2;
    return values.size() % 2 == 1 ? values[middle] : (values[middle - 1] + values[middle]) / 2;
}

}  // namespace vtr::bench
