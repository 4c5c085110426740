#include "checks/conflicts/CheckSeqChannelConflicts.h"

#include <memory>
#include <utility>
#include <variant>
#include <vector>

#include "checks/common/BlobberConflictHelper.h"
#include "checks/conflicts/ConflictContext.h"
#include "checks/conflicts/SeqChannelConflictsChInfo.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/ProgressHandler.h"
#include "engine/VtrError.h"
#include "environment/SequenceUtils.h"
#include "sequencelib/FlatMap.h"
#include "sequencelib/Sequence.h"

namespace vtr {

CheckSeqChannelConflicts::CheckSeqChannelConflicts(std::string filename)
    : FileCheck(CheckType::SeqChannelConflicts,
                "Sequence file channel conflicts: ", std::move(filename)) {}

namespace {

// Every channel object reached by walking the tracks in order, each once.
std::vector<const seqlib::Channel*> DistinctChannels(const seqlib::Sequence& sequence) {
    std::vector<const seqlib::Channel*> channels;
    seqlib::SequenceChannelMap<bool> seen(sequence.Channels());
    for (const auto& track : sequence.Tracks()) {
        for (const auto& channel : track->Channels()) {
            if (seen.Insert(channel.get(), true).second)
                channels.push_back(channel.get());
        }
    }
    return channels;
}

}  // namespace

void CheckSeqChannelConflicts::Check() {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(filename_); });
    if (!sequence)
        return;

    // An intensity file is known by its kind and track; a channel needs no context.
    using Helper = BlobberConflictHelper<ConflictContext, std::monostate>;
    Helper helper;
    ProgressHandler progress;
    progress.SetDescription("Sequence file channel conflicts");
    helper.BlobberCheckDeviceProgress = [&](int32_t) { progress.MakeProgress(1); };
    helper.ChannelConflict = [&](const ConflictContext& context,
                                 const seqlib::DeviceAddress& device, const std::monostate&,
                                 const seqlib::Channel& channel) {
        LibVerify::AddResult(
            Messages::SequenceIntensityFileSettingsConflict,
            {"[SEQUENCE]: " + filename_, "[TRACK]: " + context.TrackName(),
             "[CHANNEL]: " + channel.Name(), "[INTENSITY FILE]: " + context.BlobberName(),
             "[RANGE]: " + SequenceUtils::DescribeDeviceAddress(device)});
    };
    helper.BlobberConflict =
        [&](const ConflictContext& first, const seqlib::DeviceAddress& firstDevice,
            const ConflictContext& second, const seqlib::DeviceAddress& secondDevice) {
            LibVerify::AddResult(
                Messages::IntensityFileSettingsConflict,
                {"[SEQUENCE]: " + filename_, "[INTENSITY FILE]: " + first.BlobberName(),
                 "[RANGE]: " + SequenceUtils::DescribeDeviceAddress(firstDevice),
                 "[INTENSITY FILE]: " + second.BlobberName(),
                 "[RANGE]: " + SequenceUtils::DescribeDeviceAddress(secondDevice)});
        };

    const auto& tracks = sequence->Tracks();
    std::size_t entries = 0;
    for (const auto& track : tracks)
        entries += track->Channels().size();
    // The files present, Gridcraft first, each with the kind and the track that carries it.
    std::vector<Helper::Blobber> blobbers;
    for (const auto kind :
         {seqlib::IntensityFileKind::Gridcraft, seqlib::IntensityFileKind::Novalux}) {
        const auto file = sequence->IntensityFileOf(kind);
        if (!file)
            continue;
        ConflictContext context;
        context.SetBlobberName(BlobberKindName(kind));
        context.SetTrackName(SequenceUtils::TrackText(file->CarryingTrack(), file->TrackIndex()));
        blobbers.push_back({file.get(), std::move(context)});
    }

    // One part per channel entry of the tracks, per channel compared with a file and per
    // device of a file compared with the files.
    auto parts = static_cast<int64_t>(entries);
    // The distinct channels are only compared with files: without one, they are not sought.
    const std::vector<const seqlib::Channel*> distinct =
        blobbers.empty() ? std::vector<const seqlib::Channel*>() : DistinctChannels(*sequence);
    for (const auto& blobber : blobbers)
        parts += static_cast<int64_t>(distinct.size()) + blobber.file->DeviceCount();
    progress.SetProgressParts(static_cast<int32_t>(std::min<int64_t>(parts, INT32_MAX)));

    // Channel against channel: the first channel seen at each address stands for it.
    std::vector<SeqChannelConflictsChInfo> firstSeen;
    seqlib::SettingsMap<std::size_t> firstSeenAt(sequence->Channels().size());
    for (std::size_t t = 0; t < tracks.size(); ++t) {
        for (const auto& channel : tracks[t]->Channels()) {
            progress.MakeProgress(1);
            if (!channel->HasPhysicalSettings())
                continue;
            ResumeStep([&] {
                const auto [at, isNew] =
                    firstSeenAt.Insert(channel->SettingsIdentity(), firstSeen.size());
                if (isNew) {
                    SeqChannelConflictsChInfo& first = firstSeen.emplace_back();
                    first.SetChannel(channel);
                    first.SetTrack(tracks[t]);
                    first.SetTrackIndex(static_cast<int32_t>(t));
                    return;
                }
                const SeqChannelConflictsChInfo& earlier = firstSeen[*at];
                if (earlier.Channel() != channel) {
                    // Tracks share channel objects; only a different channel conflicts.
                    LibVerify::AddResult(
                        Messages::SequenceChannelSettingsConflict,
                        {"[SEQUENCE]: " + filename_,
                         "[TRACK]: " +
                             SequenceUtils::TrackText(earlier.Track(), earlier.TrackIndex()),
                         "[CHANNEL]: " + earlier.Channel()->Name(),
                         "[TRACK]: " + SequenceUtils::TrackText(tracks[t], static_cast<int32_t>(t)),
                         "[CHANNEL]: " + channel->Name()});
                }
            });
        }
    }

    // Channels against each file, then the file against itself and the files after it, so
    // that every pair of devices is compared once.
    for (std::size_t b = 0; b < blobbers.size(); ++b) {
        bool found = false;
        for (const seqlib::Channel* channel : distinct) {
            progress.MakeProgress(1);
            ResumeStep([&] { helper.CheckForChannelConflicts(blobbers[b], channel, {}, found); });
        }
        ResumeStep([&] {
            helper.CheckForBlobberConflicts(
                blobbers[b], std::span<const Helper::Blobber>(blobbers).subspan(b), found);
        });
    }
}

}  // namespace vtr
