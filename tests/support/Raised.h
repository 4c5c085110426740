#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>

#include "engine/VtrError.h"

// What a call raised, for tests that expect an error of the system's own.
namespace vtr::testsupport {

// The error the call raised, or nothing when it returned.
inline std::optional<VtrError> Raised(const std::function<void()>& call) {
    try {
        call();
    } catch (const VtrError& error) {
        return error;
    }
    return std::nullopt;
}

// The number of the error the call raised; 0 when it returned.
inline int32_t RaisedNumber(const std::function<void()>& call) {
    const auto error = Raised(call);
    return error ? error->Number() : 0;
}

// The description of the error the call raised; "" when it returned.
inline std::string RaisedDescription(const std::function<void()>& call) {
    const auto error = Raised(call);
    return error ? error->Description() : std::string();
}

}  // namespace vtr::testsupport
