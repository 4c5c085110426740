#pragma once

#include <string>
#include <vector>

#include "checks/common/FileCheck.h"
#include "show/Trigger.h"

namespace vtr {

class Show;

// One place where a show refers to a sequence file or to a trigger, in the order the show
// is walked.
struct ShowReference {
    enum class Kind { Sequence, Trigger };
    Kind kind = Kind::Sequence;
    // Sequence: the sequence file. Trigger: unused.
    std::string sequenceFile;
    // Sequence: the section label ("background", "startup", "animation", "musical",
    // "shutdown" or "Interactive group (" name ")"). Trigger: its description ("Startup
    // trigger", or the group's label).
    std::string label;
    // Sequence: the section cannot play audio (background, animation, an independent
    // interactive group), so the sequence must not be a musical one.
    bool nonAudio = false;
    // Trigger: the trigger object (identity matters; nullptr when the show stores none).
    TriggerPtr trigger;
};

// A show file can be read; queues the checks of everything the show refers to, then the
// checks of the show as a whole.
class CheckLoadShowFile : public FileCheck {
  public:
    explicit CheckLoadShowFile(std::string filename = {});

    void Check() override;

    // Every sequence and trigger of the show in the order their checks are queued: the five
    // sections (background, startup, animation, musical, shutdown), each list in order and
    // then its clean-up sequence; the startup trigger when the show waits for one; then
    // each interactive group's sets in order, each set's trigger before its sequences.
    static std::vector<ShowReference> WalkShow(const Show& show);

  private:
    void QueueSequenceChecks(const ShowReference& reference) const;
    void QueueShowChecks() const;
};

}  // namespace vtr
