#include "checks/installation/CheckUserDataPathExists.h"

#include <memory>

#include "checks/schedule/CheckShowIsScheduled.h"
#include "checks/schedule/CheckWeeklyScheduleExists.h"
#include "checks/schedule/CheckYearlyScheduleExists.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"
#include "environment/VTRCommon.h"

namespace vtr {

void CheckUserDataPathExists::Check() {
    const std::string path = ResumeOr(std::string{}, [] { return VTRCommon::GetUserDataPath(); });
    const bool exists = ResumeOr(false, [&] { return LibFile::DirectoryExists(path); });
    if (!exists) {
        LibVerify::AddResult(Messages::UserDataDirectoryMissing, {path});
        return;
    }
    LibVerify::AddCheck(std::make_shared<CheckWeeklyScheduleExists>());
    LibVerify::AddCheck(std::make_shared<CheckYearlyScheduleExists>());
    LibVerify::AddCheck(std::make_shared<CheckShowIsScheduled>());
}

std::string CheckUserDataPathExists::CheckIdentifier() {
    return identifier_.Get(CheckType::UserDataPathExists, "");
}

}  // namespace vtr
