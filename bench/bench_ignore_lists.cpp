// Saving an ignore list. One save is what `vantori-verify ignore --key KEY` (or unignore) does
// to the settings store: under the store's lock it reads the list afresh, adds or removes the
// entry and writes the whole list back (entries 1 to count, then the count) in one
// replacement of the file. Measured on stores whose single-result list holds 1,000, 2,000,
// 10,000 and 100,000 entries: each iteration un-ignores the list's first entry, which moves every
// other entry one place up (every value rewritten), and ignores it again, which appends it
// (two saves).
//
// Judged by (printed at the end):
//   one save of 100,000 entries   about a second at most
//   ratio between sizes           the time of a save over that of the next shorter list:
//                                 about the ratio of their lengths when the cost grows with
//                                 the list (the store is read, checked and written once per
//                                 save), its square if every entry cost a pass over the
//                                 whole store
//   memory per byte of store      the peak resident set of `vantori-verify ignore` on a store
//                                 of a million keys (a child process) over the store file's
//                                 size: a small constant, never gigabytes

#include <benchmark/benchmark.h>

#include <cstdio>
#include <fstream>
#include <memory>
#include <string>

#include "engine/IgnoreLists.h"
#include "engine/LibVerify.h"
#include "environment/RegistryFile.h"
#include "environment/RegistryStore.h"
#include "support/ChildProcess.h"
#include "support/SequenceBenchSupport.h"

#ifndef VTR_VERIFY_PROGRAM
#define VTR_VERIFY_PROGRAM "vantori-verify"
#endif

namespace {

using namespace vtr;

bench::BenchFolder* folder = nullptr;

// A result's key of realistic length.
std::string Key(int n) {
    return "28-[SEQUENCE]: /home/show/Vantori/Sequences/Carol " + std::to_string(n) +
           ".lms / [CHANNEL]: Unit " + std::to_string(n % 16) + ", circuit 3 / ";
}

// A store with the suite's usual settings and a single-result list of n entries.
std::string StoreWithList(int entries) {
    const std::string path = folder->File("list" + std::to_string(entries) + ".reg");
    std::ofstream out(path, std::ios::binary);
    out << "Windows Registry Editor Version 5.00\r\n\r\n"
           "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
           "\"AppPath\"=\"C:\\\\Program Files\\\\Vantori\\\\\"\r\n"
           "\"UserDataPath\"=\"D:\\\\Shows\\\\\"\r\n\r\n"
           "[HKEY_CURRENT_USER\\Software\\Vantori\\Verifier]\r\n";
    out << "\"CountIgnoreMsg\"=" << RegistryFile::DwordText(static_cast<uint32_t>(entries))
        << "\r\n";
    for (int n = 1; n <= entries; ++n)
        out << "\"IgnoreMsg" << n << "\"=" << RegistryFile::QuotedText(Key(n)) << "\r\n";
    return path;
}

void BM_SaveIgnoreList(benchmark::State& state) {
    const int entries = static_cast<int>(state.range(0));
    auto previous = RegistryStore::Install(RegistryStore::OpenFileStore(StoreWithList(entries)));
    LibVerify::IgnoredResultKeys().Clear();
    IgnoreLists::LoadIgnoreLists();
    for (auto _ : state) {
        const std::string first = LibVerify::IgnoredResultKeys().Entries().front();
        if (IgnoreLists::RemoveIgnoredResultKey(first) != IgnoreLists::ChangeOutcome::Removed ||
            IgnoreLists::AddIgnoredResultKey(first) != IgnoreLists::ChangeOutcome::Added) {
            state.SkipWithError("the list did not change as asked");
            break;
        }
    }
    state.counters["entries"] = static_cast<double>(LibVerify::IgnoredResultKeys().Count());
    LibVerify::IgnoredResultKeys().Clear();
    RegistryStore::Install(std::move(previous));
}

BENCHMARK(BM_SaveIgnoreList)
    ->Arg(1000)
    ->Arg(2000)
    ->Arg(10000)
    ->Arg(100000)
    ->Unit(benchmark::kMillisecond)
    ->MinTime(1.0);

// A store of a million keys, each with one value, in the layout of the network preferences.
std::string MillionKeyStore() {
    const std::string path = folder->File("million.reg");
    std::ofstream out(path, std::ios::binary);
    out << "Windows Registry Editor Version 5.00\r\n\r\n";
    for (int k = 0; k < 1000000; ++k) {
        out << "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network\\DMX" << k
            << "]\r\n\"Adapter\"=\"adapter " << k << "\"\r\n\r\n";
    }
    return path;
}

}  // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    folder = new bench::BenchFolder;
    bench::TimeKeepingReporter times;
    benchmark::RunSpecifiedBenchmarks(&times);

    std::printf("\nOne save of an ignore list (processor time, half an iteration):\n");
    double last = 0;
    int lastEntries = 0;
    for (const int entries : {1000, 2000, 10000, 100000}) {
        const auto seconds = times.Seconds("BM_SaveIgnoreList/" + std::to_string(entries));
        if (!seconds)
            continue;
        const double save = *seconds / 2;
        std::printf("  %7d entries: %9.2f ms", entries, save * 1e3);
        if (last > 0) {
            std::printf("   ratio to %d entries: %.1f (the list %d times as long)", lastEntries,
                        save / last, entries / lastEntries);
        }
        std::printf("\n");
        last = save;
        lastEntries = entries;
    }
    if (const auto largest = times.Seconds("BM_SaveIgnoreList/100000")) {
        std::printf("  100,000 entries in about a second: %s\n",
                    *largest / 2 <= 1.5 ? "met" : "NOT met");
    }

    const std::string million = MillionKeyStore();
    const auto size = std::ifstream(million, std::ios::binary | std::ios::ate).tellg();
    if (const auto run = bench::RunChild(
            {VTR_VERIFY_PROGRAM, "ignore", "--message", "23", "--registry", million})) {
        std::printf(
            "\n`vantori-verify ignore` on a store of a million keys (%.1f MB): exit status %d, "
            "%.2f s, peak %.0f MB = %.1f bytes of memory per byte of store\n",
            static_cast<double>(size) / 1e6, run->status, run->wallSeconds,
            static_cast<double>(run->peakBytes) / 1e6,
            static_cast<double>(run->peakBytes) / static_cast<double>(size));
    }
    delete folder;
    benchmark::Shutdown();
    return 0;
}
