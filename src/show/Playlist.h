#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace vtr {

// One section of a show: sequence files in play order and how they are played.
// The type setter keeps the numbers consistent: AnimationType is written only while the
// playlist is an animation one (type 1), MusicalType and Delay only while it is a musical
// one (type 2). Set PlaylistType first when filling a playlist from stored values.
class Playlist {
  public:
    static constexpr int32_t AnimationPlaylist = 1;
    static constexpr int32_t MusicalPlaylist = 2;

    // An animation playlist: type 1, AnimationType 1, lights off at the end, no sequences.
    Playlist();

    int32_t AnimationType() const noexcept { return animationType_; }
    void SetAnimationType(int32_t value) noexcept;
    const std::string& CleanUp() const noexcept { return cleanUp_; }
    void SetCleanUp(std::string value) { cleanUp_ = std::move(value); }
    int32_t Count() const noexcept { return static_cast<int32_t>(list_.size()); }
    int32_t Delay() const noexcept { return delay_; }
    void SetDelay(int32_t value) noexcept;
    bool LightsOffAtEnd() const noexcept { return lightsOffAtEnd_; }
    void SetLightsOffAtEnd(bool value) noexcept { lightsOffAtEnd_ = value; }
    // The sequence file names in play order; the collection itself can be changed.
    std::vector<std::string>& List() noexcept { return list_; }
    const std::vector<std::string>& List() const noexcept { return list_; }
    int32_t MusicalType() const noexcept { return musicalType_; }
    void SetMusicalType(int32_t value) noexcept;
    int32_t PlaylistType() const noexcept { return playlistType_; }
    // A change to 1 resets AnimationType 1, MusicalType 0, Delay 0; a change to 2 sets
    // AnimationType 0, MusicalType 1 and keeps Delay; other values are only stored.
    void SetPlaylistType(int32_t value) noexcept;
    bool ShuffleAllowsBackToBack() const noexcept { return shuffleAllowsBackToBack_; }
    void SetShuffleAllowsBackToBack(bool value) noexcept { shuffleAllowsBackToBack_ = value; }
    bool ShuffleWithReplacement() const noexcept { return shuffleWithReplacement_; }
    void SetShuffleWithReplacement(bool value) noexcept { shuffleWithReplacement_ = value; }

  private:
    int32_t animationType_ = 0;
    std::string cleanUp_;
    int32_t delay_ = 0;
    bool lightsOffAtEnd_ = false;
    std::vector<std::string> list_;
    int32_t musicalType_ = 0;
    int32_t playlistType_ = 0;
    bool shuffleAllowsBackToBack_ = false;
    bool shuffleWithReplacement_ = false;
};

using PlaylistPtr = std::shared_ptr<Playlist>;

namespace PlaylistFunctions {

PlaylistPtr NewAnimationPlaylist(int32_t animationType);
PlaylistPtr NewMusicalPlaylist(int32_t musicalType, int32_t delay);

// (animation,musical,type,delay,cleanup,(names...),lights off,back to back,replacement);
// the names field is empty when there are no sequences.
std::string PlaylistToText(const Playlist& playlist);
// Reads a playlist. Fewer than six fields or a malformed list raise; the numbers are read
// leniently (a non-number gives 0) and the three flags default to true when absent.
PlaylistPtr PlaylistFromText(std::string_view text);

}  // namespace PlaylistFunctions

}  // namespace vtr
