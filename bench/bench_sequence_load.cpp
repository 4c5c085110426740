// Loading a large sequence against the bare work it cannot avoid: a pugixml parse of the
// same bytes (and, for a compressed file, zlib's expansion of them first). Prints the
// throughput ratios, the peak memory of a load against the file's size and what a loaded
// sequence keeps per channel.

#include <benchmark/benchmark.h>
#include <zlib.h>
#include <pugixml.hpp>

#include <cstdio>
#include <cstring>
#include <memory>

#include "sequencelib/Sequence.h"
#include "sequencelib/SequenceGenerator.h"
#include "support/SequenceBenchSupport.h"

namespace {

using namespace vtr;

constexpr std::uint64_t kTargetBytes = std::uint64_t{100} << 20;
constexpr int32_t kChannels = 2000;

struct Files {
    bench::BenchFolder folder;
    std::string plainPath = folder.File("big.lms");
    std::string packedPath = folder.File("big.las");
    std::string plainBytes;
    std::string packedBytes;
    seqlib::SequenceGenerator::Written written;
};

Files* files = nullptr;

void Prepare() {
    files = new Files;
    seqlib::SequenceGenerator::Options options;
    options.channels = kChannels;
    options.eventsPerChannel =
        seqlib::SequenceGenerator::EventsPerChannelFor(kTargetBytes, kChannels);
    options.tracks = 8;
    options.sharedChannels = 16;
    options.subsequenceChannels = 4;
    options.offChannels = 10;
    options.gridcraftDevices = 170;
    options.novaluxDevices = 4;
    options.media = "Song.mp3";
    options.shellCommand = "3";
    files->written = seqlib::SequenceGenerator::WriteFile(files->plainPath, options);
    options.compressed = true;
    seqlib::SequenceGenerator::WriteFile(files->packedPath, options);
    files->plainBytes = bench::ReadAll(files->plainPath);
    files->packedBytes = bench::ReadAll(files->packedPath);
    std::printf("Sequence: %d channels, %lld events, %.1f MB of XML, %.1f MB compressed\n",
                kChannels, static_cast<long long>(files->written.events),
                static_cast<double>(files->plainBytes.size()) / 1e6,
                static_cast<double>(files->packedBytes.size()) / 1e6);
}

void SetBytes(benchmark::State& state) {
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                            static_cast<int64_t>(files->plainBytes.size()));
}

void BM_BarePugixmlParse(benchmark::State& state) {
    for (auto _ : state) {
        pugi::xml_document doc;
        const auto result = doc.load_buffer(files->plainBytes.data(), files->plainBytes.size(),
                                            pugi::parse_default, pugi::encoding_utf8);
        if (!result)
            state.SkipWithError("bare parse failed");
        benchmark::DoNotOptimize(doc.first_child());
    }
    SetBytes(state);
}

void BM_BarePugixmlParseInPlace(benchmark::State& state) {
    std::unique_ptr<char[]> copy(new char[files->plainBytes.size()]);
    for (auto _ : state) {
        state.PauseTiming();
        std::memcpy(copy.get(), files->plainBytes.data(), files->plainBytes.size());
        state.ResumeTiming();
        pugi::xml_document doc;
        const auto result = doc.load_buffer_inplace(copy.get(), files->plainBytes.size(),
                                                    pugi::parse_default, pugi::encoding_utf8);
        if (!result)
            state.SkipWithError("bare parse failed");
        benchmark::DoNotOptimize(doc.first_child());
    }
    SetBytes(state);
}

void BM_SequenceLoad(benchmark::State& state) {
    for (auto _ : state) {
        seqlib::Sequence sequence;
        sequence.Load(files->plainPath);
        benchmark::DoNotOptimize(sequence.Channels().data());
    }
    SetBytes(state);
}

void BM_BareGunzipAndParse(benchmark::State& state) {
    std::unique_ptr<char[]> text(new char[files->plainBytes.size()]);
    for (auto _ : state) {
        z_stream zs{};
        inflateInit2(&zs, 15 + 16);
        zs.next_in = reinterpret_cast<Bytef*>(files->packedBytes.data());
        zs.avail_in = static_cast<uInt>(files->packedBytes.size());
        zs.next_out = reinterpret_cast<Bytef*>(text.get());
        zs.avail_out = static_cast<uInt>(files->plainBytes.size());
        const int rc = inflate(&zs, Z_FINISH);
        inflateEnd(&zs);
        if (rc != Z_STREAM_END)
            state.SkipWithError("inflate failed");
        pugi::xml_document doc;
        const auto result = doc.load_buffer_inplace(text.get(), files->plainBytes.size(),
                                                    pugi::parse_default, pugi::encoding_utf8);
        if (!result)
            state.SkipWithError("bare parse failed");
        benchmark::DoNotOptimize(doc.first_child());
    }
    SetBytes(state);
}

void BM_SequenceLoadCompressed(benchmark::State& state) {
    for (auto _ : state) {
        seqlib::Sequence sequence;
        sequence.Load(files->packedPath);
        benchmark::DoNotOptimize(sequence.Channels().data());
    }
    SetBytes(state);
}

BENCHMARK(BM_BarePugixmlParse)->Unit(benchmark::kMillisecond)->MinTime(2.0);
BENCHMARK(BM_BarePugixmlParseInPlace)->Unit(benchmark::kMillisecond)->MinTime(2.0);
BENCHMARK(BM_SequenceLoad)->Unit(benchmark::kMillisecond)->MinTime(2.0);
BENCHMARK(BM_BareGunzipAndParse)->Unit(benchmark::kMillisecond)->MinTime(2.0);
BENCHMARK(BM_SequenceLoadCompressed)->Unit(benchmark::kMillisecond)->MinTime(2.0);

void PrintRatio(const bench::TimeKeepingReporter& times, const char* what, const char* bare,
                const char* ours, double target) {
    const auto bareSeconds = times.Seconds(bare);
    const auto ourSeconds = times.Seconds(ours);
    if (!bareSeconds || !ourSeconds)
        return;
    const double ratio = *bareSeconds / *ourSeconds;
    std::printf("%-58s %.2f (target >= %.2f) %s\n", what, ratio, target,
                ratio >= target ? "ok" : "BELOW TARGET");
}

void PrintMemory(const char* what, const std::string& path, double fileBytes) {
    const auto memory = bench::MeasureLoadInChild(path);
    if (!memory) {
        std::printf("%-58s not measured on this platform\n", what);
        return;
    }
    const double ratio = static_cast<double>(memory->peakBytes) / fileBytes;
    std::printf("%-58s %.2f (%.1f MB; target < 2.50) %s\n", what, ratio,
                static_cast<double>(memory->peakBytes) / 1e6, ratio < 2.5 ? "ok" : "ABOVE TARGET");
    std::printf("%-58s %.0f bytes per channel (%llu bytes, %llu channels)\n",
                "  kept by the loaded sequence:",
                static_cast<double>(memory->retainedBytes) / static_cast<double>(memory->channels),
                static_cast<unsigned long long>(memory->retainedBytes),
                static_cast<unsigned long long>(memory->channels));
}

}  // namespace

int main(int argc, char** argv) {
    if (vtr::bench::RunLoadMeasurementIfAsked(argc, argv))
        return 0;
    benchmark::Initialize(&argc, argv);
    Prepare();
    vtr::bench::TimeKeepingReporter times;
    benchmark::RunSpecifiedBenchmarks(&times);
    std::printf("\n");
    PrintRatio(times, "Load throughput / bare pugixml parse:", "BM_BarePugixmlParse",
               "BM_SequenceLoad", 0.7);
    PrintRatio(times,
               "Load throughput / bare in-place pugixml parse:", "BM_BarePugixmlParseInPlace",
               "BM_SequenceLoad", 0.7);
    PrintRatio(times, "Compressed load / (zlib expansion + bare parse):", "BM_BareGunzipAndParse",
               "BM_SequenceLoadCompressed", 0.7);
    const double plainSize = static_cast<double>(files->plainBytes.size());
    PrintMemory("Peak memory of a load / file size:", files->plainPath, plainSize);
    PrintMemory("Peak memory of a compressed load / expanded size:", files->packedPath, plainSize);
    if (const auto packed = bench::MeasureLoadInChild(files->packedPath)) {
        std::printf("%-58s %.2f\n", "Peak memory of a compressed load / compressed file size:",
                    static_cast<double>(packed->peakBytes) /
                        static_cast<double>(files->packedBytes.size()));
    }
    delete files;
    benchmark::Shutdown();
    return 0;
}
