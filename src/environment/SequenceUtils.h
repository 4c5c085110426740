#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "sequencelib/DeviceAddress.h"
#include "sequencelib/Track.h"

// Texts that name devices, networks, units and tracks in result details, and the playback
// file of a sequence of the newer format.
namespace vtr::SequenceUtils {

// The device type's prefix ("VTR ", "DMX ", "<Device type n> "), then the network, the
// unit and the circuit range, each as far as the type has it: "VTR Regular 0A 1-16",
// "DMX Universe 3 5". Never fails.
std::string DescribeDeviceAddress(int32_t deviceType, int32_t network, uint8_t unit,
                                  int16_t startCircuit, int16_t numCircuits);
std::string DescribeDeviceAddress(const seqlib::DeviceAddress& device);

// Type 7: UniverseText; type 1: VtrNetworkText; any other: "".
std::string NetworkText(int32_t deviceType, int32_t network);
// "Regular" (0), "Aux A" to "Aux Z" (1 to 26), else "Net " and the number.
std::string VtrNetworkText(int32_t network);
// "Universe " and the number.
std::string UniverseText(int32_t universe);
// The unit identifier in the device type's own form, or "" outside its range.
std::string UnitText(int32_t deviceType, uint8_t unit);

// "Track n: name", "Track n" for a track without a name; with index -1 the name alone, or
// "Track". Tracks are numbered from 1 in texts (index + 1).
std::string TrackText(const seqlib::Track* track, int32_t index);
std::string TrackText(const std::shared_ptr<seqlib::Track>& track, int32_t index);

// The sequence file that an edit file ("vtredit", "vtrprot") plays, or "". Tells the
// notification clients "Getting info for R9 Sequence: " and the file; an edit file that
// names no playback file adds the Error result "No Playback File Name" (message 0) with
// the two texts of its problem and gives "". The edit file is read on every call.
std::string GetR9PlaybackFile(const std::string& sequenceFile);

}  // namespace vtr::SequenceUtils
