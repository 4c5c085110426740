#pragma once

#include <cstdint>
#include <string>
#include <string_view>

// Writes valid sequence files of a chosen shape and size, for benchmarks and tests.
namespace vtr::seqlib::SequenceGenerator {

struct Options {
    int32_t channels = 8;
    int32_t eventsPerChannel = 4;
    int32_t tracks = 1;
    // The first channels, listed by every track (one shared object each). The others are
    // dealt out over the tracks in turn.
    int32_t sharedChannels = 0;
    // The channels after the shared ones that play another sequence (type 6).
    int32_t subsequenceChannels = 0;
    std::string subsequenceFile = "Sub.las";
    // The last channels, whose events all have level 0: never on.
    int32_t offChannels = 0;
    // A Gridcraft intensity file on the first track and a Novalux one on the last, with
    // this many devices each; a negative count writes no file.
    int32_t gridcraftDevices = -1;
    int32_t novaluxDevices = -1;
    std::string media;         // "" writes no media file
    std::string shellCommand;  // "" writes no shell command
    int32_t length = 180000;   // milliseconds
    bool compressed = false;   // gzip
    int compressionLevel = 6;
};

// What was written.
struct Written {
    std::uint64_t xmlBytes = 0;   // the XML text
    std::uint64_t fileBytes = 0;  // the file (the compressed size when compressed)
    std::int64_t events = 0;
};

// The sequence's XML text.
std::string Xml(const Options& options);

// Writes the file, gzip-compressed when options.compressed. Raises VtrError when the
// file cannot be written.
Written WriteFile(const std::string& path, const Options& options);

// The bytes as one gzip member, at zlib's compression level (0 to 9, -1 for its default):
// how the suite compresses sequence and edit files. Raises VtrError when zlib refuses.
std::string Gzip(std::string_view bytes, int level = -1);

// The events per channel that give a text of about targetBytes with that many channels.
int32_t EventsPerChannelFor(std::uint64_t targetBytes, int32_t channels);

// Channel i's device (counted from 0): the suite's own controllers, every channel on a
// different circuit (network i / 3840 % 16, unit 1 + i / 16 % 240, circuit 1 + i % 16).
int32_t ChannelNetwork(int32_t index);
int32_t ChannelUnit(int32_t index);
int32_t ChannelCircuit(int32_t index);

}  // namespace vtr::seqlib::SequenceGenerator
