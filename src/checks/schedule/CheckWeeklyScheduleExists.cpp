#include "checks/schedule/CheckWeeklyScheduleExists.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"

namespace vtr {

void CheckWeeklyScheduleExists::Check() {
    const std::string file =
        ResumeOr(std::string{}, [] { return LibVerify::VerifiedWeeklyScheduleFile(); });
    if (!ResumeOr(false, [&] { return LibFile::FileExists(file); }))
        LibVerify::AddResult(Messages::WeeklyScheduleMissing, {file});
}

std::string CheckWeeklyScheduleExists::CheckIdentifier() {
    return identifier_.Get(CheckType::WeeklyScheduleExists, "");
}

}  // namespace vtr
