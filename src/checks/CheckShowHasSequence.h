#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

class Show;

// A show plays at least one sequence: in one of its five sections (a list entry or a
// clean-up sequence) or in a triggered set of an interactive group.
class CheckShowHasSequence : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Show has sequence: " + filename_; }

    const std::string& Filename() const { return filename_; }
    void SetFilename(const std::string& filename);

    static bool HasSequence(const Show& show);

  private:
    std::string filename_;
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
