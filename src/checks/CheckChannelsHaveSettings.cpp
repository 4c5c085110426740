#include "checks/CheckChannelsHaveSettings.h"

#include <memory>

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/SequenceUtils.h"
#include "sequencelib/Sequence.h"

namespace vtr {

void CheckChannelsHaveSettings::Check() {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(filename_); });
    if (!sequence)
        return;
    const auto& tracks = sequence->Tracks();
    for (std::size_t t = 0; t < tracks.size(); ++t) {
        const auto& channels = tracks[t]->Channels();
        for (std::size_t c = 0; c < channels.size(); ++c) {
            const auto& channel = channels[c];
            if (channel->HasPhysicalSettings())
                continue;
            // "c0" first in the first track is the placeholder channel of an empty sequence.
            if (t == 0 && c == 0 && channel->Name() == "c0")
                continue;
            ResumeStep([&] {
                LibVerify::AddResult(
                    Messages::ChannelMissingSettings,
                    {"[SEQUENCE]: " + filename_,
                     "[TRACK]: " + SequenceUtils::TrackText(tracks[t], static_cast<int32_t>(t)),
                     "[CHANNEL]: " + channel->Name()});
            });
        }
    }
}

std::string CheckChannelsHaveSettings::CheckIdentifier() {
    return identifier_.Get(CheckType::ChannelsHaveSettings, filename_);
}

std::string CheckChannelsHaveSettings::Description() {
    return "Channel physical settings: " + filename_;
}

}  // namespace vtr
