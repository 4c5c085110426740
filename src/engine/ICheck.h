#pragma once

#include <memory>
#include <string>

namespace vtr {

// One unit of verification work.
class ICheck {
public:
    virtual ~ICheck() = default;
    // Performs the check: reports through LibVerify::AddResult, queues children through
    // LibVerify::AddCheck.
    virtual void Check() = 0;
    // The check's identity for de-duplication, computed once and kept.
    virtual std::string CheckIdentifier() = 0;
    // The line shown in the output log.
    virtual std::string Description() = 0;
};

using CheckPtr = std::shared_ptr<ICheck>;

}  // namespace vtr
