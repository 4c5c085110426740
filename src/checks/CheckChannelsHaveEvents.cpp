#include "checks/CheckChannelsHaveEvents.h"

#include <memory>

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/SequenceUtils.h"
#include "sequencelib/Sequence.h"

namespace vtr {

void CheckChannelsHaveEvents::Check() {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(filename_); });
    if (!sequence)
        return;
    const auto& tracks = sequence->Tracks();
    for (std::size_t t = 0; t < tracks.size(); ++t) {
        const auto& channels = tracks[t]->Channels();
        for (std::size_t c = 0; c < channels.size(); ++c) {
            const auto& channel = channels[c];
            if (channel->IsEverOn())
                continue;
            // "c0" first in the first track is the placeholder channel of an empty sequence.
            if (t == 0 && c == 0 && channel->Name() == "c0")
                continue;
            ResumeStep([&] {
                LibVerify::AddResult(
                    Messages::ChannelCompletelyOff,
                    {"[SEQUENCE]: " + filename_,
                     "[TRACK]: " + SequenceUtils::TrackText(tracks[t], static_cast<int32_t>(t)),
                     "[CHANNEL]: " + channel->Name()});
            });
        }
    }
}

std::string CheckChannelsHaveEvents::CheckIdentifier() {
    return identifier_.Get(CheckType::ChannelsHaveEvents, filename_);
}

std::string CheckChannelsHaveEvents::Description() {
    return "Channels have events: " + filename_;
}

}  // namespace vtr
