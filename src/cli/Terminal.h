#pragma once

#include <cstdio>

#include "CommandLine.h"

namespace vtr::cli {

// Whether the stream is a terminal (a console on Windows).
bool IsTerminal(std::FILE* stream);

// The terminal's width in columns: the size the terminal reports, else the COLUMNS variable,
// else 80.
int TerminalColumns(std::FILE* stream);

// Lets the terminal behind the stream show colour escapes (a console on Windows is switched
// to read them); false when it cannot.
bool EnableColorEscapes(std::FILE* stream);

// Whether results are coloured: always, never, or (auto) on a terminal that shows colours,
// unless the NO_COLOR variable is set to any text or TERM is "dumb". Never in a pipe or a
// file unless asked for with always.
bool UseColor(ColorChoice choice, bool colorTerminal);

}  // namespace vtr::cli
