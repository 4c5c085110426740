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
    // The four parts packed into two words and mixed (the finaliser of splitmix64).
    const uint64_t high =
        (uint64_t{static_cast<uint32_t>(id.type)} << 32) | static_cast<uint32_t>(id.network);
    const uint64_t low =
        (uint64_t{static_cast<uint32_t>(id.unit)} << 32) | static_cast<uint32_t>(id.circuit);
    uint64_t x = high ^ (low * 0x9E3779B97F4A7C15ull);
    x = (x ^ (x >> 30)) * 0xBF58476D1CE4E5B9ull;
    x = (x ^ (x >> 27)) * 0x94D049BB133111EBull;
    return static_cast<std::size_t>(x ^ (x >> 31));
}

}  // namespace vtr::seqlib
