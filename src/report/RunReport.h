#pragma once

#include <chrono>
#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "engine/Result.h"
#include "schedule/DateTime.h"

namespace vtr {
class Schedule;
class YearSchedule;
}  // namespace vtr

// What the shared reports (HTML and SARIF) say about one verification. The front ends fill
// it from the run they followed; the writers only read it, and never change a result, its
// texts or the order the run produced them in.
namespace vtr::report {

enum class Target { Schedule, Show, Sequence };

// "schedule", "show", "sequence".
const char* TargetName(Target target);

struct ReportedResult {
    ResultPtr result;
    bool ignored = false;     // it matched an entry of the ignore lists
    bool inBaseline = false;  // its key is in the baseline the run was compared with
};

struct RunReport {
    std::string program = "vantori-verify";
    std::string version;
    Target target = Target::Schedule;
    std::string targetFile;  // the show or sequence; empty for the schedule

    // When the run began, by the local clock; its date is "today" for the calendar dates.
    DateTime started;
    std::chrono::system_clock::time_point startedUtc;
    std::chrono::system_clock::time_point finishedUtc;

    // The settings store: its name ("the settings store /home/ann/registry.reg"), how it was
    // chosen ("named with --registry"), and its file when it is one.
    std::string store;
    std::string storeChosen;
    std::optional<std::string> storeFile;

    bool cancelled = false;
    int32_t checksPerformed = 0;
    std::vector<ReportedResult> results;  // every result, in the order the run produced them
    // The baseline the run was compared with; results in it are left out of the HTML report
    // (which says how many) and marked unchanged in the SARIF report.
    std::optional<std::string> baselineFile;

    // The week the HTML report draws: for the schedule, the schedules the run verified; for
    // one show, the suite's own schedules, with that show as the one verified; none for a
    // sequence, which has no place in the week of its own.
    std::shared_ptr<const Schedule> weekly;
    std::shared_ptr<const YearSchedule> calendar;
    // The shows the run verified, each with the files it plays (its sequences and, as deep as
    // the run loaded them, their subsequences). A result that names only a sequence belongs
    // to every show that plays it.
    std::map<std::string, std::vector<std::string>> showFiles;
};

// Fills what the verification driver knows of the run just finished: the program's version,
// the times of the run, the settings store in use, the week to draw and the files of the
// shows it verified (from what the run loaded; nothing is read again but the suite's
// schedule files for a show). The target and the results are the front end's to fill.
void AddRunContext(RunReport& report);

// The results of the last run as the driver keeps them: the results that are not ignored,
// then the ignored ones, each in the order produced, each marked ignored when it matches the
// ignore lists now (as the window lists them). The driver keeps the two apart, so a front end
// that followed the run gives the run's own order instead.
std::vector<ReportedResult> LastRunResults();

// The report of the last run from what the driver keeps: its target, results, checks and
// context. (The window's Save; the command line records its run itself.)
RunReport LastRunReport();

}  // namespace vtr::report
