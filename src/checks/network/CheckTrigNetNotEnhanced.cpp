#include "checks/network/CheckTrigNetNotEnhanced.h"

#include <utility>

#include "checks/network/CheckTriggerDefinedNetwork.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/NetworkPreferences.h"
#include "environment/SequenceUtils.h"

namespace vtr {

CheckTrigNetNotEnhanced::CheckTrigNetNotEnhanced(std::string showFilename, TriggerPtr trig,
                                                 std::string triggerDescription)
    : TriggerCheck(CheckType::TrigNetNotEnhanced,
                   "Trigger on VTR Enhanced network: ", std::move(showFilename), std::move(trig),
                   std::move(triggerDescription)) {}

void CheckTrigNetNotEnhanced::Check() {
    if (!trig_)
        return;
    const int32_t network = trig_->Network();
    const bool enhanced = ResumeOr(
        false, [&] { return LibVerify::GetNetworkPreferences().VTRNetwork(network).Enhanced(); });
    if (!enhanced)
        return;
    LibVerify::AddResult(
        Messages::TriggerUsesEnhancedNetwork,
        {"[SHOW] " + showFilename_, "[NETWORK] " + SequenceUtils::VtrNetworkText(network),
         "[TRIGGER] " + triggerDescription_});
}

}  // namespace vtr
