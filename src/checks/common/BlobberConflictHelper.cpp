#include "checks/common/BlobberConflictHelper.h"

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

bool DeviceOverlap::DevicesConflict(int32_t type1, int32_t network1, uint8_t unit1, int16_t start1,
                                    int16_t count1, int32_t type2, int32_t network2, uint8_t unit2,
                                    int16_t start2, int16_t count2) const {
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

bool DeviceOverlap::DevicesConflict(const seqlib::DeviceAddress& first,
                                    const seqlib::DeviceAddress& second) const {
    return DevicesConflict(first.DeviceType(), first.Network(), first.Unit(), first.StartAddress(),
                           first.NumAddresses(), second.DeviceType(), second.Network(),
                           second.Unit(), second.StartAddress(), second.NumAddresses());
}

int32_t DeviceOverlap::DeviceCount(const seqlib::IntensityFile* blobber) {
    return blobber != nullptr ? blobber->DeviceCount() : 0;
}

}  // namespace vtr
