#include "engine/CheckUtils.h"

namespace vtr::CheckUtils {

std::string MakeCheckIdentifier(int32_t checkType, const std::string& parameter) {
    std::string identifier = std::to_string(checkType);
    if (!parameter.empty())
        identifier += "_" + parameter;
    return identifier;
}

}  // namespace vtr::CheckUtils
