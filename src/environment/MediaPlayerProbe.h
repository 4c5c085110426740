#pragma once

#include <cstdint>
#include <functional>
#include <string>

// The version of the media player that the suite plays audio through. On Windows it is the
// versionInfo property of the operating system's media player control; elsewhere there is
// no such control, and the suite records the version of the player it uses on that host as
// the string "VersionInfo" of "Software\Vantori\Shared\MediaPlayer".
namespace vtr::MediaPlayerProbe {

// The player's version text ("12.0.19041.1"); "" when the setting is absent or no control
// is installed. Raises when an installed control cannot be created or asked.
std::string VersionText();

// The version text as the store records it: "VersionInfo" of "Shared\MediaPlayer", "" when
// absent. VersionText's answer away from Windows.
std::string StoredVersionText();

// Installs where VersionText's answer comes from; an empty function restores the platform's
// own (the control on Windows, the store elsewhere). Returns the source installed before.
// Tests use it so as not to depend on the machine's media player.
using VersionSource = std::function<std::string()>;
VersionSource SetVersionSource(VersionSource source);

// Restores the previous source when it goes out of scope.
class ScopedVersionSource {
  public:
    explicit ScopedVersionSource(VersionSource source)
        : previous_(SetVersionSource(std::move(source))) {}
    ~ScopedVersionSource() { SetVersionSource(std::move(previous_)); }
    ScopedVersionSource(const ScopedVersionSource&) = delete;
    ScopedVersionSource& operator=(const ScopedVersionSource&) = delete;

  private:
    VersionSource previous_;
};

#ifdef _WIN32
// The versionInfo property of the media player control registered under progId, read
// through COM from the control's core interface: "" when no such control is installed;
// raises when it cannot be created or has no such interface. VersionText asks the
// operating system's control, "WMPlayer.OCX".
std::string ControlVersionText(const std::string& progId);
#endif

// True when the version text has exactly four "."-separated parts and the first is a whole
// number written canonically (no sign, blank or leading zero that converting it to a
// number and back would lose) that is at least minimumMajor. A minimum of 0 or less is
// met by any readable text; a probe that fails meets none.
bool IsVersionAtLeast(int32_t minimumMajor);
// The same test on a given text.
bool IsVersionTextAtLeast(const std::string& versionText, int32_t minimumMajor);

}  // namespace vtr::MediaPlayerProbe
