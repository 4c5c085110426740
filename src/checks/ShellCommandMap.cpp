#include "checks/ShellCommandMap.h"

#include "engine/VtrError.h"
#include "environment/VTRCommon.h"
#include "show/Serialize.h"
#include "show/WholeFile.h"

namespace vtr {

std::string ShellCommandMap::MapFilePath() const {
    return VTRCommon::GetUserDataPath() + "shellcmd.map";
}

std::string ShellCommandMap::CommandText(const std::string& identifier) const {
    std::string text;
    if (ReadWholeFile(MapFilePath(), text) != 0)
        return {};
    return CommandTextIn(text, identifier);
}

std::string ShellCommandMap::CommandTextIn(const std::string& mapText,
                                           const std::string& identifier) {
    return ResumeOr(std::string(), [&] {
        for (const std::string& item : Serialize::ListFromText(mapText, 0)) {
            // An item that is not a readable pair is passed over.
            const auto pair =
                ResumeOr(Serialize::List(), [&] { return Serialize::ListFromText(item, 0); });
            if (pair.Count() >= 2 && Serialize::UnescapeText(pair[0]) == identifier)
                return Serialize::UnescapeText(pair[1]);
        }
        return std::string();
    });
}

}  // namespace vtr
