#include "sequencelib/Channel.h"

#include "sequencelib/DeviceTypeInfo.h"

namespace vtr::seqlib {

std::string Channel::SettingsKey() const {
    if (!HasPhysicalSettings())
        return {};
    const DeviceTypeInfo info;
    const int32_t type = device_.DeviceType();
    std::string key = std::to_string(type);
    key += ':';
    if (info.HasNetwork(type))
        key += std::to_string(device_.Network());
    key += ':';
    if (info.HasUnit(type))
        key += std::to_string(device_.Unit());
    key += ':';
    if (info.HasCircuits(type))
        key += std::to_string(device_.StartAddress());
    return key;
}

Channel::SettingsId Channel::SettingsIdentity() const {
    if (!HasPhysicalSettings())
        return {};
    const DeviceTypeInfo info;
    const int32_t type = device_.DeviceType();
    return {type, info.HasNetwork(type) ? device_.Network() : 0,
            info.HasUnit(type) ? device_.Unit() : 0,
            info.HasCircuits(type) ? device_.StartAddress() : 0};
}

std::size_t Channel::SettingsIdHash::operator()(const SettingsId& id) const noexcept {
    // The device (type, network and unit, mixed by the finaliser of splitmix64) plus the
    // circuit: neighbouring circuits of one device, which sequences usually list in a row,
    // land side by side in a table, while devices scatter.
    uint64_t x =
        ((uint64_t{static_cast<uint32_t>(id.type)} << 32) | static_cast<uint32_t>(id.network)) ^
        (uint64_t{static_cast<uint32_t>(id.unit)} * 0x9E3779B97F4A7C15ull);
    x = (x ^ (x >> 30)) * 0xBF58476D1CE4E5B9ull;
    x = (x ^ (x >> 27)) * 0x94D049BB133111EBull;
    x ^= x >> 31;
    return static_cast<std::size_t>(x + static_cast<uint32_t>(id.circuit));
}

}  // namespace vtr::seqlib
