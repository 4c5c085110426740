#include "App.h"

#include <exception>
#include <filesystem>
#include <memory>
#include <ostream>
#include <string>
#include <system_error>
#include <vector>

#include "IgnoreCommands.h"
#include "Interrupt.h"
#include "ResultsOutput.h"
#include "engine/LibVerify.h"
#include "engine/OutputLog.h"
#include "engine/ResultsReport.h"
#include "engine/VtrError.h"
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

bool SameFile(const std::string& a, const std::string& b) {
    std::error_code error;
    return !a.empty() && !b.empty() && fs::equivalent(fs::path(a), fs::path(b), error) && !error;
}

// What the run must not overwrite with its report: the target and the settings store.
std::vector<std::string> ProtectedFiles(const Options& options) {
    std::vector<std::string> files;
    if (options.target == TargetKind::Schedule) {
        files.push_back(VTRCommon::GetWeeklyScheduleFile());
        files.push_back(VTRCommon::GetYearlyScheduleFile());
    } else {
        files.push_back(options.targetFile);
    }
    if (auto store = RegistryStore::CurrentFile())
        files.push_back(*store);
    return files;
}

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
        for (const std::string& file : ProtectedFiles(options)) {
            if (SameFile(*options.output, file))
                return "the results report " + *options.output +
                       " would overwrite a file of the suite";
        }
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

    // Ctrl-C from here on only asks for a cancellation, which the pump passes on between two
    // steps of the run; the driver then removes its temporary files as at any other end.
    auto interrupts = std::make_unique<InterruptGuard>();
    bool cancelRequested = false;
    ScopedEventPump pump([&] {
        if (InterruptGuard::Requested() && !cancelRequested && LibVerify::IsVerifying()) {
            cancelRequested = true;
            LibVerify::CancelVerification();
        }
        if (progress) {
            progress->SetCounts(LibVerify::ChecksPerformedCount(),
                                LibVerify::ChecksRemainingCount());
            progress->Tick();
        }
    });

    try {
        SelectTarget(options);
    } catch (const VtrError& error) {
        Fail(console.err, error.Description());
        return ExitStatus::CannotSetUp;
    }

    LibVerify::RunVerification();
    if (progress)
        progress->Erase();

    RunRecord record;
    record.target = options.target;
    record.targetFile = options.targetFile;
    record.cancelled = observer.Cancelled() || LibVerify::IsCancelled();
    record.checksPerformed = LibVerify::ChecksPerformedCount();
    record.errors = LibVerify::ErrorCount();
    record.warnings = LibVerify::WarningCount();
    record.results = observer.TakeResults();
    record.store = store;

    int status = ExitStatusOf(record);
    if (options.output) {
        try {
            ResultsReport::SaveResultsReport(*options.output);
        } catch (const VtrError& error) {
            Fail(console.err, "Error Saving Verifier Messages: " + error.Description());
            status = ExitStatus::CannotSetUp;
        }
    }
    // From here Ctrl-C ends the program as usual: there is nothing left to clean up.
    interrupts.reset();

    if (options.format == OutputFormat::Json)
        WriteJson(console.out, record);
    else
        WriteText(console.out, record);
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
    } catch (const VtrError& error) {
        Fail(console.err, error.Description());
    } catch (const std::exception& error) {
        Fail(console.err, error.what());
    } catch (...) {
        Fail(console.err, "unexpected failure");
    }
    return ExitStatus::Internal;
}

}  // namespace vtr::cli
