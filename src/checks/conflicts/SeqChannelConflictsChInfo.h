#pragma once

#include <cstdint>
#include <memory>

#include "sequencelib/Channel.h"
#include "sequencelib/Track.h"

namespace vtr {

// Where a channel with a given settings key was first seen in a sequence: the channel
// object, the track that lists it and that track's index (from 0).
class SeqChannelConflictsChInfo {
  public:
    const std::shared_ptr<seqlib::Channel>& Channel() const { return channel_; }
    void SetChannel(std::shared_ptr<seqlib::Channel> channel) { channel_ = std::move(channel); }
    const std::shared_ptr<seqlib::Track>& Track() const { return track_; }
    void SetTrack(std::shared_ptr<seqlib::Track> track) { track_ = std::move(track); }
    int32_t TrackIndex() const { return trackIndex_; }
    void SetTrackIndex(int32_t index) { trackIndex_ = index; }

  private:
    std::shared_ptr<seqlib::Channel> channel_;
    std::shared_ptr<seqlib::Track> track_;
    int32_t trackIndex_ = 0;
};

}  // namespace vtr
