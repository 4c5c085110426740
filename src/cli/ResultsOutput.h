#pragma once

#include <cstdint>
#include <iosfwd>
#include <string>
#include <vector>

#include "CommandLine.h"
#include "engine/Result.h"
#include "environment/RegistryStore.h"

namespace vtr::cli {

// One result as the run produced it, with whether it was ignored at that moment.
struct RecordedResult {
    ResultPtr result;
    bool ignored = false;
};

// What a finished run hands to the printers.
struct RunRecord {
    TargetKind target = TargetKind::Schedule;
    std::string targetFile;  // empty for the schedule
    bool cancelled = false;
    int32_t checksPerformed = 0;
    int32_t errors = 0;                   // not-ignored errors
    int32_t warnings = 0;                 // not-ignored warnings
    std::vector<RecordedResult> results;  // every result in the order produced
    RegistryStore::Description store;     // the settings store the run read
};

// 0 with no warning or error, 1 with warnings only, 2 with errors.
int ExitStatusOf(const RunRecord& record);

// The text form: each not-ignored result as
//   "<severity text> <message number>: <summary>"
// with its details below, indented by four blanks; then, when there are any, a blank line,
// "Ignored results:" and the ignored ones in the same form; then a blank line and the
// summary line, e.g. "97 checks performed, 1 error, 3 warnings, 2 ignored results."
// (with " Verification cancelled." appended after a cancellation).
void WriteText(std::ostream& out, const RunRecord& record);

// The JSON form: one object with "target" ({"kind", "file"}; no "file" for the schedule),
// "store" ({"path" (null for the Windows registry), "chosenBy" ("option", "environment",
// "default" or "registry"), "exists", "understood", "readOnly"}), "cancelled", "checksPerformed",
// "errors", "warnings" and "results", every result in the order produced with "severity" (number),
// "severityText", "messageNumber", "helpContextId", "summary", "details" (array), "ignored" and
// "ignoreKey". Bytes that are not UTF-8 are written as U+FFFD.
void WriteJson(std::ostream& out, const RunRecord& record);

// The summary line of the text form, without its line break.
std::string SummaryLine(const RunRecord& record);

}  // namespace vtr::cli
