// vantori-make-installation: writes a whole generated installation of the suite into a
// folder and prints where everything is, for benchmarks and end-to-end tests.
#include <CLI/CLI.hpp>

#include <cstdio>
#include <exception>

#include "engine/VtrError.h"
#include "schedule/DateTime.h"
#include "vtrsupport/InstallationGenerator.h"
#include "vtrsupport/PeImage.h"

int main(int argc, char** argv) {
    CLI::App app{
        "Writes a generated installation of the suite: settings store, application "
        "folder, schedules, shows, sequences and media."};
    std::string root;
    std::string calendarStart;
    bool noApplicationFiles = false;
    vtr::gen::InstallationOptions options;
    app.add_option("folder", root, "Folder to write the installation into")->required();
    app.add_option("--shows", options.shows, "Shows, each scheduled once")
        ->capture_default_str()
        ->check(CLI::Range(0, 1008));
    app.add_option("--sequences-per-show", options.sequencesPerShow,
                   "Animation or musical sequences per show")
        ->capture_default_str()
        ->check(CLI::NonNegativeNumber);
    app.add_option("--channels", options.channelsPerSequence, "Channels per sequence")
        ->capture_default_str()
        ->check(CLI::Range(1, 1000000));
    app.add_option("--events", options.eventsPerChannel, "Events per channel")
        ->capture_default_str()
        ->check(CLI::Range(1, 1000000));
    app.add_option("--tracks", options.tracksPerSequence, "Tracks per sequence")
        ->capture_default_str()
        ->check(CLI::Range(1, 1000));
    app.add_option("--shared-track-channels", options.sharedTrackChannels,
                   "Channels every track of a sequence lists")
        ->capture_default_str()
        ->check(CLI::NonNegativeNumber);
    app.add_option("--background-channels", options.backgroundChannels,
                   "Channels of the background sequence every show plays")
        ->capture_default_str()
        ->check(CLI::Range(1, 1000000));
    app.add_option("--intensity-devices", options.intensityFileDevices,
                   "Gridcraft devices of every other animation sequence (-1: none)")
        ->capture_default_str();
    app.add_option("--calendar-days", options.calendarDays, "Dates in the calendar schedule")
        ->capture_default_str()
        ->check(CLI::Range(0, 3660));
    app.add_option("--calendar-start", calendarStart,
                   "First date of the calendar schedule, yyyy-mm-dd (default: today)");
    app.add_flag("--compressed", options.compressed, "Write the sequence files gzip-compressed");
    app.add_flag("--faults", options.faults, "Add a show of deliberate problems");
    app.add_flag(
        "--no-subsequences", [&](int64_t) { options.subsequences = false; }, "No subsequences");
    app.add_flag(
        "--no-edit-files", [&](int64_t) { options.editFiles = false; }, "No edit files");
    app.add_flag("--no-application-files", noApplicationFiles,
                 "Leave the application folder empty");
    CLI11_PARSE(app, argc, argv);

    try {
        if (!calendarStart.empty())
            options.calendarStart = vtr::DateTime::FromText(calendarStart);
        if (!noApplicationFiles) {
            options.writeApplicationFile = [](const std::string& path, const std::string& version) {
                vtr::testsupport::WritePeImage(path, version);
            };
        }
        const vtr::gen::Installation installation = vtr::gen::MakeInstallation(root, options);
        std::printf("registry: %s\n", installation.registryFile.c_str());
        std::printf("user data: %s\n", installation.userDataFolder.c_str());
        std::printf("shows: %zu\n", installation.showFiles.size());
        std::printf("sequence files: %zu (%.1f MB of XML, %.1f MB on disk, largest %.1f MB)\n",
                    installation.sequenceFiles.size(),
                    static_cast<double>(installation.sequenceXmlBytes) / 1e6,
                    static_cast<double>(installation.sequenceFileBytes) / 1e6,
                    static_cast<double>(installation.largestSequenceFileBytes) / 1e6);
        std::printf("channels: %lld, events: %lld\n", static_cast<long long>(installation.channels),
                    static_cast<long long>(installation.events));
        std::printf("verify with: vantori-verify --schedule --registry %s\n",
                    installation.registryFile.c_str());
        return 0;
    } catch (const vtr::VtrError& error) {
        std::fprintf(stderr, "vantori-make-installation: %s\n", error.Description().c_str());
    } catch (const std::exception& error) {
        std::fprintf(stderr, "vantori-make-installation: %s\n", error.what());
    }
    return 1;
}
