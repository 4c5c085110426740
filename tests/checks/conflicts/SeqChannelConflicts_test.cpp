// Device addresses claimed twice within one sequence, and channels in tracks of different
// lengths.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "checks/SequenceFixture.h"
#include "checks/conflicts/CheckChannelLengthConflicts.h"
#include "checks/conflicts/CheckSeqChannelConflicts.h"
#include "engine/LibVerify.h"

namespace vtr {
namespace {

using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using testsupport::DeviceXml;
using testsupport::IntensityFileXml;
using testsupport::ResultTexts;
using testsupport::SequenceText;

std::string Vtr(int unit, int circuit) {
    return R"(deviceType="1" unit=")" + std::to_string(unit) + R"(" circuit=")" +
           std::to_string(circuit) + "\"";
}
std::string Dmx(int universe, int circuit) {
    return R"(deviceType="7" network=")" + std::to_string(universe) + R"(" circuit=")" +
           std::to_string(circuit) + "\"";
}

class SeqChannelConflictsTest : public testsupport::SequenceCheckTest {
  protected:
    std::vector<std::string> Conflicts(const SequenceText& sequence) {
        path = WriteSequence("Seq.las", sequence);
        CheckSeqChannelConflicts check(path);
        RunCheck(check);
        return ResultTexts();
    }
    std::string path = DataFile("Seq.las");
};

TEST_F(SeqChannelConflictsTest, TwoChannelsOnOneCircuitConflictOnceAndASharedChannelNever) {
    SequenceText seq;
    seq.Channel(1, "Roof", Vtr(10, 1))
        .Channel(2, "Eaves", Vtr(10, 1))
        .Channel(3, "Yard", Vtr(10, 2))
        .Track("Front", {1, 3})
        .Track("", {3, 2});
    {
        const auto results = Conflicts(seq);
        EXPECT_THAT(results,
                    ElementsAre("27: [SEQUENCE]: " + path +
                                " | [TRACK]: Track 1: Front | [CHANNEL]: Roof | [TRACK]: Track 2 | "
                                "[CHANNEL]: Eaves"));
    }
}

TEST_F(SeqChannelConflictsTest, EveryLaterChannelIsReportedAgainstTheFirstOnItsCircuit) {
    SequenceText seq;
    seq.Channel(1, "A", Vtr(10, 1))
        .Channel(2, "B", Vtr(10, 1))
        .Channel(3, "C", Vtr(10, 1))
        .Channel(4, "Loose", "")
        .Channel(5, "Loose too", "")
        .Track("T", {1, 2, 4, 5, 3});
    {
        const auto results = Conflicts(seq);
        EXPECT_THAT(results,
                    ElementsAre("27: [SEQUENCE]: " + path +
                                    " | [TRACK]: Track 1: T | [CHANNEL]: A | [TRACK]: Track 1: T | "
                                    "[CHANNEL]: B",
                                "27: [SEQUENCE]: " + path +
                                    " | [TRACK]: Track 1: T | [CHANNEL]: A | [TRACK]: Track 1: T | "
                                    "[CHANNEL]: C"));
    }
}

TEST_F(SeqChannelConflictsTest, AChannelInsideAnIntensityFileRangeIsReportedWithTheCarryingTrack) {
    SequenceText seq;
    seq.Channel(1, "Tree", Dmx(1, 12))
        .Channel(2, "Porch", Dmx(2, 12))
        .Track("Lights", {1, 2})
        .Track("Grid", {1}, IntensityFileXml("Gridcraft", DeviceXml(7, 1, 0, 10, 3)));
    {
        const auto results = Conflicts(seq);
        EXPECT_THAT(results,
                    ElementsAre("45: [SEQUENCE]: " + path +
                                " | [TRACK]: Track 2: Grid | [CHANNEL]: Tree | [INTENSITY FILE]: "
                                "Gridcraft Intensity File | [RANGE]: DMX Universe 1 10-12"));
    }
    const auto& result = LibVerify::GetResults().front();
    EXPECT_EQ(result->HelpContextID(), 47);
    EXPECT_EQ(result->Summary(), "Channel settings conflict in sequence/intensity file");
}

TEST_F(SeqChannelConflictsTest, OverlappingDevicesOfOneFileGiveOneResultAndEachPairOfFilesOnce) {
    SequenceText seq;
    seq.Channel(1, "Roof", Vtr(10, 1))
        .Track("A", {1},
               IntensityFileXml("Gridcraft", DeviceXml(7, 1, 0, 1, 10) + DeviceXml(7, 1, 0, 10, 5)))
        .Track("B", {1},
               IntensityFileXml("Novalux", DeviceXml(7, 1, 0, 14, 1) + DeviceXml(7, 9, 0, 1, 1)));
    EXPECT_THAT(
        Conflicts(seq),
        ElementsAre("46: [SEQUENCE]: " + path +
                        " | [INTENSITY FILE]: Gridcraft Intensity File | [RANGE]: DMX Universe 1 "
                        "1-10 | [INTENSITY FILE]: Gridcraft Intensity File | [RANGE]: DMX "
                        "Universe 1 10-14",
                    "46: [SEQUENCE]: " + path +
                        " | [INTENSITY FILE]: Gridcraft Intensity File | [RANGE]: DMX Universe 1 "
                        "10-14 | [INTENSITY FILE]: Novalux Intensity File | [RANGE]: DMX "
                        "Universe 1 14"));
    EXPECT_EQ(LibVerify::GetResults().front()->HelpContextID(), 48);
}

TEST_F(SeqChannelConflictsTest, ChannelsMeetEachFileOnceInTrackOrderBeforeTheFilesMeet) {
    SequenceText seq;
    seq.Channel(1, "Tree", Dmx(1, 5))
        .Channel(2, "Star", Dmx(1, 20))
        .Track("A", {2, 1}, IntensityFileXml("Novalux", DeviceXml(7, 1, 0, 1, 30)))
        .Track("B", {1, 2}, IntensityFileXml("Gridcraft", DeviceXml(7, 1, 0, 4, 2)));
    const auto results = Conflicts(seq);
    const std::string grid = "[INTENSITY FILE]: Gridcraft Intensity File";
    const std::string nova = "[INTENSITY FILE]: Novalux Intensity File";
    EXPECT_THAT(
        results,
        ElementsAre("45: [SEQUENCE]: " + path + " | [TRACK]: Track 2: B | [CHANNEL]: Tree | " +
                        grid + " | [RANGE]: DMX Universe 1 4-5",
                    "46: [SEQUENCE]: " + path + " | " + grid + " | [RANGE]: DMX Universe 1 4-5 | " +
                        nova + " | [RANGE]: DMX Universe 1 1-30",
                    "45: [SEQUENCE]: " + path + " | [TRACK]: Track 1: A | [CHANNEL]: Star | " +
                        nova + " | [RANGE]: DMX Universe 1 1-30",
                    "45: [SEQUENCE]: " + path + " | [TRACK]: Track 1: A | [CHANNEL]: Tree | " +
                        nova + " | [RANGE]: DMX Universe 1 1-30"));
}

TEST_F(SeqChannelConflictsTest, ARangePast32767EndsOnlyTheComparisonItIsIn) {
    SequenceText seq;
    seq.Channel(1, "Tree", Dmx(1, 5))
        .Channel(2, "Star", Dmx(1, 7))
        .Channel(3, "Roof", Vtr(10, 1))
        .Channel(4, "Eaves", Vtr(10, 1))
        .Track("A", {1, 2, 3, 4},
               IntensityFileXml("Gridcraft",
                                DeviceXml(7, 1, 0, 1, 10) + DeviceXml(7, 1, 0, 32000, 1000)));
    const auto results = Conflicts(seq);
    const std::string tail =
        " | [INTENSITY FILE]: Gridcraft Intensity File | [RANGE]: DMX Universe 1 1-10";
    EXPECT_THAT(
        results,
        ElementsAre("27: [SEQUENCE]: " + path +
                        " | [TRACK]: Track 1: A | [CHANNEL]: Roof | [TRACK]: Track 1: A | "
                        "[CHANNEL]: Eaves",
                    "45: [SEQUENCE]: " + path + " | [TRACK]: Track 1: A | [CHANNEL]: Tree" + tail,
                    "45: [SEQUENCE]: " + path + " | [TRACK]: Track 1: A | [CHANNEL]: Star" + tail));
}

TEST_F(SeqChannelConflictsTest, ProgressIsToldAsPercentOfTheWork) {
    SequenceText seq;
    seq.Channel(1, "A", Vtr(10, 1))
        .Channel(2, "B", Vtr(10, 2))
        .Track("T", {1, 2})
        .Track("U", {1, 2});
    Conflicts(seq);
    // The sequence's load reports its own progress first.
    EXPECT_THAT(client.Lines("Transient Channel conflict check progress: "),
                ElementsAre("25%", "50%", "75%", "100%"));
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(SeqChannelConflictsTest, AChannelInTracksOfDifferentLengthsIsReported) {
    SequenceText seq;
    seq.Channel(1, "Roof", Vtr(10, 1))
        .Channel(2, "Yard", Vtr(10, 2))
        .Track("Long", {1, 2}, "", R"(length="2000")")
        .Track("Default", {2})
        .Track("Short", {1}, "", R"(length="1000")");
    path = WriteSequence("Lengths.las", seq);
    CheckChannelLengthConflicts check(path);
    RunCheck(check);
    // Track 3 is as long as the sequence, like track 2: Yard conflicts, Roof once.
    EXPECT_THAT(
        ResultTexts(),
        ElementsAre("32: [SEQUENCE]: " + path +
                        " | [CHANNEL]: Yard | [TRACK]: Track 1: Long | [TRACK]: Track 2: Default",
                    "32: [SEQUENCE]: " + path +
                        " | [CHANNEL]: Roof | [TRACK]: Track 1: Long | [TRACK]: Track 3: Short"));
    EXPECT_THAT(client.Lines("Transient "), Contains("Channel conflict check progress: 100%"));
}

TEST_F(SeqChannelConflictsTest, ChannelsInTracksOfEqualLengthGiveNothing) {
    SequenceText seq;
    seq.Channel(1, "Roof", Vtr(10, 1)).Track("A", {1}).Track("B", {1}, "", R"(length="1000")");
    path = WriteSequence("Equal.las", seq);
    CheckChannelLengthConflicts check(path);
    RunCheck(check);
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST(SeqConflictIdentityTest, IdentifiersAndDescriptions) {
    CheckSeqChannelConflicts conflicts("a.lms");
    EXPECT_EQ(conflicts.CheckIdentifier(), "23_a.lms");
    EXPECT_EQ(conflicts.Description(), "Sequence file channel conflicts: a.lms");
    conflicts.SetFilename("b.lms");
    EXPECT_EQ(conflicts.CheckIdentifier(), "23_b.lms");
    CheckChannelLengthConflicts lengths("a.lms");
    EXPECT_EQ(lengths.CheckIdentifier(), "28_a.lms");
    EXPECT_EQ(lengths.Description(), "Channel length conflicts: a.lms");
}

}  // namespace
}  // namespace vtr
