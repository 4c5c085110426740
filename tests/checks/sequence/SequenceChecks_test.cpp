// The checks of one sequence file: existence, loading, media, events, settings and shell
// commands, with the checks each one queues.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>

#include "checks/SequenceFixture.h"
#include "checks/sequence/CheckChannelsHaveEvents.h"
#include "checks/sequence/CheckChannelsHaveSettings.h"
#include "checks/sequence/CheckMediaFileExists.h"
#include "checks/sequence/CheckSequenceFileExists.h"
#include "checks/sequence/CheckSequenceHasEvents.h"
#include "checks/sequence/CheckSequenceLoads.h"
#include "checks/sequence/CheckShellCommandMapExists.h"
#include "checks/sequence/CheckShellCommandSet.h"
#include "checks/sequence/MediaPathResolver.h"
#include "engine/LibVerify.h"

namespace vtr {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using testsupport::DeviceXml;
using testsupport::IntensityFileXml;
using testsupport::ResultTexts;
using testsupport::SequenceText;
using testsupport::WriteFileBytes;

constexpr const char* kRoof = R"(deviceType="1" unit="10" circuit="1")";

class SequenceChecksTest : public testsupport::SequenceCheckTest {};

TEST_F(SequenceChecksTest, AMissingSequenceIsReportedAndNothingFollows) {
    const std::string missing = DataFile("Gone.lms");
    CheckSequenceFileExists check(missing, "show " + DataFile("Eve.lss"));
    EXPECT_THAT(RunCheck(check), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("23: [SEQUENCE]: " + missing + " | [SHOW]: show " +
                                           DataFile("Eve.lss")));
    // A folder is not a sequence file.
    LibVerify::ClearResults();
    CheckSequenceFileExists folder(DataFolder() + "media", "show x.lss");
    EXPECT_THAT(RunCheck(folder), IsEmpty());
    EXPECT_THAT(ResultTexts(),
                ElementsAre("23: [SEQUENCE]: " + DataFolder() + "media | [SHOW]: show x.lss"));
}

TEST_F(SequenceChecksTest, AnExistingSequenceGoesOnToItsLoadCheck) {
    const std::string path =
        WriteSequence("Carol.lms", SequenceText().Channel(1, "Roof", kRoof).Track("A", {1}));
    CheckSequenceFileExists check(path, "sequence Parent.lms");
    EXPECT_THAT(RunCheck(check), ElementsAre("Sequence file loads: " + path));
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(SequenceChecksTest, AnEditFileIsNeverLoadedOnlyItsPlaybackFileIsChecked) {
    const std::string edit = WriteSequenceText(
        "Carol.VtrEdit",
        R"(<?xml version="1.0"?><sequenceEdit formatVersion="1"><playback file="Carol.lms"/></sequenceEdit>)");
    CheckSequenceFileExists check(edit, "show Eve.lss");
    EXPECT_THAT(RunCheck(check), ElementsAre("Media file existence: " + DataFile("Carol.lms") +
                                             " (referenced in sequence " + edit + ")"));
    EXPECT_THAT(client.Lines("Transient "), ElementsAre("Getting info for R9 Sequence: " + edit));
    EXPECT_EQ(LibVerify::GetFileLoadCounts().sequenceLoads, 0);

    // The playback file does not exist: message 26.
    client.Clear();
    CheckMediaFileExists media(DataFile("Carol.lms"), edit);
    media.Check();
    EXPECT_THAT(ResultTexts(),
                ElementsAre("26: [FILE]: " + DataFile("Carol.lms") + " | [SEQUENCE]: " + edit));
}

TEST_F(SequenceChecksTest, AnEditFileNamingNoPlaybackFileGivesMessageZeroAndAnEmptyMediaName) {
    const std::string edit = WriteSequenceText(
        "Blank.vtrprot", R"(<sequenceEdit formatVersion="1"><playback file=""/></sequenceEdit>)");
    CheckSequenceFileExists check(edit, "show Eve.lss");
    EXPECT_THAT(RunCheck(check),
                ElementsAre("Media file existence:  (referenced in sequence " + edit + ")"));
    CheckMediaFileExists media("", edit);
    media.Check();
    EXPECT_THAT(ResultTexts(),
                ElementsAre("0: [SEQUENCE]: " + edit + " | [PROBLEM]: No playback file named",
                            "26: [FILE]:  | [SEQUENCE]: " + edit));
}

TEST_F(SequenceChecksTest, EditFilesAreKnownByTheirExtensionInAnyCase) {
    EXPECT_TRUE(CheckSequenceFileExists::IsEditFile("a.vtredit"));
    EXPECT_TRUE(CheckSequenceFileExists::IsEditFile("C:\\Shows\\A.VTRPROT"));
    EXPECT_TRUE(CheckSequenceFileExists::IsEditFile("/shows/a.VtrProt"));
    EXPECT_FALSE(CheckSequenceFileExists::IsEditFile("a.vtredit.lms"));
    EXPECT_FALSE(CheckSequenceFileExists::IsEditFile("/shows/x.vtredit/a"));
    EXPECT_FALSE(CheckSequenceFileExists::IsEditFile("vtredit"));
}

TEST_F(SequenceChecksTest, ASequenceThatCannotBeLoadedGivesMessage24AndNoContentChecks) {
    const std::string path = WriteSequenceText("Broken.las", "<sequence><channels>");
    CheckSequenceLoads check(path);
    EXPECT_THAT(RunCheck(check), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("24: " + path));
}

TEST_F(SequenceChecksTest, ALoadedSequenceQueuesItsChecksInOrder) {
    const std::string sub = DataFile("Intro.las");
    SequenceText seq;
    seq.Attributes(R"(media="Carol.mp3" shellCommand="12")")
        .Channel(1, "Roof", kRoof)
        .Channel(2, "Intro", R"(type="6" subsequence=")" + sub + R"(")")
        .Channel(3, "Empty sub", R"(type="6" subsequence="")")
        .Channel(4, "Outro", R"(type="6" subsequence="Outro.las")")
        .Track("A", {1, 2, 3})
        .Track("B", {2, 4});
    const std::string path = WriteSequence("Carol.lms", seq);
    CheckSequenceLoads check(path);
    EXPECT_THAT(
        RunCheck(check),
        ElementsAre("Media file existence: " + MediaFile("Carol.mp3") +
                        " (referenced in sequence " + path + ")",
                    "Sequence has events: " + path, "Sequence file channel conflicts: " + path,
                    "Channels have events: " + path, "Channel physical settings: " + path,
                    "Channels use defined networks: " + path, "Channel length conflicts: " + path,
                    "Sequence file existence: " + sub + " (referenced in sequence " + path + ")",
                    "Sequence file existence: Outro.las (referenced in sequence " + path + ")",
                    "Shell command map file existence", "Shell command set: " + path));
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(SequenceChecksTest, ASequenceWithoutMediaOrShellCommandQueuesOnlyItsContentChecks) {
    const std::string path =
        WriteSequence("Plain.las", SequenceText().Channel(1, "Roof", kRoof).Track("A", {1}));
    CheckSequenceLoads check(path);
    EXPECT_THAT(
        RunCheck(check),
        ElementsAre("Sequence has events: " + path, "Sequence file channel conflicts: " + path,
                    "Channels have events: " + path, "Channel physical settings: " + path,
                    "Channels use defined networks: " + path, "Channel length conflicts: " + path));
}

TEST_F(SequenceChecksTest, MediaNamesResolveAgainstTheMediaFolderOrTheSequencesOwn) {
    const MediaPathResolver resolver;
    EXPECT_EQ(resolver.Resolve("Carol.mp3", "/shows/Carol.lms"), MediaFile("Carol.mp3"));
    EXPECT_EQ(resolver.Resolve("/music/Carol.mp3", "/shows/Carol.lms"), "/music/Carol.mp3");
    EXPECT_EQ(resolver.Resolve("C:\\Music\\Carol.mp3", "/shows/Carol.lms"), "C:\\Music\\Carol.mp3");
    store["Shared"].erase("MediaDataPath");
    WriteSuiteStore();
    EXPECT_EQ(resolver.Resolve("sub/Carol.mp3", "/shows/Carol.lms"), "/shows/sub/Carol.mp3");
    EXPECT_EQ(resolver.Resolve("Carol.mp3", "Carol.lms"), "Carol.mp3");
}

TEST_F(SequenceChecksTest, AnExistingMediaFileGivesNothing) {
    WriteFileBytes(MediaFile("Carol.mp3"), "ID3");
    CheckMediaFileExists check(MediaFile("Carol.mp3"), "Carol.lms");
    RunCheck(check);
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(SequenceChecksTest, EmptyChannelsAreReportedInTrackThenChannelOrderAndTheSequenceIsOff) {
    SequenceText seq;
    seq.Channel(1, "Roof", kRoof, false)
        .Channel(2, "Yard", R"(deviceType="1" unit="10" circuit="2")", false)
        .Track("", {1})
        .Track("Garden", {2, 1});
    const std::string path = WriteSequence("Off.las", seq);
    CheckChannelsHaveEvents channels(path);
    RunCheck(channels);
    CheckSequenceHasEvents sequence(path);
    sequence.Check();
    EXPECT_THAT(
        ResultTexts(),
        ElementsAre("28: [SEQUENCE]: " + path + " | [TRACK]: Track 1 | [CHANNEL]: Roof",
                    "28: [SEQUENCE]: " + path + " | [TRACK]: Track 2: Garden | [CHANNEL]: Yard",
                    "28: [SEQUENCE]: " + path + " | [TRACK]: Track 2: Garden | [CHANNEL]: Roof",
                    "29: " + path));
}

TEST_F(SequenceChecksTest, TheFirstChannelOfTheFirstTrackNamedC0IsExempt) {
    SequenceText only;
    only.Channel(1, "c0", "", false).Track("A", {1});
    const std::string placeholder = WriteSequence("Empty.las", only);
    CheckChannelsHaveEvents events(placeholder);
    RunCheck(events);
    CheckChannelsHaveSettings settings(placeholder);
    settings.Check();
    CheckSequenceHasEvents off(placeholder);
    off.Check();
    EXPECT_THAT(ResultTexts(), ElementsAre("29: " + placeholder));

    // Anywhere else "c0" is an ordinary channel.
    LibVerify::ClearResults();
    SequenceText elsewhere;
    elsewhere.Channel(1, "Roof", kRoof)
        .Channel(2, "c0", "", false)
        .Track("A", {1, 2})
        .Track("B", {2});
    const std::string path = WriteSequence("Late.las", elsewhere);
    CheckChannelsHaveEvents late(path);
    RunCheck(late);
    CheckChannelsHaveSettings lateSettings(path);
    lateSettings.Check();
    EXPECT_THAT(ResultTexts(),
                ElementsAre("28: [SEQUENCE]: " + path + " | [TRACK]: Track 1: A | [CHANNEL]: c0",
                            "28: [SEQUENCE]: " + path + " | [TRACK]: Track 2: B | [CHANNEL]: c0",
                            "30: [SEQUENCE]: " + path + " | [TRACK]: Track 1: A | [CHANNEL]: c0",
                            "30: [SEQUENCE]: " + path + " | [TRACK]: Track 2: B | [CHANNEL]: c0"));
}

TEST_F(SequenceChecksTest, AGridcraftDeviceKeepsASequenceWithoutEventsFromBeingOff) {
    SequenceText seq;
    seq.Channel(1, "Roof", kRoof, false)
        .Track("A", {1}, IntensityFileXml("Gridcraft", DeviceXml(7, 1, 0, 1, 3)));
    const std::string path = WriteSequence("Grid.las", seq);
    CheckSequenceHasEvents check(path);
    RunCheck(check);
    EXPECT_THAT(ResultTexts(), IsEmpty());

    // A Novalux file, or a Gridcraft file without devices, does not.
    SequenceText novalux;
    novalux.Channel(1, "Roof", kRoof, false)
        .Track("A", {1},
               IntensityFileXml("Novalux", DeviceXml(7, 1, 0, 1, 3)) +
                   IntensityFileXml("Gridcraft", ""));
    const std::string other = WriteSequence("Nova.las", novalux);
    CheckSequenceHasEvents otherCheck(other);
    otherCheck.Check();
    EXPECT_THAT(ResultTexts(), ElementsAre("29: " + other));
}

TEST_F(SequenceChecksTest, AChannelOnInOneTrackMakesTheSequenceOn) {
    SequenceText seq;
    seq.Channel(1, "Roof", kRoof, false).Channel(2, "Yard", kRoof).Channel(3, "Unlisted", kRoof);
    seq.Track("A", {1}).Track("B", {2});
    const std::string path = WriteSequence("On.las", seq);
    CheckSequenceHasEvents check(path);
    RunCheck(check);
    EXPECT_THAT(ResultTexts(), IsEmpty());
    // Only channels that a track lists count.
    SequenceText unlisted;
    unlisted.Channel(1, "Roof", kRoof, false).Channel(2, "Unlisted", kRoof).Track("A", {1});
    const std::string offPath = WriteSequence("Unlisted.las", unlisted);
    CheckSequenceHasEvents offCheck(offPath);
    offCheck.Check();
    EXPECT_THAT(ResultTexts(), ElementsAre("29: " + offPath));
}

TEST_F(SequenceChecksTest, ChannelsWithoutPhysicalSettingsAreReported) {
    SequenceText seq;
    seq.Channel(1, "Roof", kRoof)
        .Channel(2, "Loose", R"(deviceType="0" circuit="4")")
        .Track("Front", {1, 2});
    const std::string path = WriteSequence("Loose.las", seq);
    CheckChannelsHaveSettings check(path);
    RunCheck(check);
    EXPECT_THAT(ResultTexts(), ElementsAre("30: [SEQUENCE]: " + path +
                                           " | [TRACK]: Track 1: Front | [CHANNEL]: Loose"));
}

TEST_F(SequenceChecksTest, AMissingShellCommandMapIsReportedWithItsPath) {
    CheckShellCommandMapExists check;
    RunCheck(check);
    EXPECT_THAT(ResultTexts(), ElementsAre("41: " + DataFile("shellcmd.map")));
    LibVerify::ClearResults();
    WriteFileBytes(DataFile("shellcmd.map"), "()");
    check.Check();
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(SequenceChecksTest, AShellCommandIsSetWhenTheMapGivesItACommand) {
    WriteFileBytes(
        DataFile("shellcmd.map"),
        "((12,C:\\Show\\lights.bat),(13,notify-send Show*Sstarted),(13,second),(1*S4,x))");
    const std::string set = WriteSequence(
        "Set.las",
        SequenceText().Attributes(R"(shellCommand="13")").Channel(1, "R", kRoof).Track("A", {1}));
    const std::string unknown = WriteSequence(
        "Unknown.las",
        SequenceText().Attributes(R"(shellCommand="14")").Channel(1, "R", kRoof).Track("A", {1}));
    CheckShellCommandSet setCheck(set);
    RunCheck(setCheck);
    CheckShellCommandSet unknownCheck(unknown);
    unknownCheck.Check();
    // Identifiers are compared as the map's escaped texts read back.
    const std::string escaped = WriteSequence(
        "Escaped.las",
        SequenceText().Attributes(R"(shellCommand="1,4")").Channel(1, "R", kRoof).Track("A", {1}));
    CheckShellCommandSet escapedCheck(escaped);
    escapedCheck.Check();
    EXPECT_THAT(ResultTexts(), ElementsAre("42: " + unknown));
}

TEST_F(SequenceChecksTest, AShellCommandWithoutAMapIsNotSet) {
    const std::string path = WriteSequence(
        "Set.las",
        SequenceText().Attributes(R"(shellCommand="12")").Channel(1, "R", kRoof).Track("A", {1}));
    CheckShellCommandSet check(path);
    RunCheck(check);
    EXPECT_THAT(ResultTexts(), ElementsAre("42: " + path));
}

TEST(SequenceCheckIdentityTest, IdentifiersAndDescriptions) {
    CheckSequenceFileExists exists("a.lms", "show b.lss");
    EXPECT_EQ(exists.CheckIdentifier(), "19_a.lms (referenced in show b.lss)");
    EXPECT_EQ(exists.Description(), "Sequence file existence: a.lms (referenced in show b.lss)");
    exists.SetReferencedIn("sequence c.lms");
    EXPECT_EQ(exists.CheckIdentifier(), "19_a.lms (referenced in sequence c.lms)");
    exists.SetFilename("d.las");
    EXPECT_EQ(exists.CheckIdentifier(), "19_d.las (referenced in sequence c.lms)");

    CheckMediaFileExists media("x.mp3", "a.lms");
    EXPECT_EQ(media.CheckIdentifier(), "22_x.mp3 (referenced in sequence a.lms)");
    EXPECT_EQ(media.Description(), "Media file existence: x.mp3 (referenced in sequence a.lms)");
    media.SetInSequenceFile("b.lms");
    EXPECT_EQ(media.CheckIdentifier(), "22_x.mp3 (referenced in sequence b.lms)");

    CheckSequenceLoads loads("a.lms");
    EXPECT_EQ(loads.CheckIdentifier(), "20_a.lms");
    EXPECT_EQ(loads.Description(), "Sequence file loads: a.lms");
    loads.SetFilename("b.lms");
    EXPECT_EQ(loads.CheckIdentifier(), "20_b.lms");
    CheckChannelsHaveEvents events("a.lms");
    EXPECT_EQ(events.CheckIdentifier(), "24_a.lms");
    CheckSequenceHasEvents hasEvents("a.lms");
    EXPECT_EQ(hasEvents.CheckIdentifier(), "25_a.lms");
    EXPECT_EQ(hasEvents.Description(), "Sequence has events: a.lms");
    CheckChannelsHaveSettings settings("a.lms");
    EXPECT_EQ(settings.CheckIdentifier(), "26_a.lms");
    CheckShellCommandMapExists map;
    EXPECT_EQ(map.CheckIdentifier(), "30");
    EXPECT_EQ(map.Description(), "Shell command map file existence");
    CheckShellCommandSet set("a.lms");
    EXPECT_EQ(set.CheckIdentifier(), "31_a.lms");
    EXPECT_EQ(set.Description(), "Shell command set: a.lms");
    set.SetSequenceFile("b.lms");
    EXPECT_EQ(set.CheckIdentifier(), "31_b.lms");
}

}  // namespace
}  // namespace vtr
