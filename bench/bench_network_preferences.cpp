// Reading the network preferences at the start of a verification: 16 networks and 999 DMX
// universes from a settings-store file where every one of them is configured, and from
// one where none is.

#include <benchmark/benchmark.h>

#include <cstdio>
#include <fstream>
#include <memory>

#include "environment/NetworkPreferences.h"
#include "environment/RegistryStore.h"
#include "support/SequenceBenchSupport.h"

namespace {

using namespace vtr;

bench::BenchFolder* folder = nullptr;

std::string FullStore() {
    const std::string key = "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network{rev}";
    std::string text =
        "Windows Registry Editor Version 5.00\r\n\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\NetVersion]\r\n"
        "\"Ver\"=\"{rev}\"\r\n\r\n" +
        key + "]\r\n\"NetworkVantori\"=dword:00000001\r\n\r\n";
    for (int n = 1; n < 16; ++n) {
        char port[16];
        std::snprintf(port, sizeof port, "%08x", n + 1);
        text += key + "\\Aux" + std::string(1, static_cast<char>(64 + n)) +
                "]\r\n\"NetworkVantori\"=dword:" + port + "\r\n\"Comment\"=\"Aux\"\r\n\r\n";
    }
    for (int u = 1; u <= 999; ++u) {
        text += key + "\\DMX" + std::to_string(u) + "]\r\n\"Adapter\"=\"Interface " +
                std::to_string(u) +
                "\"\r\n\"Protocol\"=dword:00000002\r\n\"Uses E131\"=dword:00000001\r\n"
                "\"E131 IP Address Type\"=dword:00000001\r\n\"E131 IP Address\"=\"239.255.0." +
                std::to_string(u % 256) +
                "\"\r\n\"E131 Send To Port\"=dword:000015c0\r\n"
                "\"Comment\"=\"Universe " +
                std::to_string(u) + "\"\r\n\r\n";
    }
    return text;
}

void Read(benchmark::State& state, const std::string& file) {
    RegistryStore::Select(file);
    for (auto _ : state) {
        NetworkPreferences prefs;
        prefs.InitFromRegistry(true);
        benchmark::DoNotOptimize(prefs.DMXUniverse(999).Adapter().data());
    }
}

void BM_NetworkPreferencesFullStore(benchmark::State& state) {
    Read(state, folder->File("full.reg"));
}

void BM_NetworkPreferencesEmptyStore(benchmark::State& state) {
    Read(state, folder->File("empty.reg"));
}

BENCHMARK(BM_NetworkPreferencesFullStore)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_NetworkPreferencesEmptyStore)->Unit(benchmark::kMillisecond);

}  // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    folder = new bench::BenchFolder;
    const std::string store = FullStore();
    std::ofstream(folder->File("full.reg"), std::ios::binary) << store;
    std::ofstream(folder->File("empty.reg"), std::ios::binary)
        << "Windows Registry Editor Version 5.00\r\n";
    std::printf("Store of %zu bytes with 16 networks and 999 universes configured\n", store.size());
    bench::TimeKeepingReporter times;
    benchmark::RunSpecifiedBenchmarks(&times);
    if (const auto full = times.Seconds("BM_NetworkPreferencesFullStore")) {
        std::printf(
            "\nReading every network preference from the full store: %.1f ms "
            "(%.1f us of processor time per value read)\n",
            *full * 1e3, *full * 1e6 / (999 * 7 + 16 * 9 + 6));
    }
    delete folder;
    benchmark::Shutdown();
    return 0;
}
