#include "vtrsupport/SequenceGenerator.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <set>

#include "SeqTestFiles.h"
#include "sequencelib/Sequence.h"

namespace vtr::seqlib {
namespace {

using testing::TempFolder;

TEST(SequenceGenerator, WritesTheShapeItIsAskedFor) {
    TempFolder folder;
    SequenceGenerator::Options o;
    o.channels = 40;
    o.eventsPerChannel = 6;
    o.tracks = 3;
    o.sharedChannels = 4;
    o.subsequenceChannels = 2;
    o.subsequenceFile = "Intro & more.las";
    o.offChannels = 5;
    o.gridcraftDevices = 2;
    o.novaluxDevices = 1;
    o.media = "Song.mp3";
    o.shellCommand = "12";
    const auto written = SequenceGenerator::WriteFile(folder.File("g.lms"), o);
    EXPECT_EQ(written.events, 240);
    EXPECT_EQ(written.fileBytes, written.xmlBytes);
    EXPECT_EQ(written.xmlBytes, std::filesystem::file_size(folder.File("g.lms")));
    EXPECT_EQ(SequenceGenerator::Xml(o).size(), written.xmlBytes);

    Sequence s;
    s.Load(folder.File("g.lms"));
    EXPECT_EQ(s.Media(), "Song.mp3");
    EXPECT_EQ(s.ShellCommand(), "12");
    ASSERT_EQ(s.Channels().size(), 40u);
    ASSERT_EQ(s.Tracks().size(), 3u);
    std::size_t listed = 0;
    for (const auto& track : s.Tracks()) {
        listed += track->Channels().size();
        for (int i = 0; i < 4; ++i)
            EXPECT_EQ(track->Channels()[i], s.Channels()[i]);
    }
    EXPECT_EQ(listed, 4u * 3 + 36) << "shared channels in every track, the others in one";
    for (int i = 0; i < 40; ++i) {
        const Channel& c = *s.Channels()[i];
        EXPECT_EQ(c.IsSubsequence(), i == 4 || i == 5) << i;
        EXPECT_EQ(c.IsEverOn(), i < 35) << i;
        if (c.IsSubsequence()) {
            EXPECT_EQ(c.SubsequenceFile(), "Intro & more.las");
            EXPECT_FALSE(c.HasPhysicalSettings());
        } else {
            EXPECT_EQ(c.Device(),
                      DeviceAddress(1, SequenceGenerator::ChannelNetwork(i),
                                    static_cast<uint8_t>(SequenceGenerator::ChannelUnit(i)),
                                    static_cast<int16_t>(SequenceGenerator::ChannelCircuit(i)), 1));
        }
    }
    ASSERT_NE(s.GridcraftFile(), nullptr);
    EXPECT_EQ(s.GridcraftFile()->DeviceCount(), 2);
    EXPECT_EQ(s.GridcraftFile()->TrackIndex(), 0);
    ASSERT_NE(s.NovaluxFile(), nullptr);
    EXPECT_EQ(s.NovaluxFile()->TrackIndex(), 2);
}

TEST(SequenceGenerator, GivesEveryChannelItsOwnCircuitAndCompressesOnRequest) {
    TempFolder folder;
    SequenceGenerator::Options o;
    o.channels = 5000;
    o.eventsPerChannel = 1;
    o.compressed = true;
    const auto written = SequenceGenerator::WriteFile(folder.File("g.las"), o);
    EXPECT_LT(written.fileBytes, written.xmlBytes / 3);
    Sequence s;
    s.Load(folder.File("g.las"));
    std::set<std::string> keys;
    for (const auto& c : s.Channels())
        keys.insert(c->SettingsKey());
    EXPECT_EQ(keys.size(), 5000u);
    EXPECT_EQ(s.GridcraftFile(), nullptr);
    EXPECT_FALSE(s.HasMedia());
}

}  // namespace
}  // namespace vtr::seqlib
