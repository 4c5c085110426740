#include "checks/installation/CheckOldKRP.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "environment/NetworkPreferences.h"
#include "environment/SequenceUtils.h"

namespace vtr {

void CheckOldKRP::Check() {
    for (int32_t network = 0; network < NetworkPreferences::kVTRNetworks; ++network) {
        ResumeStep([&] {
            const VTRNetworkPreferences& preferences =
                LibVerify::GetNetworkPreferences().VTRNetwork(network);
            if (preferences.Port() != 0 && preferences.OldKRP()) {
                LibVerify::AddResult(Messages::OldKRPEnabled,
                                     {SequenceUtils::VtrNetworkText(network)});
            }
        });
    }
}

std::string CheckOldKRP::CheckIdentifier() {
    return identifier_.Get(CheckType::OldKRP, "");
}

}  // namespace vtr
