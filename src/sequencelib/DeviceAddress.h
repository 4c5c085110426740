#pragma once

#include <cstdint>

namespace vtr::seqlib {

// The address of a lighting device: its type, the network it sits on (the universe for
// DMX), its unit identifier, and its block of circuits (start address and count).
class DeviceAddress {
  public:
    constexpr DeviceAddress() = default;
    constexpr DeviceAddress(int32_t deviceType, int32_t network, uint8_t unit, int16_t startAddress,
                            int16_t numAddresses)
        : deviceType_(deviceType),
          network_(network),
          unit_(unit),
          startAddress_(startAddress),
          numAddresses_(numAddresses) {}

    constexpr int32_t DeviceType() const { return deviceType_; }
    constexpr int32_t Network() const { return network_; }
    constexpr uint8_t Unit() const { return unit_; }
    constexpr int16_t StartAddress() const { return startAddress_; }
    constexpr int16_t NumAddresses() const { return numAddresses_; }

    constexpr bool operator==(const DeviceAddress&) const = default;

  private:
    int32_t deviceType_ = 0;
    int32_t network_ = 0;
    uint8_t unit_ = 0;
    int16_t startAddress_ = 0;
    int16_t numAddresses_ = 1;
};

}  // namespace vtr::seqlib
