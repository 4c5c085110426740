#include "sequencelib/Sequence.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>

#include "SeqTestFiles.h"

namespace vtr::seqlib {
namespace {

using testing::Gzip;
using testing::TempFolder;

const char* const kExample = R"(<?xml version="1.0" encoding="UTF-8"?>
<sequence formatVersion="1" length="180000" media="Carol.mp3" shellCommand="12">
  <channels>
    <channel id="1" name="Roof" deviceType="1" network="0" unit="10" circuit="1">
      <event start="0" end="1500" intensity="100"/>
      <event start="1500" end="3000" from="100" to="0"/>
    </channel>
    <channel id="2" name="Yard" deviceType="7" network="3" circuit="5"/>
    <channel id="3" name="Intro" type="6" subsequence="Intro.las"/>
  </channels>
  <tracks>
    <track name="House" length="180000">
      <channelRef id="1"/>
      <channelRef id="2"/>
      <intensityFile kind="Gridcraft" name="tree.gci">
        <device deviceType="7" network="1" start="1" count="510"/>
      </intensityFile>
    </track>
  </tracks>
</sequence>
)";

Sequence LoadText(const TempFolder& folder, const std::string& text,
                  const LoadOptions& options = {}) {
    Sequence sequence;
    sequence.Load(folder.Write("seq.lms", text), {}, options);
    return sequence;
}

// A sequence of the given length with one channel per event list.
std::string WithChannels(int length, const std::string& channels) {
    return "<sequence length=\"" + std::to_string(length) + "\"><channels>" + channels +
           "</channels></sequence>";
}

TEST(SequenceLoad, ReadsEverythingTheChecksAskAbout) {
    TempFolder folder;
    const Sequence s = LoadText(folder, kExample);
    EXPECT_EQ(s.FileName(), folder.File("seq.lms"));
    EXPECT_EQ(s.FormatVersion(), 1);
    EXPECT_EQ(s.Length(), 180000);
    EXPECT_TRUE(s.HasMedia());
    EXPECT_EQ(s.Media(), "Carol.mp3");
    EXPECT_TRUE(s.UsesShellCommands());
    EXPECT_EQ(s.ShellCommand(), "12");

    ASSERT_EQ(s.Channels().size(), 3u);
    const Channel& roof = *s.Channels()[0];
    EXPECT_EQ(roof.Id(), "1");
    EXPECT_EQ(roof.Name(), "Roof");
    EXPECT_EQ(roof.Device(), DeviceAddress(1, 0, 10, 1, 1));
    EXPECT_TRUE(roof.HasPhysicalSettings());
    EXPECT_EQ(roof.SettingsKey(), "1:0:10:1");
    EXPECT_TRUE(roof.IsEverOn());
    EXPECT_EQ(roof.ChannelType(), 0);

    const Channel& yard = *s.Channels()[1];
    EXPECT_EQ(yard.SettingsKey(), "7:3::5");
    EXPECT_FALSE(yard.IsEverOn());

    const Channel& intro = *s.Channels()[2];
    EXPECT_TRUE(intro.IsSubsequence());
    EXPECT_EQ(intro.ChannelType(), kSubsequenceChannelType);
    EXPECT_EQ(intro.SubsequenceFile(), "Intro.las");
    EXPECT_FALSE(intro.HasPhysicalSettings());
    EXPECT_EQ(intro.SettingsKey(), "");

    ASSERT_EQ(s.Tracks().size(), 1u);
    const Track& house = *s.Tracks()[0];
    EXPECT_EQ(house.Name(), "House");
    EXPECT_EQ(house.Length(), 180000);
    ASSERT_EQ(house.Channels().size(), 2u);
    EXPECT_EQ(house.Channels()[0], s.Channels()[0]);
    EXPECT_EQ(house.Channels()[1], s.Channels()[1]);

    const auto grid = s.GridcraftFile();
    ASSERT_NE(grid, nullptr);
    EXPECT_EQ(grid->Kind(), IntensityFileKind::Gridcraft);
    EXPECT_EQ(grid->Name(), "tree.gci");
    EXPECT_EQ(grid->TrackIndex(), 0);
    EXPECT_EQ(grid->CarryingTrack(), s.Tracks()[0]);
    ASSERT_EQ(grid->DeviceCount(), 1);
    EXPECT_EQ(grid->Devices()[0], DeviceAddress(7, 1, 0, 1, 510));
    EXPECT_EQ(house.IntensityFiles(), std::vector<std::shared_ptr<IntensityFile>>{grid});
    EXPECT_EQ(s.NovaluxFile(), nullptr);
}

// The numeric identity that the conflict checks look channels up by names the same
// addresses as the settings key, for every device type: the parts a type does not have
// never tell two channels apart, and the parts it has always do.
TEST(SequenceLoad, ASettingsIdentityIsEqualExactlyWhenTheSettingsKeyIs) {
    std::vector<Channel> channels;
    for (int32_t type = 0; type <= 9; ++type) {
        for (const int32_t network : {0, 3, 15}) {
            for (const uint8_t unit : {uint8_t{0}, uint8_t{1}, uint8_t{240}}) {
                for (const int16_t circuit : {int16_t{0}, int16_t{1}, int16_t{512}}) {
                    Channel& channel = channels.emplace_back();
                    channel.SetDevice(DeviceAddress(type, network, unit, circuit, 1));
                }
            }
        }
    }
    const Channel::SettingsIdHash hash;
    for (const Channel& a : channels) {
        for (const Channel& b : channels) {
            const bool sameKey = a.SettingsKey() == b.SettingsKey();
            ASSERT_EQ(a.SettingsIdentity() == b.SettingsIdentity(), sameKey)
                << a.SettingsKey() << " / " << b.SettingsKey();
            if (sameKey) {
                ASSERT_EQ(hash(a.SettingsIdentity()), hash(b.SettingsIdentity()));
            }
        }
    }
}

TEST(SequenceLoad, TracksShareOneObjectPerChannelIdWhereverItIsDefined) {
    TempFolder folder;
    // The tracks come first here, so their references wait for the channels.
    const Sequence s = LoadText(folder, R"(<sequence length="100">
      <tracks>
        <track name="A" length="50"><channelRef id="b"/><channelRef id="a"/></track>
        <track name="B"><channelRef id="a"/></track>
        <track/>
      </tracks>
      <channels>
        <channel id="a" name="Shared" deviceType="3" unit="37"/>
        <channel id="b" name="Own"/>
        <channel id="c" name="Listed by no track"/>
      </channels>
    </sequence>)");
    ASSERT_EQ(s.Channels().size(), 3u);
    EXPECT_EQ(s.Channels()[2]->Name(), "Listed by no track");
    ASSERT_EQ(s.Tracks().size(), 3u);
    const auto& a = s.Tracks()[0]->Channels();
    const auto& b = s.Tracks()[1]->Channels();
    ASSERT_EQ(a.size(), 2u);
    ASSERT_EQ(b.size(), 1u);
    EXPECT_EQ(a[0]->Name(), "Own");
    EXPECT_EQ(a[1].get(), b[0].get()) << "one channel object, not a copy";
    EXPECT_EQ(a[1].get(), s.Channels()[0].get());
    EXPECT_EQ(s.Tracks()[0]->Length(), 50);
    EXPECT_EQ(s.Tracks()[1]->Length(), 100) << "a track's length defaults to the sequence's";
    EXPECT_EQ(s.Tracks()[2]->Name(), "");
    EXPECT_TRUE(s.Tracks()[2]->Channels().empty());
}

// Thousands of channels, their ids numbers out of order, numbers with leading zeros (equal
// in value to others, and hashed alike) and words; a track lists them backwards and every
// third one, so that the index is asked rather than the guess of the next channel.
TEST(SequenceLoad, ChannelRefsFindEveryChannelByIdAmongThousands) {
    TempFolder folder;
    std::vector<std::string> ids;
    for (int i = 0; i < 3000; ++i)
        ids.push_back(std::to_string((i * 7919) % 3001));
    for (int i = 0; i < 400; ++i)
        ids.push_back("0" + std::to_string(i));
    for (int i = 0; i < 400; ++i)
        ids.push_back("ch" + std::to_string(i));
    std::string text = "<sequence length=\"10\"><channels>";
    for (const std::string& id : ids)
        text += "<channel id=\"" + id + "\" name=\"n" + id + "\"/>";
    text += "</channels><tracks><track>";
    for (std::size_t i = ids.size(); i-- > 0;) {
        if (i % 3 == 0)
            text += "<channelRef id=\"" + ids[i] + "\"/>";
    }
    text += "</track></tracks></sequence>";
    const Sequence s = LoadText(folder, text);
    ASSERT_EQ(s.Channels().size(), ids.size());
    ASSERT_EQ(s.Tracks().size(), 1u);
    const auto& listed = s.Tracks()[0]->Channels();
    ASSERT_EQ(listed.size(), (ids.size() + 2) / 3);
    std::size_t at = 0;
    for (std::size_t i = ids.size(); i-- > 0;) {
        if (i % 3 == 0) {
            EXPECT_EQ(listed[at]->Name(), "n" + ids[i]);
            EXPECT_EQ(listed[at].get(), s.Channels()[i].get());
            ++at;
        }
    }

    const std::string repeated =
        text.substr(0, text.find("</channels>")) + "<channel id=\"0399\"/></channels></sequence>";
    EXPECT_THAT(testing::ErrorOf([&] { LoadText(folder, repeated); }),
                ::testing::HasSubstr("the channel id \"0399\" is repeated"));
}

TEST(SequenceLoad, SettingsKeyHoldsTheAddressPartsEachDeviceTypeHas) {
    TempFolder folder;
    const Sequence s = LoadText(folder, WithChannels(10, R"(
        <channel id="1" deviceType="1" network="2" unit="10" circuit="7"/>
        <channel id="2" deviceType="2" network="2" unit="5" circuit="3"/>
        <channel id="3" deviceType="3" network="2" unit="37" circuit="9"/>
        <channel id="4" deviceType="4" unit="9" circuit="2"/>
        <channel id="5" deviceType="5" unit="0" circuit="0"/>
        <channel id="7" deviceType="7" network="3" unit="4" circuit="5"/>
        <channel id="9" deviceType="9" network="1" unit="1" circuit="1"/>
        <channel id="none" network="1" unit="1" circuit="1"/>
        <channel id="zero" deviceType="0" network="1" circuit="1"/>)"));
    std::vector<std::string> keys;
    std::vector<bool> physical;
    for (const auto& channel : s.Channels()) {
        keys.push_back(channel->SettingsKey());
        physical.push_back(channel->HasPhysicalSettings());
    }
    EXPECT_EQ(keys, (std::vector<std::string>{"1:2:10:7", "2::5:3", "3::37:", "4::9:2", "5::0:0",
                                              "7:3::5", "9:::", "", ""}));
    EXPECT_EQ(physical,
              (std::vector<bool>{true, true, true, true, true, true, true, false, false}));
    EXPECT_EQ(s.Channels()[7]->Network(), 1) << "settings are kept even without a device type";
}

TEST(SequenceLoad, AChannelIsOnOnlyForAPositiveLevelInsideZeroToLength) {
    TempFolder folder;
    const Sequence s = LoadText(folder, WithChannels(1000, R"(
        <channel id="endsAtZero"><event start="-500" end="0" intensity="100"/></channel>
        <channel id="endsJustAfterZero"><event start="-500" end="1" intensity="100"/></channel>
        <channel id="startsAtLength"><event start="1000" end="2000" intensity="100"/></channel>
        <channel id="startsJustBeforeLength"><event start="999" end="5000" intensity="1"/></channel>
        <channel id="coversAll"><event start="-10" end="99999" intensity="50"/></channel>
        <channel id="levelZero"><event start="0" end="1000" intensity="0"/></channel>
        <channel id="rampUp"><event start="0" end="10" from="0" to="30"/></channel>
        <channel id="rampDown"><event start="0" end="10" from="30" to="0"/></channel>
        <channel id="intensityWins"><event start="0" end="10" intensity="0" from="50" to="50"/></channel>
        <channel id="emptyInterval"><event start="20" end="20" intensity="80"/></channel>
        <channel id="reversed"><event start="30" end="20" intensity="80"/></channel>
        <channel id="noEvents"/>
        <channel id="laterEventOn"><event start="0" end="5" intensity="0"/><event start="5" end="6" intensity="1"/></channel>)"));
    std::vector<std::string> on;
    for (const auto& channel : s.Channels()) {
        if (channel->IsEverOn())
            on.push_back(channel->Id());
    }
    EXPECT_EQ(on, (std::vector<std::string>{"endsJustAfterZero", "startsJustBeforeLength",
                                            "coversAll", "rampUp", "rampDown", "laterEventOn"}));
}

TEST(SequenceLoad, AbsentAttributesTakeTheirDefaults) {
    TempFolder folder;
    const Sequence s = LoadText(folder, R"(<sequence media="" shellCommand="">
        <channels><channel id="1" deviceType="1"><event end="5" intensity="9"/></channel></channels>
        <tracks><track><channelRef id="1"/></track></tracks></sequence>)");
    EXPECT_EQ(s.Length(), 0);
    EXPECT_EQ(s.FormatVersion(), 0);
    EXPECT_FALSE(s.HasMedia());
    EXPECT_FALSE(s.UsesShellCommands());
    const Channel& c = *s.Channels()[0];
    EXPECT_EQ(c.Device(), DeviceAddress(1, 0, 0, 0, 1));
    EXPECT_EQ(c.Name(), "");
    EXPECT_FALSE(c.IsEverOn()) << "nothing is inside a sequence of length 0";
    EXPECT_EQ(s.Tracks()[0]->Length(), 0);
}

TEST(SequenceLoad, ReadsEachIntensityFileKindFromTheTrackThatCarriesIt) {
    TempFolder folder;
    const Sequence s = LoadText(folder, R"(<sequence length="10"><tracks>
        <track name="one"/>
        <track name="two">
          <intensityFile kind="Novalux" name="n.nvx">
            <device deviceType="1" network="2" unit="240" start="32767" count="0"/>
            <device/>
          </intensityFile>
          <intensityFile kind="Other" name="ignored"><device unit="x"/></intensityFile>
        </track>
        <track name="three"><intensityFile kind="Gridcraft"/></track>
      </tracks></sequence>)");
    const auto novalux = s.NovaluxFile();
    ASSERT_NE(novalux, nullptr);
    EXPECT_EQ(novalux->TrackIndex(), 1);
    EXPECT_EQ(novalux->CarryingTrack()->Name(), "two");
    EXPECT_EQ(novalux->Devices(), (std::vector<DeviceAddress>{DeviceAddress(1, 2, 240, 32767, 0),
                                                              DeviceAddress(0, 0, 0, 0, 1)}));
    ASSERT_NE(s.GridcraftFile(), nullptr);
    EXPECT_EQ(s.GridcraftFile()->TrackIndex(), 2);
    EXPECT_EQ(s.GridcraftFile()->Name(), "");
    EXPECT_EQ(s.GridcraftFile()->DeviceCount(), 0);
    EXPECT_EQ(s.IntensityFileOf(IntensityFileKind::Novalux), novalux);
    EXPECT_TRUE(s.Tracks()[0]->IntensityFiles().empty());
}

TEST(SequenceLoad, IgnoresWhatItDoesNotKnow) {
    TempFolder folder;
    const Sequence s = LoadText(folder, R"(<?xml version="1.0"?>
<!DOCTYPE sequence [ <!ENTITY x "y"> <!-- a ] > comment --> ]>
<!-- before --><?app data?>
<sequence length="10" future="yes">
  <notes>Some <b>rich</b> text &amp; more <![CDATA[ <channel id="9"/> ]]></notes>
  <channels extra="1">
    <!-- <channel id="8"/> -->
    <channel id="1" colour="red"><event start="0" end="5" intensity="5" curve="s"/><marker/></channel>
    <group><channel id="not read"/></group>
  </channels>
  <tracks><track><channelRef id="1" note="x"/><label/></track></tracks>
</sequence>
<!-- after --> <?app more?>
)");
    ASSERT_EQ(s.Channels().size(), 1u);
    EXPECT_TRUE(s.Channels()[0]->IsEverOn());
    EXPECT_EQ(s.Tracks()[0]->Channels().size(), 1u);
}

TEST(SequenceLoad, CompressedFilesLoadLikePlainOnes) {
    TempFolder folder;
    Sequence plain;
    plain.Load(folder.Write("plain.lms", kExample));
    Sequence packed;
    packed.Load(folder.Write("packed.las", Gzip(kExample)));
    EXPECT_EQ(packed.Channels().size(), plain.Channels().size());
    EXPECT_EQ(packed.Channels()[0]->SettingsKey(), "1:0:10:1");
    EXPECT_EQ(packed.Media(), "Carol.mp3");

    // Several gzip members in a row are one text.
    const std::string text = kExample;
    const std::size_t half = text.size() / 2;
    Sequence members;
    members.Load(folder.Write("members.lms", Gzip(text.substr(0, half)) + Gzip(text.substr(half))));
    EXPECT_EQ(members.Channels().size(), 3u);
    EXPECT_NE(members.GridcraftFile(), nullptr);
}

TEST(SequenceLoad, ReportsRisingPercentsFromZeroToHundredOnceEach) {
    TempFolder folder;
    std::string channels;
    for (int i = 1; i <= 300; ++i) {
        channels += "<channel id=\"" + std::to_string(i) +
                    "\"><event start=\"0\" end=\"5\" intensity=\"7\"/></channel>\n";
    }
    const std::string file = folder.Write("seq.lms", WithChannels(10, channels));
    for (const bool compressed : {false, true}) {
        const std::string path =
            compressed ? folder.Write("seq.las", Gzip(WithChannels(10, channels), 1)) : file;
        std::vector<int32_t> told;
        Sequence s;
        LoadOptions options;
        options.pieceBytes = 256;
        s.Load(
            path, [&](int32_t percent) { told.push_back(percent); }, options);
        ASSERT_GE(told.size(), 3u);
        EXPECT_EQ(told.front(), 0);
        EXPECT_EQ(told.back(), 100);
        EXPECT_TRUE(std::is_sorted(told.begin(), told.end()));
        EXPECT_EQ(std::adjacent_find(told.begin(), told.end()), told.end()) << "a value twice";
        EXPECT_EQ(s.Channels().size(), 300u);
    }
}

TEST(SequenceLoad, AFailedLoadLeavesTheSequenceAsItWas) {
    TempFolder folder;
    Sequence s;
    s.Load(folder.Write("good.lms", kExample));
    std::vector<int32_t> told;
    EXPECT_THROW(s.Load(folder.Write("bad.lms", "<sequence><channels>"),
                        [&](int32_t p) { told.push_back(p); }),
                 VtrError);
    EXPECT_EQ(s.FileName(), folder.File("good.lms"));
    EXPECT_EQ(s.Channels().size(), 3u);
    EXPECT_TRUE(std::find(told.begin(), told.end(), 100) == told.end());
}

TEST(SequenceLoad, IsAskedWhetherToGoOnBetweenPercentsAndStopsWhenTold) {
    TempFolder folder;
    std::string channels;
    for (int i = 1; i <= 300; ++i) {
        channels += "<channel id=\"" + std::to_string(i) +
                    "\"><event start=\"0\" end=\"5\" intensity=\"7\"/></channel>\n";
    }
    const std::string big = folder.Write("big.lms", WithChannels(10, channels));
    LoadOptions options;
    options.pieceBytes = 256;
    options.pollInterval = std::chrono::milliseconds(0);
    int asked = 0;
    options.keepGoing = [&] {
        ++asked;
        return true;
    };
    std::vector<int32_t> told;
    Sequence s;
    EXPECT_TRUE(s.Load(
        big, [&](int32_t percent) { told.push_back(percent); }, options));
    EXPECT_GT(asked, static_cast<int>(told.size()))
        << "asked as the load goes, not only per percent";

    s.Load(folder.Write("good.lms", kExample));
    told.clear();
    asked = 0;
    options.keepGoing = [&] { return ++asked < 5; };
    EXPECT_FALSE(s.Load(
        big, [&](int32_t percent) { told.push_back(percent); }, options));
    EXPECT_EQ(asked, 5) << "stops when told, and is asked no more";
    EXPECT_EQ(s.FileName(), folder.File("good.lms")) << "the sequence is left as it was";
    EXPECT_EQ(s.Channels().size(), 3u);
    EXPECT_TRUE(std::find(told.begin(), told.end(), 100) == told.end());
}

// Compressed text of a few megabytes can hold millions of small elements: what a load keeps
// of them is counted as it is read and bounded.
TEST(SequenceLoad, WhatALoadKeepsIsBoundedAsItIsRead) {
    TempFolder folder;
    std::string channels;
    for (int i = 1; i <= 1000; ++i)
        channels += "<channel id=\"" + std::to_string(i) + "\" name=\"Channel\"/>\n";
    const std::string path = folder.Write("many.las", Gzip(WithChannels(10, channels)));
    LoadOptions options;
    options.maxKeptBytes = std::uint64_t{16} << 10;
    const std::string error = testing::ErrorOf([&] { Sequence().Load(path, {}, options); });
    EXPECT_THAT(error, ::testing::StartsWith("Cannot load sequence file \"" + path + "\": line "));
    EXPECT_THAT(error, ::testing::EndsWith(": the sequence holds more channels, tracks and "
                                           "intensity-file devices than fit in 16 KiB"));
    EXPECT_EQ(kMaxKeptBytes, std::uint64_t{1} << 30);
    Sequence s;
    EXPECT_TRUE(s.Load(path));
    EXPECT_EQ(s.Channels().size(), 1000u);
}

TEST(SequenceModel, BuiltInMemoryLikeALoadedOne) {
    Sequence s;
    auto track = std::make_shared<Track>();
    track->SetName("T");
    auto channel = std::make_shared<Channel>("1");
    channel->SetDevice(DeviceAddress(7, 2, 0, 12, 3));
    track->AddChannel(channel);
    s.AddChannel(channel);
    s.AddTrack(track);
    auto first = std::make_shared<IntensityFile>(IntensityFileKind::Gridcraft, "a");
    auto second = std::make_shared<IntensityFile>(IntensityFileKind::Gridcraft, "b");
    s.SetIntensityFile(first, 0);
    s.SetIntensityFile(second, 0);
    EXPECT_EQ(s.GridcraftFile(), second);
    EXPECT_EQ(track->IntensityFiles(), std::vector<std::shared_ptr<IntensityFile>>{second});
    EXPECT_EQ(channel->SettingsKey(), "7:2::12");
    EXPECT_THROW(s.SetIntensityFile(first, 1), VtrError);
}

}  // namespace
}  // namespace vtr::seqlib
