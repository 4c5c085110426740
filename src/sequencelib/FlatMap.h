#pragma once

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <utility>
#include <vector>

#include "sequencelib/Channel.h"

namespace vtr::seqlib {

// A hash map in one flat array (open addressing, linear probing), for looking up the
// channels of sequences by their object or their address: one allocation for the whole map
// instead of one per entry, and entries side by side in memory. Entries are added, never
// removed; the array doubles when it is half full. An entry's place is the low bits of its
// key's hash, so the hash must spread keys there.
template <typename Key, typename Value, typename Hash>
class FlatMap {
  public:
    explicit FlatMap(std::size_t expected = 0) {
        Rehash(std::bit_ceil(std::max<std::size_t>(expected * 2, 16)));
    }

    // The value under the key; `value` is put there first when the key is new (second:
    // true).
    std::pair<Value*, bool> Insert(const Key& key, const Value& value) {
        if ((size_ + 1) * 2 > slots_.size())
            Rehash(slots_.size() * 2);
        Slot& slot = SlotOf(key);
        if (slot.used)
            return {&slot.value, false};
        slot = {key, value, true};
        ++size_;
        return {&slot.value, true};
    }

    // The value under the key, or nullptr.
    const Value* Find(const Key& key) const {
        const Slot& slot = const_cast<FlatMap*>(this)->SlotOf(key);
        return slot.used ? &slot.value : nullptr;
    }

    std::size_t Size() const { return size_; }

  private:
    struct Slot {
        Key key{};
        Value value{};
        bool used = false;
    };

    // The slot that holds the key, or the free one where it goes.
    Slot& SlotOf(const Key& key) {
        const std::size_t mask = slots_.size() - 1;
        std::size_t i = Hash{}(key)&mask;
        while (slots_[i].used && !(slots_[i].key == key))
            i = (i + 1) & mask;
        return slots_[i];
    }

    void Rehash(std::size_t capacity) {
        std::vector<Slot> old = std::move(slots_);
        slots_.assign(capacity, Slot{});
        for (const Slot& slot : old) {
            if (slot.used)
                SlotOf(slot.key) = slot;
        }
    }

    std::vector<Slot> slots_;
    std::size_t size_ = 0;
};

// Channel objects, by their address (mixed: addresses share their low bits).
struct ChannelAddressHash {
    std::size_t operator()(const Channel* channel) const noexcept {
        auto x = static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(channel));
        x = (x ^ (x >> 30)) * 0xBF58476D1CE4E5B9ull;
        x = (x ^ (x >> 27)) * 0x94D049BB133111EBull;
        return static_cast<std::size_t>(x ^ (x >> 31));
    }
};
template <typename Value>
using ChannelMap = FlatMap<const Channel*, Value, ChannelAddressHash>;

// Channels by the device address they drive (equal exactly when their settings keys are).
template <typename Value>
using SettingsMap = FlatMap<Channel::SettingsId, Value, Channel::SettingsIdHash>;

// Values for the channel objects of one sequence, as the checks that walk its tracks keep
// them: the sequence's own channels by their place in its channel list (an array, no
// hashing, and neighbours in the tracks are neighbours here), any other channel object
// through a ChannelMap.
template <typename Value>
class SequenceChannelMap {
  public:
    explicit SequenceChannelMap(const std::vector<std::shared_ptr<Channel>>& channels)
        : channels_(channels), entries_(channels.size()) {}

    // As FlatMap::Insert.
    std::pair<Value*, bool> Insert(const Channel* channel, const Value& value) {
        if (Entry* entry = Own(channel)) {
            if (entry->used)
                return {&entry->value, false};
            *entry = {value, true};
            return {&entry->value, true};
        }
        return others_.Insert(channel, value);
    }

    // The value for the channel, or nullptr.
    const Value* Find(const Channel* channel) const {
        if (const Entry* entry = const_cast<SequenceChannelMap*>(this)->Own(channel))
            return entry->used ? &entry->value : nullptr;
        return others_.Find(channel);
    }

  private:
    struct Entry {
        Value value{};
        bool used = false;
    };

    // The entry of one of the sequence's own channels; nullptr for any other channel.
    Entry* Own(const Channel* channel) {
        const std::size_t index = channel->IndexInSequence();
        return index < entries_.size() && channels_[index].get() == channel ? &entries_[index]
                                                                            : nullptr;
    }

    const std::vector<std::shared_ptr<Channel>>& channels_;
    std::vector<Entry> entries_;
    ChannelMap<Value> others_;
};

}  // namespace vtr::seqlib
