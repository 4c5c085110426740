#pragma once

#include <iosfwd>
#include <string>

#include "CommandLine.h"
#include "ResultsOutput.h"
#include "report/RunReport.h"

// The results report that --output saves, in the format its file name asks for, and what
// --format prints on standard output.
namespace vtr::cli {

enum class ReportFormat {
    Text,   // the results report of the suite: every result that is not ignored
    Json,   // the JSON document that --format json prints
    Html,   // the HTML report that --format html prints
    Sarif,  // the SARIF report that --format sarif prints
};

// The format for a file name, by its extension without regard to letter case: ".json" gives
// Json, ".html" and ".htm" Html, ".sarif" Sarif, any other name Text.
ReportFormat ReportFormatFor(const std::string& path);

// The shared reports' view of a finished run: its results as recorded, with the run's
// context from the driver (times, settings store, the week, the shows' files).
report::RunReport ReportOf(const RunRecord& record, const Presentation& presentation);

// Saves the report of the run just finished. Raises a VtrError when it cannot be written.
void SaveReport(const std::string& path, const RunRecord& record, const Presentation& presentation);

// Prints the run's results on standard output in the format chosen with --format.
void WriteOutput(std::ostream& out, OutputFormat format, const RunRecord& record,
                 const Presentation& presentation);

}  // namespace vtr::cli
