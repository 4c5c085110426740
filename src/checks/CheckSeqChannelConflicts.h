#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// Finds device addresses claimed twice within one sequence: by two channels (message 27), by
// a channel and an intensity file (45), by two intensity files or two devices of one (46).
// Reports its progress as "Channel conflict check progress: " and a percent.
class CheckSeqChannelConflicts : public ICheck {
  public:
    CheckSeqChannelConflicts() = default;
    explicit CheckSeqChannelConflicts(std::string filename) : filename_(std::move(filename)) {}

    const std::string& Filename() const { return filename_; }
    void SetFilename(std::string filename) {
        filename_ = std::move(filename);
        identifier_ = {};
    }

    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override;

  private:
    std::string filename_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
