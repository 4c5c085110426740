#pragma once

#include <string>
#include <utility>

#include "checks/common/FileCheck.h"

namespace vtr {

// Reports message 42 when the shell-command map gives no command for the sequence's
// shell-command identifier.
class CheckShellCommandSet : public FileCheck {
  public:
    explicit CheckShellCommandSet(std::string sequenceFile = {});
    // The file of the check, by the name its creator knows it.
    const std::string& SequenceFile() const { return Filename(); }
    void SetSequenceFile(std::string sequenceFile) { SetFilename(std::move(sequenceFile)); }

    void Check() override;
};

}  // namespace vtr
