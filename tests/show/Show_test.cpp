#include "show/Show.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <functional>

#include "engine/VtrError.h"
#include "show/Serialize.h"
#include "show/TempFolder.h"
#include "show/WholeFile.h"
#include "support/Raised.h"

namespace vtr {
namespace {

using testsupport::RaisedNumber;
using namespace ShowFunctions;
using namespace PlaylistFunctions;

constexpr const char* kNewShowText =
    "((0,1,2,0,,,T,F,F),(0,1,2,0,,,T,F,F),(1,0,1,0,,,T,F,F),(0,1,2,0,,,T,F,F),,"
    "(2,0,1,0,,,T,F,F),, 0,,F)";

TEST(Playlist, TypeSetterKeepsTheNumbersConsistent) {
    Playlist playlist;
    EXPECT_EQ(playlist.PlaylistType(), 1);
    EXPECT_EQ(playlist.AnimationType(), 1);
    EXPECT_EQ(playlist.MusicalType(), 0);
    EXPECT_TRUE(playlist.LightsOffAtEnd());
    EXPECT_FALSE(playlist.ShuffleAllowsBackToBack());
    EXPECT_FALSE(playlist.ShuffleWithReplacement());

    playlist.SetMusicalType(4);  // ignored by an animation playlist
    playlist.SetDelay(9);
    EXPECT_EQ(playlist.MusicalType(), 0);
    EXPECT_EQ(playlist.Delay(), 0);

    playlist.SetPlaylistType(2);
    EXPECT_EQ(playlist.AnimationType(), 0);
    EXPECT_EQ(playlist.MusicalType(), 1);
    playlist.SetAnimationType(3);  // ignored by a musical playlist
    playlist.SetMusicalType(5);
    playlist.SetDelay(7);
    playlist.SetPlaylistType(2);  // the same type again changes nothing
    EXPECT_EQ(playlist.AnimationType(), 0);
    EXPECT_EQ(playlist.MusicalType(), 5);
    EXPECT_EQ(playlist.Delay(), 7);

    playlist.SetPlaylistType(3);  // stored with no other change
    EXPECT_EQ(playlist.PlaylistType(), 3);
    EXPECT_EQ(playlist.MusicalType(), 5);
    playlist.SetPlaylistType(1);
    EXPECT_EQ(playlist.AnimationType(), 1);
    EXPECT_EQ(playlist.MusicalType(), 0);
    EXPECT_EQ(playlist.Delay(), 0);

    EXPECT_EQ(NewMusicalPlaylist(3, 250)->Delay(), 250);
    EXPECT_EQ(NewAnimationPlaylist(2)->AnimationType(), 2);
}

TEST(Playlist, TextRoundTripsAndReadsLeniently) {
    auto playlist = NewMusicalPlaylist(2, 1500);
    playlist->SetCleanUp("Off (all).lms");
    playlist->List() = {"Carol, verse 1.lms", "*Star*.lms"};
    playlist->SetLightsOffAtEnd(false);
    playlist->SetShuffleWithReplacement(true);
    const std::string text = PlaylistToText(*playlist);
    EXPECT_EQ(text, "(0,2,2,1500,Off *Oall*C.lms,(Carol*S verse 1.lms,*EStar*E.lms),F,F,T)");
    const auto back = PlaylistFromText(text);
    EXPECT_EQ(PlaylistToText(*back), text);
    EXPECT_EQ(back->List()[0], "Carol, verse 1.lms");

    // Six fields: lights off and both shuffle flags come back true.
    const auto six = PlaylistFromText("(1,0,1,0,,)");
    EXPECT_TRUE(six->LightsOffAtEnd());
    EXPECT_TRUE(six->ShuffleAllowsBackToBack());
    EXPECT_TRUE(six->ShuffleWithReplacement());
    EXPECT_TRUE(six->List().empty());

    // Numbers are read leniently and rounded.
    const auto lenient = PlaylistFromText("(abc,0, 1.6,0,,())");
    EXPECT_EQ(lenient->PlaylistType(), 2);
    EXPECT_EQ(lenient->Delay(), 0);
    EXPECT_EQ(lenient->List(), std::vector<std::string>{""});  // "()" names one empty file

    EXPECT_EQ(RaisedNumber([] { PlaylistFromText("(1,0,1,0,)"); }),
              ErrorNumbers::SubscriptOutOfRange);
    EXPECT_EQ(RaisedNumber([] { PlaylistFromText("(1,0,1,0,,(a)"); }), 2);
}

TEST(ShowFile, NewShowHasItsDefaultsAndText) {
    Show show;
    EXPECT_EQ(ShowToText(show), kNewShowText);
    EXPECT_EQ(show.Background()->AnimationType(), 2);
    EXPECT_EQ(show.Startup()->PlaylistType(), 2);
    EXPECT_NE(show.Monitoring(), nullptr);
    show.SetMonitoring(nullptr);
    EXPECT_NE(show.Monitoring(), nullptr);
}

TEST(ShowFile, SmallestShowTakesTheDefaultsOfMissingFields) {
    const auto show = ShowFromText("((1,0,1,0,,),(1,0,2,0,,),(1,0,1,0,,),(1,0,2,0,,))");
    ASSERT_NE(show, nullptr);
    EXPECT_EQ(show->Background()->PlaylistType(), 1);
    EXPECT_EQ(show->Background()->AnimationType(), 2);
    EXPECT_EQ(show->Background()->Count(), 0);
    EXPECT_TRUE(show->InteractiveGroups().empty());
    EXPECT_EQ(show->StartupType(), 0);
    EXPECT_EQ(show->StartupTrigger(), nullptr);
    EXPECT_FALSE(show->PreloadSequences());

    // A playlist stored with the wrong type gets the defaults of its section's type.
    EXPECT_EQ(show->Startup()->PlaylistType(), 2);
    EXPECT_EQ(show->Startup()->AnimationType(), 0);
    EXPECT_EQ(show->Startup()->MusicalType(), 1);
    const auto wrong = ShowFromText("((3,0,1,7,,),(1,0,2,0,,),(1,0,1,0,,),(1,0,2,0,,))");
    ASSERT_NE(wrong, nullptr);
    EXPECT_EQ(wrong->Startup()->Delay(), 0);

    EXPECT_EQ(ShowFromText("((1,0,1,0,,),(1,0,2,0,,),(1,0,1,0,,))"), nullptr);
    EXPECT_EQ(ShowFromText(""), nullptr);
    EXPECT_EQ(ShowFromText("no list here"), nullptr);
    EXPECT_EQ(ShowFromText("((1,0,1,0,,),(1,0,2,0,,),(1,0,1,0,,),(1,0,2,0,,)"), nullptr);
    EXPECT_EQ(ShowFromText("((1,0,1,0,,),(1,0,2,0,,),(1,0,1,0),(1,0,2,0,,))"), nullptr);
    EXPECT_NE(ShowFromText("junk ((1,0,1,0,,),(1,0,2,0,,),(1,0,1,0,,),(1,0,2,0,,))\r\n"), nullptr);
}

ShowPtr RichShow() {
    auto show = std::make_shared<Show>();
    show->Musical()->List() = {"Carol.lms", "Bells, (remix).lms"};
    show->Background()->List() = {"Twinkle.las"};
    show->Main()->SetCleanUp("Dark.las");
    auto group = std::make_shared<InteractiveGroup>();
    group->SetName("Doorbell");
    group->SetDescription("Front, back");
    group->SetInterruptible(true);
    group->AddTriggeredSequences(TriggeredSequencesFunctions::CreateTriggeredSequences(
        TriggerFunctions::CreateTrigger(1, 3, 2, "Front door"), {"Intro.lms", "Outro.lms"}));
    show->InteractiveGroups().push_back(group);
    show->SetStartupType(1);
    show->SetStartupTrigger(TriggerFunctions::CreateTrigger(0, 5, 1, "Key"));
    show->SetPreloadSequences(true);
    return show;
}

TEST(ShowFile, WrittenAndReadBackIsTheSameShow) {
    const auto show = RichShow();
    const std::string text = ShowToText(*show);
    EXPECT_EQ(text,
              "((0,1,2,0,,,T,F,F),(0,1,2,0,,,T,F,F),(1,0,1,0,Dark.las,,T,F,F),"
              "(0,1,2,0,,(Carol.lms,Bells*S *Oremix*C.lms),T,F,F),,"
              "(2,0,1,0,,(Twinkle.las),T,F,F),"
              "(( 1,Front*S back,F,T,T,Doorbell,((Intro.lms,( 2,Front door, 3, 1),Outro.lms)),T)),"
              " 1,( 1,Key, 5, 0),T)");
    const auto back = ShowFromText(text);
    ASSERT_NE(back, nullptr);
    EXPECT_TRUE(back->HasSameContents(*show));
    EXPECT_EQ(ShowToText(*back), text);
    EXPECT_EQ(back->InteractiveGroups().at(0)->TypeName(), "Soundboard");
    EXPECT_EQ(back->Musical()->List().at(1), "Bells, (remix).lms");

    // Monitoring takes no part in the comparison; a change of contents does.
    back->Monitoring()->SetShuttingDown(true);
    EXPECT_TRUE(back->HasSameContents(*show));
    back->Main()->List().push_back("Extra.las");
    EXPECT_FALSE(back->HasSameContents(*show));
}

TEST(ShowFile, UnreadablePartsKeepTheirDefaults) {
    const std::string playlists = "(1,0,1,0,,),(1,0,2,0,,),(1,0,1,0,,),(1,0,2,0,,),,(2,0,1,0,,)";
    // A group with no sets, a good group, a trigger with a non-number, a bad startup type.
    const auto show = ShowFromText(
        "(" + playlists +
        ",((0,d,F,F,T,bad,,T),( 1,,F,F,T,good,((a.lms,( 1,, 1, 0))))),( x,t, 1, 0),abc,t)");
    ASSERT_NE(show, nullptr);
    ASSERT_EQ(show->InteractiveGroups().size(), 1u);
    EXPECT_EQ(show->InteractiveGroups()[0]->Name(), "good");
    EXPECT_TRUE(show->InteractiveGroups()[0]->LightsOffAtEnd());  // no field 8
    EXPECT_EQ(show->StartupTrigger(), nullptr);
    EXPECT_EQ(show->StartupType(), 0);
    EXPECT_TRUE(show->PreloadSequences());

    // A trigger is kept although the show starts by schedule alone.
    const auto kept = ShowFromText("(" + playlists + ",, 0,( 4,Pad, 2, 1),F)");
    ASSERT_NE(kept, nullptr);
    ASSERT_NE(kept->StartupTrigger(), nullptr);
    EXPECT_EQ(kept->StartupTrigger()->InputNumber(), 4);
    EXPECT_EQ(kept->StartupType(), 0);
}

TEST(ShowFile, EmptyFieldsForNoGroupsAndNoTrigger) {
    Show show;
    const auto fields = Serialize::ListFromText(ShowToText(show), 1);
    EXPECT_EQ(fields[7], "");
    EXPECT_EQ(fields[9], "");
    const auto back = ShowFromText(ShowToText(show));
    ASSERT_NE(back, nullptr);
    EXPECT_TRUE(back->InteractiveGroups().empty());
    EXPECT_EQ(back->StartupTrigger(), nullptr);
    EXPECT_TRUE(back->Musical()->List().empty());
}

TEST(ShowFile, ShowsThatCannotBeWritten) {
    Show show;
    show.InteractiveGroups().push_back(std::make_shared<InteractiveGroup>());  // no sets
    EXPECT_EQ(RaisedNumber([&] { ShowToText(show); }), ErrorNumbers::SubscriptOutOfRange);
    EXPECT_FALSE(show.HasSameContents(show));
    Show missing;
    missing.SetMain(nullptr);
    EXPECT_EQ(RaisedNumber([&] { ShowToText(missing); }), ErrorNumbers::ObjectNotSet);

    EXPECT_EQ(RaisedNumber([] {
                  CreateShow(nullptr, NewMusicalPlaylist(1, 0), NewAnimationPlaylist(1),
                             NewMusicalPlaylist(1, 0), NewAnimationPlaylist(2), {}, 0, nullptr,
                             false);
              }),
              ErrorNumbers::ObjectNotSet);
    const auto created =
        CreateShow(NewAnimationPlaylist(1), NewMusicalPlaylist(1, 0), NewMusicalPlaylist(1, 0),
                   NewMusicalPlaylist(1, 0), NewAnimationPlaylist(2),
                   {nullptr, std::make_shared<InteractiveGroup>(), nullptr}, 0, nullptr, false);
    EXPECT_EQ(created->InteractiveGroups().size(), 1u);
    EXPECT_EQ(created->Startup()->PlaylistType(), 2);
    EXPECT_EQ(created->Main()->PlaylistType(), 1);
}

TEST(WholeFile, ReadsAndWritesBytesUnchanged) {
    testing::TempFolder folder;
    const std::string path = folder.File("show.lss");
    const std::string bytes("line one\r\nzwei\xFC\xFF\0end\n", 21);
    EXPECT_EQ(WriteWholeFile(path, bytes), 0);
    std::string read = "stale";
    EXPECT_EQ(ReadWholeFile(path, read), 0);
    EXPECT_EQ(read, bytes);
    EXPECT_EQ(std::filesystem::file_size(path), bytes.size());

    EXPECT_EQ(WriteWholeFile(path, ""), 0);
    EXPECT_EQ(ReadWholeFile(path, read), 0);
    EXPECT_EQ(read, "");

    EXPECT_EQ(ReadWholeFile(folder.File("missing.lss"), read), FileErrors::FileNotFound);
    EXPECT_EQ(ReadWholeFile(folder.Path().string(), read), FileErrors::PathFileAccessError);
    EXPECT_EQ(WriteWholeFile(folder.File("no/such/folder.lss"), "x"), FileErrors::PathNotFound);
    EXPECT_EQ(WriteWholeFile(folder.Path().string(), "x"), FileErrors::PathFileAccessError);
    EXPECT_EQ(FileErrorDescription(FileErrors::FileNotFound), "File not found");
}

TEST(WholeFile, LoadsAShowFile) {
    testing::TempFolder folder;
    const auto show = RichShow();
    const std::string path = folder.File("Evening.lss");
    ASSERT_EQ(WriteWholeFile(path, ShowToText(*show)), 0);
    const auto loaded = LoadShowFile(path);
    ASSERT_NE(loaded, nullptr);
    EXPECT_TRUE(loaded->HasSameContents(*show));
    EXPECT_EQ(LoadShowFile(folder.File("missing.lss")), nullptr);
    ASSERT_EQ(WriteWholeFile(path, "(not,a,show)"), 0);
    EXPECT_EQ(LoadShowFile(path), nullptr);
}

}  // namespace
}  // namespace vtr
