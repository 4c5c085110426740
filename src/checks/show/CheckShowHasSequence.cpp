#include "checks/show/CheckShowHasSequence.h"

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "show/Show.h"

namespace vtr {

CheckShowHasSequence::CheckShowHasSequence(std::string filename)
    : FileCheck(CheckType::ShowHasSequence, "Show has sequence: ", std::move(filename)) {}

bool CheckShowHasSequence::HasSequence(const Show& show) {
    for (const PlaylistPtr* section :
         {&show.Background(), &show.Startup(), &show.Main(), &show.Musical(), &show.Shutdown()}) {
        const PlaylistPtr& playlist = *section;
        if (playlist && (playlist->Count() > 0 || !playlist->CleanUp().empty()))
            return true;
    }
    for (const InteractiveGroupPtr& group : show.InteractiveGroups()) {
        if (!group)
            continue;
        for (const TriggeredSequencesPtr& set : group->TriggeredSets()) {
            if (set && set->NumSequences() > 0)
                return true;
        }
    }
    return false;
}

void CheckShowHasSequence::Check() {
    const ShowPtr show = ResumeOr(ShowPtr{}, [&] { return LibVerify::LoadShow(filename_); });
    // A show that cannot be loaded has no sequence either.
    if (show && ResumeOr(false, [&] { return HasSequence(*show); }))
        return;
    LibVerify::AddResult(Messages::ShowHasNoSequences, {filename_});
}

}  // namespace vtr
