#include "checks/network/CheckTriggerDefinedNetwork.h"

#include <cstdint>
#include <memory>

#include <utility>

#include "checks/network/CheckTrigNetNotEnhanced.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/NetworkPreferences.h"
#include "environment/SequenceUtils.h"

namespace vtr {

CheckTriggerDefinedNetwork::CheckTriggerDefinedNetwork(std::string showFilename, TriggerPtr trig,
                                                       std::string triggerDescription)
    : TriggerCheck(CheckType::TriggerDefinedNetwork,
                   "Trigger on defined network: ", std::move(showFilename), std::move(trig),
                   std::move(triggerDescription)) {}

void CheckTriggerDefinedNetwork::Check() {
    if (!trig_)
        return;  // nothing to check
    const int32_t network = trig_->Network();
    // A network the preferences cannot hold (outside 0..15) has no port.
    const int32_t port = ResumeOr(0, [&] {
        return static_cast<int32_t>(LibVerify::GetNetworkPreferences().VTRNetwork(network).Port());
    });
    if (port == 0) {
        LibVerify::AddResult(
            Messages::TriggerUndefinedNetwork,
            {"[SHOW] " + showFilename_, "[NETWORK] " + SequenceUtils::VtrNetworkText(network),
             "[TRIGGER] " + triggerDescription_});
        return;
    }
    LibVerify::AddCheck(
        std::make_shared<CheckTrigNetNotEnhanced>(showFilename_, trig_, triggerDescription_));
}

}  // namespace vtr
