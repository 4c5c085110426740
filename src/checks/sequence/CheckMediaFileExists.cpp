#include "checks/sequence/CheckMediaFileExists.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"

namespace vtr {

std::string CheckMediaFileExists::ReferenceText() const {
    return filename_ + " (referenced in sequence " + inSequenceFile_ + ")";
}

void CheckMediaFileExists::Check() {
    if (ResumeOr(false, [&] { return LibFile::FileExists(filename_); }))
        return;
    LibVerify::AddResult(Messages::MediaFileMissing,
                         {"[FILE]: " + filename_, "[SEQUENCE]: " + inSequenceFile_});
}

std::string CheckMediaFileExists::CheckIdentifier() {
    return identifier_.Get(CheckType::MediaFileExists, ReferenceText());
}

std::string CheckMediaFileExists::Description() {
    return "Media file existence: " + ReferenceText();
}

}  // namespace vtr
