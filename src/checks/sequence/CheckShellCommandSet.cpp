#include "checks/sequence/CheckShellCommandSet.h"

#include <memory>

#include "engine/CheckTypes.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "sequencelib/Sequence.h"

namespace vtr {

CheckShellCommandSet::CheckShellCommandSet(std::string sequenceFile)
    : FileCheck(CheckType::ShellCommandSet, "Shell command set: ", std::move(sequenceFile)) {}

void CheckShellCommandSet::Check() {
    const auto sequence = ResumeOr(std::shared_ptr<seqlib::Sequence>(),
                                   [&] { return LibVerify::LoadSequence(filename_); });
    if (!sequence)
        return;  // CheckSequenceLoads reports a sequence that cannot be loaded
    const std::string identifier = sequence->ShellCommand();
    const std::string command =
        ResumeOr(std::string(), [&] { return LibVerify::ShellCommandText(identifier); });
    if (!command.empty())
        return;
    LibVerify::AddResult(Messages::ShellCommandNotSet, {filename_});
}

}  // namespace vtr
