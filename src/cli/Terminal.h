#pragma once

#include <cstdio>

namespace vtr::cli {

// Whether the stream is a terminal (a console on Windows).
bool IsTerminal(std::FILE* stream);

// The terminal's width in columns: the size the terminal reports, else the COLUMNS variable,
// else 80.
int TerminalColumns(std::FILE* stream);

}  // namespace vtr::cli
