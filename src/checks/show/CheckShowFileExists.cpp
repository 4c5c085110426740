#include "checks/show/CheckShowFileExists.h"

#include <memory>
#include <utility>

#include "checks/show/CheckLoadShowFile.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"

namespace vtr {

CheckShowFileExists::CheckShowFileExists(std::string filename)
    : FileCheck(CheckType::ShowFileExists, "Show file existence: ", std::move(filename)) {}

void CheckShowFileExists::Check() {
    if (ResumeOr(false, [&] { return LibFile::FileExists(filename_); })) {
        ResumeStep([&] {
            auto load = std::make_shared<CheckLoadShowFile>();
            load->SetFilename(filename_);
            LibVerify::AddCheck(load);
        });
    } else {
        LibVerify::AddResult(Messages::ShowFileMissing, {filename_});
    }
}

}  // namespace vtr
