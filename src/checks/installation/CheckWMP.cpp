#include "checks/installation/CheckWMP.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/MediaPlayerProbe.h"

namespace vtr {

void CheckWMP::Check() {
    const bool supported =
        ResumeOr(false, [] { return MediaPlayerProbe::IsVersionAtLeast(kMinimumMajorVersion); });
    if (!supported)
        LibVerify::AddResult(Messages::UnsupportedMediaPlayer);
}

std::string CheckWMP::CheckIdentifier() {
    return identifier_.Get(CheckType::WMP, "");
}

}  // namespace vtr
