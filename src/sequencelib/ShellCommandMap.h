#pragma once

#include <string>
#include <unordered_map>

namespace vtr::seqlib {

// The shell-command map: the file "shellcmd.map" in the user-data folder, holding one list
// in the list notation of the show files whose items are (identifier, command line) pairs
// of escaped texts, for example ((12,C:\Show\lights.bat),(13,notify-send Show*Sstarted)).
class ShellCommandMap {
  public:
    static constexpr const char* kFileName = "shellcmd.map";

    // The map file's path: the user-data folder followed by "shellcmd.map".
    std::string MapFilePath() const;

    // The command line of the first item with that identifier. An unknown identifier, or a
    // map that is missing or cannot be read, gives "". The map is read on every call.
    std::string CommandText(const std::string& identifier) const;

    // The same for a given map file.
    static std::string CommandTextIn(const std::string& mapFile, const std::string& identifier);

    // A map file read once, for any number of questions (a verification reads the map once
    // and asks it for every sequence that uses shell commands).
    class Contents {
      public:
        // A map that is missing or cannot be read gives no commands.
        static Contents Read(const std::string& mapFile);
        // As ShellCommandMap::CommandText, without reading the file again.
        std::string CommandText(const std::string& identifier) const;

      private:
        std::unordered_map<std::string, std::string> commands_;  // by identifier
    };
};

}  // namespace vtr::seqlib
