#include "checks/sequence/CheckChannelsHaveEvents.h"

#include <utility>

#include "checks/sequence/ChannelWalk.h"
#include "engine/CheckTypes.h"
#include "sequencelib/Channel.h"

namespace vtr {

CheckChannelsHaveEvents::CheckChannelsHaveEvents(std::string filename)
    : FileCheck(CheckType::ChannelsHaveEvents, "Channels have events: ", std::move(filename)) {}

void CheckChannelsHaveEvents::Check() {
    ChannelWalk::ReportChannelsFailing(
        filename_, Messages::ChannelCompletelyOff,
        [](const seqlib::Channel& channel) { return channel.IsEverOn(); });
}

}  // namespace vtr
