#include "checks/conflicts/CheckIntersequenceConflicts.h"

#include <array>
#include <deque>
#include <memory>
#include <vector>

#include <utility>

#include "checks/common/BlobberConflictHelper.h"
#include "checks/sequence/CheckSequenceFileExists.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/LibFile.h"
#include "environment/SequenceUtils.h"
#include "sequencelib/FlatMap.h"
#include "sequencelib/Sequence.h"
#include "show/Show.h"

namespace vtr {

namespace {

// The sections of a show as flags, in the order in which a channel is compared with them.
constexpr std::array<int32_t, 6> kFlagOrder = {1, 2, 4, 8, 16, 32};
constexpr int32_t kBackground = 1;
constexpr int32_t kStartup = 2;
constexpr int32_t kAnimation = 4;
constexpr int32_t kMusical = 8;
constexpr int32_t kInteractive = 16;
constexpr int32_t kShutdown = 32;

// The sections that each section is compared with: what the show player runs at the same
// time. Background sequences run together and under everything; Startup and Shutdown run
// alone over the Background; the Animation runs with the Musical and Interactive sections,
// and its own sequences run together only when the Main playlist plays them simultaneously
// (animation type 2). Pairs of different sections are listed both ways round, so each pair
// is compared once, from whichever side is walked later.
constexpr int32_t kEverySection =
    kBackground | kStartup | kAnimation | kMusical | kInteractive | kShutdown;
constexpr int32_t kUnderBackground = kBackground;
constexpr int32_t kWithAnimation = kBackground | kAnimation;
constexpr int32_t kAnimationInTurn = kBackground | kMusical | kInteractive;
constexpr int32_t kAnimationTogether = kAnimationInTurn | kAnimation;
constexpr int32_t kSimultaneousAnimation = 2;
static_assert(kEverySection == 63 && kAnimationTogether == 29 && kAnimationInTurn == 25 &&
              kWithAnimation == 5 && kUnderBackground == 1);

int SlotOf(int32_t flag) {
    for (int slot = 0; slot < static_cast<int>(kFlagOrder.size()); ++slot) {
        if (kFlagOrder[slot] == flag)
            return slot;
    }
    return -1;
}

// One walk of one sequence name (a name listed twice is walked, and counted, twice).
struct WalkedSequence {
    std::string name;
    std::shared_ptr<seqlib::Sequence> sequence;
};

// A channel registered in a section: where it was walked. Registrations of one key are
// chained through `next` in the order they were made.
struct Registration {
    int32_t sequence;  // index into the walked sequences
    int32_t track;     // the track's index in its sequence
    const seqlib::Channel* channel;
    int32_t next;  // the next registration under the same key, -1 for none
};

// What the intensity-file comparison knows of one side: the section, the walked sequence and
// (for an intensity file) its kind, or (for a channel) its track.
struct BlobberRecord {
    int32_t section;
    int32_t sequence;
    seqlib::IntensityFileKind kind;
};
struct ChannelRecord {
    int32_t section;
    int32_t sequence;
    int32_t track;
};

// What the comparison of intensity files hands back with each conflict.
using Helper = BlobberConflictHelper<const BlobberRecord*, ChannelRecord>;

struct SectionRecord {
    int32_t flag = 0;
    int32_t mask = 0;
    // Every registration in the order made, chained per address.
    std::vector<Registration> registrations;
    std::vector<Helper::Blobber> blobbers;
};

// The registrations at one address in each section: the first and the last of the chain.
struct AddressChains {
    std::array<std::pair<int32_t, int32_t>, kFlagOrder.size()> chains;
    AddressChains() { chains.fill({-1, -1}); }
};

class IntersequenceWalk {
  public:
    IntersequenceWalk(const std::string& showFilename, int32_t animationType)
        : filename_(showFilename) {
        const std::array<std::pair<int32_t, int32_t>, 6> masks = {{
            {kBackground, kEverySection},
            {kStartup, kUnderBackground},
            {kAnimation,
             animationType == kSimultaneousAnimation ? kAnimationTogether : kAnimationInTurn},
            {kMusical, kWithAnimation},
            {kInteractive, kWithAnimation},
            {kShutdown, kUnderBackground},
        }};
        for (const auto& [flag, mask] : masks) {
            SectionRecord& record = sections_[SlotOf(flag)];
            record.flag = flag;
            record.mask = mask;
        }
        helper_.ChannelConflict =
            [this](const BlobberRecord* blobber, const seqlib::DeviceAddress& device,
                   const ChannelRecord& record, const seqlib::Channel& channel) {
                OnChannelConflict(*blobber, device, record, channel);
            };
        helper_.BlobberConflict =
            [this](const BlobberRecord* first, const seqlib::DeviceAddress& firstDevice,
                   const BlobberRecord* second, const seqlib::DeviceAddress& secondDevice) {
                OnBlobberConflict(*first, firstDevice, *second, secondDevice);
            };
    }

    void WalkSequence(int32_t sectionFlag, const std::string& listedName) {
        if (listedName.empty())
            return;
        std::string name = listedName;
        if (CheckSequenceFileExists::IsEditFile(name))
            name = SequenceUtils::GetR9PlaybackFile(name);
        if (!LibFile::FileExists(name))
            return;  // its own checks report it
        auto sequence = LibVerify::LoadSequence(name);
        if (!sequence)
            return;
        const auto index = static_cast<int32_t>(walked_.size());
        walked_.push_back({std::move(name), std::move(sequence)});
        const seqlib::Sequence& walked = *walked_.back().sequence;
        SectionRecord& section = sections_[SlotOf(sectionFlag)];

        const auto& tracks = walked.Tracks();
        seqlib::SequenceChannelMap<bool> inEarlierTracks(walked.Channels());
        for (std::size_t t = 0; t < tracks.size(); ++t) {
            for (const auto& channel : tracks[t]->Channels()) {
                ResumeStep([&] {
                    WalkChannel(section, index, static_cast<int32_t>(t), *channel, inEarlierTracks);
                });
            }
            if (t + 1 < tracks.size()) {
                for (const auto& channel : tracks[t]->Channels())
                    inEarlierTracks.Insert(channel.get(), true);
            }
        }

        for (const auto kind :
             {seqlib::IntensityFileKind::Gridcraft, seqlib::IntensityFileKind::Novalux}) {
            ResumeStep([&] { CompareIntensityFile(section, index, walked, kind); });
        }
    }

  private:
    void WalkChannel(SectionRecord& section, int32_t sequence, int32_t track,
                     const seqlib::Channel& channel,
                     const seqlib::SequenceChannelMap<bool>& inEarlierTracks) {
        if (!channel.HasPhysicalSettings())
            return;
        // A channel shared by several tracks of one sequence counts once, with its first.
        if (inEarlierTracks.Find(&channel) != nullptr)
            return;
        // One look-up for every section: the chains of the channel's address.
        const auto [at, isNew] =
            addresses_.Insert(channel.SettingsIdentity(), static_cast<int32_t>(chains_.size()));
        if (isNew)
            chains_.emplace_back();
        const int32_t chainsAt = *at;
        const ChannelRecord channelRecord{section.flag, sequence, track};
        for (std::size_t slot = 0; slot < kFlagOrder.size(); ++slot) {
            if ((section.mask & kFlagOrder[slot]) == 0)
                continue;
            SectionRecord& other = sections_[slot];
            for (int32_t r = chains_[chainsAt].chains[slot].first; r >= 0;
                 r = other.registrations[r].next) {
                const Registration registration = other.registrations[r];
                ResumeStep([&] {
                    ReportChannelConflict(section.flag, sequence, track, channel, other.flag,
                                          registration);
                });
            }
            for (const auto& blobber : other.blobbers) {
                bool found = false;
                ResumeStep([&] {
                    helper_.CheckForChannelConflicts(blobber, &channel, channelRecord, found);
                });
            }
        }
        // Registered after the comparison, so that a channel never meets itself.
        const auto index = static_cast<int32_t>(section.registrations.size());
        section.registrations.push_back({sequence, track, &channel, -1});
        auto& [first, last] = chains_[chainsAt].chains[SlotOf(section.flag)];
        if (first < 0) {
            first = index;
        } else {
            section.registrations[last].next = index;
        }
        last = index;
    }

    void CompareIntensityFile(SectionRecord& section, int32_t sequence,
                              const seqlib::Sequence& walked, seqlib::IntensityFileKind kind) {
        const auto file = walked.IntensityFileOf(kind);
        if (!file)
            return;
        const BlobberRecord& record =
            blobberRecords_.emplace_back(BlobberRecord{section.flag, sequence, kind});
        const Helper::Blobber blobber{file.get(), &record};
        for (const int32_t flag : kFlagOrder) {
            if ((section.mask & flag) == 0)
                continue;
            const SectionRecord& other = sections_[SlotOf(flag)];
            bool found = false;
            for (const Registration& registration : other.registrations) {
                const ChannelRecord channelRecord{other.flag, registration.sequence,
                                                  registration.track};
                ResumeStep([&] {
                    helper_.CheckForChannelConflicts(blobber, registration.channel, channelRecord,
                                                     found);
                });
            }
            ResumeStep([&] { helper_.CheckForBlobberConflicts(blobber, other.blobbers, found); });
        }
        section.blobbers.push_back(blobber);
    }

    std::string TrackTextOf(int32_t sequence, int32_t track) const {
        return SequenceUtils::TrackText(walked_[sequence].sequence->Tracks()[track], track);
    }

    void ReportChannelConflict(int32_t section, int32_t sequence, int32_t track,
                               const seqlib::Channel& channel, int32_t otherSection,
                               const Registration& other) {
        LibVerify::AddResult(
            Messages::ChannelConflict,
            {"[SHOW]: " + filename_,
             "[SECTION]: " + CheckIntersequenceConflicts::SectionName(section),
             "[SEQUENCE]: " + walked_[sequence].name, "[TRACK]: " + TrackTextOf(sequence, track),
             "[CHANNEL]: " + channel.Name(),
             "[SECTION]: " + CheckIntersequenceConflicts::SectionName(otherSection),
             "[SEQUENCE]: " + walked_[other.sequence].name,
             "[TRACK]: " + TrackTextOf(other.sequence, other.track),
             "[CHANNEL]: " + other.channel->Name()});
    }

    void OnChannelConflict(const BlobberRecord& blobber, const seqlib::DeviceAddress& device,
                           const ChannelRecord& record, const seqlib::Channel& channel) {
        LibVerify::AddResult(
            Messages::ChannelIntensityFileConflict,
            {"[SHOW]: " + filename_,
             "[SECTION]: " + CheckIntersequenceConflicts::SectionName(record.section),
             "[SEQUENCE]: " + walked_[record.sequence].name,
             "[TRACK]: " + TrackTextOf(record.sequence, record.track),
             "[CHANNEL]: " + channel.Name(),
             "[SECTION]: " + CheckIntersequenceConflicts::SectionName(blobber.section),
             "[SEQUENCE]: " + walked_[blobber.sequence].name,
             "[INTENSITY FILE]: " + BlobberKindName(blobber.kind),
             "[RANGE]: " + SequenceUtils::DescribeDeviceAddress(device)});
    }

    void OnBlobberConflict(const BlobberRecord& first, const seqlib::DeviceAddress& firstDevice,
                           const BlobberRecord& second, const seqlib::DeviceAddress& secondDevice) {
        LibVerify::AddResult(
            Messages::IntensityFileConflict,
            {"[SHOW]: " + filename_,
             "[SECTION]: " + CheckIntersequenceConflicts::SectionName(first.section),
             "[SEQUENCE]: " + walked_[first.sequence].name,
             "[INTENSITY FILE]: " + BlobberKindName(first.kind),
             "[RANGE]: " + SequenceUtils::DescribeDeviceAddress(firstDevice),
             "[SECTION]: " + CheckIntersequenceConflicts::SectionName(second.section),
             "[SEQUENCE]: " + walked_[second.sequence].name,
             "[INTENSITY FILE]: " + BlobberKindName(second.kind),
             "[RANGE]: " + SequenceUtils::DescribeDeviceAddress(secondDevice)});
    }

    const std::string& filename_;
    Helper helper_;
    std::array<SectionRecord, kFlagOrder.size()> sections_;
    // The chains of each address met, found by the address.
    seqlib::SettingsMap<int32_t> addresses_;
    std::vector<AddressChains> chains_;
    std::vector<WalkedSequence> walked_;
    std::deque<BlobberRecord> blobberRecords_;  // addresses stay put as it grows
};

}  // namespace

CheckIntersequenceConflicts::CheckIntersequenceConflicts(std::string showFilename)
    : FileCheck(CheckType::IntersequenceConflicts,
                "Intersequence channel conflicts: ", std::move(showFilename)) {}

std::string CheckIntersequenceConflicts::SectionName(int32_t flag) {
    switch (flag) {
        case kBackground:
            return "Background";
        case kStartup:
            return "Startup";
        case kAnimation:
            return "Animation";
        case kMusical:
            return "Musical";
        case kInteractive:
            return "Interactive";
        case kShutdown:
            return "Shutdown";
        default:
            return "(" + std::to_string(flag) + ")";
    }
}

namespace {

// Calls visit(section flag, listed name) for every sequence name of the show in the order
// the sequences are walked: each playlist's list and then its clean-up sequence, section by
// section, then the interactive sets.
template <typename Visit>
void ForEachListed(const Show& show, Visit&& visit) {
    const auto visitPlaylist = [&](int32_t flag, const PlaylistPtr& playlist) {
        if (!playlist)
            return;
        for (const std::string& name : playlist->List())
            visit(flag, name);
        visit(flag, playlist->CleanUp());
    };
    visitPlaylist(kBackground, show.Background());
    visitPlaylist(kStartup, show.Startup());
    visitPlaylist(kAnimation, show.Main());
    visitPlaylist(kMusical, show.Musical());
    visitPlaylist(kShutdown, show.Shutdown());
    for (const auto& group : show.InteractiveGroups()) {
        if (!group)
            continue;
        for (const auto& set : group->TriggeredSets()) {
            if (!set)
                continue;
            for (const std::string& name : set->Sequences())
                visit(kInteractive, name);
        }
    }
}

}  // namespace

std::vector<std::string> CheckIntersequenceConflicts::SequenceFiles(const Show& show) const {
    std::vector<std::string> files;
    ForEachListed(show, [&](int32_t, const std::string& name) {
        // An edit file names its playback file only when read, and reading it reports what
        // is wrong with it: that is the walk's to do, in its turn, so its sequence is left to
        // be loaded then.
        if (!name.empty() && !CheckSequenceFileExists::IsEditFile(name))
            files.push_back(name);
    });
    return files;
}

void CheckIntersequenceConflicts::Check() {
    const auto show =
        ResumeOr(std::shared_ptr<Show>(), [&] { return LibVerify::LoadShow(filename_); });
    if (!show)
        return;  // CheckLoadShowFile reports a show that cannot be loaded
    const int32_t animationType = show->Main() ? show->Main()->AnimationType() : 0;
    IntersequenceWalk walk(filename_, animationType);
    ForEachListed(*show, [&](int32_t flag, const std::string& name) {
        ResumeStep([&] { walk.WalkSequence(flag, name); });
    });
}

}  // namespace vtr
