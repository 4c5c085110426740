#include "checks/conflicts/CheckChannelLengthConflicts.h"

#include <memory>
#include <utility>

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/ProgressHandler.h"
#include "engine/VtrError.h"
#include "environment/SequenceUtils.h"
#include "sequencelib/FlatMap.h"
#include "sequencelib/Sequence.h"

namespace vtr {

CheckChannelLengthConflicts::CheckChannelLengthConflicts(std::string filename)
    : FileCheck(CheckType::ChannelLengthConflicts,
                "Channel length conflicts: ", std::move(filename)) {}

void CheckChannelLengthConflicts::Check() {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(filename_); });
    if (!sequence)
        return;
    const auto& tracks = sequence->Tracks();

    ProgressHandler progress;
    progress.SetDescription("Channel length conflicts");
    int64_t parts = 0;
    for (const auto& track : tracks)
        parts += static_cast<int64_t>(track->Channels().size());
    progress.SetProgressParts(static_cast<int32_t>(std::min<int64_t>(parts, INT32_MAX)));

    // The first track that lists each channel object.
    seqlib::SequenceChannelMap<std::size_t> firstTrack(sequence->Channels());
    for (std::size_t t = 0; t < tracks.size(); ++t) {
        for (const auto& channel : tracks[t]->Channels()) {
            progress.MakeProgress(1);
            const auto [entry, isNew] = firstTrack.Insert(channel.get(), t);
            if (isNew)
                continue;
            const std::size_t first = *entry;
            if (tracks[first]->Length() == tracks[t]->Length())
                continue;
            LibVerify::AddResult(
                Messages::ChannelLengthConflict,
                {"[SEQUENCE]: " + filename_, "[CHANNEL]: " + channel->Name(),
                 "[TRACK]: " + SequenceUtils::TrackText(tracks[first], static_cast<int32_t>(first)),
                 "[TRACK]: " + SequenceUtils::TrackText(tracks[t], static_cast<int32_t>(t))});
        }
    }
}

}  // namespace vtr
