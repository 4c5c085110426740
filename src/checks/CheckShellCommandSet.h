#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Reports message 42 when the shell-command map gives no command for the sequence's
// shell-command identifier.
class CheckShellCommandSet : public ICheck {
  public:
    CheckShellCommandSet() = default;
    explicit CheckShellCommandSet(std::string sequenceFile)
        : sequenceFile_(std::move(sequenceFile)) {}

    const std::string& SequenceFile() const { return sequenceFile_; }
    void SetSequenceFile(std::string sequenceFile) {
        sequenceFile_ = std::move(sequenceFile);
        identifier_ = {};
    }

    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override;

  private:
    std::string sequenceFile_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
