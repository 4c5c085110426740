// Channels and intensity-file circuits shared by sequences of sections of a show that can
// play at the same time.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "checks/SequenceFixture.h"
#include "checks/conflicts/CheckIntersequenceConflicts.h"
#include "engine/LibVerify.h"
#include "show/Show.h"
#include "show/TriggeredSequences.h"

namespace vtr {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;
using testsupport::DeviceXml;
using testsupport::IntensityFileXml;
using testsupport::ResultTexts;
using testsupport::SequenceText;
using testsupport::WriteFileBytes;

class IntersequenceTest : public testsupport::SequenceCheckTest {
  protected:
    // A sequence with one channel per circuit of unit 10 (named after the circuit).
    std::string Sequence(const std::string& name, const std::vector<int>& circuits,
                         const std::string& intensityFiles = {}) {
        SequenceText seq;
        std::vector<int> ids;
        for (int circuit : circuits) {
            seq.Channel(circuit, "C" + std::to_string(circuit),
                        R"(deviceType="1" unit="10" circuit=")" + std::to_string(circuit) + "\"");
            ids.push_back(circuit);
        }
        seq.Track("T", ids, intensityFiles);
        return WriteSequence(name, seq);
    }

    std::vector<std::string> Run() {
        WriteFileBytes(showFile, ShowFunctions::ShowToText(show));
        CheckIntersequenceConflicts check;
        check.SetShowFilename(showFile);
        RunCheck(check);
        return ResultTexts();
    }

    // The nine details of message 43 between two channels.
    std::string Conflict(const std::string& section, const std::string& sequence,
                         const std::string& channel, const std::string& otherSection,
                         const std::string& otherSequence, const std::string& otherChannel,
                         const std::string& track = "Track 1: T",
                         const std::string& otherTrack = "Track 1: T") const {
        return "43: [SHOW]: " + showFile + " | [SECTION]: " + section +
               " | [SEQUENCE]: " + sequence + " | [TRACK]: " + track + " | [CHANNEL]: " + channel +
               " | [SECTION]: " + otherSection + " | [SEQUENCE]: " + otherSequence +
               " | [TRACK]: " + otherTrack + " | [CHANNEL]: " + otherChannel;
    }

    void AddInteractive(const std::vector<std::string>& names) {
        auto group = std::make_shared<InteractiveGroup>();
        group->SetName("Porch");
        group->AddTriggeredSequences(TriggeredSequencesFunctions::CreateTriggeredSequences(
            TriggerFunctions::CreateTrigger(0, 1, 1, "Button"), names));
        show.InteractiveGroups().push_back(group);
    }

    Show show;
    const std::string showFile = DataFile("Eve.lss");
};

TEST_F(IntersequenceTest, StartupAndShutdownNeverOverlapButTheBackgroundRunsUnderBoth) {
    const std::string startup = Sequence("Start.las", {1});
    const std::string shutdown = Sequence("End.las", {1});
    show.Startup()->List() = {startup};
    show.Shutdown()->List() = {shutdown};
    {
        const auto results = Run();
        EXPECT_THAT(results, IsEmpty());
    }

    const std::string background = Sequence("Glow.las", {1, 2});
    show.Background()->List() = {background};
    EXPECT_THAT(Run(),
                ElementsAre(Conflict("Startup", startup, "C1", "Background", background, "C1"),
                            Conflict("Shutdown", shutdown, "C1", "Background", background, "C1")));
    const auto& result = LibVerify::GetResults().front();
    EXPECT_EQ(result->Summary(), "Channel conflict");
    EXPECT_EQ(result->HelpContextID(), 43);
}

TEST_F(IntersequenceTest, AnimationSequencesConflictOnlyWhenTheyRunTogether) {
    const std::string first = Sequence("A.las", {1, 2});
    const std::string second = Sequence("B.las", {2, 3});
    show.Main()->List() = {first, second};
    show.Main()->SetAnimationType(1);
    {
        const auto results = Run();
        EXPECT_THAT(results, IsEmpty());
    }
    show.Main()->SetAnimationType(2);
    {
        const auto results = Run();
        EXPECT_THAT(results,
                    ElementsAre(Conflict("Animation", second, "C2", "Animation", first, "C2")));
    }
}

TEST_F(IntersequenceTest, MusicalAndInteractiveSequencesDoNotMeetButBothMeetTheAnimation) {
    const std::string musical = Sequence("Song.lms", {1, 2});
    const std::string interactive = Sequence("Door.las", {1, 3});
    show.Musical()->List() = {musical};
    AddInteractive({interactive});
    {
        const auto results = Run();
        EXPECT_THAT(results, IsEmpty());
    }

    const std::string animation = Sequence("Twinkle.las", {2, 3});
    show.Main()->SetCleanUp(animation);
    {
        const auto results = Run();
        EXPECT_THAT(
            results,
            ElementsAre(Conflict("Musical", musical, "C2", "Animation", animation, "C2"),
                        Conflict("Interactive", interactive, "C3", "Animation", animation, "C3")));
    }
}

TEST_F(IntersequenceTest, ASequenceListedTwiceInTheBackgroundConflictsWithItself) {
    const std::string glow = Sequence("Glow.las", {4, 5});
    show.Background()->List() = {glow, "", glow};
    {
        const auto results = Run();
        EXPECT_THAT(results,
                    ElementsAre(Conflict("Background", glow, "C4", "Background", glow, "C4"),
                                Conflict("Background", glow, "C5", "Background", glow, "C5")));
    }
}

TEST_F(IntersequenceTest, EveryEarlierRegistrationOfTheChannelIsReported) {
    const std::string a = Sequence("A.las", {1});
    const std::string b = Sequence("B.las", {1});
    const std::string c = Sequence("C.las", {1});
    show.Background()->List() = {a, b, c};
    {
        const auto results = Run();
        EXPECT_THAT(results, ElementsAre(Conflict("Background", b, "C1", "Background", a, "C1"),
                                         Conflict("Background", c, "C1", "Background", a, "C1"),
                                         Conflict("Background", c, "C1", "Background", b, "C1")));
    }
}

TEST_F(IntersequenceTest, SectionsAreComparedInFlagOrderWhateverTheWalkOrder) {
    // Walked in the order Background, Startup, Animation, Musical, Shutdown, Interactive.
    const std::string startup = Sequence("Start.las", {1});
    const std::string animation = Sequence("Anim.las", {1});
    const std::string background = Sequence("Glow.las", {1});
    show.Startup()->List() = {startup};
    show.Main()->List() = {animation};
    show.Background()->SetCleanUp(background);
    AddInteractive({Sequence("Door.las", {1})});
    const std::string door = DataFile("Door.las");
    EXPECT_THAT(Run(),
                ElementsAre(Conflict("Startup", startup, "C1", "Background", background, "C1"),
                            Conflict("Animation", animation, "C1", "Background", background, "C1"),
                            Conflict("Interactive", door, "C1", "Background", background, "C1"),
                            Conflict("Interactive", door, "C1", "Animation", animation, "C1")));
}

TEST_F(IntersequenceTest, AChannelSharedByTwoTracksCountsOnceWithItsFirstTrack) {
    SequenceText seq;
    seq.Channel(1, "Roof", R"(deviceType="1" unit="10" circuit="1")")
        .Channel(2, "Loose", "")
        .Channel(3, "Eaves", R"(deviceType="1" unit="10" circuit="1")")
        .Track("A", {2, 1})
        .Track("B", {1, 3});
    const std::string own = WriteSequence("Own.las", seq);
    const std::string glow = Sequence("Glow.las", {1});
    show.Background()->List() = {glow};
    show.Musical()->List() = {own};
    // Eaves is another channel object on the same circuit: it conflicts too. The channel
    // without settings takes no part.
    EXPECT_THAT(
        Run(),
        ElementsAre(Conflict("Musical", own, "Roof", "Background", glow, "C1", "Track 1: A"),
                    Conflict("Musical", own, "Eaves", "Background", glow, "C1", "Track 2: B")));
}

TEST_F(IntersequenceTest, AnEditFileIsWalkedAsTheSequenceItPlays) {
    const std::string glow = Sequence("Glow.las", {7});
    const std::string song = Sequence("Song.lms", {7});
    const std::string edit = WriteSequenceText(
        "Song.VTREDIT",
        R"(<sequenceEdit formatVersion="1"><playback file="Song.lms"/></sequenceEdit>)");
    const std::string blank = WriteSequenceText(
        "Blank.vtrprot", R"(<sequenceEdit formatVersion="1"><playback/></sequenceEdit>)");
    show.Background()->List() = {glow};
    show.Musical()->List() = {edit, blank};
    // The edit file naming no playback file is reported again here, and skipped.
    EXPECT_THAT(Run(),
                ElementsAre(Conflict("Musical", song, "C7", "Background", glow, "C7"),
                            "0: [SEQUENCE]: " + blank + " | [PROBLEM]: No playback file named"));
}

TEST_F(IntersequenceTest, MissingAndUnloadableSequencesAreSkippedSilently) {
    const std::string glow = Sequence("Glow.las", {1});
    const std::string broken = WriteSequenceText("Broken.las", "<sequence>");
    show.Background()->List() = {DataFile("Gone.las"), broken, DataFolder() + "media", glow};
    show.Shutdown()->List() = {Sequence("End.las", {1})};
    {
        const auto results = Run();
        EXPECT_THAT(results, ElementsAre(Conflict("Shutdown", DataFile("End.las"), "C1",
                                                  "Background", glow, "C1")));
    }
}

TEST_F(IntersequenceTest, AShowThatCannotBeLoadedGivesNothing) {
    CheckIntersequenceConflicts check;
    check.SetShowFilename(DataFile("None.lss"));
    RunCheck(check);
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(IntersequenceTest, AChannelMeetsTheIntensityFilesOfEarlierSections) {
    const std::string glow =
        Sequence("Glow.las", {}, IntensityFileXml("Gridcraft", DeviceXml(1, 0, 10, 1, 16)));
    const std::string song = Sequence("Song.lms", {16, 17});
    show.Background()->List() = {glow};
    show.Musical()->List() = {song};
    EXPECT_THAT(
        Run(),
        ElementsAre(
            "48: [SHOW]: " + showFile + " | [SECTION]: Musical | [SEQUENCE]: " + song +
            " | [TRACK]: Track 1: T | [CHANNEL]: C16 | [SECTION]: Background | [SEQUENCE]: " +
            glow + " | [INTENSITY FILE]: Gridcraft Intensity File | [RANGE]: VTR Regular 0A 1-16"));
    EXPECT_EQ(LibVerify::GetResults().front()->HelpContextID(), 50);
}

TEST_F(IntersequenceTest, AnIntensityFileMeetsEarlierChannelsAndEarlierIntensityFiles) {
    const std::string glow =
        Sequence("Glow.las", {3}, IntensityFileXml("Novalux", DeviceXml(7, 2, 0, 1, 10)));
    const std::string anim = Sequence("Anim.las", {},
                                      IntensityFileXml("Gridcraft", DeviceXml(1, 0, 10, 2, 4)) +
                                          IntensityFileXml("Novalux", DeviceXml(7, 2, 0, 10, 1)));
    show.Background()->List() = {glow};
    show.Main()->List() = {anim};
    const std::string show43 = "[SHOW]: " + showFile;
    EXPECT_THAT(
        Run(),
        ElementsAre(
            "48: " + show43 + " | [SECTION]: Background | [SEQUENCE]: " + glow +
                " | [TRACK]: Track 1: T | [CHANNEL]: C3 | [SECTION]: Animation | "
                "[SEQUENCE]: " +
                anim +
                " | [INTENSITY FILE]: Gridcraft Intensity File | [RANGE]: VTR Regular 0A 2-5",
            "47: " + show43 + " | [SECTION]: Animation | [SEQUENCE]: " + anim +
                " | [INTENSITY FILE]: Novalux Intensity File | [RANGE]: DMX Universe 2 10 | "
                "[SECTION]: Background | [SEQUENCE]: " +
                glow +
                " | [INTENSITY FILE]: Novalux Intensity File | [RANGE]: DMX Universe 2 1-10"));
    EXPECT_EQ(LibVerify::GetResults().back()->HelpContextID(), 49);
    EXPECT_EQ(LibVerify::GetResults().back()->Summary(), "Intensity file conflict");
}

TEST_F(IntersequenceTest, IntensityFilesOfSectionsThatNeverOverlapDoNotMeet) {
    show.Startup()->List() = {
        Sequence("Start.las", {1}, IntensityFileXml("Gridcraft", DeviceXml(7, 1, 0, 1, 10)))};
    show.Shutdown()->List() = {
        Sequence("End.las", {2}, IntensityFileXml("Gridcraft", DeviceXml(7, 1, 0, 1, 10)))};
    show.Musical()->List() = {Sequence("Song.lms", {1})};
    AddInteractive(
        {Sequence("Door.las", {}, IntensityFileXml("Novalux", DeviceXml(1, 0, 10, 1, 1)))});
    {
        const auto results = Run();
        EXPECT_THAT(results, IsEmpty());
    }
}

TEST_F(IntersequenceTest, ABackgroundSequencesOwnChannelsMeetItsIntensityFile) {
    // Background sequences all run together, the channels of a sequence registered before
    // its own intensity files are compared included.
    const std::string glow =
        Sequence("Glow.las", {5}, IntensityFileXml("Gridcraft", DeviceXml(1, 0, 10, 1, 8)));
    show.Background()->List() = {glow};
    {
        const auto results = Run();
        EXPECT_THAT(results, SizeIs(1));
    }
    EXPECT_EQ(LibVerify::GetResults().front()->MessageNumber(), 48);
}

TEST(IntersequenceIdentityTest, IdentifierDescriptionAndSectionNames) {
    CheckIntersequenceConflicts check;
    check.SetShowFilename("Eve.lss");
    EXPECT_EQ(check.CheckIdentifier(), "32_Eve.lss");
    EXPECT_EQ(check.Description(), "Intersequence channel conflicts: Eve.lss");
    check.SetShowFilename("Day.lss");
    EXPECT_EQ(check.CheckIdentifier(), "32_Day.lss");
    EXPECT_EQ(CheckIntersequenceConflicts::SectionName(1), "Background");
    EXPECT_EQ(CheckIntersequenceConflicts::SectionName(2), "Startup");
    EXPECT_EQ(CheckIntersequenceConflicts::SectionName(4), "Animation");
    EXPECT_EQ(CheckIntersequenceConflicts::SectionName(8), "Musical");
    EXPECT_EQ(CheckIntersequenceConflicts::SectionName(16), "Interactive");
    EXPECT_EQ(CheckIntersequenceConflicts::SectionName(32), "Shutdown");
    EXPECT_EQ(CheckIntersequenceConflicts::SectionName(64), "(64)");
    EXPECT_EQ(CheckIntersequenceConflicts::SectionName(0), "(0)");
}

}  // namespace
}  // namespace vtr
