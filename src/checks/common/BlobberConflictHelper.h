#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>

#include "sequencelib/Channel.h"
#include "sequencelib/DeviceAddress.h"
#include "sequencelib/DeviceTypeInfo.h"
#include "sequencelib/IntensityFile.h"

namespace vtr {

// "Gridcraft Intensity File" or "Novalux Intensity File": how results name an intensity
// file (its kind, not the file's own name).
std::string BlobberKindName(seqlib::IntensityFileKind kind);

// The address-overlap rule between devices of intensity files ("blobbers") and channels.
class DeviceOverlap {
  public:
    // Devices of different types never conflict, nor devices on different networks or units
    // where the type has them; devices of a type without circuits always conflict; otherwise
    // their inclusive circuit ranges are compared, each taken from its two ends whichever way
    // round, so touching ranges (1-16 and 16-20) conflict and adjacent ones (1-16 and 17-32)
    // do not. The range arithmetic is 16-bit signed: a start plus count beyond 32767 raises
    // VtrError 6 (overflow).
    bool DevicesConflict(int32_t type1, int32_t network1, uint8_t unit1, int16_t start1,
                         int16_t count1, int32_t type2, int32_t network2, uint8_t unit2,
                         int16_t start2, int16_t count2) const;
    bool DevicesConflict(const seqlib::DeviceAddress& first,
                         const seqlib::DeviceAddress& second) const;

    // The number of devices of the file; 0 for none.
    static int32_t DeviceCount(const seqlib::IntensityFile* blobber);

  private:
    seqlib::DeviceTypeInfo deviceTypeInfo_;
};

// Decides whether device addresses claimed by intensity files and channels overlap. Used
// within one sequence and between the sequences of a show; the owner learns of each overlap
// through the events, which it sets before calling the checks. Every side of a conflict
// carries a context of the owner's type (what it knows of an intensity file, of a channel),
// which the helper never reads and hands back unchanged.
template <typename BlobberContext, typename ChannelContext>
class BlobberConflictHelper : public DeviceOverlap {
  public:
    // An intensity file and what its owner knows of it.
    struct Blobber {
        const seqlib::IntensityFile* file = nullptr;
        BlobberContext context{};
    };

    // Raised once per device of the examined file, after all others were scanned for it;
    // the argument is the device's index.
    std::function<void(int32_t device)> BlobberCheckDeviceProgress;
    // Two devices of two intensity files (or two devices of one) claim the same address.
    std::function<void(const BlobberContext& first, const seqlib::DeviceAddress& firstDevice,
                       const BlobberContext& second, const seqlib::DeviceAddress& secondDevice)>
        BlobberConflict;
    // A device of an intensity file claims the address of a channel.
    std::function<void(const BlobberContext& blobber, const seqlib::DeviceAddress& device,
                       const ChannelContext& channelContext, const seqlib::Channel& channel)>
        ChannelConflict;

    // Compares every device of `blobber` with every device of each of `others` (from the
    // next device on when the other is the same file, so each pair inside one file is met
    // once and no device meets itself), raising BlobberConflict for each overlapping pair
    // and setting found. Nothing when blobber has no file. An overflow reaches the caller
    // and ends the comparison.
    void CheckForBlobberConflicts(const Blobber& blobber, std::span<const Blobber> others,
                                  bool& found) {
        if (blobber.file == nullptr)
            return;
        const auto& devices = blobber.file->Devices();
        for (std::size_t i = 0; i < devices.size(); ++i) {
            for (const Blobber& other : others) {
                if (other.file == nullptr)
                    continue;
                const auto& otherDevices = other.file->Devices();
                const std::size_t first = other.file == blobber.file ? i + 1 : 0;
                for (std::size_t k = first; k < otherDevices.size(); ++k) {
                    if (DevicesConflict(devices[i], otherDevices[k])) {
                        found = true;
                        if (BlobberConflict)
                            BlobberConflict(blobber.context, devices[i], other.context,
                                            otherDevices[k]);
                    }
                }
            }
            if (BlobberCheckDeviceProgress)
                BlobberCheckDeviceProgress(static_cast<int32_t>(i));
        }
    }

    // Compares a channel that has physical settings, as a range of one circuit, with every
    // device of the file, raising ChannelConflict for each overlap and setting found.
    void CheckForChannelConflicts(const Blobber& blobber, const seqlib::Channel* channel,
                                  const ChannelContext& channelContext, bool& found) {
        if (blobber.file == nullptr || channel == nullptr || !channel->HasPhysicalSettings())
            return;
        const seqlib::DeviceAddress circuit(channel->DeviceType(), channel->Network(),
                                            channel->Unit(), channel->Circuit(), 1);
        for (const seqlib::DeviceAddress& device : blobber.file->Devices()) {
            if (DevicesConflict(device, circuit)) {
                found = true;
                if (ChannelConflict)
                    ChannelConflict(blobber.context, device, channelContext, *channel);
            }
        }
    }
};

}  // namespace vtr
