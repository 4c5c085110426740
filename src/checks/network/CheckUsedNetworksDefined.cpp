#include "checks/network/CheckUsedNetworksDefined.h"

#include <memory>
#include <utility>

#include "checks/common/BlobberConflictHelper.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/NetworkPreferences.h"
#include "environment/SequenceUtils.h"
#include "sequencelib/DeviceTypeInfo.h"
#include "sequencelib/FlatMap.h"
#include "sequencelib/Sequence.h"

namespace vtr {

CheckUsedNetworksDefined::CheckUsedNetworksDefined(std::string filename)
    : FileCheck(CheckType::UsedNetworksDefined,
                "Channels use defined networks: ", std::move(filename)) {}

bool CheckUsedNetworksDefined::IsNetworkDefined(const NetworkPreferences& preferences,
                                                int32_t deviceType, int32_t network) {
    switch (deviceType) {
        case seqlib::DeviceTypes::VtrController:
            return network >= 0 && network < NetworkPreferences::kVTRNetworks &&
                   preferences.VTRNetwork(network).Port() != 0;
        case seqlib::DeviceTypes::X10:
            return preferences.X10Port() != 0;
        case seqlib::DeviceTypes::Tolvex:
            return preferences.TolvexPort() != 0;
        case seqlib::DeviceTypes::Dmx:
            // A universe the preferences cannot hold is not defined either.
            return ResumeOr(false, [&] {
                const DMXUniversePrefs& universe = preferences.DMXUniverse(network);
                return universe.UsesE131() ? !universe.E131IPAddress().empty()
                                           : !universe.Adapter().empty();
            });
        default:
            return true;
    }
}

void CheckUsedNetworksDefined::Check() {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(filename_); });
    if (!sequence)
        return;
    const NetworkPreferences& preferences = LibVerify::GetNetworkPreferences();

    const auto& tracks = sequence->Tracks();
    seqlib::SequenceChannelMap<bool> examined(sequence->Channels());
    for (std::size_t t = 0; t < tracks.size(); ++t) {
        for (const auto& channel : tracks[t]->Channels()) {
            if (!examined.Insert(channel.get(), true).second)
                continue;  // already seen through another track that shares it
            if (IsNetworkDefined(preferences, channel->DeviceType(), channel->Network()))
                continue;
            LibVerify::AddResult(
                Messages::ChannelUndefinedNetwork,
                {"[SEQUENCE]: " + filename_,
                 "[TRACK]: " + SequenceUtils::TrackText(tracks[t], static_cast<int32_t>(t)),
                 "[CHANNEL]: " + channel->Name()});
        }
    }

    // Intensity-file devices are reported one by one, however many share a network.
    for (const auto kind :
         {seqlib::IntensityFileKind::Gridcraft, seqlib::IntensityFileKind::Novalux}) {
        const auto file = sequence->IntensityFileOf(kind);
        if (!file)
            continue;
        for (const seqlib::DeviceAddress& device : file->Devices()) {
            if (IsNetworkDefined(preferences, device.DeviceType(), device.Network()))
                continue;
            LibVerify::AddResult(
                Messages::IntensityFileUndefinedNetwork,
                {"[SEQUENCE]: " + filename_, "[INTENSITY FILE]: " + BlobberKindName(kind),
                 "[NETWORK]: " +
                     SequenceUtils::NetworkText(device.DeviceType(), device.Network())});
        }
    }
}

}  // namespace vtr
