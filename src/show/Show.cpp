#include "show/Show.h"

#include "engine/VtrError.h"
#include "show/ModelErrors.h"
#include "show/Serialize.h"
#include "show/WholeFile.h"

namespace vtr {

Show::Show()
    : background_(PlaylistFunctions::NewAnimationPlaylist(2)),
      main_(PlaylistFunctions::NewAnimationPlaylist(1)),
      monitoring_(std::make_shared<MonitoredShowEvent>()),
      musical_(PlaylistFunctions::NewMusicalPlaylist(1, 0)),
      shutdown_(PlaylistFunctions::NewMusicalPlaylist(1, 0)),
      startup_(PlaylistFunctions::NewMusicalPlaylist(1, 0)) {}

void Show::SetMonitoring(MonitoredShowEventPtr value) {
    monitoring_ = value ? std::move(value) : std::make_shared<MonitoredShowEvent>();
}

bool Show::HasSameContents(const Show& other) const {
    return ResumeOr(false, [&] {
        return ShowFunctions::ShowToText(*this) == ShowFunctions::ShowToText(other);
    });
}

namespace ShowFunctions {

namespace {

constexpr const char* kDefaultBackground = "(2,0,1,0,,)";

const Playlist& Required(const PlaylistPtr& playlist) {
    if (!playlist) {
        ModelErrors::ObjectNotSet("ShowFunctions.ShowToText");
    }
    return *playlist;
}

}  // namespace

ShowPtr CreateShow(PlaylistPtr startup, PlaylistPtr shutdown, PlaylistPtr main, PlaylistPtr musical,
                   PlaylistPtr background, std::vector<InteractiveGroupPtr> interactiveGroups,
                   int32_t startupType, TriggerPtr startupTrigger, bool preloadSequences) {
    if (!startup || !shutdown || !main || !musical || !background) {
        ModelErrors::ObjectNotSet("ShowFunctions.CreateShow");
    }
    auto show = std::make_shared<Show>();
    show->SetStartup(std::move(startup));
    show->SetShutdown(std::move(shutdown));
    show->SetMain(std::move(main));
    show->SetMusical(std::move(musical));
    show->SetInteractiveGroups(std::move(interactiveGroups));
    show->SetBackground(std::move(background));
    show->SetStartupType(startupType);
    show->SetStartupTrigger(std::move(startupTrigger));
    show->SetPreloadSequences(preloadSequences);

    show->Startup()->SetPlaylistType(Playlist::MusicalPlaylist);
    show->Shutdown()->SetPlaylistType(Playlist::MusicalPlaylist);
    show->Musical()->SetPlaylistType(Playlist::MusicalPlaylist);
    show->Main()->SetPlaylistType(Playlist::AnimationPlaylist);
    show->Background()->SetPlaylistType(Playlist::AnimationPlaylist);

    auto& groups = show->InteractiveGroups();
    std::erase_if(groups, [](const InteractiveGroupPtr& group) { return !group; });
    return show;
}

std::string ShowToText(const Show& show) {
    std::string groups;
    if (!show.InteractiveGroups().empty()) {
        std::vector<std::string> texts;
        texts.reserve(show.InteractiveGroups().size());
        for (const auto& group : show.InteractiveGroups()) {
            if (!group) {
                ModelErrors::ObjectNotSet("ShowFunctions.ShowToText");
            }
            texts.push_back(InteractiveGroupFunctions::InteractiveGroupToText(*group));
        }
        groups = Serialize::ListToText(texts);
    }
    return Serialize::ListToText(
        {PlaylistFunctions::PlaylistToText(Required(show.Startup())),
         PlaylistFunctions::PlaylistToText(Required(show.Shutdown())),
         PlaylistFunctions::PlaylistToText(Required(show.Main())),
         PlaylistFunctions::PlaylistToText(Required(show.Musical())), std::string(),
         PlaylistFunctions::PlaylistToText(Required(show.Background())), groups,
         Serialize::LongToText(show.StartupType()),
         show.StartupTrigger() ? TriggerFunctions::TriggerToText(show.StartupTrigger())
                               : std::string(),
         Serialize::BoolToText(show.PreloadSequences())});
}

ShowPtr ShowFromText(std::string_view text) {
    std::vector<std::string> fields;
    try {
        fields = Serialize::ListFromText(text, 1).Items();
    } catch (const VtrError&) {
        return nullptr;
    }
    // Missing fields: empty texts up to the fifth, then the defaults of fields 6 to 10.
    while (fields.size() < 5) {
        fields.emplace_back();
    }
    static const char* const kDefaults[] = {kDefaultBackground, "", " 0", "", "F"};
    for (std::size_t number = 6; number <= 10; ++number) {
        if (fields.size() < number) {
            fields.emplace_back(kDefaults[number - 6]);
        }
    }
    auto field = [&](std::size_t number) -> const std::string& { return fields[number - 1]; };

    // Each step below that fails leaves its value at its initial state.
    std::vector<InteractiveGroupPtr> groups;
    ResumeStep([&] {
        for (const auto& item : Serialize::ListFromText(field(7), 1)) {
            groups.push_back(ResumeOr(InteractiveGroupPtr(), [&] {
                return InteractiveGroupFunctions::InteractiveGroupFromText(item);
            }));
        }
    });
    TriggerPtr trigger;
    if (!field(9).empty()) {
        trigger =
            ResumeOr(TriggerPtr(), [&] { return TriggerFunctions::TriggerFromText(field(9)); });
    }
    auto playlist = [&](std::size_t number) {
        return ResumeOr(PlaylistPtr(),
                        [&] { return PlaylistFunctions::PlaylistFromText(field(number)); });
    };
    auto startup = playlist(1);
    auto shutdown = playlist(2);
    auto main = playlist(3);
    auto musical = playlist(4);
    auto background = playlist(6);
    const int32_t startupType = ResumeOr(0, [&] { return Serialize::TextToLong(field(8)); });
    const bool preload = ResumeOr(false, [&] { return Serialize::TextToBool(field(10)); });

    return ResumeOr(ShowPtr(), [&] {
        return CreateShow(std::move(startup), std::move(shutdown), std::move(main),
                          std::move(musical), std::move(background), std::move(groups), startupType,
                          std::move(trigger), preload);
    });
}

ShowPtr LoadShowFile(const std::string& path) {
    std::string text;
    if (ReadWholeFile(path, text) != 0) {
        return nullptr;
    }
    return ShowFromText(text);
}

}  // namespace ShowFunctions

}  // namespace vtr
