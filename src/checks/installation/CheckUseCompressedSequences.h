#pragma once

#include <string>

#include "engine/CheckUtils.h"
#include "engine/ICheck.h"

namespace vtr {

// The suite stores its sequences compressed ("UseCompressedSequences", on when absent).
class CheckUseCompressedSequences : public ICheck {
  public:
    void Check() override;
    std::string CheckIdentifier() override;
    std::string Description() override { return "Use Compressed Sequences"; }

  private:
    CheckUtils::IdentifierOnce identifier_;
};

}  // namespace vtr
