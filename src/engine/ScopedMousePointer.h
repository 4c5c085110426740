#pragma once

#include <cstdint>
#include <functional>
#include <optional>

namespace vtr {

// Mouse pointer shapes, with the numbers the window understands.
namespace MousePointer {
inline constexpr int16_t Default = 0;
inline constexpr int16_t Arrow = 1;
inline constexpr int16_t Hourglass = 11;
}  // namespace MousePointer

// Shows a pointer (typically the hourglass) for as long as the object lives and puts the
// previous one back afterwards. The core knows no screen: the window installs the two hooks
// that read and set the pointer. With none installed nothing happens; failures are ignored.
class ScopedMousePointer {
  public:
    using GetHook = std::function<int16_t()>;
    using SetHook = std::function<void(int16_t)>;

    // Installs (or, with empty functions, removes) the hooks for the whole program.
    static void InstallHooks(GetHook get, SetHook set);

    ScopedMousePointer() = default;
    ScopedMousePointer(const ScopedMousePointer&) = delete;
    ScopedMousePointer& operator=(const ScopedMousePointer&) = delete;
    ~ScopedMousePointer();

    // Sets the pointer; the first call also remembers the one in force.
    void SetPointer(int16_t pointer);

  private:
    std::optional<int16_t> remembered_;
};

}  // namespace vtr
