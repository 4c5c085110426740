#pragma once

#include <string>

#include "report/RunReport.h"

// The HTML report of a run: one self-contained UTF-8 page (its style and its few lines of
// script inline, no image, font or other file, nothing from the network) that reads without
// scripts and prints. From the top:
//   - what was verified, when, by which version, with which settings store;
//   - the counts per severity (ignored too) and a bar of them;
//   - the shows with findings, and the findings of the installation that no show owns;
//   - the week at a glance: the weekly schedule on a seven-day, 24-hour grid, each show a
//     block marked by what was found in it, and below it the calendar dates from today on,
//     each with the weekly schedule's shows of its weekday beside its own;
//   - the results, errors first: by show (a show's channel conflicts under the two sequences
//     that clash), then by sequence, then the installation and settings, then the ignored
//     ones; each with its details whole and what to do about it;
//   - a filter by severity and text, which the inline script turns on.
// Every text that came from the user's files is escaped. The results are shown as the run
// produced them; the report only arranges them.
namespace vtr::report::HtmlReport {

std::string Write(const RunReport& report);

// Writes the page to the file, whole or not at all, and never over a file the run read
// (OutputFile::Write); raises a VtrError naming the file when it cannot.
void Save(const std::string& fileName, const RunReport& report);

}  // namespace vtr::report::HtmlReport
