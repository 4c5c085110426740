#pragma once

#include <string>

#include "ResultsOutput.h"

// The results report that --output saves, in the format its file name asks for.
namespace vtr::cli {

enum class ReportFormat {
    Text,  // the results report of the suite: every result that is not ignored
    Json,  // the JSON document that --format json prints
    // The HTML and SARIF reports join here, chosen by ".html" and ".sarif".
};

// The format for a file name, by its extension without regard to letter case: ".json" gives
// Json, any other name Text.
ReportFormat ReportFormatFor(const std::string& path);

// Saves the report of the run just finished. Raises a VtrError when it cannot be written.
void SaveReport(const std::string& path, const RunRecord& record, const Presentation& presentation);

}  // namespace vtr::cli
