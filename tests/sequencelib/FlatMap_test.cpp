#include "sequencelib/FlatMap.h"

#include <gtest/gtest.h>

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

}  // namespace
}  // namespace vtr::seqlib
