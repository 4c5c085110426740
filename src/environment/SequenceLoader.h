#pragma once

#include <chrono>
#include <cstdint>
#include <memory>
#include <string>

#include "sequencelib/Sequence.h"

namespace vtr {

// Loads one sequence and turns its progress into status text: "Loading " n "% of " and
// the file, sent to the notification clients, after which the user interface processes
// its pending events (so a Cancel click is seen during a long load). Between percents the
// user interface still gets its turn at least every kPumpInterval of the load's work, and
// a cancelled verification stops the load. The loader calls the driver's notifications and
// pump, so it runs on the driver's thread.
class SequenceLoader {
  public:
    // The longest the load works without giving the user interface its turn, give or take
    // one step of the load.
    static constexpr std::chrono::milliseconds kPumpInterval{40};

    SequenceLoader() = default;
    ~SequenceLoader();
    SequenceLoader(const SequenceLoader&) = delete;
    SequenceLoader& operator=(const SequenceLoader&) = delete;

    // The loaded sequence, or nullptr when the verification is cancelled before the load
    // ends (which says nothing of the file). A load error (VtrError) reaches the caller
    // unchanged.
    std::shared_ptr<seqlib::Sequence> Load(const std::string& fileName);

    // Tells the clients that the load of that file is `percent` done and lets the user
    // interface process its events: what a load does at each step of its progress (also
    // for a load made on another thread, told when the caller takes it).
    static void TellProgress(const std::string& fileName, int32_t percent);

  private:
    void OnProgress(int32_t percent);
    bool KeepGoing();

    std::shared_ptr<seqlib::Sequence> sequence_;
    std::string fileName_;
    bool justPumped_ = false;
};

}  // namespace vtr
