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
    std::string text;
    if (ReadWholeFile(mapFile, text) != 0)
        return {};
    return ResumeOr(std::string(), [&] {
        for (const std::string& item : Serialize::ListFromText(text, 0)) {
            // Each item is itself a list: the identifier, then the command line. Anything
            // else in the list is passed over.
            if (item.empty() || item.front() != '(')
                continue;
            const Serialize::List pair = Serialize::ListFromText(item, 0);
            if (pair.Count() >= 2 && Serialize::UnescapeText(pair[0]) == identifier)
                return Serialize::UnescapeText(pair[1]);
        }
        return std::string();
    });
}

}  // namespace vtr::seqlib
