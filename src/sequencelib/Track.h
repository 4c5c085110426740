#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "sequencelib/Channel.h"
#include "sequencelib/IntensityFile.h"

namespace vtr::seqlib {

// A track of a sequence: a name, a length in milliseconds, the channels it lists (shared
// with other tracks that list the same channel) and the intensity files it carries.
class Track {
  public:
    const std::string& Name() const { return name_; }
    void SetName(std::string name) { name_ = std::move(name); }

    int32_t Length() const { return length_; }
    void SetLength(int32_t length) { length_ = length; }

    const std::vector<std::shared_ptr<Channel>>& Channels() const { return channels_; }
    void AddChannel(std::shared_ptr<Channel> channel) { channels_.push_back(std::move(channel)); }

    const std::vector<std::shared_ptr<IntensityFile>>& IntensityFiles() const {
        return intensityFiles_;
    }

  private:
    friend class Sequence;
    friend class SequenceBuilder;

    std::string name_;
    int32_t length_ = 0;
    std::vector<std::shared_ptr<Channel>> channels_;
    std::vector<std::shared_ptr<IntensityFile>> intensityFiles_;
};

}  // namespace vtr::seqlib
