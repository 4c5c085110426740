#include "checks/sequence/CheckSequenceLoads.h"

#include <memory>
#include <utility>

#include "checks/conflicts/CheckChannelLengthConflicts.h"
#include "checks/conflicts/CheckSeqChannelConflicts.h"
#include "checks/network/CheckUsedNetworksDefined.h"
#include "checks/sequence/CheckChannelsHaveEvents.h"
#include "checks/sequence/CheckChannelsHaveSettings.h"
#include "checks/sequence/CheckMediaFileExists.h"
#include "checks/sequence/CheckSequenceFileExists.h"
#include "checks/sequence/CheckSequenceHasEvents.h"
#include "checks/sequence/CheckShellCommandMapExists.h"
#include "checks/sequence/CheckShellCommandSet.h"
#include "checks/sequence/MediaPathResolver.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "sequencelib/Sequence.h"

namespace vtr {

CheckSequenceLoads::CheckSequenceLoads(std::string filename)
    : FileCheck(CheckType::SequenceLoads, "Sequence file loads: ", std::move(filename)) {}

void CheckSequenceLoads::Check() {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(filename_); });
    if (!sequence) {
        // A cancellation that stopped the load says nothing of the file.
        if (!LibVerify::IsCancelled())
            LibVerify::AddResult(Messages::SequenceCannotLoad, {filename_});
        return;
    }

    if (sequence->HasMedia()) {
        const std::string media = ResumeOr(std::string(), [&] {
            return MediaPathResolver().Resolve(sequence->Media(), filename_);
        });
        ResumeStep(
            [&] { LibVerify::AddCheck(std::make_shared<CheckMediaFileExists>(media, filename_)); });
    }

    LibVerify::AddCheck(std::make_shared<CheckSequenceHasEvents>(filename_));
    LibVerify::AddCheck(std::make_shared<CheckSeqChannelConflicts>(filename_));
    LibVerify::AddCheck(std::make_shared<CheckChannelsHaveEvents>(filename_));
    ResumeStep(
        [&] { LibVerify::AddCheck(std::make_shared<CheckChannelsHaveSettings>(filename_)); });
    LibVerify::AddCheck(std::make_shared<CheckUsedNetworksDefined>(filename_));
    ResumeStep(
        [&] { LibVerify::AddCheck(std::make_shared<CheckChannelLengthConflicts>(filename_)); });

    // Every sequence played as a subsequence is verified in full, as deep as the files go;
    // a chain that comes back to a sequence already verified ends there, its checks being
    // known to the driver by their identifiers.
    const std::string referencedIn = "sequence " + filename_;
    for (const auto& track : sequence->Tracks()) {
        for (const auto& channel : track->Channels()) {
            if (channel->IsSubsequence() && !channel->SubsequenceFile().empty()) {
                LibVerify::AddCheck(std::make_shared<CheckSequenceFileExists>(
                    channel->SubsequenceFile(), referencedIn));
            }
        }
    }

    if (sequence->UsesShellCommands()) {
        LibVerify::AddCheck(std::make_shared<CheckShellCommandMapExists>());
        LibVerify::AddCheck(std::make_shared<CheckShellCommandSet>(filename_));
    }
}

}  // namespace vtr
