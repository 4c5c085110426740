#include "checks/sequence/CheckChannelsHaveSettings.h"

#include <utility>

#include "checks/sequence/ChannelWalk.h"
#include "engine/CheckTypes.h"
#include "sequencelib/Channel.h"

namespace vtr {

CheckChannelsHaveSettings::CheckChannelsHaveSettings(std::string filename)
    : FileCheck(CheckType::ChannelsHaveSettings,
                "Channel physical settings: ", std::move(filename)) {}

void CheckChannelsHaveSettings::Check() {
    ChannelWalk::ReportChannelsFailing(
        filename_, Messages::ChannelMissingSettings,
        [](const seqlib::Channel& channel) { return channel.HasPhysicalSettings(); });
}

}  // namespace vtr
