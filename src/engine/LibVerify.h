#pragma once

#include <chrono>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "engine/ICheck.h"
#include "engine/INotificationClient.h"
#include "engine/Messages.h"
#include "engine/OrderedStringSet.h"
#include "engine/Result.h"
#include "schedule/DateTime.h"

namespace vtr {
class Show;
class Schedule;
class YearSchedule;
class NetworkPreferences;
namespace seqlib {
class Sequence;
}
}  // namespace vtr

// The verification driver: one state for the whole program. Every target is reduced to a
// pair of schedule files; a run queues the three root checks and then runs the queue first
// in, first out, each check queueing the checks that follow from what it found. The front
// ends select a target, register a notification client and call RunVerification.
namespace vtr::LibVerify {

// --- Notification clients and the event pump -------------------------------------------

// Clients are told of every step, in registration order; an error raised by a client is
// ignored and the broadcast goes on with the next. The caller keeps the client alive.
void AddNotificationClient(INotificationClient* client);
void RemoveNotificationClient(INotificationClient* client);

// "Let the user interface process pending events": the front end installs the pump (the
// window processes Qt events, the command line redraws its progress line). With none
// installed ProcessPendingEvents does nothing.
void SetEventPump(std::function<void()> pump);
void ProcessPendingEvents();

// Broadcasts TransientMessage(message) to every client.
void PostTransientMessage(const std::string& message);

// --- Results --------------------------------------------------------------------------

// The result factory: the only way a result enters the verification. Empty details are
// skipped without leaving a gap; at most nine details are taken. Never throws: a result that
// cannot be made (no memory) is lost and nullptr returned, and a client that fails while
// being told of it does not keep it from the others.
ResultPtr AddResult(Severity severity, const std::string& summary, int32_t helpContextId,
                    int32_t messageNumber, const std::vector<std::string>& details = {}) noexcept;
// The same for a catalog entry: its severity, summary, help-context id and number.
ResultPtr AddResult(const Message& message, const std::vector<std::string>& details = {}) noexcept;

// True when the result's message number, or else its IgnoreKey, is in the ignore lists.
// Never fails.
bool IsResultIgnored(const Result& result);

// The results of the current (or last) run.
const std::vector<ResultPtr>& GetResults();         // not ignored, in the order produced
const std::vector<ResultPtr>& GetIgnoredResults();  // matched an ignore entry
int32_t ErrorCount();                               // not-ignored errors
int32_t WarningCount();                             // not-ignored warnings

// Empties the result collections (the start of a run).
void ClearResults();

// The two in-memory ignore lists (loaded from the settings store at the start of a run).
OrderedStringSet& IgnoredMessageNumbers();
OrderedStringSet& IgnoredResultKeys();

// --- Target selection (before each run) ---------------------------------------------------

// Target selection also tells FilesRead which files the target names; a run records there
// every file it reads, so that no report replaces one of them.
//
// Stores both names and drops any loaded schedules.
void SetScheduleFiles(const std::string& weeklyFile, const std::string& yearlyFile);
// Wraps one show in a temporary weekly schedule ("VTRVer-WS-": one show event from day 1,
// 3:00:37 to 7:00:37) and an empty calendar schedule ("VTRVer-YS-"); raises error 37 when
// they cannot be made or written, after deleting every temporary file made so far. The
// temporary files of an earlier selection that never ran are deleted first.
void VerifyShowFile(const std::string& showFile);
// Wraps one sequence in a temporary show ("VTRVer-Show-", the sequence as the only entry of
// its musical section), then verifies that show; error 37 as above.
void VerifySequenceFile(const std::string& sequenceFile);
const std::string& VerifiedWeeklyScheduleFile();
const std::string& VerifiedYearlyScheduleFile();
// Deletes the temporary show and schedule files of the current target, if any (the end of
// every run does it too). Failures to delete are ignored.
void DeleteTempFiles();

// --- Running -------------------------------------------------------------------------------

// Clears the collections, loads the network preferences and ignore lists, queues the root
// checks. The first step of RunVerification; the window also calls it once at start-up.
void BeginVerification();
// Runs one whole verification on the caller's thread; ends with ChecksCompleted.
void RunVerification();
// Empties the queue and refuses new checks; the running check finishes.
void CancelVerification();
bool IsVerifying();
bool IsCancelled();

// --- Services for checks ---------------------------------------------------------------------

// Queues a check unless cancelled or a check with the same identifier is queued or done.
// Never throws: a check whose identifier cannot be worked out is not queued.
void AddCheck(CheckPtr check) noexcept;
// The sequence of that file, loaded once per run; nullptr when it cannot be loaded, or when
// the run is cancelled before it is loaded (which is not kept as a failure).
std::shared_ptr<seqlib::Sequence> LoadSequence(const std::string& fileName);
// The show of that file, parsed once per run (failures are not kept); nullptr on failure.
std::shared_ptr<Show> LoadShow(const std::string& fileName);
// The network preferences, loaded afresh at the start of each run.
NetworkPreferences& GetNetworkPreferences();
// The command of that identifier in the shell-command map ("" when none), the map being read
// once per run, at the first question.
std::string ShellCommandText(const std::string& identifier);
// The schedules of the current target, loaded on first request in a run.
std::shared_ptr<Schedule> GetSchedule();
std::shared_ptr<YearSchedule> GetYearSchedule();
// What the current (or last) run has loaded of that file, without reading anything: nullptr
// when the run did not load it or could not (for the reports, after a run).
std::shared_ptr<Show> LoadedShow(const std::string& fileName);
std::shared_ptr<seqlib::Sequence> LoadedSequence(const std::string& fileName);

// --- Summary ---------------------------------------------------------------------------------

int32_t ChecksPerformedCount();  // checks done, each identifier once
int32_t ChecksRemainingCount();  // checks still queued

// How often the current (or last) run read a file from disk: show files parsed (failures
// included, as they are tried again) and sequence loads attempted. Each file is read once
// per run however many checks ask for it.
struct FileLoadCounts {
    int32_t showReads = 0;
    int32_t sequenceLoads = 0;
};
FileLoadCounts GetFileLoadCounts();

// What the current (or last) run verified, as the target was selected; when it began, by the
// local clock (DateTime::Now, which tests may set) and by the system clock; and when it ended
// (its start while it runs).
enum class TargetKind { Schedule, Show, Sequence };
struct RunInfo {
    TargetKind target = TargetKind::Schedule;
    std::string targetFile;  // the show or sequence; empty for the schedule
    DateTime started;
    std::chrono::system_clock::time_point startedUtc;
    std::chrono::system_clock::time_point finishedUtc;
};
RunInfo GetRunInfo();

}  // namespace vtr::LibVerify
