#pragma once

#include <optional>
#include <string>
#include <vector>

#include "engine/Result.h"
#include "report/RunReport.h"

// The SARIF 2.1.0 report of a run, for the tools that gather findings from many checkers
// (code-scanning services, editors' problem lists). One run; one rule per message number the
// run found (its summary, severity and what to do); one result per finding, in the order the
// run produced them, at the file it is about, with the other files it names as related
// locations; ignored results carry an external suppression, results in a baseline the
// baseline state "unchanged" (the others "new"). The run's properties hold the target, the
// program's version, the settings store and the checks performed. The document is the same
// from run to run of the same installation but for the invocation's two time stamps.
namespace vtr::report::SarifReport {

std::string Write(const RunReport& report);

// The rule id of a message number: "VTR043".
std::string RuleId(int32_t messageNumber);

// The files a result names: the one it is about (where a viewer lists it), then the others,
// each with what it is ("show", "sequence", "file", "folder", "settings store"). Results about
// the installation's settings are placed at the settings store file, when the store is one.
struct Place {
    std::string path;
    std::string role;
    bool operator==(const Place&) const = default;
};
std::vector<Place> PlacesOf(const Result& result, const std::optional<std::string>& storeFile);

}  // namespace vtr::report::SarifReport
