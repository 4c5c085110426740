#pragma once

#include <cstdint>
#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

#include "CommandLine.h"
#include "engine/Result.h"
#include "engine/ResultGrouping.h"
#include "environment/RegistryStore.h"

namespace vtr::cli {

// One result as the run produced it, with whether it was ignored at that moment and whether
// its key is in the baseline the run was compared with.
struct RecordedResult {
    ResultPtr result;
    bool ignored = false;
    bool inBaseline = false;
};

// What a finished run hands to the printers.
struct RunRecord {
    TargetKind target = TargetKind::Schedule;
    std::string targetFile;  // empty for the schedule
    bool cancelled = false;
    int32_t checksPerformed = 0;
    std::vector<RecordedResult> results;  // every result in the order produced
    RegistryStore::Description store;     // the settings store the run read
};

// How the results are presented. None of it changes the results; with the defaults the
// printers list every result (the text errors first, the JSON in the order produced).
struct Presentation {
    Severity minimumSeverity = Severity::Info;  // list this severity and worse
    GroupBy groupBy = GroupBy::None;
    bool statistics = false;  // the text gives counts instead of the results
    bool color = false;       // the text colours results by severity (terminal escapes)
    FailOn failOn = FailOn::Warning;
    // The baseline the results were compared with: results whose key is in it are left out
    // of everything but the count of them.
    std::optional<std::string> baselineFile;
};

// The exit status of a finished run: 2 with errors, 1 with warnings only, 0 without either;
// only errors count with FailOn::Error, nothing with FailOn::Never. Ignored results and
// results in the baseline never count.
int ExitStatusOf(const RunRecord& record, FailOn failOn = FailOn::Warning);

// The text form: each listed not-ignored result as
//   "<severity text> <message number>: <summary>"
// with its details below, indented by four blanks, errors first, then warnings, then
// information, each in the order produced; then, when there are any, a blank line,
// "Ignored results:" and the ignored ones in the same form; then a blank line and the
// summary line. With a grouping, the results go under headings
//   "== <group title> (<counts>) =="
// with a blank line between groups. With statistics, the results are replaced by one line
// per message number ("  3,018  Warning 43: Channel conflict"), most frequent first, and,
// with a grouping, the number of groups and the ten with the worst and most results.
void WriteText(std::ostream& out, const RunRecord& record, const Presentation& presentation = {});

// The JSON form: one object with "program", "version", "target" ({"kind", "file"}; no "file"
// for the schedule), "store" ({"path" (null for the Windows registry), "chosenBy" ("option",
// "environment", "default" or "registry"), "exists", "understood", "readOnly"}), "cancelled",
// "checksPerformed", "errors", "warnings", "counts"
// ({"errors", "warnings", "info", "ignored"}) and "results", every listed result in the
// order produced with "severity" (number), "severityText", "messageNumber",
// "helpContextId", "summary", "details" (array), "ignored" and "ignoreKey" (the key in the
// text form of IgnoreKeyText, which "ignore --key" takes back). Other bytes that are not
// UTF-8 are written as U+FFFD. With a severity below which results are not listed:
// "severity" and "hidden"; with a baseline: "baseline" ({"file", "inBaseline"}); with a
// grouping: "groups", each {"key", "title", "counts", "results"} (positions in "results"); with
// statistics: "statistics", each {"messageNumber", "severityText", "count", "summary"}.
void WriteJson(std::ostream& out, const RunRecord& record, const Presentation& presentation = {});

// The summary line of the text form, without its line break, e.g.
// "97 checks performed, 1 error, 3 warnings, 2 ignored results."
// (with " Verification cancelled." appended after a cancellation, and what the severity and
// the baseline left out).
std::string SummaryLine(const RunRecord& record, const Presentation& presentation = {});

}  // namespace vtr::cli
