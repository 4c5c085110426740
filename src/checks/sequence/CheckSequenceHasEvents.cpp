#include "checks/sequence/CheckSequenceHasEvents.h"

#include <memory>
#include <utility>

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "sequencelib/Sequence.h"

namespace vtr {

CheckSequenceHasEvents::CheckSequenceHasEvents(std::string filename)
    : FileCheck(CheckType::SequenceHasEvents, "Sequence has events: ", std::move(filename)) {}

void CheckSequenceHasEvents::Check() {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(filename_); });
    if (!sequence)
        return;
    for (const auto& track : sequence->Tracks()) {
        for (const auto& channel : track->Channels()) {
            if (channel->IsEverOn())
                return;
        }
    }
    // A Gridcraft intensity file with a device lights the sequence on its own.
    const auto gridcraft = sequence->GridcraftFile();
    if (gridcraft && gridcraft->DeviceCount() > 0)
        return;
    LibVerify::AddResult(Messages::SequenceCompletelyOff, {filename_});
}

}  // namespace vtr
