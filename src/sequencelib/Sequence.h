#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "sequencelib/Channel.h"
#include "sequencelib/IntensityFile.h"
#include "sequencelib/Track.h"

namespace vtr::seqlib {

// Told the percent of a load done: it rises from 0 to 100, each value at most once.
using ProgressCallback = std::function<void(int32_t percent)>;

// The most a compressed sequence may expand to; a larger one is refused.
inline constexpr std::uint64_t kMaxExpandedBytes = std::uint64_t{2} << 30;

// The deepest nesting of elements a sequence file may have (the sequence element is at 1;
// the suite's own files never go past 4).
inline constexpr int32_t kMaxNestingDepth = 100000;

// The most memory a loaded sequence may keep for its channels, tracks and intensity files
// (a channel costs some 200 bytes: five million channels fit).
inline constexpr std::uint64_t kMaxKeptBytes = std::uint64_t{1} << 30;

// How a load reads and when it stops. Each load has its own: loads of different sequences
// may run on different threads at once, each calling back on its own thread.
struct LoadOptions {
    // How much of the file is parsed at a time. The loader never holds the parse tree of
    // more than about this much text, whatever the file's size. A quarter of a megabyte
    // keeps the text and its elements in the processor's cache as they are read, which
    // makes a load both smaller and faster than with larger pieces.
    std::size_t pieceBytes = std::size_t{256} << 10;
    // Decompressed data beyond this is refused.
    std::uint64_t maxExpandedBytes = kMaxExpandedBytes;
    // Elements nested deeper than this are refused.
    int32_t maxDepth = kMaxNestingDepth;
    // A sequence that would keep more than this is refused as it is read, however small its
    // file (compressed text of a few megabytes can hold hundreds of millions of elements).
    std::uint64_t maxKeptBytes = kMaxKeptBytes;
    // Plainly written markup is read in one pass of its own; off, pugixml reads every piece
    // (the same sequence, the same errors, more slowly).
    bool plainMarkup = true;
    // Asked as the load goes, after each percent told and at least once per pollInterval
    // of work in between (the loading thread's processor time): false stops the load.
    std::function<bool()> keepGoing;
    std::chrono::milliseconds pollInterval{50};
};

// A sequence ("lms" musical or "las" animation file, plain or gzip-compressed): its
// channels in file order, its tracks, its intensity files, its media file and shell
// command. It keeps what the checks ask about, not the events.
class Sequence {
  public:
    // Reads the file; true once it is loaded. Raises VtrError (number 37, source
    // "Sequence.Load") naming the file, the place in it and the cause when the file cannot
    // be loaded. False when options.keepGoing stopped the load, which says nothing of the
    // file. Either way the sequence is left as it was.
    bool Load(const std::string& fileName, const ProgressCallback& progress = {},
              const LoadOptions& options = {});

    // The file last loaded ("" for a sequence built in memory).
    const std::string& FileName() const { return fileName_; }

    int32_t FormatVersion() const { return formatVersion_; }
    void SetFormatVersion(int32_t version) { formatVersion_ = version; }

    // The sequence's length in milliseconds.
    int32_t Length() const { return length_; }
    void SetLength(int32_t length) { length_ = length; }

    // The media (audio or video) file as the sequence names it; "" when it has none.
    const std::string& Media() const { return media_; }
    void SetMedia(std::string media) { media_ = std::move(media); }
    bool HasMedia() const { return !media_.empty(); }

    // The shell-command identifier; the sequence uses shell commands when it is not "".
    const std::string& ShellCommand() const { return shellCommand_; }
    void SetShellCommand(std::string id) { shellCommand_ = std::move(id); }
    bool UsesShellCommands() const { return !shellCommand_.empty(); }

    // Every channel of the file, in file order, whether or not a track lists it.
    const std::vector<std::shared_ptr<Channel>>& Channels() const { return channels_; }
    void AddChannel(std::shared_ptr<Channel> channel) {
        channel->SetIndexInSequence(static_cast<uint32_t>(channels_.size()));
        channels_.push_back(std::move(channel));
    }
    // Adds a new channel of that id, kept with the channels made before it: channels are
    // made in blocks, one allocation for many, side by side in memory.
    Channel& NewChannel(std::string_view id);

    const std::vector<std::shared_ptr<Track>>& Tracks() const { return tracks_; }
    void AddTrack(std::shared_ptr<Track> track) { tracks_.push_back(std::move(track)); }

    // The sequence's intensity file of each kind, or nullptr.
    std::shared_ptr<IntensityFile> GridcraftFile() const { return gridcraft_; }
    std::shared_ptr<IntensityFile> NovaluxFile() const { return novalux_; }
    std::shared_ptr<IntensityFile> IntensityFileOf(IntensityFileKind kind) const;

    // Makes the file the sequence's one file of its kind, carried by the track at the
    // index (which must exist). A file of the same kind that was there is replaced.
    void SetIntensityFile(std::shared_ptr<IntensityFile> file, int32_t trackIndex);

  private:
    std::string fileName_;
    int32_t formatVersion_ = 0;
    int32_t length_ = 0;
    std::string media_;
    std::string shellCommand_;
    std::vector<std::shared_ptr<Channel>> channels_;
    // The block NewChannel fills (its room reserved, so channels never move).
    std::shared_ptr<std::vector<Channel>> channelBlock_;
    std::vector<std::shared_ptr<Track>> tracks_;
    std::shared_ptr<IntensityFile> gridcraft_;
    std::shared_ptr<IntensityFile> novalux_;
};

}  // namespace vtr::seqlib
