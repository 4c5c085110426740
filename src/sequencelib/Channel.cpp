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

}  // namespace vtr::seqlib
