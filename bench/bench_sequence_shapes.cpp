// Verifying a whole installation of each sequence shape against the bare work it cannot
// avoid: a pugixml parse of the same sequence bytes (for compressed files, zlib's expansion
// of them and then the parse). One thread; processor time, the best of a few runs of each,
// all measured in one run of this program.
//
// The installations are the installation tool's (vantori-make-installation FOLDER and the
// options below), verified by the command-line verifier as a child process
// (vantori-verify --schedule --registry FILE --format json --jobs 1). Judged by (printed at the
// end):
//
//   --channels 20000 --events 2        many channels of few events    at most 1.00
//   --channels 8000 --events 4                                        at most 1.00
//   --events 1000                      data-heavy                     at most 1.40
//   --events 1000 --compressed         against expansion + parse      at most 1.20
//
// VTR_BENCH_VERIFIER=PATH measures another build of the verifier against the same figures.

#include <benchmark/benchmark.h>
#include <zlib.h>
#include <pugixml.hpp>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "support/ChildProcess.h"
#include "support/SequenceBenchSupport.h"

namespace {

using namespace vtr;

struct Shape {
    const char* options;
    std::vector<std::string> arguments;
    bool compressed;
    double target;
};

const Shape kShapes[] = {
    {"--channels 20000 --events 2", {"--channels", "20000", "--events", "2"}, false, 1.00},
    {"--channels 8000 --events 4", {"--channels", "8000", "--events", "4"}, false, 1.00},
    {"--events 1000", {"--events", "1000"}, false, 1.40},
    {"--events 1000 --compressed", {"--events", "1000", "--compressed"}, true, 1.20},
};
constexpr int kShapeCount = static_cast<int>(std::size(kShapes));

struct Installation {
    std::string registry;
    std::vector<std::string> files;  // the sequence files as they are on disk
    std::vector<std::size_t> xmlSizes;
    std::uint64_t xmlBytes = 0;
    double bareSeconds = 0;    // processor time of the bare work in a fresh process
    double verifySeconds = 0;  // processor time of the verifier
    int status = -1;
};

bench::BenchFolder* folder = nullptr;
Installation installations[kShapeCount];

// Processor seconds used by this process so far.
double ProcessorSeconds() {
    return static_cast<double>(std::clock()) / CLOCKS_PER_SEC;
}

// The expansion of gzip data (every member), or the bytes as they are.
std::string Expanded(const std::string& bytes) {
    if (bytes.size() < 2 || bytes[0] != '\x1f' || bytes[1] != '\x8b')
        return bytes;
    std::string text;
    z_stream zs{};
    inflateInit2(&zs, 15 + 16);
    zs.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(bytes.data()));
    zs.avail_in = static_cast<uInt>(bytes.size());
    char block[1 << 16];
    int rc = Z_OK;
    while (rc != Z_STREAM_END || zs.avail_in > 0) {
        if (rc == Z_STREAM_END)
            inflateReset(&zs);
        zs.next_out = reinterpret_cast<Bytef*>(block);
        zs.avail_out = sizeof block;
        rc = inflate(&zs, Z_NO_FLUSH);
        if (rc != Z_OK && rc != Z_STREAM_END)
            break;
        text.append(block, sizeof block - zs.avail_out);
    }
    inflateEnd(&zs);
    return text;
}

bool Prepare() {
    folder = new bench::BenchFolder;
    for (int s = 0; s < kShapeCount; ++s) {
        const std::string root = folder->File("shape" + std::to_string(s));
        std::vector<std::string> make = {VTR_MAKE_INSTALLATION_PROGRAM, root};
        make.insert(make.end(), kShapes[s].arguments.begin(), kShapes[s].arguments.end());
        const auto made = bench::MeasureChild(make);
        if (!made || made->status != 0) {
            std::fprintf(stderr, "the installation tool failed for %s\n", kShapes[s].options);
            return false;
        }
        Installation& installation = installations[s];
        installation.registry = root + "/registry.reg";
        for (const auto& entry : std::filesystem::directory_iterator(root + "/data/sequences")) {
            const std::string extension = entry.path().extension().string();
            if (extension == ".las" || extension == ".lms")
                installation.files.push_back(entry.path().string());
        }
        std::sort(installation.files.begin(), installation.files.end());
        std::uint64_t fileBytes = 0;
        for (const std::string& file : installation.files) {
            const std::string bytes = bench::ReadAll(file);
            fileBytes += bytes.size();
            installation.xmlSizes.push_back(Expanded(bytes).size());
            installation.xmlBytes += installation.xmlSizes.back();
        }
        std::printf("%-30s %zu sequence files, %.1f MB of XML (%.1f MB on disk)\n",
                    kShapes[s].options, installation.files.size(),
                    static_cast<double>(installation.xmlBytes) / 1e6,
                    static_cast<double>(fileBytes) / 1e6);
    }
    return true;
}

// Expands gzip data (one member) into `text`, which has room for exactly all of it.
bool Inflate(const std::string& bytes, std::string& text) {
    z_stream zs{};
    inflateInit2(&zs, 15 + 16);
    zs.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(bytes.data()));
    zs.avail_in = static_cast<uInt>(bytes.size());
    zs.next_out = reinterpret_cast<Bytef*>(text.data());
    zs.avail_out = static_cast<uInt>(text.size());
    const int rc = inflate(&zs, Z_FINISH);
    inflateEnd(&zs);
    return rc == Z_STREAM_END;
}

// The bare work over the files, from their bytes in memory: the expansion of a compressed
// file, a pugixml parse into a document of its own. Processor seconds, or -1 on failure.
double BareWork(const std::vector<std::string>& bytes, const std::vector<std::size_t>& sizes,
                bool compressed) {
    std::vector<std::string> texts;
    for (const std::size_t size : sizes)
        texts.emplace_back(compressed ? size : 0, ' ');
    const double start = ProcessorSeconds();
    for (std::size_t f = 0; f < bytes.size(); ++f) {
        pugi::xml_document doc;
        pugi::xml_parse_result parsed;
        if (compressed) {
            if (!Inflate(bytes[f], texts[f]))
                return -1;
            parsed = doc.load_buffer_inplace(texts[f].data(), texts[f].size(), pugi::parse_default,
                                             pugi::encoding_utf8);
        } else {
            parsed = doc.load_buffer(bytes[f].data(), bytes[f].size(), pugi::parse_default,
                                     pugi::encoding_utf8);
        }
        if (!parsed)
            return -1;
        benchmark::DoNotOptimize(doc.first_child());
    }
    return ProcessorSeconds() - start;
}

// The parsing copy's side: `--bare-parse SHAPE FILE...` does the bare work once in a fresh
// process, as a program that parses the files would, and prints its processor seconds.
bool RunBareParseIfAsked(int argc, char** argv) {
    if (argc < 3 || std::string(argv[1]) != "--bare-parse")
        return false;
    const bool compressed = kShapes[std::atoi(argv[2])].compressed;
    std::vector<std::string> bytes;
    std::vector<std::size_t> sizes;
    for (int i = 3; i < argc; ++i) {
        bytes.push_back(bench::ReadAll(argv[i]));
        sizes.push_back(Expanded(bytes.back()).size());
    }
    std::printf("%.6f\n", BareWork(bytes, sizes, compressed));
    return true;
}

// The bare work in a fresh process, where the parser's memory is new to it (done over and
// over in one process, it costs a third as much or three times as much, depending on
// whether the allocator happens to keep the parser's memory between documents).
void BM_BareParse(benchmark::State& state) {
    Installation& installation = installations[state.range(0)];
    installation.bareSeconds = 1e9;
    const std::string self = std::filesystem::read_symlink("/proc/self/exe").string();
    std::string command = "'" + self + "' --bare-parse " + std::to_string(state.range(0));
    for (const std::string& file : installation.files)
        command += " '" + file + "'";
    for (auto _ : state) {
        double seconds = -1;
        if (std::FILE* child = popen(command.c_str(), "r")) {
            if (std::fscanf(child, "%lf", &seconds) != 1)
                seconds = -1;
            pclose(child);
        }
        if (seconds < 0) {
            state.SkipWithError("the bare parse failed");
            break;
        }
        state.SetIterationTime(seconds);
        installation.bareSeconds = std::min(installation.bareSeconds, seconds);
    }
    state.counters["cpu_ms"] = installation.bareSeconds * 1e3;
}
// Both sides are the fastest of the same number of runs: the fastest of more runs would
// have more chances to miss the machine's pauses.
constexpr int kRuns = 5;

BENCHMARK(BM_BareParse)
    ->DenseRange(0, kShapeCount - 1)
    ->UseManualTime()
    ->Iterations(kRuns)
    ->Unit(benchmark::kMillisecond);

// The verifier measured: VTR_BENCH_VERIFIER names another build of it (an earlier one, to
// compare), else the one built with this benchmark.
std::string Verifier() {
    const char* other = std::getenv("VTR_BENCH_VERIFIER");
    return other != nullptr && *other != '\0' ? other : VTR_VERIFY_PROGRAM;
}

void BM_VerifyEntireSchedule(benchmark::State& state) {
    Installation& installation = installations[state.range(0)];
    installation.verifySeconds = 1e9;
    for (auto _ : state) {
        const auto run =
            bench::MeasureChild({Verifier(), "--schedule", "--registry", installation.registry,
                                 "--format", "json", "--jobs", "1"});
        if (!run) {
            state.SkipWithError("the verifier could not be run");
            break;
        }
        state.SetIterationTime(run->processorSeconds);
        installation.verifySeconds = std::min(installation.verifySeconds, run->processorSeconds);
        installation.status = run->status;
    }
    state.counters["cpu_ms"] = installation.verifySeconds * 1e3;
}
BENCHMARK(BM_VerifyEntireSchedule)
    ->DenseRange(0, kShapeCount - 1)
    ->UseManualTime()
    ->Iterations(kRuns)
    ->Unit(benchmark::kMillisecond);

}  // namespace

int main(int argc, char** argv) {
    if (bench::RunMeasuredIfAsked(argc, argv) || RunBareParseIfAsked(argc, argv))
        return 0;
    benchmark::Initialize(&argc, argv);
    if (!Prepare())
        return 1;
    benchmark::RunSpecifiedBenchmarks();
    std::printf(
        "\nVerification of the entire schedule / bare parse of its sequences, one thread, "
        "processor time\n(the bare parse in a fresh process, as a program that parses the "
        "files would):\n");
    for (int s = 0; s < kShapeCount; ++s) {
        const Installation& installation = installations[s];
        if (installation.bareSeconds <= 0 || installation.bareSeconds >= 1e9 ||
            installation.verifySeconds >= 1e9) {
            continue;
        }
        const double ratio = installation.verifySeconds / installation.bareSeconds;
        char detail[96];
        std::snprintf(detail, sizeof detail, "%.0f ms / %.0f ms%s",
                      installation.verifySeconds * 1e3, installation.bareSeconds * 1e3,
                      kShapes[s].compressed ? " with expansion" : "");
        std::printf("  %-28s %.2f (%s; target <= %.2f) %s\n", kShapes[s].options, ratio, detail,
                    kShapes[s].target, ratio <= kShapes[s].target ? "ok" : "ABOVE TARGET");
    }
    delete folder;
    benchmark::Shutdown();
    return 0;
}
