#pragma once

#include <cstdint>
#include <iosfwd>
#include <optional>
#include <string>

#include "engine/Result.h"
#include "engine/ResultGrouping.h"

// The command line of vantori-verify:
//
//   vantori-verify (--schedule | --show FILE | --sequence FILE) [--registry FILE]
//                  [--format text|json|html|sarif] [--output FILE] [--log] [-q|--quiet]
//                  [--severity error|warning|info] [--fail-on error|warning|never]
//                  [--group-by message|show|sequence|pair] [--statistics]
//                  [--color auto|always|never] [--baseline FILE] [--write-baseline FILE]
//   vantori-verify ignore (--message N | --key KEY) [--registry FILE]
//   vantori-verify unignore (--message N | --key KEY) [--registry FILE]
//   vantori-verify ignored [--registry FILE] [--format text|json]
//   vantori-verify --help | --version
namespace vtr::cli {

// The process's exit status.
namespace ExitStatus {
inline constexpr int Clean = 0;        // no un-ignored warning or error
inline constexpr int Warnings = 1;     // warnings, no errors
inline constexpr int Errors = 2;       // errors
inline constexpr int CannotSetUp = 3;  // the target (or the settings store) cannot be set up
inline constexpr int Usage = 64;       // wrong usage
inline constexpr int Cancelled = 130;  // cancelled (Ctrl-C, SIGTERM, a hang-up), whatever found
inline constexpr int Internal = 70;    // an unexpected failure of the program itself
}  // namespace ExitStatus

enum class Command { Verify, Ignore, Unignore, ListIgnored };
enum class TargetKind { Schedule, Show, Sequence };
// What a verification prints on standard output (the ignore lists: text or JSON only).
enum class OutputFormat { Text, Json, Html, Sarif };
// Which findings make the exit status other than 0.
enum class FailOn { Warning, Error, Never };
enum class ColorChoice { Auto, Always, Never };

struct Options {
    Command command = Command::Verify;

    // Verify.
    TargetKind target = TargetKind::Schedule;
    std::string targetFile;  // the show or sequence file; empty for the schedule
    std::optional<std::string> output;
    bool log = false;
    bool quiet = false;
    // How the results are presented; none of these changes the results themselves.
    Severity minimumSeverity = Severity::Info;  // list this severity and worse
    FailOn failOn = FailOn::Warning;
    GroupBy groupBy = GroupBy::None;
    bool statistics = false;
    ColorChoice color = ColorChoice::Auto;
    std::optional<std::string> baseline;       // list only results whose keys are not in it
    std::optional<std::string> writeBaseline;  // save this run's keys
    int jobs = 0;  // processors that load sequence files; 0: every one of the machine's

    // Ignore and Unignore: exactly one of the two.
    std::optional<int32_t> messageNumber;
    std::optional<std::string> ignoreKey;  // as given (possibly in the escaped form)

    // Every command.
    std::optional<std::string> registry;
    OutputFormat format = OutputFormat::Text;
};

// What parsing decided: the options to run, or an exit status when there is nothing to run
// (--help and --version print to out and give 0; wrong usage prints its reason to err and
// gives 64).
struct ParseOutcome {
    std::optional<Options> options;
    int exitStatus = ExitStatus::Clean;
};

ParseOutcome ParseCommandLine(int argc, const char* const* argv, std::ostream& out,
                              std::ostream& err);

// "schedule", "show", "sequence".
const char* TargetKindName(TargetKind kind);

// The message numbers of the catalog as ranges: "0-7, 9-18, 20-33, 41-49 and 51-54".
std::string CatalogRanges();

}  // namespace vtr::cli
