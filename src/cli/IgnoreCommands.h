#pragma once

#include <iosfwd>
#include <optional>
#include <string>

#include "CommandLine.h"
#include "engine/Result.h"

// The ignore subcommands: they change or list the two ignore lists of the settings store
// that a verification would use (the store is selected before they run).
namespace vtr::cli {

// "ignore" and "unignore" with --message N or --key KEY. Prints what changed on out. Gives 0,
// 64 for a key that cannot be a result's key, 3 when the change could not be saved in the
// store (it is read back to make sure).
int RunIgnoreCommand(const Options& options, std::ostream& out, std::ostream& err);

// "ignored": both lists, as text (keys in double quotes, so that their trailing blank shows)
// or as one JSON object {"messageNumbers": [...], "results": [...]}.
int RunListIgnored(const Options& options, std::ostream& out);

// A result whose IgnoreKey is the given key, or nothing when no result can have that key.
// A key is a message number in decimal, "-", then each detail followed by " / ".
std::optional<Result> ResultFromIgnoreKey(const std::string& key);

// The key that a key given on the command line stands for: its text decoded (a text that
// begins "escaped:", see IgnoreKeyText) and the " / " after the last detail added when it was
// left out. Nothing for an escaped text that cannot be decoded.
std::optional<std::string> KeyFromArgument(const std::string& argument);

}  // namespace vtr::cli
