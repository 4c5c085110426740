#pragma once

#include <string>

namespace vtr {

// The suite's map from shell-command identifiers to command lines: the file "shellcmd.map"
// in the user-data folder, one list in the show files' list notation whose items are
// (identifier,command line) pairs of escaped texts. The file is read on every request.
class ShellCommandMap {
  public:
    // The map file's path: the user-data folder followed by "shellcmd.map".
    std::string MapFilePath() const;
    // The command line of the first item with that identifier; "" for an unknown
    // identifier, or when the map is missing or cannot be read.
    std::string CommandText(const std::string& identifier) const;
    // The same, from a map file's text.
    static std::string CommandTextIn(const std::string& mapText, const std::string& identifier);
};

}  // namespace vtr
