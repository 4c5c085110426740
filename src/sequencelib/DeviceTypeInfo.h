#pragma once

#include <cstdint>

namespace vtr::seqlib {

// Device types of the suite that the program names.
namespace DeviceTypes {
inline constexpr int32_t None = 0;
inline constexpr int32_t VtrController = 1;  // the suite's own controllers
inline constexpr int32_t DigitalIO = 2;
inline constexpr int32_t X10 = 3;
inline constexpr int32_t Tolvex = 4;
inline constexpr int32_t Servo = 5;
inline constexpr int32_t Dmx = 7;  // the network is the DMX universe
}  // namespace DeviceTypes

// What addresses the devices of a type: whether they sit on a network, carry a unit
// identifier and have circuits. Types the suite does not know have none of the three.
class DeviceTypeInfo {
  public:
    bool HasNetwork(int32_t deviceType) const;
    bool HasUnit(int32_t deviceType) const;
    bool HasCircuits(int32_t deviceType) const;
};

}  // namespace vtr::seqlib
