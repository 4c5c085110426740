#include "checks/sequence/ChannelWalk.h"

#include <cstdint>
#include <memory>

#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/SequenceUtils.h"
#include "sequencelib/Sequence.h"

namespace vtr::ChannelWalk {

void ReportChannelsFailing(const std::string& sequenceFile, const Message& message,
                           const std::function<bool(const seqlib::Channel&)>& passes) {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(sequenceFile); });
    if (!sequence)
        return;
    const auto& tracks = sequence->Tracks();
    for (std::size_t t = 0; t < tracks.size(); ++t) {
        const auto& channels = tracks[t]->Channels();
        for (std::size_t c = 0; c < channels.size(); ++c) {
            const auto& channel = channels[c];
            if (ResumeOr(true, [&] { return passes(*channel); }))
                continue;
            if (t == 0 && c == 0 && channel->Name() == "c0")
                continue;
            LibVerify::AddResult(message, {"[SEQUENCE]: " + sequenceFile,
                                           "[TRACK]: " + SequenceUtils::TrackText(
                                                             tracks[t], static_cast<int32_t>(t)),
                                           "[CHANNEL]: " + channel->Name()});
        }
    }
}

}  // namespace vtr::ChannelWalk
