#include "checks/schedule/CheckYearlyScheduleExists.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"

namespace vtr {

void CheckYearlyScheduleExists::Check() {
    const std::string file =
        ResumeOr(std::string{}, [] { return LibVerify::VerifiedYearlyScheduleFile(); });
    if (!ResumeOr(false, [&] { return LibFile::FileExists(file); }))
        LibVerify::AddResult(Messages::YearlyScheduleMissing, {file});
}

std::string CheckYearlyScheduleExists::CheckIdentifier() {
    return identifier_.Get(CheckType::YearlyScheduleExists, "");
}

}  // namespace vtr
