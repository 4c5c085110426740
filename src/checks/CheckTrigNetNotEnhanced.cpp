#include "checks/CheckTrigNetNotEnhanced.h"

#include "checks/CheckTriggerDefinedNetwork.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/NetworkPreferences.h"
#include "environment/SequenceUtils.h"

namespace vtr {

void CheckTrigNetNotEnhanced::Check() {
    if (!trig_)
        return;
    const int32_t network = trig_->Network();
    const bool enhanced = ResumeOr(
        false, [&] { return LibVerify::GetNetworkPreferences().VTRNetwork(network).Enhanced(); });
    if (!enhanced)
        return;
    ResumeStep([&] {
        LibVerify::AddResult(
            Messages::TriggerUsesEnhancedNetwork,
            {"[SHOW] " + showFilename_, "[NETWORK] " + SequenceUtils::VtrNetworkText(network),
             "[TRIGGER] " + triggerDescription_});
    });
}

std::string CheckTrigNetNotEnhanced::CheckIdentifier() {
    return identifier_.Get(CheckType::TrigNetNotEnhanced, TriggerIdentityText(trig_.get()));
}

std::string CheckTrigNetNotEnhanced::Description() {
    return "Trigger on VTR Enhanced network: " + triggerDescription_;
}

}  // namespace vtr
