#include "engine/LibVerify.h"

#include <algorithm>
#include <deque>
#include <exception>
#include <memory>
#include <optional>
#include <thread>
#include <unordered_map>
#include <unordered_set>
#include <utility>

#include "checks/conflicts/CheckIntersequenceConflicts.h"
#include "checks/installation/CheckOldKRP.h"
#include "checks/installation/CheckPostInstall.h"
#include "checks/installation/CheckWMP.h"
#include "checks/sequence/CheckSequenceLoads.h"
#include "engine/IgnoreLists.h"
#include "engine/SequencePrefetch.h"
#include "engine/VtrError.h"
#include "environment/FilesRead.h"
#include "environment/LibFile.h"
#include "environment/NetworkPreferences.h"
#include "environment/SequenceLoader.h"
#include "schedule/Schedule.h"
#include "schedule/WeekTime.h"
#include "schedule/YearSchedule.h"
#include "sequencelib/Sequence.h"
#include "sequencelib/ShellCommandMap.h"
#include "show/Show.h"
#include "show/WholeFile.h"

namespace vtr::LibVerify {
namespace {

// The identifiers of the run's checks, each with whether a check of it waits in the queue
// and whether one has run: one entry an identifier, so that "queued or done already?" is
// one lookup, and a check leaves the queue and joins the done ones without another.
class CheckIds {
  public:
    enum : uint8_t { kQueued = 1, kDone = 2 };
    // The flags of the identifier, none when it is new (they stay where they are while the
    // identifier is known).
    uint8_t& operator[](std::string id) {
        return flags_.try_emplace(std::move(id), uint8_t{0}).first->second;
    }
    void Clear() { flags_.clear(); }

  private:
    std::unordered_map<std::string, uint8_t> flags_;
};

// The queue of checks still to run: first in, first run.
class PendingChecks {
  public:
    bool Empty() const { return queue_.empty(); }
    std::size_t Size() const { return queue_.size(); }
    void Append(uint8_t& idFlags, CheckPtr check) {
        idFlags |= CheckIds::kQueued;
        queue_.emplace_back(&idFlags, std::move(check));
    }
    const CheckPtr& Front() const { return queue_.front().second; }
    void RemoveFront() {
        *queue_.front().first &= static_cast<uint8_t>(~CheckIds::kQueued);
        queue_.pop_front();
    }
    void Clear() { queue_.clear(); }

  private:
    std::deque<std::pair<uint8_t*, CheckPtr>> queue_;
};

// The checks that have run, in the order they finished, each identifier once.
class DoneChecks {
  public:
    std::size_t Size() const { return checks_.size(); }
    // False (and nothing recorded) when a check with that identifier is already done.
    bool Add(uint8_t& idFlags, CheckPtr check) {
        if ((idFlags & CheckIds::kDone) != 0)
            return false;
        idFlags |= CheckIds::kDone;
        checks_.push_back(std::move(check));
        return true;
    }
    void Clear() { checks_.clear(); }

  private:
    std::vector<CheckPtr> checks_;
};

// The verification state: one instance for the whole program.
struct VerificationState {
    bool cancelled = false;
    CheckIds checkIds;
    DoneChecks doneChecks;
    PendingChecks pendingChecks;
    std::vector<ResultPtr> errors;          // not-ignored results of severity Error
    std::vector<ResultPtr> ignoredResults;  // results that matched an ignore entry
    std::unique_ptr<NetworkPreferences> networkPreferences;
    std::vector<INotificationClient*> clients;  // in registration order
    std::function<void()> eventPump;
    OrderedStringSet ignoredMessageNumbers;
    std::vector<ResultPtr> results;  // every not-ignored result, in the order produced
    OrderedStringSet ignoredResultKeys;
    // Sequences by file name; a file that failed to load is kept as nullptr so that it is
    // not read again in the same run.
    std::unordered_map<std::string, std::shared_ptr<seqlib::Sequence>> sequenceCache;
    // Shows by file name; only shows that were read and parsed are kept.
    std::unordered_map<std::string, ShowPtr> showCache;
    // The shell-command map, read at its first use in a run.
    std::optional<seqlib::ShellCommandMap::Contents> shellCommands;
    std::string tempShowFile;
    std::string tempWeeklyFile;
    std::string tempYearlyFile;
    bool verifying = false;
    // RunVerification is on the stack (verifying alone also holds after the window's
    // BeginVerification at start-up).
    bool running = false;
    std::vector<ResultPtr> warnings;  // not-ignored results of severity Warning
    SchedulePtr weeklySchedule;
    std::string weeklyScheduleFile;
    YearSchedulePtr yearlySchedule;
    std::string yearlyScheduleFile;
    FileLoadCounts loadCounts;
    RunInfo selected;     // the target as selected, without the times
    RunInfo run;          // the target and times of the current (or last) run
    int loadingJobs = 0;  // 0: every processor
    // Loads sequences ahead of the queue while a run goes, with more than one job.
    std::unique_ptr<SequencePrefetch> prefetch;

    VerificationState() = default;
    VerificationState(const VerificationState&) = delete;
    VerificationState& operator=(const VerificationState&) = delete;
    // A target selected but never verified leaves no temporary file behind when the
    // program ends.
    ~VerificationState() {
        for (const std::string* name : {&tempShowFile, &tempWeeklyFile, &tempYearlyFile}) {
            if (!name->empty())
                LibFile::DeleteTempFile(*name);
        }
    }

    bool IsTempFile(const std::string& name) const {
        return !name.empty() &&
               (name == tempShowFile || name == tempWeeklyFile || name == tempYearlyFile);
    }
    // Remembers a file the run read (FilesRead), unless it is one of the run's own.
    void RecordRead(const std::string& name) const {
        if (!IsTempFile(name))
            FilesRead::Record(name, FilesRead::Use::Read);
    }
};

VerificationState& State() {
    // Never destroyed: at exit the system takes the process's memory back at once, where
    // freeing every kept sequence, show and result one by one took a few percent of a large
    // run. Nothing in it writes anything when it goes, and no run outlives the program.
    static VerificationState& state = *new VerificationState;
    return state;
}

// Calls the operation on every client in registration order. A client that fails does not
// stop the broadcast; one that registers or unregisters clients while being told does not
// disturb it either (the list is copied first).
template <typename Operation>
void Broadcast(Operation&& operation) {
    const std::vector<INotificationClient*> clients = State().clients;
    for (INotificationClient* client : clients) {
        ResumeStep([&] { operation(*client); });
    }
}

constexpr std::size_t kMaxDetails = 9;

// How many files the workers load beyond those the checks have taken, per worker: one keeps
// them busy, since a file's checks take a fraction of its load, and bounds the memory of
// sequences loaded and not yet asked for to one per worker.
constexpr std::size_t kFilesAheadPerWorker = 1;

// The sequence files a check just queued will load, in the order it loads them, as far as is
// known when it is queued. A wrong guess costs time, never a result: the first check to ask
// for each file is the one that loads a sequence, and for a show the intersequence check
// asks for all of its sequences before their own checks run.
std::vector<std::string> SequenceFilesOf(ICheck& check, const VerificationState& state) {
    if (auto* loads = dynamic_cast<CheckSequenceLoads*>(&check))
        return {loads->Filename()};
    if (auto* conflicts = dynamic_cast<CheckIntersequenceConflicts*>(&check)) {
        // Its show was read by the check that queued it.
        const auto show = state.showCache.find(conflicts->ShowFilename());
        if (show != state.showCache.end() && show->second)
            return conflicts->SequenceFiles(*show->second);
    }
    return {};
}

// The week time that the temporary schedule of a single show starts and ends at: day 1,
// 3:00:37 and 7:00:37. The odd second keeps the times apart from anything a user schedules
// by the minute.
constexpr int32_t kTargetDay = 1;
constexpr int32_t kTargetStartHour = 3;
constexpr int32_t kTargetEndHour = 7;
constexpr int32_t kTargetMinute = 0;
constexpr int32_t kTargetSecond = 37;

[[noreturn]] void RaiseTargetError(const char* source, const std::string& description) {
    DeleteTempFiles();
    Raise(ErrorNumbers::UserMessage, source, description);
}

// Makes a temporary file, remembered in `slot` so that DeleteTempFiles finds it and
// registered so that the program removes it however it ends (LibFile); a failure deletes the
// temporary files made so far and raises error 37 with the text of the failure.
const std::string& MakeTempFile(std::string& slot, const char* prefix, const char* source) {
    try {
        slot = LibFile::MakeTempFileName(prefix);
    } catch (...) {
        RaiseTargetError(source, DescribeException(std::current_exception()));
    }
    LibFile::RegisterTempFile(slot);
    return slot;
}

// Stores the names of the schedule files to verify and drops any loaded schedules.
void SelectScheduleFiles(const std::string& weeklyFile, const std::string& yearlyFile) {
    VerificationState& state = State();
    state.weeklyScheduleFile = weeklyFile;
    state.yearlyScheduleFile = yearlyFile;
    state.weeklySchedule = nullptr;
    state.yearlySchedule = nullptr;
}

// Builds the temporary schedule pair for one show and selects it.
void BuildShowTarget(const std::string& showFile) {
    constexpr const char* kSource = "LibVerify.VerifyShowFile";
    VerificationState& state = State();

    auto schedule = std::make_shared<Schedule>();
    try {
        schedule->AddShowEventByFile(showFile,
                                     WeekTimeFunctions::NewWeekTime(kTargetDay, kTargetStartHour,
                                                                    kTargetMinute, kTargetSecond),
                                     WeekTimeFunctions::NewWeekTime(kTargetDay, kTargetEndHour,
                                                                    kTargetMinute, kTargetSecond));
    } catch (...) {
        RaiseTargetError(kSource, DescribeException(std::current_exception()));
    }
    const std::string& weeklyFile = MakeTempFile(state.tempWeeklyFile, "VTRVer-WS-", kSource);
    if (!ResumeStep([&] { schedule->Save(weeklyFile); }))
        RaiseTargetError(kSource, "Cannot save temporary weekly file " + weeklyFile);

    YearSchedule yearSchedule;
    const std::string& yearlyFile = MakeTempFile(state.tempYearlyFile, "VTRVer-YS-", kSource);
    if (!ResumeStep([&] { yearSchedule.Save(yearlyFile); }))
        RaiseTargetError(kSource, "Cannot save temporary yearly file " + yearlyFile);

    SelectScheduleFiles(weeklyFile, yearlyFile);
}

}  // namespace

void AddNotificationClient(INotificationClient* client) {
    if (client != nullptr)
        State().clients.push_back(client);
}

void RemoveNotificationClient(INotificationClient* client) {
    auto& clients = State().clients;
    auto found = std::find(clients.begin(), clients.end(), client);
    if (found != clients.end())
        clients.erase(found);
}

void SetEventPump(std::function<void()> pump) {
    State().eventPump = std::move(pump);
}

void ProcessPendingEvents() {
    // Copied so that a pump which replaces itself while running stays alive until it returns.
    std::function<void()> pump = State().eventPump;
    if (pump)
        ResumeStep(pump);
}

void PostTransientMessage(const std::string& message) {
    Broadcast([&](INotificationClient& client) { client.TransientMessage(message); });
}

ResultPtr AddResult(Severity severity, const std::string& summary, int32_t helpContextId,
                    int32_t messageNumber, const std::vector<std::string>& details) noexcept {
    return ResumeOr(ResultPtr{}, [&] {
        auto result = std::make_shared<Result>();
        result->SetSeverity(severity);
        result->SetSummary(summary);
        result->SetHelpContextID(helpContextId);
        result->SetMessageNumber(messageNumber);
        // Empty details leave no gap: a result's details are always consecutive from the first.
        const std::size_t count = std::min(details.size(), kMaxDetails);
        for (std::size_t i = 0; i < count; ++i) {
            if (!details[i].empty())
                result->AddDetail(details[i]);
        }

        VerificationState& state = State();
        if (IsResultIgnored(*result)) {
            state.ignoredResults.push_back(result);
        } else {
            state.results.push_back(result);
            if (severity == Severity::Error) {
                state.errors.push_back(result);
            } else if (severity == Severity::Warning) {
                state.warnings.push_back(result);
            }
        }
        Broadcast([&](INotificationClient& client) { client.ResultAdded(result); });
        return result;
    });
}

ResultPtr AddResult(const Message& message, const std::vector<std::string>& details) noexcept {
    return AddResult(message.severity, message.summary, message.helpContextId, message.number,
                     details);
}

bool IsResultIgnored(const Result& result) {
    return ResumeOr(false, [&] {
        const VerificationState& state = State();
        return state.ignoredMessageNumbers.Contains(std::to_string(result.MessageNumber())) ||
               state.ignoredResultKeys.Contains(result.IgnoreKey());
    });
}

const std::vector<ResultPtr>& GetResults() {
    return State().results;
}
const std::vector<ResultPtr>& GetIgnoredResults() {
    return State().ignoredResults;
}
int32_t ErrorCount() {
    return static_cast<int32_t>(State().errors.size());
}
int32_t WarningCount() {
    return static_cast<int32_t>(State().warnings.size());
}

void ClearResults() {
    VerificationState& state = State();
    state.results.clear();
    state.ignoredResults.clear();
    state.errors.clear();
    state.warnings.clear();
}

OrderedStringSet& IgnoredMessageNumbers() {
    return State().ignoredMessageNumbers;
}
OrderedStringSet& IgnoredResultKeys() {
    return State().ignoredResultKeys;
}

// --- Target selection -----------------------------------------------------------------------

void SetScheduleFiles(const std::string& weeklyFile, const std::string& yearlyFile) {
    FilesRead::SetTargetFiles({weeklyFile, yearlyFile});
    SelectScheduleFiles(weeklyFile, yearlyFile);
    State().selected = RunInfo{TargetKind::Schedule, {}, {}, {}, {}};
}

void VerifyShowFile(const std::string& showFile) {
    DeleteTempFiles();
    FilesRead::SetTargetFiles({showFile});
    BuildShowTarget(showFile);
    State().selected = RunInfo{TargetKind::Show, showFile, {}, {}, {}};
}

void VerifySequenceFile(const std::string& sequenceFile) {
    constexpr const char* kSource = "LibVerify.VerifySequenceFile";
    DeleteTempFiles();
    FilesRead::SetTargetFiles({sequenceFile});
    VerificationState& state = State();

    Show show;
    show.Musical()->List().push_back(sequenceFile);
    std::string text;
    try {
        text = ShowFunctions::ShowToText(show);
    } catch (...) {
        RaiseTargetError(kSource, DescribeException(std::current_exception()));
    }
    const std::string& showFile = MakeTempFile(state.tempShowFile, "VTRVer-Show-", kSource);
    if (WriteWholeFile(showFile, text) != 0)
        RaiseTargetError(kSource, "Cannot write temporary show file " + showFile);

    BuildShowTarget(showFile);
    state.selected = RunInfo{TargetKind::Sequence, sequenceFile, {}, {}, {}};
}

const std::string& VerifiedWeeklyScheduleFile() {
    return State().weeklyScheduleFile;
}

const std::string& VerifiedYearlyScheduleFile() {
    return State().yearlyScheduleFile;
}

void DeleteTempFiles() {
    VerificationState& state = State();
    for (std::string* name : {&state.tempShowFile, &state.tempWeeklyFile, &state.tempYearlyFile}) {
        if (!name->empty()) {
            LibFile::DeleteTempFile(*name);  // a file that cannot be deleted is left to the system
            name->clear();
        }
    }
}

// --- Running ---------------------------------------------------------------------------------

void BeginVerification() {
    VerificationState& state = State();
    state.verifying = true;
    Broadcast([](INotificationClient& client) { client.Initializing(); });

    state.doneChecks.Clear();
    state.pendingChecks.Clear();
    state.checkIds.Clear();
    state.errors.clear();
    state.ignoredResults.clear();
    state.results.clear();
    state.ignoredResultKeys.Clear();
    state.ignoredMessageNumbers.Clear();
    state.sequenceCache.clear();
    state.showCache.clear();
    state.shellCommands.reset();
    state.warnings.clear();
    state.weeklySchedule = nullptr;
    state.yearlySchedule = nullptr;
    state.loadCounts = {};
    FilesRead::BeginRun();

    state.cancelled = false;

    ResumeStep([&] {
        if (!state.networkPreferences)
            state.networkPreferences = std::make_unique<NetworkPreferences>();
        state.networkPreferences->InitFromRegistry(true);
    });
    ResumeStep([] { IgnoreLists::LoadIgnoreLists(); });

    AddCheck(std::make_shared<CheckPostInstall>());
    AddCheck(std::make_shared<CheckWMP>());
    AddCheck(std::make_shared<CheckOldKRP>());
}

void RunVerification() {
    VerificationState& state = State();
    // A run asked for from inside a run (a client, the event pump) would tear down the
    // queue under the running one; it is refused.
    if (state.running)
        return;
    state.running = true;
    state.run = state.selected;
    state.run.started = DateTime::Now();
    state.run.startedUtc = std::chrono::system_clock::now();
    state.run.finishedUtc = state.run.startedUtc;

    ResumeStep([] { BeginVerification(); });
    if (const int jobs = LoadingJobs(); jobs > 1) {
        state.prefetch = std::make_unique<SequencePrefetch>(
            jobs, kFilesAheadPerWorker * static_cast<std::size_t>(jobs));
        // The root checks queued by BeginVerification load no sequence: the files are named
        // by the checks queued from here on.
    }

    while (!state.pendingChecks.Empty()) {
        const CheckPtr check = state.pendingChecks.Front();
        Broadcast([&](INotificationClient& client) { client.Checking(*check); });
        // A client told of the check may have cancelled, which empties the queue; the
        // check announced still runs.
        if (!state.pendingChecks.Empty() && state.pendingChecks.Front() == check)
            state.pendingChecks.RemoveFront();

        ResumeStep([&] { check->Check(); });
        // A check whose identifier is already done (the version check of an application
        // file shares its existence check's identifier) is not recorded a second time.
        ResumeStep([&] { state.doneChecks.Add(state.checkIds[check->CheckIdentifier()], check); });
        Broadcast([&](INotificationClient& client) { client.CheckCompleted(*check); });
        ProcessPendingEvents();
    }
    state.prefetch.reset();  // stops and waits for the workers

    ResumeStep([&] {
        if (state.errors.empty() && state.warnings.empty())
            AddResult(Messages::NoErrorsOrWarnings);
    });

    state.verifying = false;
    state.running = false;
    state.run.finishedUtc = std::chrono::system_clock::now();
    DeleteTempFiles();
    const bool cancelled = state.cancelled;
    Broadcast([&](INotificationClient& client) { client.ChecksCompleted(cancelled); });
}

void CancelVerification() {
    VerificationState& state = State();
    state.cancelled = true;
    if (state.prefetch)
        state.prefetch->Stop();
    AddResult(Messages::VerificationCancelled);
    while (!state.pendingChecks.Empty())
        state.pendingChecks.RemoveFront();
    Broadcast([](INotificationClient& client) { client.VerificationCancelled(); });
}

void SetLoadingJobs(int jobs) {
    State().loadingJobs = std::max(jobs, 0);
}

int LoadingJobs() {
    const int jobs = State().loadingJobs;
    if (jobs > 0)
        return jobs;
    return std::max(1, static_cast<int>(std::thread::hardware_concurrency()));
}

bool IsVerifying() {
    return State().verifying;
}

bool IsCancelled() {
    return State().cancelled;
}

// --- Services for checks -----------------------------------------------------------------------

void AddCheck(CheckPtr check) noexcept {
    ResumeStep([&] {
        VerificationState& state = State();
        if (state.cancelled || !check)
            return;
        uint8_t& idFlags = state.checkIds[check->CheckIdentifier()];
        if ((idFlags & (CheckIds::kQueued | CheckIds::kDone)) != 0)
            return;
        state.pendingChecks.Append(idFlags, check);
        if (state.prefetch) {
            ResumeStep([&] {
                for (const std::string& file : SequenceFilesOf(*check, state)) {
                    if (!file.empty() && state.sequenceCache.count(file) == 0)
                        state.prefetch->Want(file);
                }
            });
        }
        Broadcast([&](INotificationClient& client) { client.CheckAdded(*check); });
    });
}

std::shared_ptr<seqlib::Sequence> LoadSequence(const std::string& fileName) {
    VerificationState& state = State();
    if (auto cached = state.sequenceCache.find(fileName); cached != state.sequenceCache.end())
        return cached->second;

    if (state.cancelled && state.verifying)
        return nullptr;  // a cancelled run loads nothing more

    ++state.loadCounts.sequenceLoads;
    state.RecordRead(fileName);
    std::shared_ptr<seqlib::Sequence> sequence;
    std::string failure;
    bool failed = false;
    std::optional<SequencePrefetch::Load> loaded;
    if (state.prefetch)
        loaded = state.prefetch->Take(fileName);
    if (loaded) {
        // Loaded by a worker: its progress is told now, as if loaded here, and a cancel seen
        // at one of its percents stops it there, as it would have stopped a load made here.
        bool stopped = false;
        for (const int32_t percent : loaded->progress) {
            SequenceLoader::TellProgress(fileName, percent);
            if (state.cancelled && state.verifying) {
                stopped = true;
                break;
            }
        }
        sequence = stopped ? nullptr : std::move(loaded->sequence);
        if (loaded->failure && !stopped) {
            failed = true;
            failure = DescribeException(loaded->failure);
        }
    } else {
        try {
            SequenceLoader loader;
            sequence = loader.Load(fileName);
        } catch (...) {
            sequence = nullptr;
            failed = true;
            failure = DescribeException(std::current_exception());
        }
    }
    // A load stopped by a cancellation says nothing of the file: neither kept nor told.
    if (!sequence && !failed)
        return nullptr;
    // Kept even when empty: a file that cannot be loaded is not tried again in this run.
    ResumeStep([&] { state.sequenceCache.emplace(fileName, sequence); });
    if (!failure.empty())
        PostTransientMessage(failure);  // the log says why the load failed
    return sequence;
}

std::shared_ptr<Show> LoadShow(const std::string& fileName) {
    VerificationState& state = State();
    if (auto cached = state.showCache.find(fileName); cached != state.showCache.end())
        return cached->second;

    ++state.loadCounts.showReads;
    state.RecordRead(fileName);
    ShowPtr show = ResumeOr(ShowPtr{}, [&] { return ShowFunctions::LoadShowFile(fileName); });
    // A show that cannot be read is not kept, so a later request tries again.
    if (show)
        ResumeStep([&] { state.showCache.emplace(fileName, show); });
    return show;
}

std::shared_ptr<Show> LoadedShow(const std::string& fileName) {
    const VerificationState& state = State();
    const auto cached = state.showCache.find(fileName);
    return cached == state.showCache.end() ? nullptr : cached->second;
}

std::shared_ptr<seqlib::Sequence> LoadedSequence(const std::string& fileName) {
    const VerificationState& state = State();
    const auto cached = state.sequenceCache.find(fileName);
    return cached == state.sequenceCache.end() ? nullptr : cached->second;
}

NetworkPreferences& GetNetworkPreferences() {
    VerificationState& state = State();
    if (!state.networkPreferences)
        state.networkPreferences = std::make_unique<NetworkPreferences>();
    return *state.networkPreferences;
}

std::string ShellCommandText(const std::string& identifier) {
    VerificationState& state = State();
    if (!state.shellCommands) {
        state.shellCommands =
            seqlib::ShellCommandMap::Contents::Read(seqlib::ShellCommandMap().MapFilePath());
    }
    return state.shellCommands->CommandText(identifier);
}

std::shared_ptr<Schedule> GetSchedule() {
    VerificationState& state = State();
    if (!state.weeklySchedule) {
        state.RecordRead(state.weeklyScheduleFile);
        state.weeklySchedule = ResumeOr(SchedulePtr{}, [&] {
            return ScheduleFunctions::LoadSchedule(state.weeklyScheduleFile);
        });
    }
    return state.weeklySchedule;
}

std::shared_ptr<YearSchedule> GetYearSchedule() {
    VerificationState& state = State();
    if (!state.yearlySchedule) {
        state.RecordRead(state.yearlyScheduleFile);
        state.yearlySchedule = ResumeOr(YearSchedulePtr{}, [&] {
            return YearScheduleFunctions::LoadYearSchedule(state.yearlyScheduleFile);
        });
    }
    return state.yearlySchedule;
}

// --- Summary
// ---------------------------------------------------------------------------------------

int32_t ChecksPerformedCount() {
    return static_cast<int32_t>(State().doneChecks.Size());
}

int32_t ChecksRemainingCount() {
    return static_cast<int32_t>(State().pendingChecks.Size());
}

RunInfo GetRunInfo() {
    return State().run;
}

FileLoadCounts GetFileLoadCounts() {
    return State().loadCounts;
}

}  // namespace vtr::LibVerify
