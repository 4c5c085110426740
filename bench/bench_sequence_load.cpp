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
#include "support/SequenceBenchSupport.h"
#include "vtrsupport/SequenceGenerator.h"

namespace {

using namespace vtr;

constexpr std::uint64_t kTargetBytes = std::uint64_t{100} << 20;

// The two shapes measured: thousands of channels of about a thousand events, and a
// hundred channels of tens of thousands of events (each larger than a parsed piece).
struct Shape {
    const char* name;
    int32_t channels;
};
constexpr Shape kShapes[] = {{"2000 channels", 2000}, {"100 channels", 100}};

struct Files {
    std::string plainPath;
    std::string packedPath;
    std::string plainBytes;
    std::string packedBytes;
    seqlib::SequenceGenerator::Written written;
};

bench::BenchFolder* folder = nullptr;
Files files[2];

void Prepare() {
    folder = new bench::BenchFolder;
    for (int s = 0; s < 2; ++s) {
        Files& f = files[s];
        const int32_t channels = kShapes[s].channels;
        f.plainPath = folder->File("big" + std::to_string(s) + ".lms");
        f.packedPath = folder->File("big" + std::to_string(s) + ".las");
        seqlib::SequenceGenerator::Options options;
        options.channels = channels;
        options.eventsPerChannel =
            seqlib::SequenceGenerator::EventsPerChannelFor(kTargetBytes, channels);
        options.tracks = 8;
        options.sharedChannels = 16;
        options.subsequenceChannels = 4;
        options.offChannels = 10;
        options.gridcraftDevices = 170;
        options.novaluxDevices = 4;
        options.media = "Song.mp3";
        options.shellCommand = "3";
        f.written = seqlib::SequenceGenerator::WriteFile(f.plainPath, options);
        options.compressed = true;
        seqlib::SequenceGenerator::WriteFile(f.packedPath, options);
        f.plainBytes = bench::ReadAll(f.plainPath);
        f.packedBytes = bench::ReadAll(f.packedPath);
        std::printf(
            "Shape %d: %d channels of %d events (%lld events), %.1f MB of XML, "
            "%.1f MB compressed\n",
            s, channels, options.eventsPerChannel, static_cast<long long>(f.written.events),
            static_cast<double>(f.plainBytes.size()) / 1e6,
            static_cast<double>(f.packedBytes.size()) / 1e6);
    }
}

const Files& FilesOf(const benchmark::State& state) {
    return files[state.range(0)];
}

void SetBytes(benchmark::State& state) {
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                            static_cast<int64_t>(FilesOf(state).plainBytes.size()));
}

void BM_BarePugixmlParse(benchmark::State& state) {
    const Files& f = FilesOf(state);
    for (auto _ : state) {
        pugi::xml_document doc;
        const auto result = doc.load_buffer(f.plainBytes.data(), f.plainBytes.size(),
                                            pugi::parse_default, pugi::encoding_utf8);
        if (!result)
            state.SkipWithError("bare parse failed");
        benchmark::DoNotOptimize(doc.first_child());
    }
    SetBytes(state);
}

void BM_BarePugixmlParseInPlace(benchmark::State& state) {
    const Files& f = FilesOf(state);
    std::unique_ptr<char[]> copy(new char[f.plainBytes.size()]);
    for (auto _ : state) {
        state.PauseTiming();
        std::memcpy(copy.get(), f.plainBytes.data(), f.plainBytes.size());
        state.ResumeTiming();
        pugi::xml_document doc;
        const auto result = doc.load_buffer_inplace(copy.get(), f.plainBytes.size(),
                                                    pugi::parse_default, pugi::encoding_utf8);
        if (!result)
            state.SkipWithError("bare parse failed");
        benchmark::DoNotOptimize(doc.first_child());
    }
    SetBytes(state);
}

void BM_SequenceLoad(benchmark::State& state) {
    const Files& f = FilesOf(state);
    for (auto _ : state) {
        seqlib::Sequence sequence;
        sequence.Load(f.plainPath);
        benchmark::DoNotOptimize(sequence.Channels().data());
    }
    SetBytes(state);
}

void BM_BareGunzipAndParse(benchmark::State& state) {
    const Files& f = FilesOf(state);
    std::unique_ptr<char[]> text(new char[f.plainBytes.size()]);
    for (auto _ : state) {
        z_stream zs{};
        inflateInit2(&zs, 15 + 16);
        zs.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(f.packedBytes.data()));
        zs.avail_in = static_cast<uInt>(f.packedBytes.size());
        zs.next_out = reinterpret_cast<Bytef*>(text.get());
        zs.avail_out = static_cast<uInt>(f.plainBytes.size());
        const int rc = inflate(&zs, Z_FINISH);
        inflateEnd(&zs);
        if (rc != Z_STREAM_END)
            state.SkipWithError("inflate failed");
        pugi::xml_document doc;
        const auto result = doc.load_buffer_inplace(text.get(), f.plainBytes.size(),
                                                    pugi::parse_default, pugi::encoding_utf8);
        if (!result)
            state.SkipWithError("bare parse failed");
        benchmark::DoNotOptimize(doc.first_child());
    }
    SetBytes(state);
}

void BM_SequenceLoadCompressed(benchmark::State& state) {
    const Files& f = FilesOf(state);
    for (auto _ : state) {
        seqlib::Sequence sequence;
        sequence.Load(f.packedPath);
        benchmark::DoNotOptimize(sequence.Channels().data());
    }
    SetBytes(state);
}

BENCHMARK(BM_BarePugixmlParse)->DenseRange(0, 1)->Unit(benchmark::kMillisecond)->MinTime(2.0);
BENCHMARK(BM_BarePugixmlParseInPlace)
    ->DenseRange(0, 1)
    ->Unit(benchmark::kMillisecond)
    ->MinTime(2.0);
BENCHMARK(BM_SequenceLoad)->DenseRange(0, 1)->Unit(benchmark::kMillisecond)->MinTime(2.0);
BENCHMARK(BM_BareGunzipAndParse)->DenseRange(0, 1)->Unit(benchmark::kMillisecond)->MinTime(2.0);
BENCHMARK(BM_SequenceLoadCompressed)->DenseRange(0, 1)->Unit(benchmark::kMillisecond)->MinTime(2.0);

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
    for (int shape = 0; shape < 2; ++shape) {
        const Files& f = files[shape];
        const std::string arg = "/" + std::to_string(shape);
        std::printf("%s:\n", kShapes[shape].name);
        PrintRatio(times,
                   "  load throughput / bare pugixml parse:", ("BM_BarePugixmlParse" + arg).c_str(),
                   ("BM_SequenceLoad" + arg).c_str(), 0.7);
        PrintRatio(times, "  load throughput / bare in-place pugixml parse:",
                   ("BM_BarePugixmlParseInPlace" + arg).c_str(), ("BM_SequenceLoad" + arg).c_str(),
                   0.7);
        PrintRatio(times, "  compressed load / (zlib expansion + bare parse):",
                   ("BM_BareGunzipAndParse" + arg).c_str(),
                   ("BM_SequenceLoadCompressed" + arg).c_str(), 0.7);
        const double plainSize = static_cast<double>(f.plainBytes.size());
        PrintMemory("  peak memory of a load / file size:", f.plainPath, plainSize);
        PrintMemory("  peak memory of a compressed load / expanded size:", f.packedPath, plainSize);
    }
    delete folder;
    benchmark::Shutdown();
    return 0;
}
