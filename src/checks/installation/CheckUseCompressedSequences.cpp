#include "checks/installation/CheckUseCompressedSequences.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/LibRegistryVTRShared.h"

namespace vtr {

void CheckUseCompressedSequences::Check() {
    const bool enabled = ResumeOr(true, [] {
        return LibRegistryVTRShared::GetSharedBool("UseCompressedSequences", "", true);
    });
    if (!enabled)
        LibVerify::AddResult(Messages::CompressedSequencesDisabled);
}

std::string CheckUseCompressedSequences::CheckIdentifier() {
    return identifier_.Get(CheckType::UseCompressedSequences, "");
}

}  // namespace vtr
