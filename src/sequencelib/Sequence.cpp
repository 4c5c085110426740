#include "sequencelib/Sequence.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <limits>
#include <new>
#include <string_view>
#include <utility>

#include "engine/VtrError.h"
#include "sequencelib/ByteSource.h"
#include "sequencelib/LoadClock.h"
#include "sequencelib/LoadFailure.h"
#include "sequencelib/XmlPieceReader.h"

namespace vtr::seqlib {

const char* IntensityFileKindName(IntensityFileKind kind) {
    return kind == IntensityFileKind::Gridcraft ? "Gridcraft" : "Novalux";
}

std::shared_ptr<IntensityFile> Sequence::IntensityFileOf(IntensityFileKind kind) const {
    return kind == IntensityFileKind::Gridcraft ? gridcraft_ : novalux_;
}

Channel& Sequence::NewChannel(std::string_view id) {
    // Blocks grow with the sequence, from a few channels to a thousand.
    constexpr std::size_t kFirstBlock = 16;
    constexpr std::size_t kLargestBlock = 1024;
    if (!channelBlock_ || channelBlock_->size() == channelBlock_->capacity()) {
        channelBlock_ = std::make_shared<std::vector<Channel>>();
        channelBlock_->reserve(std::clamp(channels_.size(), kFirstBlock, kLargestBlock));
    }
    Channel& channel = channelBlock_->emplace_back(id);
    AddChannel(std::shared_ptr<Channel>(channelBlock_, &channel));
    return channel;
}

void Sequence::SetIntensityFile(std::shared_ptr<IntensityFile> file, int32_t trackIndex) {
    if (!file)
        return;
    if (trackIndex < 0 || static_cast<std::size_t>(trackIndex) >= tracks_.size()) {
        Raise(ErrorNumbers::SubscriptOutOfRange, "Sequence.SetIntensityFile",
              "No track " + std::to_string(trackIndex) + " to carry the intensity file");
    }
    std::shared_ptr<IntensityFile>& slot =
        file->Kind() == IntensityFileKind::Gridcraft ? gridcraft_ : novalux_;
    if (slot) {
        if (auto previous = slot->CarryingTrack()) {
            auto& list = previous->intensityFiles_;
            list.erase(std::remove(list.begin(), list.end(), slot), list.end());
        }
    }
    const std::shared_ptr<Track>& track = tracks_[static_cast<std::size_t>(trackIndex)];
    file->track_ = track;
    file->trackIndex_ = trackIndex;
    track->intensityFiles_.push_back(file);
    slot = std::move(file);
}

namespace {

// Channel ids are usually the numbers 1, 2, 3...: hashed as their value, they fill the
// table in order, which keeps a large file's index in the cache. Other ids hash as text.
std::size_t ChannelIdHash(std::string_view id) noexcept {
    if (id.empty() || id.size() > 18)
        return std::hash<std::string_view>{}(id);
    std::size_t value = 0;
    for (const char c : id) {
        if (c < '0' || c > '9')
            return std::hash<std::string_view>{}(id);
        value = value * 10 + static_cast<std::size_t>(c - '0');
    }
    return value;
}

// Each channel's index in the sequence, by id: open addressing (linear probing) over eight
// bytes a channel, its id's hash and its index, the id itself compared in the channel. The
// table doubles when half full, moving hashes without reading an id again.
class ChannelIdIndex {
  public:
    static constexpr std::size_t kNone = static_cast<std::size_t>(-1);

    explicit ChannelIdIndex(const std::vector<std::shared_ptr<Channel>>& channels)
        : channels_(channels), slots_(64) {}

    // Adds the channel at `index` under its id; false when a channel has that id already.
    bool Insert(std::size_t index) {
        if ((size_ + 1) * 2 > slots_.size())
            Grow();
        const std::string_view id = channels_[index]->Id();
        const auto hash = static_cast<uint32_t>(ChannelIdHash(id));
        Slot& slot = SlotOf(id, hash);
        if (slot.index != kEmpty)
            return false;
        slot = {hash, static_cast<uint32_t>(index)};
        ++size_;
        return true;
    }

    std::size_t Find(std::string_view id) const {
        const Slot& slot =
            const_cast<ChannelIdIndex*>(this)->SlotOf(id, static_cast<uint32_t>(ChannelIdHash(id)));
        return slot.index == kEmpty ? kNone : slot.index;
    }

  private:
    static constexpr uint32_t kEmpty = UINT32_MAX;
    struct Slot {
        uint32_t hash = 0;
        uint32_t index = kEmpty;
    };

    Slot& SlotOf(std::string_view id, uint32_t hash) {
        const std::size_t mask = slots_.size() - 1;
        for (std::size_t i = hash & mask;; i = (i + 1) & mask) {
            Slot& slot = slots_[i];
            if (slot.index == kEmpty || (slot.hash == hash && channels_[slot.index]->Id() == id))
                return slot;
        }
    }

    void Grow() {
        std::vector<Slot> old(slots_.size() * 2);
        old.swap(slots_);
        const std::size_t mask = slots_.size() - 1;
        for (const Slot& slot : old) {
            if (slot.index == kEmpty)
                continue;
            std::size_t i = slot.hash & mask;
            while (slots_[i].index != kEmpty)
                i = (i + 1) & mask;
            slots_[i] = slot;
        }
    }

    const std::vector<std::shared_ptr<Channel>>& channels_;
    std::vector<Slot> slots_;
    std::size_t size_ = 0;
};

}  // namespace

// Turns the pieces of a sequence file into the sequence: channels as they come, tracks
// with their channel references (resolved once every channel is known), intensity files.
class SequenceBuilder final : public detail::XmlPieceHandler {
  public:
    SequenceBuilder(Sequence& sequence, const detail::XmlPieceReader& reader,
                    std::uint64_t maxKeptBytes)
        : sequence_(sequence), reader_(reader), maxKept_(maxKeptBytes) {}

    void EnterElement(const detail::XmlElements& tag) override {
        const Context parent = stack_.empty() ? Context::Document : stack_.back();
        stack_.push_back(Begin(parent, tag, tag[0]));
    }

    void CompleteElements(const detail::XmlElements& elements) override {
        for (uint32_t i = 0; i < elements.Size(); i = elements[i].end)
            Walk(stack_.back(), elements, i);
    }

    void LeaveElement() override {
        End(stack_.back());
        stack_.pop_back();
    }

    // Resolves the channel references that named a channel not yet read.
    void Finish() {
        for (const PendingReference& ref : pending_) {
            const std::size_t index = FindChannel(ref.id);
            if (index == kNoChannel) {
                detail::FailLoad(detail::PlaceText(ref.place),
                                 "the <channelRef> names no channel (id \"" + ref.id + "\")");
            }
            ref.track->channels_[ref.slot] = sequence_.Channels()[index];
        }
    }

  private:
    enum class Context {
        Document,
        Sequence,
        Channels,
        Channel,
        Tracks,
        Track,
        IntensityFile,
        Ignored
    };

    struct PendingReference {
        Track* track;
        std::size_t slot;
        std::string id;
        detail::TextPlace place;
    };

    using Elements = detail::XmlElements;
    using Element = detail::XmlElement;
    using Attribute = detail::XmlAttribute;

    static bool Is(std::string_view name, std::string_view literal) { return name == literal; }

    // Only the elements the sequence is read from are walked into, a few levels deep.
    void Walk(Context parent, const Elements& elements, uint32_t index) {
        const Element& element = elements[index];
        const Context context = Begin(parent, elements, element);
        if (context == Context::Channel) {
            // Events are most of the elements of most files, and nothing in them is walked
            // into: they are read here, without a turn through Begin for each.
            for (uint32_t child = index + 1; child < element.end; child = elements[child].end)
                ReadChannelChild(elements, elements[child]);
        } else if (context != Context::Ignored) {
            for (uint32_t child = index + 1; child < element.end; child = elements[child].end)
                Walk(context, elements, child);
        }
        End(context);
    }

    Context Begin(Context parent, const Elements& elements, const Element& element) {
        const std::string_view name = element.name;
        switch (parent) {
            case Context::Document:
                if (!Is(name, "sequence")) {
                    Fail(element,
                         "the root element is <" + std::string(name) + ">, not <sequence>");
                }
                ReadSequence(elements, element);
                return Context::Sequence;
            case Context::Sequence:
                if (Is(name, "channels"))
                    return Context::Channels;
                if (Is(name, "tracks"))
                    return Context::Tracks;
                return Context::Ignored;
            case Context::Channels:
                if (!Is(name, "channel"))
                    return Context::Ignored;
                BeginChannel(elements, element);
                return Context::Channel;
            case Context::Channel:
                ReadChannelChild(elements, element);
                return Context::Ignored;
            case Context::Tracks:
                if (!Is(name, "track"))
                    return Context::Ignored;
                BeginTrack(elements, element);
                return Context::Track;
            case Context::Track:
                if (Is(name, "channelRef")) {
                    ReadChannelRef(elements, element);
                } else if (Is(name, "intensityFile") && BeginIntensityFile(elements, element)) {
                    return Context::IntensityFile;
                }
                return Context::Ignored;
            case Context::IntensityFile:
                if (Is(name, "device"))
                    ReadDevice(elements, element);
                return Context::Ignored;
            case Context::Ignored:
                return Context::Ignored;
        }
        return Context::Ignored;
    }

    void End(Context context) {
        switch (context) {
            case Context::Channel:
                channel_ = nullptr;
                break;
            case Context::Track:
                track_ = nullptr;
                break;
            case Context::IntensityFile:
                intensityFile_ = nullptr;
                break;
            default:
                break;
        }
    }

    // The value of the element's attribute of that name ("" when it has none).
    static std::string_view ValueOf(const Elements& elements, const Element& element,
                                    std::string_view name) {
        const Attribute* attribute = elements.Find(element, name);
        return attribute != nullptr ? attribute->value : std::string_view();
    }

    static constexpr std::size_t kNoChannel = static_cast<std::size_t>(-1);

    // The index of the channel with that id. Tracks usually list channels in file order,
    // or every n-th of them, so the channel one stride on from the last found is tried
    // before the index.
    std::size_t FindChannel(std::string_view id) {
        const auto& channels = sequence_.Channels();
        std::size_t index = lastFound_ + lastStride_;
        if (index >= channels.size() || channels[index]->Id() != id) {
            index = indexById_.Find(id);
            if (index == ChannelIdIndex::kNone)
                return kNoChannel;
        }
        lastStride_ = index > lastFound_ ? index - lastFound_ : 1;
        lastFound_ = index;
        return index;
    }

    // --- Attributes ---

    [[noreturn]] void Fail(const Element& element, std::string cause) const {
        reader_.FailAt(element.at, std::move(cause));
    }
    [[noreturn]] void Fail(const Attribute& attribute, std::string cause) const {
        reader_.FailAt(attribute.at, std::move(cause));
    }

    // Counts what the sequence keeps for the element: however far a file's text expands, the
    // loader keeps no more than maxKeptBytes of it.
    void Keep(std::size_t bytes, const Element& element) {
        kept_ += bytes;
        if (kept_ > maxKept_)
            FailKept(element);
    }
    [[noreturn]] void FailKept(const Element& element) const;

    // Marks a known attribute as read; a second one of the same name is refused.
    void Once(unsigned& seen, unsigned bit, const Attribute& attribute, const char* element) const {
        if ((seen & bit) != 0)
            FailRepeated(attribute, element);
        seen |= bit;
    }
    [[noreturn]] void FailRepeated(const Attribute& attribute, const char* element) const;

    // The attribute's whole number, which must lie in [min, max].
    int64_t Whole(const Attribute& attribute, const char* element, int64_t min, int64_t max) const {
        int64_t value = 0;
        if (!ReadWhole(attribute.value, value) || value < min || value > max)
            FailNumber(attribute, element, min, max);
        return value;
    }
    [[noreturn]] void FailNumber(const Attribute& attribute, const char* element, int64_t min,
                                 int64_t max) const;

    // Digits, with a minus sign in front for a negative number; nothing else. Leading zeros
    // count for nothing; every range is within 32 bits, so a number of more than fifteen
    // digits after them is out of it and is not read on.
    static bool ReadWhole(std::string_view text, int64_t& value) {
        const char* p = text.data();
        const char* const end = p + text.size();
        const bool negative = p != end && *p == '-';
        p += negative ? 1 : 0;
        const char* const digits = p;
        while (p != end && *p == '0')
            ++p;
        const char* const significant = p;
        int64_t read = 0;
        for (unsigned digit; p != end && (digit = static_cast<unsigned char>(*p) - 0x30u) <= 9 &&
                             p - significant < 15;
             ++p) {
            read = read * 10 + digit;
        }
        value = negative ? -read : read;
        return p == end && p != digits;
    }

    static constexpr int64_t kLongMax = std::numeric_limits<int32_t>::max();
    static constexpr int64_t kLongMin = std::numeric_limits<int32_t>::min();
    static constexpr int64_t kIntegerMax = std::numeric_limits<int16_t>::max();
    static constexpr int64_t kLevelMax = 100;

    void ReadSequence(const Elements& elements, const Element& element) {
        unsigned seen = 0;
        for (const Attribute& a : elements.AttributesOf(element)) {
            const std::string_view name = a.name;
            if (Is(name, "formatVersion")) {
                Once(seen, 1, a, "sequence");
                sequence_.SetFormatVersion(static_cast<int32_t>(Whole(a, "sequence", 0, kLongMax)));
            } else if (Is(name, "length")) {
                Once(seen, 2, a, "sequence");
                sequence_.SetLength(static_cast<int32_t>(Whole(a, "sequence", 0, kLongMax)));
            } else if (Is(name, "media")) {
                Once(seen, 4, a, "sequence");
                sequence_.SetMedia(std::string(a.value));
            } else if (Is(name, "shellCommand")) {
                Once(seen, 8, a, "sequence");
                sequence_.SetShellCommand(std::string(a.value));
            }
        }
    }

    void BeginChannel(const Elements& elements, const Element& element) {
        const Attribute* idAttribute = nullptr;
        std::string_view name, subsequence;
        int64_t type = 0, deviceType = 0, network = 0, unit = 0, circuit = 0, circuits = 1;
        unsigned seen = 0;
        for (const Attribute& a : elements.AttributesOf(element)) {
            const std::string_view n = a.name;
            if (Is(n, "id")) {
                Once(seen, 1, a, "channel");
                idAttribute = &a;
            } else if (Is(n, "name")) {
                Once(seen, 2, a, "channel");
                name = a.value;
            } else if (Is(n, "type")) {
                Once(seen, 4, a, "channel");
                type = Whole(a, "channel", 0, kLongMax);
            } else if (Is(n, "subsequence")) {
                Once(seen, 8, a, "channel");
                subsequence = a.value;
            } else if (Is(n, "deviceType")) {
                Once(seen, 16, a, "channel");
                deviceType = Whole(a, "channel", 0, kLongMax);
            } else if (Is(n, "network")) {
                Once(seen, 32, a, "channel");
                network = Whole(a, "channel", 0, kLongMax);
            } else if (Is(n, "unit")) {
                Once(seen, 64, a, "channel");
                unit = Whole(a, "channel", 0, 255);
            } else if (Is(n, "circuit")) {
                Once(seen, 128, a, "channel");
                circuit = Whole(a, "channel", 0, kIntegerMax);
            } else if (Is(n, "circuits")) {
                Once(seen, 256, a, "channel");
                circuits = Whole(a, "channel", 0, kIntegerMax);
            }
        }
        if (idAttribute == nullptr || idAttribute->value.empty())
            Fail(element, "the <channel> has no id");
        Keep(kChannelBytes + name.size() + subsequence.size() + idAttribute->value.size(), element);
        Channel& channel = sequence_.NewChannel(idAttribute->value);
        if (!indexById_.Insert(sequence_.Channels().size() - 1))
            Fail(*idAttribute, "the channel id \"" + channel.Id() + "\" is repeated");
        channel.SetName(name);
        channel.SetChannelType(static_cast<int32_t>(type));
        channel.SetSubsequenceFile(subsequence);
        channel.SetDevice(DeviceAddress(static_cast<int32_t>(deviceType),
                                        static_cast<int32_t>(network), static_cast<uint8_t>(unit),
                                        static_cast<int16_t>(circuit),
                                        static_cast<int16_t>(circuits)));
        channel_ = &channel;
    }

    void ReadChannelChild(const Elements& elements, const Element& element) {
        if (Is(element.name, "event"))
            ReadEvent(elements, element);
    }

    void ReadEvent(const Elements& elements, const Element& element) {
        int64_t start = 0, end = 0, intensity = 0, from = 0, to = 0;
        bool hasIntensity = false;
        unsigned seen = 0;
        // Tested in the order events are written. (A switch on the first letter made a jump
        // whose target changed with every attribute, and most of those jumps mispredicted.)
        for (const Attribute& a : elements.AttributesOf(element)) {
            const std::string_view n = a.name;
            if (Is(n, "start")) {
                Once(seen, 1, a, "event");
                start = Whole(a, "event", kLongMin, kLongMax);
            } else if (Is(n, "end")) {
                Once(seen, 2, a, "event");
                end = Whole(a, "event", kLongMin, kLongMax);
            } else if (Is(n, "intensity")) {
                Once(seen, 4, a, "event");
                intensity = Whole(a, "event", 0, kLevelMax);
                hasIntensity = true;
            } else if (Is(n, "from")) {
                Once(seen, 8, a, "event");
                from = Whole(a, "event", 0, kLevelMax);
            } else if (Is(n, "to")) {
                Once(seen, 16, a, "event");
                to = Whole(a, "event", 0, kLevelMax);
            }
        }
        // On when the level is positive over part of [0, length).
        const int64_t level = hasIntensity ? intensity : std::max(from, to);
        if (level > 0 && std::max<int64_t>(start, 0) < std::min<int64_t>(end, sequence_.Length())) {
            channel_->SetEverOn(true);
        }
    }

    void BeginTrack(const Elements& elements, const Element& element) {
        Keep(kTrackBytes, element);
        auto track = std::make_shared<Track>();
        track->SetLength(sequence_.Length());
        unsigned seen = 0;
        for (const Attribute& a : elements.AttributesOf(element)) {
            const std::string_view n = a.name;
            if (Is(n, "name")) {
                Once(seen, 1, a, "track");
                track->SetName(std::string(a.value));
            } else if (Is(n, "length")) {
                Once(seen, 2, a, "track");
                track->SetLength(static_cast<int32_t>(Whole(a, "track", 0, kLongMax)));
            }
        }
        track_ = track.get();
        trackIndex_ = static_cast<int32_t>(sequence_.Tracks().size());
        sequence_.AddTrack(std::move(track));
    }

    void ReadChannelRef(const Elements& elements, const Element& element) {
        const std::string_view id = ValueOf(elements, element, "id");
        Keep(sizeof(std::shared_ptr<Channel>), element);
        if (const std::size_t index = FindChannel(id); index != kNoChannel) {
            track_->AddChannel(sequence_.Channels()[index]);
            return;
        }
        // Perhaps a channel further on: resolved when the file is read.
        Keep(sizeof(PendingReference) + id.size(), element);
        pending_.push_back(
            {track_, track_->channels_.size(), std::string(id), reader_.PlaceAt(element.at)});
        track_->channels_.push_back(nullptr);
    }

    bool BeginIntensityFile(const Elements& elements, const Element& element) {
        const std::string_view kind = ValueOf(elements, element, "kind");
        IntensityFileKind fileKind;
        if (kind == "Gridcraft") {
            fileKind = IntensityFileKind::Gridcraft;
        } else if (kind == "Novalux") {
            fileKind = IntensityFileKind::Novalux;
        } else {
            return false;
        }
        if (sequence_.IntensityFileOf(fileKind)) {
            Fail(element, std::string("a second ") + IntensityFileKindName(fileKind) +
                              " intensity file (a sequence has at most one of each kind)");
        }
        Keep(kIntensityFileBytes, element);
        auto file = std::make_shared<IntensityFile>(
            fileKind, std::string(ValueOf(elements, element, "name")));
        intensityFile_ = file.get();
        sequence_.SetIntensityFile(std::move(file), trackIndex_);
        return true;
    }

    void ReadDevice(const Elements& elements, const Element& element) {
        int64_t deviceType = 0, network = 0, unit = 0, start = 0, count = 1;
        unsigned seen = 0;
        for (const Attribute& a : elements.AttributesOf(element)) {
            const std::string_view n = a.name;
            if (Is(n, "deviceType")) {
                Once(seen, 1, a, "device");
                deviceType = Whole(a, "device", 0, kLongMax);
            } else if (Is(n, "network")) {
                Once(seen, 2, a, "device");
                network = Whole(a, "device", 0, kLongMax);
            } else if (Is(n, "unit")) {
                Once(seen, 4, a, "device");
                unit = Whole(a, "device", 0, 255);
            } else if (Is(n, "start")) {
                Once(seen, 8, a, "device");
                start = Whole(a, "device", 0, kIntegerMax);
            } else if (Is(n, "count")) {
                Once(seen, 16, a, "device");
                count = Whole(a, "device", 0, kIntegerMax);
            }
        }
        Keep(sizeof(DeviceAddress), element);
        intensityFile_->AddDevice(DeviceAddress(
            static_cast<int32_t>(deviceType), static_cast<int32_t>(network),
            static_cast<uint8_t>(unit), static_cast<int16_t>(start), static_cast<int16_t>(count)));
    }

    Sequence& sequence_;
    const detail::XmlPieceReader& reader_;
    std::vector<Context> stack_;
    // Each channel's index in the sequence, by id.
    ChannelIdIndex indexById_{sequence_.Channels()};
    std::size_t lastFound_ = 0;
    std::size_t lastStride_ = 1;
    Channel* channel_ = nullptr;
    Track* track_ = nullptr;
    int32_t trackIndex_ = -1;
    IntensityFile* intensityFile_ = nullptr;
    std::vector<PendingReference> pending_;
    std::uint64_t maxKept_;
    std::uint64_t kept_ = 0;

    // What an object costs besides its texts: the object, its control block, its place in the
    // sequence's list (and for a channel, its place in the index of ids).
    static constexpr std::size_t kChannelBytes = sizeof(Channel) + 64;
    static constexpr std::size_t kTrackBytes = sizeof(Track) + 48;
    static constexpr std::size_t kIntensityFileBytes = sizeof(IntensityFile) + 32;
};

void SequenceBuilder::FailKept(const Element& element) const {
    Fail(element,
         "the sequence holds more channels, tracks and intensity-file devices than fit "
         "in " +
             detail::ByteCountText(maxKept_));
}

void SequenceBuilder::FailRepeated(const Attribute& attribute, const char* element) const {
    Fail(attribute,
         "the attribute " + std::string(attribute.name) + " of <" + element + "> is repeated");
}

void SequenceBuilder::FailNumber(const Attribute& attribute, const char* element, int64_t min,
                                 int64_t max) const {
    Fail(attribute, "the attribute " + std::string(attribute.name) + "=\"" +
                        std::string(attribute.value) + "\" of <" + element +
                        "> is not a whole number from " + std::to_string(min) + " to " +
                        std::to_string(max));
}

namespace {

std::string LoadErrorText(const std::string& fileName, const detail::LoadFailure& failure) {
    std::string text = "Cannot load sequence file \"" + fileName + "\": ";
    if (!failure.where.empty())
        text += failure.where + ": ";
    return text + failure.cause;
}

}  // namespace

bool Sequence::Load(const std::string& fileName, const ProgressCallback& progress,
                    const LoadOptions& options) {
    Sequence loaded;
    loaded.fileName_ = fileName;
    try {
        detail::LoadClock clock(options.keepGoing, options.pollInterval);
        const auto source = detail::OpenDecodedFile(fileName, options.maxExpandedBytes);
        int32_t told = -1;
        // The caller may have let its user cancel while it was told (a load that is done
        // stays done).
        const auto tell = [&](int32_t percent) {
            if (progress && percent > told) {
                told = percent;
                progress(percent);
                if (percent < 100)
                    clock.Ask();
            }
        };
        tell(0);
        detail::XmlPieceReader::Options readerOptions;
        readerOptions.pieceBytes = options.pieceBytes;
        readerOptions.maxDepth = options.maxDepth;
        readerOptions.plainMarkup = options.plainMarkup;
        readerOptions.tick = [&clock] { clock.Tick(); };
        detail::XmlPieceReader reader(*source, std::move(readerOptions));
        SequenceBuilder builder(loaded, reader, options.maxKeptBytes);
        reader.Run(builder, [&] {
            const std::uint64_t total = source->FileBytesTotal();
            if (total == 0)
                return;
            const std::uint64_t done = std::min(source->FileBytesConsumed(), total);
            tell(static_cast<int32_t>(std::min<std::uint64_t>(99, done * 100 / total)));
        });
        builder.Finish();
        tell(100);
    } catch (const detail::LoadStopped&) {
        return false;
    } catch (const detail::LoadFailure& failure) {
        Raise(ErrorNumbers::UserMessage, "Sequence.Load", LoadErrorText(fileName, failure));
    } catch (const std::bad_alloc&) {
        Raise(ErrorNumbers::UserMessage, "Sequence.Load",
              LoadErrorText(fileName, {{}, "not enough memory to load it"}));
    }
    *this = std::move(loaded);
    return true;
}

}  // namespace vtr::seqlib
