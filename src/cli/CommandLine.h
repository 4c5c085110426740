#pragma once

#include <cstdint>
#include <iosfwd>
#include <optional>
#include <string>

// The command line of vantori-verify:
//
//   vantori-verify (--schedule | --show FILE | --sequence FILE) [--registry FILE]
//                  [--format text|json] [--output FILE] [--log] [--quiet]
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
enum class OutputFormat { Text, Json };

struct Options {
    Command command = Command::Verify;

    // Verify.
    TargetKind target = TargetKind::Schedule;
    std::string targetFile;  // the show or sequence file; empty for the schedule
    std::optional<std::string> output;
    bool log = false;
    bool quiet = false;

    // Ignore and Unignore: exactly one of the two.
    std::optional<int32_t> messageNumber;
    std::optional<std::string> ignoreKey;

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

}  // namespace vtr::cli
