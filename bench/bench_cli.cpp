// The command-line verifier's own cost on top of a verification.
//
// Judged by:
//   front_end_ratio   (BM_FrontEnd) the processor time of a whole run through vantori-verify
//                     (--format json, --log and the progress line of a terminal)
//                     over that of the same run with no client at all; the schedule has 300
//                     shows drawing on 1,000 sequences (about 12,500 checks and a hundred
//                     results). The front end must stay cheap: a ratio below 1.25.
//   BM_WriteJson      printing a run of 10,000 results as JSON, per result.
//   BM_LogLine        one line of the output log (time stamp, text, stream), per line: a
//                     run logs about three lines per check.

#include <benchmark/benchmark.h>

#include <ctime>
#include <memory>
#include <ostream>
#include <streambuf>
#include <string>
#include <vector>

#include "App.h"
#include "ResultsOutput.h"
#include "engine/LibVerify.h"
#include "engine/OutputLog.h"
#include "environment/RegistryStore.h"
#include "environment/VTRCommon.h"
#include "schedule/Schedule.h"
#include "show/Show.h"
#include "show/WholeFile.h"
#include "support/SequenceBenchSupport.h"
#include "vtrsupport/SequenceGenerator.h"

namespace {

using namespace vtr;

constexpr int kShows = 300;
constexpr int kSequences = 1000;
constexpr int kPerShow = 15;

// Swallows whatever is written to it.
class NullBuffer : public std::streambuf {
  protected:
    int overflow(int c) override { return c; }
    std::streamsize xsputn(const char*, std::streamsize count) override { return count; }
};

// A suite with a large schedule in a temporary folder, its store selected.
class Installation {
  public:
    Installation() {
        previous_ = RegistryStore::Install(RegistryStore::OpenFileStore(Store()));
        WriteWholeFile(Store(),
                       "Windows Registry Editor Version 5.00\r\n\r\n"
                       "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
                       "\"PostInstall\"=dword:00000001\r\n"
                       "\"PostInstallVer\"=dword:00000035\r\n"
                       "\"UserDataPath\"=\"" +
                           folder_.File("") + "\"\r\n");
        VTRCommon::ResetCachedFolders();

        seqlib::SequenceGenerator::Options options;
        options.channels = 16;
        options.eventsPerChannel = 8;
        for (int n = 0; n < kSequences; ++n) {
            options.compressed = n % 4 == 0;
            seqlib::SequenceGenerator::WriteFile(SequenceFile(n), options);
        }

        Schedule weekly;
        const int slot = TimeConstants::SecondsPerWeek / kShows;
        int next = 0;
        for (int i = 0; i < kShows; ++i) {
            // Musical sections only, which are never compared with each other, and every
            // 40th reference to a file that is missing: a few hundred results.
            Show show;
            for (int k = 0; k < kPerShow; ++k, ++next) {
                show.Musical()->List().push_back(
                    next % 40 == 0 ? folder_.File("Missing" + std::to_string(next) + ".lms")
                                   : SequenceFile(next % kSequences));
            }
            const std::string name = folder_.File("Show" + std::to_string(i) + ".lss");
            WriteWholeFile(name, ShowFunctions::ShowToText(show));
            auto start = std::make_shared<WeekTime>();
            start->SetTimeVal(i * slot);
            auto end = std::make_shared<WeekTime>();
            end->SetTimeVal(i * slot + slot / 2);
            weekly.AddShowEventByFile(name, start, end);
        }
        weekly.Save(folder_.File("weeksched.lsc"));
    }
    ~Installation() {
        RegistryStore::Install(std::move(previous_));
        VTRCommon::ResetCachedFolders();
    }

    std::string Store() const { return folder_.File("registry.reg"); }

  private:
    std::string SequenceFile(int n) const {
        return folder_.File("Seq" + std::to_string(n) + (n % 3 == 0 ? ".lms" : ".las"));
    }

    bench::BenchFolder folder_;
    std::unique_ptr<RegistryStore::Backend> previous_;
};

Installation& TheInstallation() {
    static Installation installation;
    return installation;
}

// Processor seconds of this process so far: on a shared machine they vary much less than
// the time on the wall.
double ProcessorSeconds() {
    return static_cast<double>(std::clock()) / CLOCKS_PER_SEC;
}

// Runs the bare verification and the command line in turn, each iteration, and compares the
// processor time of the two.
void BM_FrontEnd(benchmark::State& state) {
    Installation& installation = TheInstallation();
    NullBuffer buffer;
    std::ostream null(&buffer);
    const std::vector<std::string> arguments = {
        "vantori-verify", "--schedule", "--registry", installation.Store(),
        "--format",       "json",       "--log"};
    std::vector<const char*> argv;
    for (const std::string& argument : arguments)
        argv.push_back(argument.c_str());

    double bareSeconds = 0;
    double commandLineSeconds = 0;
    int status = -1;
    for (auto _ : state) {
        double start = 0;
        start = ProcessorSeconds();
        cli::Console console{null, null, true, 120};
        status = cli::Main(static_cast<int>(argv.size()), argv.data(), console);
        commandLineSeconds += ProcessorSeconds() - start;

        RegistryStore::Select(installation.Store());
        VTRCommon::ResetCachedFolders();
        start = ProcessorSeconds();
        LibVerify::SetScheduleFiles(VTRCommon::GetWeeklyScheduleFile(),
                                    VTRCommon::GetYearlyScheduleFile());
        LibVerify::RunVerification();
        bareSeconds += ProcessorSeconds() - start;
    }
    state.counters["checks"] = static_cast<double>(LibVerify::ChecksPerformedCount());
    state.counters["results"] = static_cast<double>(LibVerify::GetResults().size());
    state.counters["exit_status"] = status;
    state.counters["bare_ms"] = 1000 * bareSeconds / static_cast<double>(state.iterations());
    state.counters["cli_ms"] = 1000 * commandLineSeconds / static_cast<double>(state.iterations());
    state.counters["front_end_ratio"] = commandLineSeconds / bareSeconds;
}
BENCHMARK(BM_FrontEnd)->Unit(benchmark::kMillisecond)->Iterations(10);

void BM_WriteJson(benchmark::State& state) {
    cli::RunRecord record;
    for (int i = 0; i < 10000; ++i) {
        auto result = std::make_shared<Result>();
        result->SetSeverity(Severity::Warning);
        result->SetMessageNumber(43);
        result->SetHelpContextID(43);
        result->SetSummary("Channel conflict");
        for (int d = 0; d < 9; ++d)
            result->AddDetail("[SEQUENCE]: /shows/sequences/Sequence" + std::to_string(i) + ".las");
        record.results.push_back({result, i % 10 == 0});
    }
    NullBuffer buffer;
    std::ostream null(&buffer);
    for (auto _ : state)
        cli::WriteJson(null, record);
    state.SetItemsProcessed(state.iterations() * 10000);
}
BENCHMARK(BM_WriteJson)->Unit(benchmark::kMillisecond);

// One line of the output log, as --log writes it: the time stamp, the text of a notification
// and the line's way to a stream.
void BM_LogLine(benchmark::State& state) {
    NullBuffer buffer;
    std::ostream null(&buffer);
    OutputLog::LogWriter writer(
        [&](const OutputLog::LogLine& line) { null << line.Formatted() << "\n"; });
    class Named : public ICheck {
      public:
        void Check() override {}
        std::string CheckIdentifier() override { return "20_/shows/sequences/Sequence17.las"; }
        std::string Description() override {
            return "Sequence file loads: /shows/sequences/Sequence17.las";
        }
    } check;
    for (auto _ : state)
        writer.Checking(check);
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_LogLine);

}  // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
