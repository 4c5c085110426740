#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "schedule/MonitoredShowEvent.h"
#include "show/InteractiveGroup.h"
#include "show/Playlist.h"
#include "show/Trigger.h"

namespace vtr {

// What the show player runs: five playlist sections, interactive groups started by
// triggers, and an optional startup trigger. The playlists, groups and trigger are held by
// reference; a section may be absent (nullptr) in a show built by hand.
class Show {
  public:
    // Background NewAnimationPlaylist(2), Main NewAnimationPlaylist(1), Startup, Musical and
    // Shutdown NewMusicalPlaylist(1, 0); no groups, no trigger, StartupType 0, no preload.
    Show();

    const PlaylistPtr& Background() const noexcept { return background_; }
    void SetBackground(PlaylistPtr value) { background_ = std::move(value); }
    std::vector<InteractiveGroupPtr>& InteractiveGroups() noexcept { return interactiveGroups_; }
    const std::vector<InteractiveGroupPtr>& InteractiveGroups() const noexcept {
        return interactiveGroups_;
    }
    void SetInteractiveGroups(std::vector<InteractiveGroupPtr> value) {
        interactiveGroups_ = std::move(value);
    }
    const PlaylistPtr& Main() const noexcept { return main_; }
    void SetMain(PlaylistPtr value) { main_ = std::move(value); }
    // Never absent: assigning none stores a new, empty record.
    const MonitoredShowEventPtr& Monitoring() const noexcept { return monitoring_; }
    void SetMonitoring(MonitoredShowEventPtr value);
    const PlaylistPtr& Musical() const noexcept { return musical_; }
    void SetMusical(PlaylistPtr value) { musical_ = std::move(value); }
    bool PreloadSequences() const noexcept { return preloadSequences_; }
    void SetPreloadSequences(bool value) noexcept { preloadSequences_ = value; }
    const PlaylistPtr& Shutdown() const noexcept { return shutdown_; }
    void SetShutdown(PlaylistPtr value) { shutdown_ = std::move(value); }
    const PlaylistPtr& Startup() const noexcept { return startup_; }
    void SetStartup(PlaylistPtr value) { startup_ = std::move(value); }
    const TriggerPtr& StartupTrigger() const noexcept { return startupTrigger_; }
    void SetStartupTrigger(TriggerPtr value) { startupTrigger_ = std::move(value); }
    // 0: the show starts by schedule alone; otherwise it waits for StartupTrigger.
    int32_t StartupType() const noexcept { return startupType_; }
    void SetStartupType(int32_t value) noexcept { startupType_ = value; }

    // True exactly when both shows write the same show file text; false when either cannot
    // be written. Monitoring takes no part.
    bool HasSameContents(const Show& other) const;

  private:
    PlaylistPtr background_;
    std::vector<InteractiveGroupPtr> interactiveGroups_;
    PlaylistPtr main_;
    MonitoredShowEventPtr monitoring_;
    PlaylistPtr musical_;
    bool preloadSequences_ = false;
    PlaylistPtr shutdown_;
    PlaylistPtr startup_;
    TriggerPtr startupTrigger_;
    int32_t startupType_ = 0;
};

using ShowPtr = std::shared_ptr<Show>;

namespace ShowFunctions {

// A show from its parts. The section types are forced (Startup, Shutdown, Musical musical;
// Main, Background animation) and empty group entries are dropped. A missing playlist
// raises error 91.
ShowPtr CreateShow(PlaylistPtr startup, PlaylistPtr shutdown, PlaylistPtr main, PlaylistPtr musical,
                   PlaylistPtr background, std::vector<InteractiveGroupPtr> interactiveGroups,
                   int32_t startupType, TriggerPtr startupTrigger, bool preloadSequences);

// The show file text: one list of ten fields. Raises when a part cannot be written (a
// missing playlist, a group without sets).
std::string ShowToText(const Show& show);
// The show of a show file text; nullptr when the text has no readable list or one of its
// five playlists cannot be read. Unreadable groups, trigger, startup type and preload flag
// keep their defaults.
ShowPtr ShowFromText(std::string_view text);
// Reads and parses a show file; nullptr when it cannot be read or is not a show.
ShowPtr LoadShowFile(const std::string& path);

}  // namespace ShowFunctions

}  // namespace vtr
