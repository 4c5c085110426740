#include "checks/BlobberConflictHelper.h"

#include <algorithm>

#include "engine/VtrError.h"

namespace vtr {

namespace {

constexpr const char* kSource = "BlobberConflictHelper.DevicesConflict";

// The suite's 16-bit signed arithmetic: a sum outside -32768..32767 is an overflow.
int16_t Add16(int32_t a, int32_t b) {
    const int32_t sum = a + b;
    if (sum < INT16_MIN || sum > INT16_MAX)
        Raise(ErrorNumbers::Overflow, kSource, "Overflow");
    return static_cast<int16_t>(sum);
}

}  // namespace

std::string BlobberKindName(seqlib::IntensityFileKind kind) {
    return kind == seqlib::IntensityFileKind::Gridcraft ? "Gridcraft Intensity File"
                                                        : "Novalux Intensity File";
}

bool BlobberConflictHelper::DevicesConflict(int32_t type1, int32_t network1, uint8_t unit1,
                                            int16_t start1, int16_t count1, int32_t type2,
                                            int32_t network2, uint8_t unit2, int16_t start2,
                                            int16_t count2) const {
    if (type1 != type2)
        return false;
    if (deviceTypeInfo_.HasNetwork(type1) && network1 != network2)
        return false;
    if (deviceTypeInfo_.HasUnit(type1) && unit1 != unit2)
        return false;
    if (!deviceTypeInfo_.HasCircuits(type1))
        return true;  // the whole device is claimed twice
    const int16_t last1 = Add16(Add16(start1, count1), -1);
    const int16_t last2 = Add16(Add16(start2, count2), -1);
    const int16_t low1 = std::min(start1, last1);
    const int16_t high1 = std::max(start1, last1);
    const int16_t low2 = std::min(start2, last2);
    const int16_t high2 = std::max(start2, last2);
    return !(low1 > high2 || low2 > high1);
}

bool BlobberConflictHelper::DevicesConflict(const seqlib::DeviceAddress& first,
                                            const seqlib::DeviceAddress& second) const {
    return DevicesConflict(first.DeviceType(), first.Network(), first.Unit(), first.StartAddress(),
                           first.NumAddresses(), second.DeviceType(), second.Network(),
                           second.Unit(), second.StartAddress(), second.NumAddresses());
}

void BlobberConflictHelper::CheckForBlobberConflicts(const Blobber& blobber,
                                                     std::span<const Blobber> others, bool& found) {
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

void BlobberConflictHelper::CheckForChannelConflicts(const Blobber& blobber,
                                                     const seqlib::Channel* channel,
                                                     const std::any& channelContext, bool& found) {
    if (blobber.file == nullptr || channel == nullptr || !channel->HasPhysicalSettings())
        return;
    const seqlib::DeviceAddress circuit(channel->DeviceType(), channel->Network(), channel->Unit(),
                                        channel->Circuit(), 1);
    for (const seqlib::DeviceAddress& device : blobber.file->Devices()) {
        if (DevicesConflict(device, circuit)) {
            found = true;
            if (ChannelConflict)
                ChannelConflict(blobber.context, device, channelContext, *channel);
        }
    }
}

int32_t BlobberConflictHelper::DeviceCount(const seqlib::IntensityFile* blobber) {
    return blobber != nullptr ? blobber->DeviceCount() : 0;
}

}  // namespace vtr
