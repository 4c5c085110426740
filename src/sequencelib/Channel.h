#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "sequencelib/DeviceAddress.h"

namespace vtr::seqlib {

// The channel type of a channel that plays another sequence file.
inline constexpr int32_t kSubsequenceChannelType = 6;

// One channel of a sequence: a named timeline bound to a device address. Tracks share
// channel objects, so a channel is held by std::shared_ptr and compared by address.
// A loaded channel keeps whether it is ever on, not its events.
class Channel {
  public:
    explicit Channel(std::string_view id = {}) : id_(id) {}

    // The identifier that tracks use to list the channel (unique in its file).
    const std::string& Id() const { return id_; }

    const std::string& Name() const { return name_; }
    void SetName(std::string_view name) { name_.assign(name); }

    int32_t ChannelType() const { return channelType_; }
    void SetChannelType(int32_t type) { channelType_ = type; }
    bool IsSubsequence() const { return channelType_ == kSubsequenceChannelType; }

    // The sequence file that a subsequence channel plays ("" for other channels).
    // Few channels play one, so the name is kept apart from the channel.
    const std::string& SubsequenceFile() const {
        static const std::string none;
        return subsequenceFile_ ? *subsequenceFile_ : none;
    }
    void SetSubsequenceFile(std::string_view file) {
        subsequenceFile_ = file.empty() ? nullptr : std::make_shared<const std::string>(file);
    }

    // Device settings. The circuit is the start address, Circuits() the number of them.
    const DeviceAddress& Device() const { return device_; }
    void SetDevice(const DeviceAddress& device) { device_ = device; }
    int32_t DeviceType() const { return device_.DeviceType(); }
    int32_t Network() const { return device_.Network(); }
    uint8_t Unit() const { return device_.Unit(); }
    int16_t Circuit() const { return device_.StartAddress(); }
    int16_t Circuits() const { return device_.NumAddresses(); }

    // True when the channel names a device type (anything but 0).
    bool HasPhysicalSettings() const { return device_.DeviceType() != 0; }

    // Equal for the same physical address in any sequence: the device type, then the
    // network, unit and circuit, each only when the type has it, joined by ":" with an
    // absent part left empty ("1:0:10:1", "7:3::5", "3::37:"). "" without physical
    // settings.
    std::string SettingsKey() const;

    // The same address as numbers, for the checks that look channels up by it many times:
    // equal exactly when SettingsKey() is (a part the type does not have is 0, and the type
    // alone decides which parts it has).
    struct SettingsId {
        int32_t type = 0;
        int32_t network = 0;
        int32_t unit = 0;
        int32_t circuit = 0;
        bool operator==(const SettingsId&) const = default;
    };
    struct SettingsIdHash {
        std::size_t operator()(const SettingsId& id) const noexcept;
    };
    SettingsId SettingsIdentity() const;

    // True when the channel is on at some time between 0 and its sequence's length.
    bool IsEverOn() const { return everOn_; }
    void SetEverOn(bool on) { everOn_ = on; }

    // The channel's place in the channel list of the sequence it was last added to.
    uint32_t IndexInSequence() const { return indexInSequence_; }
    void SetIndexInSequence(uint32_t index) { indexInSequence_ = index; }

  private:
    std::string id_;
    std::string name_;
    std::shared_ptr<const std::string> subsequenceFile_;
    DeviceAddress device_;
    int32_t channelType_ = 0;
    uint32_t indexInSequence_ = 0;
    bool everOn_ = false;
};

}  // namespace vtr::seqlib
