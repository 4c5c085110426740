#include "sequencelib/ShellCommandMap.h"

#include "engine/VtrError.h"
#include "environment/VTRCommon.h"
#include "show/Serialize.h"
#include "show/WholeFile.h"

namespace vtr::seqlib {

std::string ShellCommandMap::MapFilePath() const {
    return VTRCommon::GetUserDataPath() + kFileName;
}

std::string ShellCommandMap::CommandText(const std::string& identifier) const {
    return CommandTextIn(MapFilePath(), identifier);
}

std::string ShellCommandMap::CommandTextIn(const std::string& mapFile,
                                           const std::string& identifier) {
    return Contents::Read(mapFile).CommandText(identifier);
}

ShellCommandMap::Contents ShellCommandMap::Contents::Read(const std::string& mapFile) {
    Contents contents;
    std::string text;
    if (ReadWholeFile(mapFile, text) != 0)
        return contents;
    // The items are taken in order, the first of each identifier kept; an item that cannot
    // be read ends the map there (the identifiers of the items before it are still found).
    ResumeStep([&] {
        for (const std::string& item : Serialize::ListFromText(text, 0)) {
            // Each item is itself a list: the identifier, then the command line. Anything
            // else in the list is passed over.
            if (item.empty() || item.front() != '(')
                continue;
            const Serialize::List pair = Serialize::ListFromText(item, 0);
            if (pair.Count() >= 2) {
                contents.commands_.try_emplace(Serialize::UnescapeText(pair[0]),
                                               Serialize::UnescapeText(pair[1]));
            }
        }
    });
    return contents;
}

std::string ShellCommandMap::Contents::CommandText(const std::string& identifier) const {
    const auto command = commands_.find(identifier);
    return command != commands_.end() ? command->second : std::string();
}

}  // namespace vtr::seqlib
