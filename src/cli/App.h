#pragma once

#include <iosfwd>

#include "CommandLine.h"
#include "ProgressLine.h"

// The command-line verifier, as a function the program's main and the tests both call.
namespace vtr::cli {

// Where the program writes, and what it knows of the terminal behind standard error.
struct Console {
    std::ostream& out;  // results, listings, --help and --version
    std::ostream& err;  // usage errors, failures, the --log lines, the progress display
    bool errIsTerminal = false;
    int errColumns = 80;
    ProgressLine::Clock clock = {};   // the progress display's clock; the steady clock when empty
    bool outIsColorTerminal = false;  // out is a terminal that shows colour escapes
};

// Parses the command line, selects the settings store and runs the command. Returns the
// process's exit status (see ExitStatus). Nothing escapes: a failure is described on err.
int Main(int argc, const char* const* argv, Console& console);

// One verification with parsed options (the store is already selected).
int RunVerify(const Options& options, Console& console);

}  // namespace vtr::cli
