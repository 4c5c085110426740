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

    // Tells the clients that the load of that file is `percent` done and lets the user
    // interface process its events: what a load does at each step of its progress (also
    // for a load made on another thread, told when the caller takes it).
    static void TellProgress(const std::string& fileName, int32_t percent);

  private:
    void OnProgress(int32_t percent);

    std::shared_ptr<seqlib::Sequence> sequence_;
    std::string fileName_;
};

}  // namespace vtr
