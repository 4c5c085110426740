#include "engine/ScopedMousePointer.h"

#include <utility>

#include "engine/VtrError.h"

namespace vtr {
namespace {

struct Hooks {
    ScopedMousePointer::GetHook get;
    ScopedMousePointer::SetHook set;
};

Hooks& InstalledHooks() {
    static Hooks hooks;
    return hooks;
}

}  // namespace

void ScopedMousePointer::InstallHooks(GetHook get, SetHook set) {
    InstalledHooks() = Hooks{std::move(get), std::move(set)};
}

ScopedMousePointer::~ScopedMousePointer() {
    if (!remembered_)
        return;
    const Hooks& hooks = InstalledHooks();
    if (hooks.set)
        ResumeStep([&] { hooks.set(*remembered_); });
}

void ScopedMousePointer::SetPointer(int16_t pointer) {
    const Hooks& hooks = InstalledHooks();
    if (!hooks.get || !hooks.set)
        return;
    if (!remembered_) {
        ResumeStep([&] { remembered_ = hooks.get(); });
    }
    ResumeStep([&] { hooks.set(pointer); });
}

}  // namespace vtr
