#pragma once

#include <string>
#include <string_view>

#include "engine/Result.h"

// The plain-text report of a run's results.
namespace vtr::ResultsReport {

// Writes every result of the last run that is not ignored, in the order produced: a line
// of 79 "=" between results; "Message Number: ", "Severity: ", "Description: " and one
// line per detail, labelled "Detail" when there is one and "Detail #1".. when there are
// more; every line ends in CR LF. No header, footer or blank line; no results give an
// empty file.
//
// The file is replaced whole or not at all (AtomicFile), and never when it is one that the
// verification read or checked (OutputFile::RefuseInput, error 37). On failure the error is
// raised and any earlier report of that name is left as it was.
void SaveResultsReport(const std::string& fileName);

// One result as the report writes it: its "Message Number: ", "Severity: " and
// "Description: " lines and its detail lines, each ending in lineEnd. (The window copies a
// result to the clipboard in this form.)
std::string ResultText(const Result& result, std::string_view lineEnd = "\r\n");

// What the window's save dialog for the report shows and allows. Cancelling it saves
// nothing.
struct DialogSettings {
    std::string title = "Save Verifier Results";
    std::string initialFolder;  // the user-data folder
    std::string fileName = "VTRVerifier Results";
    std::string defaultExtension = "txt";
    std::string filter = "Text Files (*.txt)|*.txt";  // one filter, selected as filter 1
    int filterIndex = 1;
    bool promptToOverwrite = true;
    bool hideReadOnlyBox = true;
    bool pathMustExist = true;
    bool refuseReadOnlyFile = true;
};

// The dialog settings, with the user-data folder as the initial folder.
DialogSettings ChooseResultsReportFileSettings();

}  // namespace vtr::ResultsReport
