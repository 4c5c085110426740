#include "support/SequenceBenchSupport.h"

#include <chrono>
#include <cstdio>
#include <fstream>
#include <sstream>

#include "sequencelib/Sequence.h"

#if defined(__linux__) && defined(__GLIBC__)
#include <malloc.h>
#include <sys/resource.h>
#include <unistd.h>
#define VTR_BENCH_MEASURES_MEMORY 1
#endif

namespace vtr::bench {

BenchFolder::BenchFolder() {
    const auto stamp = std::chrono::steady_clock::now().time_since_epoch().count();
    path_ = std::filesystem::temp_directory_path() / ("vtr-seqlib-bench-" + std::to_string(stamp));
    std::filesystem::create_directories(path_);
}

BenchFolder::~BenchFolder() {
    std::error_code ec;
    std::filesystem::remove_all(path_, ec);
}

std::string ReadAll(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream bytes;
    bytes << in.rdbuf();
    return bytes.str();
}

void TimeKeepingReporter::ReportRuns(const std::vector<Run>& runs) {
    for (const Run& run : runs) {
        if (run.iterations > 0 && run.run_type == Run::RT_Iteration) {
            // The name and its arguments, without the run settings ("min_time:2.000").
            std::string name = run.benchmark_name();
            if (const std::size_t setting = name.find("/min_time"); setting != std::string::npos)
                name.erase(setting);
            seconds_[name] = run.cpu_accumulated_time / static_cast<double>(run.iterations);
        }
    }
    ConsoleReporter::ReportRuns(runs);
}

std::optional<double> TimeKeepingReporter::Seconds(const std::string& name) const {
    const auto found = seconds_.find(name);
    if (found == seconds_.end())
        return std::nullopt;
    return found->second;
}

#ifdef VTR_BENCH_MEASURES_MEMORY

namespace {

std::uint64_t ResidentBytes() {
    long pages = 0, resident = 0;
    if (std::FILE* statm = std::fopen("/proc/self/statm", "r")) {
        if (std::fscanf(statm, "%ld %ld", &pages, &resident) != 2)
            resident = 0;
        std::fclose(statm);
    }
    return static_cast<std::uint64_t>(resident) * static_cast<std::uint64_t>(sysconf(_SC_PAGESIZE));
}

std::uint64_t HeapInUse() {
    const struct mallinfo2 info = mallinfo2();
    return info.uordblks + info.hblkhd;
}

}  // namespace

bool RunLoadMeasurementIfAsked(int argc, char** argv) {
    if (argc != 3 || std::string(argv[1]) != "--measure-load")
        return false;
    const std::uint64_t residentBefore = ResidentBytes();
    const std::uint64_t heapBefore = HeapInUse();
    seqlib::Sequence sequence;
    sequence.Load(argv[2]);
    struct rusage usage {};
    getrusage(RUSAGE_SELF, &usage);
    const std::uint64_t peak = static_cast<std::uint64_t>(usage.ru_maxrss) * 1024;
    std::printf("%llu %llu %llu\n",
                static_cast<unsigned long long>(peak > residentBefore ? peak - residentBefore : 0),
                static_cast<unsigned long long>(HeapInUse() - heapBefore),
                static_cast<unsigned long long>(sequence.Channels().size()));
    return true;
}

std::optional<LoadMemory> MeasureLoadInChild(const std::string& file) {
    const std::string self = std::filesystem::read_symlink("/proc/self/exe").string();
    const std::string command = "'" + self + "' --measure-load '" + file + "'";
    std::FILE* child = popen(command.c_str(), "r");
    if (child == nullptr)
        return std::nullopt;
    unsigned long long peak = 0, retained = 0, channels = 0;
    const int read = std::fscanf(child, "%llu %llu %llu", &peak, &retained, &channels);
    if (pclose(child) != 0 || read != 3)
        return std::nullopt;
    return LoadMemory{peak, retained, channels};
}

#else

bool RunLoadMeasurementIfAsked(int, char**) {
    return false;
}
std::optional<LoadMemory> MeasureLoadInChild(const std::string&) {
    return std::nullopt;
}

#endif

}  // namespace vtr::bench
