#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "schedule/DateTime.h"

// Writes a whole installation of the suite into a folder, for benchmarks, end-to-end tests
// and demonstrations: a settings store file naming the suite's folders and networks, an
// application folder, a user-data folder with weekly and calendar schedules, show files and
// the shell-command map, sequence files (with shared channels, intensity files,
// subsequences, edit files and media files) and a media folder. Sizes are chosen by the
// options; the same options always give the same files.
//
//   vtr::gen::InstallationOptions options;
//   options.shows = 20;
//   options.sequencesPerShow = 12;
//   const auto installation = vtr::gen::MakeInstallation("/tmp/big", options);
//   // vantori-verify --schedule --registry <installation.registryFile>
namespace vtr::gen {

// Writes one application file with the version it must carry ("a.b.c.d"); the generator
// asks for every file the suite installs.
using ApplicationFileWriter =
    std::function<void(const std::string& path, const std::string& version)>;

struct InstallationOptions {
    // Shows, each scheduled once in the week. Even shows play animation sequences (their
    // Main section), odd ones musical sequences with media files and shell commands and an
    // interactive group; all share one background sequence.
    int32_t shows = 2;
    // Animation or musical sequences per show (besides the background, startup and
    // shutdown sequences, and the interactive group's).
    int32_t sequencesPerShow = 6;
    int32_t channelsPerSequence = 64;
    int32_t eventsPerChannel = 16;
    int32_t tracksPerSequence = 2;
    // Channels of each sequence that every one of its tracks lists (one shared object).
    int32_t sharedTrackChannels = 2;
    // Channels of the background sequence. Channel n drives the same circuit in every
    // sequence, so each sequence shares this many circuits with the background and the
    // intersequence check reports them.
    int32_t backgroundChannels = 4;
    // Gridcraft devices of every other animation sequence (none when negative).
    int32_t intensityFileDevices = 3;
    // Each animation show plays one shared subsequence from its first sequence.
    bool subsequences = true;
    // Each musical show lists its first sequence through an edit file ("vtredit").
    bool editFiles = true;
    // Dates of the calendar schedule, one show each, from calendarStart (default: today).
    int32_t calendarDays = 2;
    std::optional<DateTime> calendarStart;
    // Sequence files gzip-compressed.
    bool compressed = false;
    // Adds one show of deliberate problems: a missing and an unloadable sequence, a missing
    // media file, a subsequence cycle and a self-reference, a channel on network 16, an
    // intensity file running past circuit 32767, overlapping intensity files, a trigger
    // on an undefined network and a shell command the map does not know.
    bool faults = false;
    // Writes the application files; without one the application folder stays empty.
    ApplicationFileWriter writeApplicationFile;
};

// What was written.
struct Installation {
    std::string root;
    std::string registryFile;  // the settings store: pass it as --registry
    std::string appFolder;
    std::string userDataFolder;
    std::string nonMediaFolder;  // where the sequence files are
    std::string mediaFolder;
    std::string weeklyScheduleFile;
    std::string yearlyScheduleFile;
    std::vector<std::string> showFiles;      // the last one is the faults show, if any
    std::vector<std::string> sequenceFiles;  // every sequence file (not the edit files)
    std::uint64_t sequenceXmlBytes = 0;      // the XML text of all sequence files
    std::uint64_t sequenceFileBytes = 0;     // their sizes on disk
    std::uint64_t largestSequenceFileBytes = 0;
    std::int64_t channels = 0;  // channels of all sequence files
    std::int64_t events = 0;
};

// Writes the installation below `root`, created when missing (files of an earlier installation
// there are replaced). Every path it writes is absolute, however `root` is given. Raises
// VtrError when a file cannot be written.
Installation MakeInstallation(const std::string& root, const InstallationOptions& options);

// The settings store text of an installation in those folders (the format of a registry
// export): the suite's folders, post-install state, media-player version, sixteen
// networks of the suite's own controllers on ports 1 to 16 and the DMX universes given
// with an adapter each.
std::string SettingsStoreText(const Installation& installation,
                              const std::vector<int32_t>& dmxUniverses);

}  // namespace vtr::gen
