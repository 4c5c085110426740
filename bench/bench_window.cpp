// The window's own cost on large runs.
//
// Judged by:
//   BM_WindowRun         a run over one show of 2,000 sequences that do not exist (about 2,000
//                        checks and as many error results, each listed and logged) through the
//                        shown window, over the same run with no window at all
//                        (window_ratio: a few at most; drawing the window after every check and
//                        result, as a plain event pump would, makes it a hundred or more)
//   BM_FillLists         listing 50,000 results (channel conflicts between the sequences of many
//                        shows, missing settings, a few errors) in the window's two lists, as a
//                        run hands them over, until the list is drawn: fill_ratio over the 200 ms
//                        a user waits without noticing (below 1)
//   BM_WindowLargeRun    a run that adds those 50,000 results with the window watching:
//                        latency_ratio, the most work the window did between two looks at its
//                        input, over 200 ms (below 1: it stays responsive), and run_ratio, the
//                        run through the window over the same run with none (logging every
//                        step and result, for information)
//   BM_WindowFilter      typing a filter into the filter box (applied with Enter) and clearing
//                        it again, with the 50,000 results listed, until the list is drawn
//                        (filter_ratio over 200 ms, the slower of the two)
//   BM_WindowRegroup     grouping them by message, show, sequence and sequence pair, and back
//                        to none, each until the list is drawn (regroup_ratio over 200 ms, the
//                        slowest)
//
// Times are the processor time of the window's thread, which is what it takes on a machine
// with nothing else to do (on a shared one the clock on the wall says more about the others).
// The window is shown on the offscreen platform unless QT_QPA_PLATFORM names another.

#include <benchmark/benchmark.h>

#include <QApplication>
#include <QComboBox>
#include <QDir>
#include <QElapsedTimer>
#include <QHeaderView>
#include <QLineEdit>
#include <QStyle>
#include <QTabWidget>
#include <QTemporaryDir>
#include <QTimer>
#include <QTreeView>
#include <algorithm>
#include <chrono>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#ifdef _WIN32
#include <windows.h>
#else
#include <ctime>
#endif

#include "ResultsModel.h"
#include "ResultsView.h"
#include "engine/LibVerify.h"
#include "environment/RegistryStore.h"
#include "environment/VTRCommon.h"
#include "frmVerifier.h"
#include "show/Show.h"
#include "show/WholeFile.h"

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kSequences = 2000;
constexpr int kLargeRunResults = 50000;
constexpr double kBudgetSeconds = 0.2;

double SecondsSince(Clock::time_point start) {
    return std::chrono::duration<double>(Clock::now() - start).count();
}

// The processor time the calling thread has used, in seconds.
double ThreadSeconds() {
#ifdef _WIN32
    FILETIME created, exited, kernel, user;
    GetThreadTimes(GetCurrentThread(), &created, &exited, &kernel, &user);
    auto seconds = [](const FILETIME& time) {
        return (static_cast<double>(time.dwHighDateTime) * 4294967296.0 + time.dwLowDateTime) / 1e7;
    };
    return seconds(kernel) + seconds(user);
#else
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) / 1e9;
#endif
}

// A store naming an installed suite, and one show whose sequences are all missing.
struct Installation {
    QTemporaryDir folder;
    std::string root;
    std::string show;

    Installation() : root(folder.path().toStdString()) {
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

// The i-th of the results of a large installation, as the conflict checks report them:
// channel conflicts between the sequences of each show, channels missing settings, some
// information and a few errors.
struct Finding {
    vtr::Severity severity = vtr::Severity::Info;
    std::string summary;
    int32_t number = 0;
    std::vector<std::string> details;
};

Finding LargeRunFinding(const std::string& root, int i) {
    const std::string data = root + "/data/";
    const int kind = i % 100;
    const std::string show = data + "Show" + std::to_string(i / 800) + ".lss";
    const std::string animation = data + "sequences/Anim-" + std::to_string(i / 800) + "-" +
                                  std::to_string(i / 80 % 10) + ".las";
    if (kind < 90) {
        const std::string channel = "[CHANNEL]: Channel " + std::to_string(i % 80 + 1);
        return {
            vtr::Severity::Warning,
            "Channel conflict",
            43,
            {"[SHOW]: " + show, "[SECTION]: Animation", "[SEQUENCE]: " + animation,
             "[TRACK]: Track 1: Track 1", channel, "[SECTION]: Background",
             "[SEQUENCE]: " + data + "sequences/Glow.las", "[TRACK]: Track 1: Track 1", channel}};
    }
    if (kind < 97) {
        return {vtr::Severity::Warning,
                "Channel is missing settings",
                30,
                {"[SEQUENCE]: " + animation, "[TRACK]: Track 2: Faults",
                 "[CHANNEL]: Unit " + std::to_string(i % 16)}};
    }
    if (kind < 99)
        return {
            vtr::Severity::Info, "Sequence uses no media file", 60, {"[SEQUENCE]: " + animation}};
    return {vtr::Severity::Error,
            "Sequence file does not exist",
            23,
            {"[SEQUENCE]: " + data + "sequences/Gone-" + std::to_string(i) + ".lms",
             "[SHOW]: show " + show}};
}

// One check that reports `count` of those results.
class ResultBurst : public vtr::ICheck {
  public:
    ResultBurst(std::string root, int count, std::function<void()> onStart = {})
        : root_(std::move(root)), count_(count), onStart_(std::move(onStart)) {}

    void Check() override {
        if (onStart_)
            onStart_();
        for (int i = 0; i < count_; ++i) {
            const Finding finding = LargeRunFinding(root_, i);
            vtr::LibVerify::AddResult(finding.severity, finding.summary, finding.number,
                                      finding.number, finding.details);
        }
    }
    std::string CheckIdentifier() override { return "9999_result_burst"; }
    std::string Description() override { return "Reporting many results"; }

  private:
    std::string root_;
    int count_;
    std::function<void()> onStart_;
};

// Queues the burst into a run once it has started.
class BurstQueuer : public vtr::INotificationClient {
  public:
    BurstQueuer(std::string root, int count) : root_(std::move(root)), count_(count) {
        vtr::LibVerify::AddNotificationClient(this);
    }
    ~BurstQueuer() override { vtr::LibVerify::RemoveNotificationClient(this); }

    void CheckAdded(vtr::ICheck&) override {}
    void CheckCompleted(vtr::ICheck&) override {}
    void Checking(vtr::ICheck&) override {
        if (!queued_) {
            queued_ = true;
            vtr::LibVerify::AddCheck(std::make_shared<ResultBurst>(root_, count_, onBurst));
        }
    }

    void ChecksCompleted(bool) override {}
    void Initializing() override { queued_ = false; }
    void ResultAdded(const vtr::ResultPtr&) override {}
    void TransientMessage(const std::string&) override {}
    void VerificationCancelled() override {}

    // Called as the burst starts.
    std::function<void()> onBurst;

  private:
    std::string root_;
    int count_;
    bool queued_ = false;
};

double RunSeconds(const std::string& show) {
    const auto start = Clock::now();
    vtr::LibVerify::VerifyShowFile(show);
    vtr::LibVerify::RunVerification();
    return SecondsSince(start);
}

// The window as a user has it, on a temporary settings file of its own.
struct ShownWindow {
    QTemporaryDir settings;
    std::unique_ptr<vtr::frmVerifier> form;

    ShownWindow() {
        vtr::frmVerifier::Options options;
        options.settingsFile = settings.filePath(QStringLiteral("window.ini"));
        form = std::make_unique<vtr::frmVerifier>(std::move(options));
        form->resize(1200, 800);
        form->show();
        QCoreApplication::processEvents();
    }

    QTreeView* Results() const { return form->findChild<QTreeView*>(QStringLiteral("lvResults1")); }
    // Lays out and draws what changed, as the event loop would.
    void Draw() const {
        QCoreApplication::processEvents();
        form->repaint();
    }
    // Verifies the show; the Results tab is shown afterwards.
    void Verify(const std::string& show) const {
        form->SetTargetFile(QString::fromStdString(show));
        form->Verify();
        Draw();
    }
};

void BM_WindowRun(benchmark::State& state) {
    Installation installation;
    double bare = 0;
    double window = 0;
    for (auto _ : state) {
        bare = RunSeconds(installation.show);
        {
            ShownWindow shown;
            const auto start = Clock::now();
            shown.Verify(installation.show);
            window = SecondsSince(start);
        }
        state.SetIterationTime(window);
    }
    state.counters["checks"] = static_cast<double>(vtr::LibVerify::ChecksPerformedCount());
    state.counters["results"] = static_cast<double>(vtr::LibVerify::GetResults().size());
    state.counters["bare_seconds"] = bare;
    state.counters["window_ratio"] = window / bare;
}
BENCHMARK(BM_WindowRun)->Iterations(2)->UseManualTime()->Unit(benchmark::kMillisecond);

void BM_FillLists(benchmark::State& state) {
    const std::string root = QDir::tempPath().toStdString() + "/installation";
    std::vector<vtr::ResultPtr> results;
    for (int i = 0; i < kLargeRunResults; ++i) {
        const Finding finding = LargeRunFinding(root, i);
        auto result = std::make_shared<vtr::Result>();
        result->SetSeverity(finding.severity);
        result->SetSummary(finding.summary);
        result->SetMessageNumber(finding.number);
        result->SetHelpContextID(finding.number);
        for (const std::string& detail : finding.details)
            result->AddDetail(detail);
        results.push_back(std::move(result));
    }
    QWidget window;
    window.resize(1200, 700);
    const QIcon icon = window.style()->standardIcon(QStyle::SP_MessageBoxWarning);
    double slowest = 0;
    for (auto _ : state) {
        // The window's lists: the grouping of the run's results, a model of each listing, and
        // their views. While a run goes the log is on view and the lists take the results as
        // they come; when it ends, the Results list is shown.
        vtr::ResultGrouping grouping;
        vtr::ResultsModel::IconOf iconOf = [&](vtr::Severity) { return icon; };
        vtr::ResultsModel listed(grouping, vtr::Listing::NotIgnored, iconOf);
        vtr::ResultsModel ignored(grouping, vtr::Listing::Ignored, iconOf);
        auto* view = new vtr::ResultsView(&listed, &window);
        view->resize(window.size());
        view->hide();
        window.show();
        QCoreApplication::processEvents();
        const double start = ThreadSeconds();
        for (std::size_t i = 0; i < results.size(); ++i) {
            grouping.Add(results[i], false);
            // Whenever the window is drawn (every 50 ms of a run: here every 500 results).
            if (i % 500 == 499 || i + 1 == results.size()) {
                listed.TakeNewResults();
                ignored.TakeNewResults();
                QCoreApplication::processEvents();
            }
        }
        view->show();
        QCoreApplication::processEvents();
        view->viewport()->repaint();
        const double seconds = ThreadSeconds() - start;
        slowest = std::max(slowest, seconds);
        state.SetIterationTime(seconds);
        delete view;
    }
    state.counters["results"] = static_cast<double>(results.size());
    state.counters["fill_ratio"] = slowest / kBudgetSeconds;
}
BENCHMARK(BM_FillLists)->Iterations(3)->UseManualTime()->Unit(benchmark::kMillisecond);

void BM_WindowLargeRun(benchmark::State& state) {
    Installation installation;
    BurstQueuer burst(installation.root, kLargeRunResults);
    // 0: the log on view, as a run starts; 1: the user turned to the Results list.
    const bool watchResults = state.range(0) == 1;
    double bare = 0;
    double window = 0;
    double mostWork = 0;
    for (auto _ : state) {
        const double bareStart = ThreadSeconds();
        RunSeconds(installation.show);
        bare = ThreadSeconds() - bareStart;
        ShownWindow shown;
        // A timer that fires whenever the window looks at its events: the most processor
        // time between two firings is the longest a user could have waited for an answer.
        double lastTick = -1;
        QTimer ticker;
        ticker.setInterval(1);
        QObject::connect(&ticker, &QTimer::timeout, [&] {
            const double now = ThreadSeconds();
            if (lastTick >= 0)
                mostWork = std::max(mostWork, now - lastTick);
            lastTick = now;
        });
        mostWork = 0;
        ticker.start();
        if (watchResults) {
            auto* tabs = shown.form->findChild<QTabWidget*>(QStringLiteral("sstDetails"));
            burst.onBurst = [tabs] { tabs->setCurrentIndex(vtr::frmVerifier::ResultsTab); };
        }
        const double start = ThreadSeconds();
        shown.Verify(installation.show);
        window = ThreadSeconds() - start;
        ticker.stop();
        state.SetIterationTime(window);
    }
    state.counters["results"] = static_cast<double>(vtr::LibVerify::GetResults().size());
    state.counters["bare_seconds"] = bare;
    state.counters["run_ratio"] = window / bare;
    state.counters["latency_ratio"] = mostWork / kBudgetSeconds;
}
BENCHMARK(BM_WindowLargeRun)
    ->ArgName("results_on_view")
    ->Arg(0)
    ->Arg(1)
    ->Iterations(2)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);

// A window with the large run's results listed, the Results tab shown.
struct ListedWindow {
    Installation installation;
    BurstQueuer burst{installation.root, kLargeRunResults};
    ShownWindow shown;

    ListedWindow() { shown.Verify(installation.show); }
};

void BM_WindowFilter(benchmark::State& state) {
    ListedWindow listed;
    auto* filter = listed.shown.form->findChild<QLineEdit*>(QStringLiteral("txtFilter"));
    double slowest = 0;
    int shown = 0;
    for (auto _ : state) {
        for (const QString& text : {QStringLiteral("anim-3-7"), QString()}) {
            const double start = ThreadSeconds();
            filter->setText(text);
            emit filter->returnPressed();
            listed.shown.Draw();
            const double seconds = ThreadSeconds() - start;
            slowest = std::max(slowest, seconds);
            state.SetIterationTime(seconds);
            if (!text.isEmpty())
                shown = listed.shown.Results()->model()->rowCount();
        }
    }
    state.counters["filtered_rows"] = shown;
    state.counters["filter_ratio"] = slowest / kBudgetSeconds;
}
BENCHMARK(BM_WindowFilter)->Iterations(3)->UseManualTime()->Unit(benchmark::kMillisecond);

void BM_WindowRegroup(benchmark::State& state) {
    ListedWindow listed;
    auto* groupBy = listed.shown.form->findChild<QComboBox*>(QStringLiteral("cboGroupBy"));
    double slowest = 0;
    int slowestGrouping = 0;
    for (auto _ : state) {
        for (int grouping : {1, 2, 3, 4, 0}) {
            const double start = ThreadSeconds();
            groupBy->setCurrentIndex(grouping);
            listed.shown.Draw();
            const double seconds = ThreadSeconds() - start;
            if (seconds > slowest) {
                slowest = seconds;
                slowestGrouping = grouping;
            }
            state.SetIterationTime(seconds);
        }
    }
    state.counters["slowest_grouping"] = slowestGrouping;
    state.counters["regroup_ratio"] = slowest / kBudgetSeconds;
}
BENCHMARK(BM_WindowRegroup)->Iterations(3)->UseManualTime()->Unit(benchmark::kMillisecond);

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
