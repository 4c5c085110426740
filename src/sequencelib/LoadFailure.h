#pragma once

#include <string>

namespace vtr::seqlib::detail {

// Why a file could not be read, and where: "line 3, column 5", "byte 812 of the compressed
// data", or "" for the file as a whole. The public entry points turn it into a VtrError
// that also names the file.
struct LoadFailure {
    std::string where;
    std::string cause;
};

[[noreturn]] inline void FailLoad(std::string where, std::string cause) {
    throw LoadFailure{std::move(where), std::move(cause)};
}

// Not a failure: the caller asked the load to stop (a cancelled verification). It unwinds
// the load like a failure and is turned back into a plain "stopped" answer at the public
// entry point, never into an error.
struct LoadStopped {};

// "2 GiB", "64 MiB", "1000 bytes": a byte count for messages.
std::string ByteCountText(unsigned long long bytes);

}  // namespace vtr::seqlib::detail
