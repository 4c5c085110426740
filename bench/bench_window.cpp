// The window's own cost on a large run.
//
// Judged by:
//   BM_WindowRun  a run over one show of 2,000 sequences that do not exist (about 2,000
//                 checks and as many error results, each listed and logged) through the
//                 shown window, over the same run with no window at all
//                 (window_ratio: a few at most; drawing the window after every check and
//                 result, as a plain event pump would, makes it a hundred or more)
//
// The window is shown on the offscreen platform unless QT_QPA_PLATFORM names another.

#include <benchmark/benchmark.h>

#include <QApplication>
#include <QTemporaryDir>
#include <chrono>
#include <filesystem>
#include <memory>
#include <string>

#include "engine/LibVerify.h"
#include "environment/RegistryStore.h"
#include "environment/VTRCommon.h"
#include "frmVerifier.h"
#include "show/Show.h"
#include "show/WholeFile.h"

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kSequences = 2000;

// A store naming an installed suite, and one show whose sequences are all missing.
struct Installation {
    QTemporaryDir folder;
    std::string show;

    Installation() {
        const std::string root = folder.path().toStdString();
        std::filesystem::create_directories(root + "/app");
        std::filesystem::create_directories(root + "/data");
        vtr::RegistryStore::Install(vtr::RegistryStore::OpenFileStore(root + "/registry.reg"));
        vtr::WriteWholeFile(
            root + "/registry.reg",
            "Windows Registry Editor Version 5.00\r\n\r\n"
            "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
            "\"AppPath\"=\"" +
                root +
                "/app/\"\r\n"
                "\"UserDataPath\"=\"" +
                root +
                "/data/\"\r\n"
                "\"PostInstall\"=dword:00000001\r\n\"PostInstallVer\"=dword:00000035\r\n");
        vtr::VTRCommon::ResetCachedFolders();
        vtr::Show model;
        for (int i = 0; i < kSequences; ++i)
            model.Musical()->List().push_back(root + "/data/missing" + std::to_string(i) + ".lms");
        show = root + "/data/large.lss";
        vtr::WriteWholeFile(show, vtr::ShowFunctions::ShowToText(model));
    }
};

double RunSeconds(const std::string& show) {
    const auto start = Clock::now();
    vtr::LibVerify::VerifyShowFile(show);
    vtr::LibVerify::RunVerification();
    return std::chrono::duration<double>(Clock::now() - start).count();
}

void BM_WindowRun(benchmark::State& state) {
    Installation installation;
    const QTemporaryDir settings;
    double bare = 0;
    double window = 0;
    for (auto _ : state) {
        bare = RunSeconds(installation.show);
        {
            vtr::frmVerifier::Options options;
            options.settingsFile = settings.filePath(QStringLiteral("window.ini"));
            vtr::frmVerifier form(std::move(options));
            form.resize(1000, 700);
            form.show();
            QCoreApplication::processEvents();
            const auto start = Clock::now();
            form.SetTargetFile(QString::fromStdString(installation.show));
            form.Verify();
            window = std::chrono::duration<double>(Clock::now() - start).count();
        }
        state.SetIterationTime(window);
    }
    state.counters["checks"] = static_cast<double>(vtr::LibVerify::ChecksPerformedCount());
    state.counters["results"] = static_cast<double>(vtr::LibVerify::GetResults().size());
    state.counters["bare_seconds"] = bare;
    state.counters["window_ratio"] = window / bare;
}
BENCHMARK(BM_WindowRun)->Iterations(2)->UseManualTime()->Unit(benchmark::kMillisecond);

}  // namespace

int main(int argc, char** argv) {
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication application(argc, argv);
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
