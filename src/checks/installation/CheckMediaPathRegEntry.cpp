#include "checks/installation/CheckMediaPathRegEntry.h"

#include <memory>

#include "checks/installation/CheckMediaPathExists.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"

namespace vtr {

void CheckMediaPathRegEntry::Check() {
    const std::string path =
        ResumeOr(std::string{}, [&] { return pathService_.GetPath(kMediaDataPath); });
    if (path.empty()) {
        LibVerify::AddResult(Messages::NoMediaPathRegEntry);
    } else {
        LibVerify::AddCheck(std::make_shared<CheckMediaPathExists>());
    }
}

std::string CheckMediaPathRegEntry::CheckIdentifier() {
    return identifier_.Get(CheckType::MediaPathRegEntry, "");
}

}  // namespace vtr
