#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "sequencelib/DeviceAddress.h"

namespace vtr::seqlib {

class Track;

// The two kinds of intensity file a track can carry.
enum class IntensityFileKind { Gridcraft, Novalux };

// "Gridcraft" or "Novalux": the kind as the sequence file writes it.
const char* IntensityFileKindName(IntensityFileKind kind);

// An intensity file that a track carries: a block of device addresses driven from the
// file rather than from the sequence's channels.
class IntensityFile {
  public:
    explicit IntensityFile(IntensityFileKind kind, std::string name = {})
        : kind_(kind), name_(std::move(name)) {}

    IntensityFileKind Kind() const { return kind_; }
    // The intensity file's own file name, as the sequence names it.
    const std::string& Name() const { return name_; }

    const std::vector<DeviceAddress>& Devices() const { return devices_; }
    int32_t DeviceCount() const { return static_cast<int32_t>(devices_.size()); }
    void AddDevice(const DeviceAddress& device) { devices_.push_back(device); }

    // The track that carries the file and its index in the sequence (counted from 0);
    // nullptr and -1 while no track does.
    std::shared_ptr<Track> CarryingTrack() const { return track_.lock(); }
    int32_t TrackIndex() const { return trackIndex_; }

  private:
    friend class Sequence;

    IntensityFileKind kind_;
    std::string name_;
    std::vector<DeviceAddress> devices_;
    std::weak_ptr<Track> track_;
    int32_t trackIndex_ = -1;
};

}  // namespace vtr::seqlib
