#include "sequencelib/DeviceTypeInfo.h"

namespace vtr::seqlib {

namespace {

struct Addressing {
    bool network;
    bool unit;
    bool circuits;
};

Addressing AddressingOf(int32_t deviceType) {
    switch (deviceType) {
        case DeviceTypes::VtrController:
            return {true, true, true};
        case DeviceTypes::DigitalIO:
        case DeviceTypes::Tolvex:
        case DeviceTypes::Servo:
            return {false, true, true};
        case DeviceTypes::X10:
            return {false, true, false};
        case DeviceTypes::Dmx:
            return {true, false, true};
        default:
            return {false, false, false};
    }
}

}  // namespace

bool DeviceTypeInfo::HasNetwork(int32_t deviceType) const {
    return AddressingOf(deviceType).network;
}

bool DeviceTypeInfo::HasUnit(int32_t deviceType) const {
    return AddressingOf(deviceType).unit;
}

bool DeviceTypeInfo::HasCircuits(int32_t deviceType) const {
    return AddressingOf(deviceType).circuits;
}

}  // namespace vtr::seqlib
