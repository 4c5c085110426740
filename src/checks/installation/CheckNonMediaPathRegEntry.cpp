#include "checks/installation/CheckNonMediaPathRegEntry.h"

#include <memory>

#include "checks/installation/CheckNonMediaPathExists.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"

namespace vtr {

void CheckNonMediaPathRegEntry::Check() {
    const std::string path =
        ResumeOr(std::string{}, [&] { return pathService_.GetPath(kNonMediaDataPath); });
    if (path.empty()) {
        LibVerify::AddResult(Messages::NoNonMediaPathRegEntry);
    } else {
        LibVerify::AddCheck(std::make_shared<CheckNonMediaPathExists>());
    }
}

std::string CheckNonMediaPathRegEntry::CheckIdentifier() {
    return identifier_.Get(CheckType::NonMediaPathRegEntry, "");
}

}  // namespace vtr
