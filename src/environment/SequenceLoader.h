#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "sequencelib/Sequence.h"

namespace vtr {

// Loads one sequence and turns its progress into status text: "Loading " n "% of " and
// the file, sent to the notification clients, after which the user interface processes
// its pending events (so a Cancel click is seen during a long load).
class SequenceLoader {
  public:
    SequenceLoader() = default;
    ~SequenceLoader();
    SequenceLoader(const SequenceLoader&) = delete;
    SequenceLoader& operator=(const SequenceLoader&) = delete;

    // The loaded sequence. A load error (VtrError) reaches the caller unchanged.
    std::shared_ptr<seqlib::Sequence> Load(const std::string& fileName);

  private:
    void OnProgress(int32_t percent);

    std::shared_ptr<seqlib::Sequence> sequence_;
    std::string fileName_;
};

}  // namespace vtr
