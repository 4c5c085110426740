#include "show/Playlist.h"

#include "engine/VtrError.h"
#include "show/Serialize.h"

namespace vtr {

Playlist::Playlist() {
    SetPlaylistType(AnimationPlaylist);
    SetAnimationType(1);
    lightsOffAtEnd_ = true;
    list_.clear();
}

void Playlist::SetAnimationType(int32_t value) noexcept {
    if (playlistType_ == AnimationPlaylist) {
        animationType_ = value;
    }
}

void Playlist::SetDelay(int32_t value) noexcept {
    if (playlistType_ == MusicalPlaylist) {
        delay_ = value;
    }
}

void Playlist::SetMusicalType(int32_t value) noexcept {
    if (playlistType_ == MusicalPlaylist) {
        musicalType_ = value;
    }
}

void Playlist::SetPlaylistType(int32_t value) noexcept {
    if (value == playlistType_) {
        return;
    }
    playlistType_ = value;
    if (value == AnimationPlaylist) {
        animationType_ = 1;
        musicalType_ = 0;
        delay_ = 0;
    } else if (value == MusicalPlaylist) {
        animationType_ = 0;
        musicalType_ = 1;
    }
}

namespace PlaylistFunctions {

namespace {

int32_t StoredNumber(const std::string& field) {
    return Serialize::RoundToLong(Serialize::LeadingNumber(Serialize::UnescapeText(field)),
                                  "PlaylistFunctions.PlaylistFromText");
}

}  // namespace

PlaylistPtr NewAnimationPlaylist(int32_t animationType) {
    auto playlist = std::make_shared<Playlist>();
    playlist->SetPlaylistType(Playlist::AnimationPlaylist);
    playlist->SetAnimationType(animationType);
    return playlist;
}

PlaylistPtr NewMusicalPlaylist(int32_t musicalType, int32_t delay) {
    auto playlist = std::make_shared<Playlist>();
    playlist->SetPlaylistType(Playlist::MusicalPlaylist);
    playlist->SetMusicalType(musicalType);
    playlist->SetDelay(delay);
    return playlist;
}

std::string PlaylistToText(const Playlist& playlist) {
    std::string names;
    if (!playlist.List().empty()) {
        std::vector<std::string> escaped;
        escaped.reserve(playlist.List().size());
        for (const auto& name : playlist.List()) {
            escaped.push_back(Serialize::EscapeText(name));
        }
        names = Serialize::ListToText(escaped);
    }
    return Serialize::ListToText(
        {std::to_string(playlist.AnimationType()), std::to_string(playlist.MusicalType()),
         std::to_string(playlist.PlaylistType()), std::to_string(playlist.Delay()),
         Serialize::EscapeText(playlist.CleanUp()), names,
         Serialize::BoolToText(playlist.LightsOffAtEnd()),
         Serialize::BoolToText(playlist.ShuffleAllowsBackToBack()),
         Serialize::BoolToText(playlist.ShuffleWithReplacement())});
}

PlaylistPtr PlaylistFromText(std::string_view text) {
    const auto f = Serialize::ListFromText(text, 1);
    auto playlist = std::make_shared<Playlist>();
    playlist->SetPlaylistType(StoredNumber(f[3]));
    playlist->SetAnimationType(StoredNumber(f[1]));
    playlist->SetMusicalType(StoredNumber(f[2]));
    playlist->SetDelay(StoredNumber(f[4]));
    playlist->SetCleanUp(Serialize::UnescapeText(f[5]));
    const auto names = Serialize::ListFromText(f[6], 1);

    // From here on a field that cannot be read keeps its default.
    ResumeStep([&] {
        for (const auto& name : names) {
            playlist->List().push_back(Serialize::UnescapeText(name));
        }
    });
    if (f.Count() >= 7) {
        ResumeStep([&] { playlist->SetLightsOffAtEnd(Serialize::TextToBool(f[7])); });
    }
    ResumeStep([&] {
        playlist->SetShuffleAllowsBackToBack(f.Count() >= 8 ? Serialize::TextToBool(f[8]) : true);
    });
    ResumeStep([&] {
        playlist->SetShuffleWithReplacement(f.Count() >= 9 ? Serialize::TextToBool(f[9]) : true);
    });
    return playlist;
}

}  // namespace PlaylistFunctions

}  // namespace vtr
