#include "sequencelib/FlatMap.h"

#include <gtest/gtest.h>

#include "sequencelib/Sequence.h"

#include <memory>
#include <string>
#include <vector>

namespace vtr::seqlib {
namespace {

struct IdentityHash {
    std::size_t operator()(int key) const noexcept { return static_cast<std::size_t>(key); }
};

TEST(FlatMap, KeepsTheFirstValueOfEachKeyThroughEveryGrowth) {
    FlatMap<int, int, IdentityHash> map;
    for (int key = 0; key < 5000; ++key) {
        const auto [value, isNew] = map.Insert(key * 7919, key);
        EXPECT_TRUE(isNew);
        EXPECT_EQ(*value, key);
    }
    EXPECT_EQ(map.Size(), 5000u);
    for (int key = 0; key < 5000; ++key) {
        const auto [value, isNew] = map.Insert(key * 7919, -1);
        EXPECT_FALSE(isNew) << key;
        EXPECT_EQ(*value, key) << "the first value stays";
        ASSERT_NE(map.Find(key * 7919), nullptr);
        EXPECT_EQ(*map.Find(key * 7919), key);
    }
    EXPECT_EQ(map.Find(1), nullptr);
    EXPECT_EQ(map.Size(), 5000u);
}

TEST(FlatMap, FindsChannelsByObjectAndByAddress) {
    std::vector<std::shared_ptr<Channel>> channels;
    ChannelMap<std::size_t> byObject;
    SettingsMap<std::size_t> byAddress;
    for (int i = 0; i < 3000; ++i) {
        auto channel = std::make_shared<Channel>(std::to_string(i));
        // Every third channel drives the same circuit as the one before it.
        const int circuit = i - (i % 3 == 2 ? 1 : 0);
        channel->SetDevice(DeviceAddress(1, 0, static_cast<uint8_t>(1 + circuit / 16 % 240),
                                         static_cast<int16_t>(circuit), 1));
        byObject.Insert(channel.get(), channels.size());
        byAddress.Insert(channel->SettingsIdentity(), channels.size());
        channels.push_back(channel);
    }
    EXPECT_EQ(byObject.Size(), 3000u);
    EXPECT_EQ(byAddress.Size(), 2000u);
    for (std::size_t i = 0; i < channels.size(); ++i) {
        EXPECT_EQ(*byObject.Find(channels[i].get()), i);
        EXPECT_EQ(*byAddress.Find(channels[i]->SettingsIdentity()), i % 3 == 2 ? i - 1 : i);
    }
    const Channel stranger("x");
    EXPECT_EQ(byObject.Find(&stranger), nullptr);
}

// The checks keep a value per channel object of a sequence's tracks. Tracks may list a
// channel object the sequence's list does not hold, or one another sequence holds at the
// same place: each is a channel of its own.
TEST(SequenceChannelMap, KeepsOwnAndForeignChannelsApart) {
    Sequence sequence;
    Sequence other;
    for (int i = 0; i < 40; ++i) {
        sequence.NewChannel("s" + std::to_string(i));
        other.NewChannel("o" + std::to_string(i));
    }
    const auto loose = std::make_shared<Channel>("loose");  // in no sequence's list
    SequenceChannelMap<int> map(sequence.Channels());
    for (int i = 0; i < 40; i += 2) {
        EXPECT_TRUE(map.Insert(sequence.Channels()[i].get(), i).second);
        EXPECT_TRUE(map.Insert(other.Channels()[i + 1].get(), 100 + i).second);
    }
    EXPECT_TRUE(map.Insert(loose.get(), 7).second);
    EXPECT_FALSE(map.Insert(loose.get(), 8).second);
    for (int i = 0; i < 40; ++i) {
        const int* own = map.Find(sequence.Channels()[i].get());
        const int* foreign = map.Find(other.Channels()[i].get());
        if (i % 2 == 0) {
            ASSERT_NE(own, nullptr) << i;
            EXPECT_EQ(*own, i);
            EXPECT_EQ(foreign, nullptr) << "another sequence's channel at the same place " << i;
        } else {
            EXPECT_EQ(own, nullptr) << i;
            ASSERT_NE(foreign, nullptr) << i;
            EXPECT_EQ(*foreign, 100 + i - 1);
        }
    }
    EXPECT_EQ(*map.Find(loose.get()), 7);
    EXPECT_FALSE(map.Insert(sequence.Channels()[0].get(), -1).second);
    EXPECT_EQ(*map.Find(sequence.Channels()[0].get()), 0) << "the first value stays";
}

}  // namespace
}  // namespace vtr::seqlib
