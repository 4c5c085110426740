#include "environment/SequenceUtils.h"

#include "engine/LibVerify.h"
#include "sequencelib/DeviceTypeInfo.h"
#include "sequencelib/SequenceInfo.h"

namespace vtr::SequenceUtils {

namespace {

std::string TypePrefix(int32_t deviceType) {
    switch (deviceType) {
        case seqlib::DeviceTypes::VtrController:
            return "VTR ";
        case seqlib::DeviceTypes::Dmx:
            return "DMX ";
        default:
            return "<Device type " + std::to_string(deviceType) + "> ";
    }
}

std::string TwoHexDigits(unsigned value) {
    static const char digits[] = "0123456789ABCDEF";
    return {digits[(value >> 4) & 0xF], digits[value & 0xF]};
}

// The one process-wide sequence-information service, made on first use.
const seqlib::SequenceInfoService& InfoService() {
    static const seqlib::SequenceInfoService service;
    return service;
}

}  // namespace

std::string DescribeDeviceAddress(int32_t deviceType, int32_t network, uint8_t unit,
                                  int16_t startCircuit, int16_t numCircuits) {
    const seqlib::DeviceTypeInfo info;
    std::string text = TypePrefix(deviceType);
    if (info.HasNetwork(deviceType))
        text += NetworkText(deviceType, network) + " ";
    if (info.HasUnit(deviceType))
        text += UnitText(deviceType, unit) + " ";
    if (info.HasCircuits(deviceType) && numCircuits > 0) {
        text += std::to_string(startCircuit);
        if (numCircuits > 1) {
            text += "-" + std::to_string(int32_t{startCircuit} + int32_t{numCircuits} - 1);
        }
    }
    return text;
}

std::string DescribeDeviceAddress(const seqlib::DeviceAddress& device) {
    return DescribeDeviceAddress(device.DeviceType(), device.Network(), device.Unit(),
                                 device.StartAddress(), device.NumAddresses());
}

std::string NetworkText(int32_t deviceType, int32_t network) {
    switch (deviceType) {
        case seqlib::DeviceTypes::Dmx:
            return UniverseText(network);
        case seqlib::DeviceTypes::VtrController:
            return VtrNetworkText(network);
        default:
            return {};
    }
}

std::string VtrNetworkText(int32_t network) {
    if (network == 0)
        return "Regular";
    if (network >= 1 && network <= 26)
        return std::string("Aux ") + static_cast<char>(64 + network);
    return "Net " + std::to_string(network);
}

std::string UniverseText(int32_t universe) {
    return "Universe " + std::to_string(universe);
}

std::string UnitText(int32_t deviceType, uint8_t unit) {
    switch (deviceType) {
        case seqlib::DeviceTypes::VtrController:
            return unit >= 1 && unit <= 240 ? TwoHexDigits(unit) : std::string();
        case seqlib::DeviceTypes::DigitalIO:
        case seqlib::DeviceTypes::Servo:
            return unit <= 99 ? std::to_string(unit) : std::string();
        case seqlib::DeviceTypes::X10:
            return std::string(1, static_cast<char>('A' + (unit >> 4))) + "-" +
                   std::to_string((unit & 0xF) + 1);
        case seqlib::DeviceTypes::Tolvex:
            return unit >= 1 && unit <= 106 ? std::to_string(unit) : std::string();
        default:
            return {};
    }
}

std::string TrackText(const seqlib::Track* track, int32_t index) {
    const std::string name = track != nullptr ? track->Name() : std::string();
    if (index >= 0) {
        std::string text = "Track " + std::to_string(int64_t{index} + 1);
        if (!name.empty())
            text += ": " + name;
        return text;
    }
    return name.empty() ? "Track" : name;
}

std::string TrackText(const std::shared_ptr<seqlib::Track>& track, int32_t index) {
    return TrackText(track.get(), index);
}

std::string GetR9PlaybackFile(const std::string& sequenceFile) {
    LibVerify::PostTransientMessage("Getting info for R9 Sequence: " + sequenceFile);
    const auto info = InfoService().GetSequenceInfo(sequenceFile);
    if (!info)
        return {};
    if (info->ProblemCount() >= 1) {
        LibVerify::AddResult(Messages::NoPlaybackFileName, info->ProblemTexts());
        return {};
    }
    return info->PlaybackFile();
}

}  // namespace vtr::SequenceUtils
