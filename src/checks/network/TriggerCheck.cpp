#include "checks/network/TriggerCheck.h"

namespace vtr {

std::string TriggerIdentityText(const Trigger* trigger) {
    return std::to_string(reinterpret_cast<std::uintptr_t>(trigger));
}

}  // namespace vtr
