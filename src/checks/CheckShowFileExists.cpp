#include "checks/CheckShowFileExists.h"

#include <memory>

#include "checks/CheckLoadShowFile.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"

namespace vtr {

void CheckShowFileExists::SetFilename(const std::string& filename) {
    filename_ = filename;
    identifier_ = {};
}

void CheckShowFileExists::Check() {
    if (ResumeOr(false, [&] { return LibFile::FileExists(filename_); })) {
        ResumeStep([&] {
            auto load = std::make_shared<CheckLoadShowFile>();
            load->SetFilename(filename_);
            LibVerify::AddCheck(load);
        });
    } else {
        ResumeStep([&] { LibVerify::AddResult(Messages::ShowFileMissing, {filename_}); });
    }
}

std::string CheckShowFileExists::CheckIdentifier() {
    return identifier_.Get(CheckType::ShowFileExists, filename_);
}

}  // namespace vtr
