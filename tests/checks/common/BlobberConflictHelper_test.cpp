// The address-overlap rule of intensity files and channels, and the pairs it reports.
#include "checks/common/BlobberConflictHelper.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "engine/VtrError.h"
#include "environment/SequenceUtils.h"

namespace vtr {
namespace {

using seqlib::DeviceAddress;
using seqlib::IntensityFile;
using seqlib::IntensityFileKind;
using ::testing::ElementsAre;

constexpr int32_t kVtr = 1;
constexpr int32_t kX10 = 3;
constexpr int32_t kDmx = 7;

// Each side of a conflict is named by a text of the test's own.
using Helper = BlobberConflictHelper<std::string, std::string>;

class DevicesConflictTest : public ::testing::Test {
  protected:
    bool Conflict(const DeviceAddress& a, const DeviceAddress& b) const {
        return helper.DevicesConflict(a, b);
    }
    DeviceOverlap helper;
};

TEST_F(DevicesConflictTest, DmxUniversesSeparateDevicesAndTheSameUniverseComparesCircuits) {
    EXPECT_FALSE(Conflict({kDmx, 1, 0, 10, 3}, {kDmx, 2, 0, 10, 3}));
    EXPECT_TRUE(Conflict({kDmx, 1, 0, 10, 3}, {kDmx, 1, 0, 12, 3}));
    // DMX has no units: a differing unit does not keep them apart.
    EXPECT_TRUE(Conflict({kDmx, 1, 5, 10, 3}, {kDmx, 1, 9, 12, 3}));
}

TEST_F(DevicesConflictTest, TouchingRangesConflictAndAdjacentOnesDoNot) {
    EXPECT_TRUE(Conflict({kVtr, 0, 10, 1, 16}, {kVtr, 0, 10, 16, 1}));
    EXPECT_TRUE(Conflict({kVtr, 0, 10, 16, 5}, {kVtr, 0, 10, 1, 16}));
    EXPECT_FALSE(Conflict({kVtr, 0, 10, 1, 16}, {kVtr, 0, 10, 17, 16}));
    EXPECT_FALSE(Conflict({kVtr, 0, 10, 17, 16}, {kVtr, 0, 10, 1, 16}));
    // Another unit, another network, another type: never.
    EXPECT_FALSE(Conflict({kVtr, 0, 10, 1, 16}, {kVtr, 0, 11, 16, 1}));
    EXPECT_FALSE(Conflict({kVtr, 0, 10, 1, 16}, {kVtr, 1, 10, 16, 1}));
    EXPECT_FALSE(Conflict({kVtr, 0, 10, 1, 16}, {kDmx, 0, 10, 1, 16}));
}

TEST_F(DevicesConflictTest, DevicesWithoutCircuitsConflictWholeOnTheSameUnit) {
    EXPECT_TRUE(Conflict({kX10, 0, 0x21, 1, 1}, {kX10, 0, 0x21, 9, 1}));
    // X10 has no network: it does not keep them apart.
    EXPECT_TRUE(Conflict({kX10, 3, 0x21, 1, 1}, {kX10, 4, 0x21, 9, 1}));
    EXPECT_FALSE(Conflict({kX10, 0, 0x21, 1, 1}, {kX10, 0, 0x22, 1, 1}));
    // A type the suite does not know has nothing to tell devices apart.
    EXPECT_TRUE(Conflict({42, 1, 1, 1, 1}, {42, 2, 2, 300, 1}));
}

TEST_F(DevicesConflictTest, RangesAreTakenFromTheirEndsWhicheverWayRound) {
    // A count of 0 runs from start - 1 to start; a negative one ends below the start
    // (20 and -5 run from 14 to 20).
    EXPECT_TRUE(Conflict({kDmx, 1, 0, 10, 0}, {kDmx, 1, 0, 9, 1}));
    EXPECT_TRUE(Conflict({kDmx, 1, 0, 20, -5}, {kDmx, 1, 0, 14, 1}));
    EXPECT_FALSE(Conflict({kDmx, 1, 0, 20, -5}, {kDmx, 1, 0, 13, 1}));
    EXPECT_FALSE(Conflict({kDmx, 1, 0, 20, -5}, {kDmx, 1, 0, 21, 1}));
}

TEST_F(DevicesConflictTest, ARangePast32767IsAnOverflow) {
    EXPECT_TRUE(Conflict({kDmx, 1, 0, 32766, 1}, {kDmx, 1, 0, 32766, 1}));
    // start + count is worked out before the 1 is taken off, as 16-bit arithmetic.
    try {
        Conflict({kDmx, 1, 0, 1, 1}, {kDmx, 1, 0, 32767, 1});
        FAIL() << "no overflow";
    } catch (const VtrError& error) {
        EXPECT_EQ(error.Number(), ErrorNumbers::Overflow);
    }
    EXPECT_THROW(Conflict({kDmx, 1, 0, 32000, 1000}, {kDmx, 1, 0, 1, 1}), VtrError);
    // No arithmetic happens for devices that differ before their ranges are compared.
    EXPECT_FALSE(Conflict({kDmx, 1, 0, 32000, 1000}, {kDmx, 2, 0, 1, 1}));
    EXPECT_TRUE(Conflict({kX10, 0, 1, 32000, 1000}, {kX10, 0, 1, 1, 1}));
}

// Records the helper's events as texts.
class HelperEventsTest : public ::testing::Test {
  protected:
    HelperEventsTest() {
        helper.BlobberConflict = [this](const std::string& a, const DeviceAddress& da,
                                        const std::string& b, const DeviceAddress& db) {
            events.push_back(a + " " + SequenceUtils::DescribeDeviceAddress(da) + " / " + b + " " +
                             SequenceUtils::DescribeDeviceAddress(db));
        };
        helper.ChannelConflict = [this](const std::string& blobber, const DeviceAddress& device,
                                        const std::string& channelContext,
                                        const seqlib::Channel& channel) {
            events.push_back(blobber + " " + SequenceUtils::DescribeDeviceAddress(device) + " / " +
                             channelContext + " " + channel.Name());
        };
        helper.BlobberCheckDeviceProgress = [this](int32_t device) {
            events.push_back("progress " + std::to_string(device));
        };
    }

    static IntensityFile File(std::vector<DeviceAddress> devices) {
        IntensityFile file(IntensityFileKind::Gridcraft, "grid.gci");
        for (const auto& device : devices)
            file.AddDevice(device);
        return file;
    }

    Helper helper;
    std::vector<std::string> events;
};

TEST_F(HelperEventsTest, DevicesOfOneFileMeetEachOtherOnceAndNeverThemselves) {
    const IntensityFile file =
        File({{kDmx, 1, 0, 1, 10}, {kDmx, 1, 0, 5, 10}, {kDmx, 1, 0, 100, 1}});
    const Helper::Blobber blobber{&file, std::string("G")};
    const std::vector<Helper::Blobber> others = {blobber};
    bool found = false;
    helper.CheckForBlobberConflicts(blobber, others, found);
    EXPECT_TRUE(found);
    EXPECT_THAT(events, ElementsAre("G DMX Universe 1 1-10 / G DMX Universe 1 5-14", "progress 0",
                                    "progress 1", "progress 2"));
}

TEST_F(HelperEventsTest, EveryConflictingPairWithOtherFilesIsReported) {
    const IntensityFile mine = File({{kDmx, 1, 0, 1, 10}, {kDmx, 2, 0, 1, 10}});
    const IntensityFile theirs = File({{kDmx, 2, 0, 10, 1}, {kDmx, 1, 0, 10, 5}});
    const std::vector<Helper::Blobber> others = {{nullptr, std::string("none")},
                                                 {&theirs, std::string("T")}};
    bool found = false;
    helper.CheckForBlobberConflicts({&mine, std::string("M")}, others, found);
    EXPECT_TRUE(found);
    EXPECT_THAT(events, ElementsAre("M DMX Universe 1 1-10 / T DMX Universe 1 10-14", "progress 0",
                                    "M DMX Universe 2 1-10 / T DMX Universe 2 10", "progress 1"));
}

TEST_F(HelperEventsTest, NoFileAndNoConflictLeaveFoundAsItWas) {
    const IntensityFile file = File({{kDmx, 1, 0, 1, 10}});
    const IntensityFile apart = File({{kDmx, 3, 0, 1, 10}});
    const std::vector<Helper::Blobber> others = {{&apart, std::string("A")}};
    bool found = false;
    helper.CheckForBlobberConflicts({nullptr, std::string("none")}, others, found);
    EXPECT_TRUE(events.empty());
    helper.CheckForBlobberConflicts({&file, std::string("F")}, others, found);
    EXPECT_FALSE(found);
    EXPECT_THAT(events, ElementsAre("progress 0"));
    found = true;
    helper.CheckForBlobberConflicts({&file, std::string("F")}, others, found);
    EXPECT_TRUE(found);
    EXPECT_EQ(DeviceOverlap::DeviceCount(nullptr), 0);
    EXPECT_EQ(DeviceOverlap::DeviceCount(&file), 1);
}

TEST_F(HelperEventsTest, AnOverflowEndsTheComparisonAfterTheConflictsAlreadyFound) {
    const IntensityFile file =
        File({{kDmx, 1, 0, 1, 10}, {kDmx, 1, 0, 5, 1}, {kDmx, 1, 0, 32000, 1000}});
    const Helper::Blobber blobber{&file, std::string("G")};
    const std::vector<Helper::Blobber> others = {blobber};
    bool found = false;
    EXPECT_THROW(helper.CheckForBlobberConflicts(blobber, others, found), VtrError);
    EXPECT_TRUE(found);
    EXPECT_THAT(events, ElementsAre("G DMX Universe 1 1-10 / G DMX Universe 1 5"));
}

TEST_F(HelperEventsTest, AChannelIsOneCircuitComparedWithEveryDevice) {
    const IntensityFile file =
        File({{kVtr, 0, 10, 1, 16}, {kVtr, 0, 11, 1, 16}, {kVtr, 0, 10, 16, 1}});
    seqlib::Channel channel("1");
    channel.SetName("Roof");
    // Its own count of circuits plays no part: the channel is its start circuit alone.
    channel.SetDevice({kVtr, 0, 10, 16, 8});
    bool found = false;
    helper.CheckForChannelConflicts({&file, std::string("G")}, &channel, std::string("C"), found);
    EXPECT_TRUE(found);
    EXPECT_THAT(events,
                ElementsAre("G VTR Regular 0A 1-16 / C Roof", "G VTR Regular 0A 16 / C Roof"));

    events.clear();
    channel.SetDevice({kVtr, 0, 10, 17, 1});
    found = false;
    helper.CheckForChannelConflicts({&file, std::string("G")}, &channel, std::string("C"), found);
    EXPECT_FALSE(found);

    // A channel without physical settings, and no channel, are never compared.
    seqlib::Channel bare("2");
    helper.CheckForChannelConflicts({&file, std::string("G")}, &bare, std::string("C"), found);
    helper.CheckForChannelConflicts({&file, std::string("G")}, nullptr, std::string("C"), found);
    EXPECT_FALSE(found);
    EXPECT_TRUE(events.empty());
}

TEST(BlobberKindNameTest, NamesTheKindNotTheFile) {
    EXPECT_EQ(BlobberKindName(IntensityFileKind::Gridcraft), "Gridcraft Intensity File");
    EXPECT_EQ(BlobberKindName(IntensityFileKind::Novalux), "Novalux Intensity File");
}

}  // namespace
}  // namespace vtr
