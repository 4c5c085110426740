#include "checks/CheckShellCommandSet.h"

#include <memory>

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "sequencelib/Sequence.h"
#include "sequencelib/ShellCommandMap.h"

namespace vtr {

void CheckShellCommandSet::Check() {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(sequenceFile_); });
    if (!sequence)
        return;  // CheckSequenceLoads reports a sequence that cannot be loaded
    const std::string identifier = sequence->ShellCommand();
    const std::string command =
        ResumeOr(std::string(), [&] { return seqlib::ShellCommandMap().CommandText(identifier); });
    if (!command.empty())
        return;
    ResumeStep([&] { LibVerify::AddResult(Messages::ShellCommandNotSet, {sequenceFile_}); });
}

std::string CheckShellCommandSet::CheckIdentifier() {
    return identifier_.Get(CheckType::ShellCommandSet, sequenceFile_);
}

std::string CheckShellCommandSet::Description() {
    return "Shell command set: " + sequenceFile_;
}

}  // namespace vtr
