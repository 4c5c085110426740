#include "checks/show/CheckLoadShowFile.h"

#include <memory>
#include <utility>

#include "checks/conflicts/CheckIntersequenceConflicts.h"
#include "checks/network/CheckTriggerDefinedNetwork.h"
#include "checks/sequence/CheckSequenceFileExists.h"
#include "checks/sequence/CheckSequenceIsNonmusical.h"
#include "checks/show/CheckShowHasSequence.h"
#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/Messages.h"
#include "engine/VtrError.h"
#include "show/Show.h"

namespace vtr {
namespace {

struct SectionRule {
    const PlaylistPtr& (Show::*playlist)() const noexcept;
    const char* label;
    bool nonAudio;
};

// The five sections in the order they are walked. Background and animation sequences play
// alongside the musical ones, so they may not carry audio of their own.
constexpr SectionRule kSections[] = {
    {&Show::Background, "background", true}, {&Show::Startup, "startup", false},
    {&Show::Main, "animation", true},        {&Show::Musical, "musical", false},
    {&Show::Shutdown, "shutdown", false},
};

ShowReference SequenceReference(const std::string& file, const std::string& label, bool nonAudio) {
    ShowReference reference;
    reference.kind = ShowReference::Kind::Sequence;
    reference.sequenceFile = file;
    reference.label = label;
    reference.nonAudio = nonAudio;
    return reference;
}

ShowReference TriggerReference(const TriggerPtr& trigger, const std::string& description) {
    ShowReference reference;
    reference.kind = ShowReference::Kind::Trigger;
    reference.label = description;
    reference.trigger = trigger;
    return reference;
}

}  // namespace

CheckLoadShowFile::CheckLoadShowFile(std::string filename)
    : FileCheck(CheckType::LoadShowFile, "Load show file: ", std::move(filename)) {}

std::vector<ShowReference> CheckLoadShowFile::WalkShow(const Show& show) {
    std::vector<ShowReference> references;
    for (const SectionRule& section : kSections) {
        const PlaylistPtr& playlist = (show.*section.playlist)();
        if (!playlist)
            continue;
        for (const std::string& name : playlist->List())
            references.push_back(SequenceReference(name, section.label, section.nonAudio));
        if (!playlist->CleanUp().empty()) {
            references.push_back(
                SequenceReference(playlist->CleanUp(), section.label, section.nonAudio));
        }
    }

    if (show.StartupType() != 0)
        references.push_back(TriggerReference(show.StartupTrigger(), "Startup trigger"));

    // Independent groups play alongside the rest of the show, so their sequences are held to
    // the non-audio rule; dependent groups are not, whatever their MusicalAllowed flag says.
    for (const InteractiveGroupPtr& group : show.InteractiveGroups()) {
        if (!group)
            continue;
        const std::string label = "Interactive group (" + group->Name() + ")";
        for (const TriggeredSequencesPtr& set : group->TriggeredSets()) {
            if (!set)
                continue;
            references.push_back(TriggerReference(set->Trig(), label));
            for (const std::string& name : set->Sequences())
                references.push_back(SequenceReference(name, label, group->Independent()));
        }
    }
    return references;
}

void CheckLoadShowFile::QueueSequenceChecks(const ShowReference& reference) const {
    LibVerify::AddCheck(
        std::make_shared<CheckSequenceFileExists>(reference.sequenceFile, "show " + filename_));
    if (reference.nonAudio) {
        ResumeStep([&] {
            auto nonmusical = std::make_shared<CheckSequenceIsNonmusical>();
            nonmusical->SetFilename(reference.sequenceFile);
            nonmusical->SetInShowFile(filename_);
            nonmusical->SetInShowSection(reference.label);
            LibVerify::AddCheck(nonmusical);
        });
    }
}

void CheckLoadShowFile::QueueShowChecks() const {
    ResumeStep([&] {
        auto hasSequence = std::make_shared<CheckShowHasSequence>();
        hasSequence->SetFilename(filename_);
        LibVerify::AddCheck(hasSequence);
    });
    ResumeStep([&] {
        auto conflicts = std::make_shared<CheckIntersequenceConflicts>();
        conflicts->SetShowFilename(filename_);
        LibVerify::AddCheck(conflicts);
    });
}

void CheckLoadShowFile::Check() {
    const ShowPtr show = ResumeOr(ShowPtr{}, [&] { return LibVerify::LoadShow(filename_); });
    if (!show) {
        LibVerify::AddResult(Messages::ShowFileUnreadable, {filename_});
        return;
    }
    const auto references = ResumeOr(std::vector<ShowReference>{}, [&] { return WalkShow(*show); });
    for (const ShowReference& reference : references) {
        if (reference.kind == ShowReference::Kind::Sequence) {
            QueueSequenceChecks(reference);
        } else {
            LibVerify::AddCheck(std::make_shared<CheckTriggerDefinedNetwork>(
                filename_, reference.trigger, reference.label));
        }
    }
    QueueShowChecks();
}

}  // namespace vtr
