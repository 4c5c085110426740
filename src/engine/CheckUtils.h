#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace vtr::CheckUtils {

// The identity of a check: the decimal check type, then "_" and the parameter when there
// is one. The parameter is used unchanged (no case folding, no path normalising), so two
// writings of one path are two different checks.
std::string MakeCheckIdentifier(int32_t checkType, const std::string& parameter);

// Holds a check's identifier: computed on the first request, returned as kept afterwards.
class IdentifierOnce {
  public:
    const std::string& Get(int32_t checkType, const std::string& parameter) {
        if (!identifier_)
            identifier_ = MakeCheckIdentifier(checkType, parameter);
        return *identifier_;
    }

  private:
    std::optional<std::string> identifier_;
};

}  // namespace vtr::CheckUtils
