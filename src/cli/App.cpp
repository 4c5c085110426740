#include "App.h"

#include <exception>
#include <filesystem>
#include <memory>
#include <optional>
#include <ostream>
#include <string>
#include <system_error>
#include <vector>

#include "Baseline.h"
#include "IgnoreCommands.h"
#include "Interrupt.h"
#include "ReportFile.h"
#include "ResultsOutput.h"
#include "Terminal.h"
#include "engine/LibVerify.h"
#include "engine/OutputLog.h"
#include "engine/ResultsReport.h"
#include "engine/SequencePrefetch.h"
#include "engine/VtrError.h"
#include "environment/OutputFile.h"
#include "environment/RegistryStore.h"
#include "environment/VTRCommon.h"

namespace vtr::cli {
namespace {

namespace fs = std::filesystem;

constexpr const char* kProgram = "vantori-verify";

void Fail(std::ostream& err, const std::string& description) {
    err << kProgram << ": " << description << "\n";
}

// Follows the run: keeps every result in the order produced, with whether it was ignored,
// and feeds the progress display.
class RunObserver : public INotificationClient {
  public:
    explicit RunObserver(ProgressLine* progress) : progress_(progress) {}

    void CheckAdded(ICheck&) override { UpdateCounts(); }
    void CheckCompleted(ICheck&) override { UpdateCounts(); }
    void Checking(ICheck& check) override {
        if (progress_ != nullptr) {
            progress_->SetCurrent(check.Description());
            progress_->Tick();
        }
    }
    void ChecksCompleted(bool cancelled) override { cancelled_ = cancelled; }
    void Initializing() override {
        results_.clear();
        cancelled_ = false;
    }
    void ResultAdded(const ResultPtr& result) override {
        if (result)
            results_.push_back(RecordedResult{result, result->Ignorable()});
    }
    void TransientMessage(const std::string&) override {}
    void VerificationCancelled() override { UpdateCounts(); }

    bool Cancelled() const { return cancelled_; }
    std::vector<RecordedResult> TakeResults() { return std::move(results_); }

  private:
    void UpdateCounts() {
        if (progress_ != nullptr) {
            progress_->SetCounts(LibVerify::ChecksPerformedCount(),
                                 LibVerify::ChecksRemainingCount());
        }
    }

    ProgressLine* progress_;
    std::vector<RecordedResult> results_;
    bool cancelled_ = false;
};

// Registers a client for as long as it lives.
class ScopedClient {
  public:
    explicit ScopedClient(INotificationClient* client) : client_(client) {
        LibVerify::AddNotificationClient(client_);
    }
    ~ScopedClient() { LibVerify::RemoveNotificationClient(client_); }
    ScopedClient(const ScopedClient&) = delete;
    ScopedClient& operator=(const ScopedClient&) = delete;

  private:
    INotificationClient* client_;
};

// Installs the event pump for as long as it lives.
class ScopedEventPump {
  public:
    explicit ScopedEventPump(std::function<void()> pump) {
        LibVerify::SetEventPump(std::move(pump));
    }
    ~ScopedEventPump() { LibVerify::SetEventPump({}); }
    ScopedEventPump(const ScopedEventPump&) = delete;
    ScopedEventPump& operator=(const ScopedEventPump&) = delete;
};

// The temporary files of the selected target go with the run, however it ends: normally,
// cancelled, or by an error escaping (at the program's end the driver's state removes them
// too, and a second Ctrl-C removes them in its handler).
class TempFilesRemover {
  public:
    TempFilesRemover() = default;
    ~TempFilesRemover() { LibVerify::DeleteTempFiles(); }
    TempFilesRemover(const TempFilesRemover&) = delete;
    TempFilesRemover& operator=(const TempFilesRemover&) = delete;
};

constexpr const char* kReportWhat = "results file";
constexpr const char* kReportSource = "vantori-verify";
constexpr const char* kBaselineWhat = "baseline";

// Why the run cannot start, or the empty text when it can.
std::string SetUpProblem(const Options& options) {
    std::error_code error;
    if (options.registry) {
        const fs::path store(*options.registry);
        if (!fs::exists(store, error))
            return "the settings store file " + *options.registry + " does not exist";
        if (fs::is_directory(store, error))
            return "the settings store " + *options.registry + " is a folder, not a file";
    }
    if (options.output) {
        const fs::path output(*options.output);
        if (fs::is_directory(output, error))
            return "cannot write the results report " + *options.output + ": it is a folder";
        const fs::path folder = output.has_parent_path() ? output.parent_path() : fs::path(".");
        if (!fs::is_directory(folder, error))
            return "cannot write the results report " + *options.output +
                   ": its folder does not exist";
    }
    return {};
}

void SelectTarget(const Options& options) {
    switch (options.target) {
        case TargetKind::Schedule:
            LibVerify::SetScheduleFiles(VTRCommon::GetWeeklyScheduleFile(),
                                        VTRCommon::GetYearlyScheduleFile());
            break;
        case TargetKind::Show:
            LibVerify::VerifyShowFile(options.targetFile);
            break;
        case TargetKind::Sequence:
            LibVerify::VerifySequenceFile(options.targetFile);
            break;
    }
}

// The target as an absolute path, as the window's file dialogs give it: the results (and so
// the keys of ignored results) then name the same file wherever the command is run from.
std::string AbsoluteTarget(const std::string& file) {
    std::error_code error;
    const fs::path absolute = fs::absolute(fs::path(file), error);
    return error ? file : absolute.lexically_normal().string();
}

}  // namespace

int RunVerify(const Options& givenOptions, Console& console) {
    Options options = givenOptions;
    if (options.target != TargetKind::Schedule)
        options.targetFile = AbsoluteTarget(options.targetFile);
    if (const std::string problem = SetUpProblem(options); !problem.empty()) {
        Fail(console.err, problem);
        return ExitStatus::CannotSetUp;
    }
    std::optional<Baseline> baseline;
    try {
        if (options.baseline)
            baseline = Baseline::Read(*options.baseline);
    } catch (const VtrError& error) {
        Fail(console.err, error.Description());
        return ExitStatus::CannotSetUp;
    }
    // A store that is missing or cannot be read still gives a verification (with no
    // settings), but the user is told first which store it was and why it was that one.
    const RegistryStore::Description store = RegistryStore::Describe();
    if (const std::string problem = store.Problem(); !problem.empty())
        Fail(console.err, problem);

    std::unique_ptr<ProgressLine> progress;
    if (console.errIsTerminal && !options.quiet)
        progress = std::make_unique<ProgressLine>(console.err, console.errColumns, console.clock);

    RunObserver observer(progress.get());
    ScopedClient observing(&observer);

    OutputLog::LogWriter logWriter([&](const OutputLog::LogLine& line) {
        if (progress)
            progress->Erase();
        console.err << line.Formatted() << "\n";
        console.err.flush();
    });
    std::unique_ptr<ScopedClient> logging;
    if (options.log)
        logging = std::make_unique<ScopedClient>(&logWriter);

    // Ctrl-C (and SIGTERM, a hang-up, a closed output) from here on only asks for a
    // cancellation, which the pump passes on as soon as it runs: between two checks, and
    // inside long checks and sequence loads as they report progress. The driver then removes
    // its temporary files as at any other end; a second Ctrl-C removes them and ends at once.
    auto interrupts = std::make_unique<InterruptGuard>();
    bool cancelRequested = false;
    ScopedEventPump pump([&] {
        const Interruption interruption = InterruptGuard::Requested();
        if (interruption != Interruption::None && !cancelRequested && LibVerify::IsVerifying()) {
            cancelRequested = true;
            if (progress)
                progress->Erase();
            Fail(console.err, CancellingNotice(interruption));
            console.err.flush();
            LibVerify::CancelVerification();
        }
        if (progress) {
            progress->SetCounts(LibVerify::ChecksPerformedCount(),
                                LibVerify::ChecksRemainingCount());
            progress->Tick();
        }
    });

    TempFilesRemover removeTempFiles;
    try {
        SelectTarget(options);
        // The report would replace the target or the store: said before the run, not after.
        if (options.output)
            OutputFile::RefuseInput(*options.output, kReportWhat, kReportSource);
        if (options.writeBaseline)
            OutputFile::RefuseInput(*options.writeBaseline, kBaselineWhat, kReportSource);
    } catch (const VtrError& error) {
        Fail(console.err, error.Description());
        return ExitStatus::CannotSetUp;
    }

    LibVerify::SetLoadingJobs(options.jobs);
    LibVerify::RunVerification();
    if (progress)
        progress->Erase();

    RunRecord record;
    record.target = options.target;
    record.targetFile = options.targetFile;
    record.cancelled = observer.Cancelled() || LibVerify::IsCancelled();
    record.checksPerformed = LibVerify::ChecksPerformedCount();
    record.results = observer.TakeResults();
    record.store = store;
    if (baseline)
        baseline->Mark(record);

    Presentation presentation;
    presentation.minimumSeverity = options.minimumSeverity;
    presentation.groupBy = options.groupBy;
    presentation.statistics = options.statistics;
    presentation.failOn = options.failOn;
    presentation.color = UseColor(options.color, console.outIsColorTerminal);
    presentation.baselineFile = options.baseline;

    // A cancelled run found less than there is: whatever it found, it is not a result.
    int status = record.cancelled ? ExitStatus::Cancelled : ExitStatusOf(record, options.failOn);
    if (options.output) {
        // Never over a file the run read or checked (the report writer refuses it), and
        // whole or not at all.
        try {
            SaveReport(*options.output, record, presentation);
        } catch (const VtrError& error) {
            Fail(console.err, error.Description());
            status = ExitStatus::CannotSetUp;
        }
    }
    if (options.writeBaseline && record.cancelled) {
        Fail(console.err, "the baseline " + *options.writeBaseline +
                              " was not written: the verification was cancelled");
    } else if (options.writeBaseline) {
        try {
            OutputFile::Write(*options.writeBaseline, Baseline::TextOf(record), kBaselineWhat,
                              kReportSource);
        } catch (const VtrError& error) {
            Fail(console.err, error.Description());
            status = ExitStatus::CannotSetUp;
        }
    }
    // From here Ctrl-C ends the program as usual: there is nothing left to clean up.
    interrupts.reset();

    WriteOutput(console.out, options.format, record, presentation);
    console.out.flush();
    return status;
}

int Main(int argc, const char* const* argv, Console& console) {
    try {
        const ParseOutcome parsed = ParseCommandLine(argc, argv, console.out, console.err);
        if (!parsed.options)
            return parsed.exitStatus;
        const Options& options = *parsed.options;

        RegistryStore::Select(options.registry);
        VTRCommon::ResetCachedFolders();

        switch (options.command) {
            case Command::Verify:
                return RunVerify(options, console);
            case Command::Ignore:
            case Command::Unignore:
                return RunIgnoreCommand(options, console.out, console.err);
            case Command::ListIgnored:
                if (const std::string problem = RegistryStore::Describe().Problem();
                    !problem.empty())
                    Fail(console.err, problem);
                return RunListIgnored(options, console.out);
        }
        return ExitStatus::Usage;
    } catch (...) {
        Fail(console.err, DescribeException(std::current_exception(), "unexpected failure"));
    }
    return ExitStatus::Internal;
}

}  // namespace vtr::cli
