#include "vtrsupport/InstallationGenerator.h"

#include <algorithm>
#include <filesystem>
#include <memory>
#include <set>

#include "checks/installation/CheckAppFileExists.h"
#include "checks/installation/CheckAppPathExists.h"
#include "engine/VtrError.h"
#include "environment/RegistryFile.h"
#include "schedule/Schedule.h"
#include "schedule/WeekTime.h"
#include "schedule/YearSchedule.h"
#include "show/Serialize.h"
#include "show/Show.h"
#include "show/TriggeredSequences.h"
#include "show/WholeFile.h"
#include "vtrsupport/SequenceGenerator.h"

namespace vtr::gen {

namespace {

namespace fs = std::filesystem;
namespace seqgen = seqlib::SequenceGenerator;

constexpr const char* kSource = "InstallationGenerator.MakeInstallation";
constexpr int32_t kShowSlotSeconds = 600;  // one show every ten minutes of the week
constexpr int32_t kShowSeconds = 540;
constexpr int32_t kWeekSeconds = 604800;

std::string WithSeparator(const fs::path& folder) {
    std::string text = folder.string();
    if (text.empty() || (text.back() != '/' && text.back() != '\\'))
        text += static_cast<char>(fs::path::preferred_separator);
    return text;
}

void WriteText(const std::string& path, const std::string& text) {
    const int32_t error = WriteWholeFile(path, text);
    if (error != 0)
        Raise(ErrorNumbers::UserMessage, kSource,
              "Cannot write \"" + path + "\": " + FileErrorDescription(error));
}

WeekTimePtr WeekTimeAt(int32_t seconds) {
    auto time = std::make_shared<WeekTime>();
    time->SetTimeVal(seconds);
    return time;
}

// The settings, schedules and shows name everything by absolute path, so that the
// installation verifies the same from any folder.
fs::path AbsoluteFolder(const std::string& root) {
    std::error_code error;
    const fs::path absolute = fs::absolute(fs::path(root), error);
    if (error)
        Raise(ErrorNumbers::UserMessage, kSource,
              "Cannot find the folder \"" + root + "\": " + error.message());
    return absolute.lexically_normal();
}

class Writer {
  public:
    Writer(const std::string& rootName, const InstallationOptions& options) : options_(options) {
        const fs::path root = AbsoluteFolder(rootName);
        installation_.root = WithSeparator(root);
        installation_.registryFile = installation_.root + "registry.reg";
        installation_.appFolder = WithSeparator(root / "app");
        installation_.userDataFolder = WithSeparator(root / "data");
        installation_.nonMediaFolder = WithSeparator(root / "data" / "sequences");
        installation_.mediaFolder = WithSeparator(root / "data" / "media");
        installation_.weeklyScheduleFile = installation_.userDataFolder + "weeksched.lsc";
        installation_.yearlyScheduleFile = installation_.userDataFolder + "yearsched.lsc";
        for (const std::string& folder :
             {installation_.appFolder, installation_.nonMediaFolder, installation_.mediaFolder}) {
            std::error_code error;
            fs::create_directories(folder, error);
            if (error)
                Raise(ErrorNumbers::UserMessage, kSource,
                      "Cannot make the folder \"" + folder + "\": " + error.message());
        }
    }

    Installation Write() {
        WriteApplicationFiles();
        const std::string glow = WriteBackground();
        const std::string sub = options_.subsequences ? WriteSubsequence() : std::string();
        std::string shellMap;
        for (int32_t k = 0; k < std::max(0, options_.shows); ++k) {
            if (k % 2 == 0) {
                WriteAnimationShow(k, glow, sub);
            } else {
                WriteMusicalShow(k, glow);
                shellMap +=
                    (shellMap.empty() ? "(" : ",") + std::string("(") + std::to_string(k) + "," +
                    Serialize::EscapeText("echo Show " + std::to_string(k) + ", begins") + ")";
            }
        }
        if (options_.faults)
            WriteFaultsShow(glow);
        WriteText(installation_.userDataFolder + "shellcmd.map",
                  shellMap.empty() ? "()" : shellMap + ")");
        WriteSchedules();
        WriteText(installation_.registryFile,
                  SettingsStoreText(installation_,
                                    std::vector<int32_t>(universes_.begin(), universes_.end())));
        return installation_;
    }

  private:
    std::string SequencePath(const std::string& name) const {
        return installation_.nonMediaFolder + name;
    }

    seqgen::Options BaseOptions(int32_t channels) const {
        seqgen::Options o;
        o.channels = std::max(1, channels);
        o.eventsPerChannel = std::max(1, options_.eventsPerChannel);
        o.tracks = std::max(1, options_.tracksPerSequence);
        o.sharedChannels = std::clamp(options_.sharedTrackChannels, 0, o.channels);
        o.compressed = options_.compressed;
        return o;
    }

    std::string WriteSequence(const std::string& name, const seqgen::Options& o) {
        const std::string path = SequencePath(name);
        const seqgen::Written written = seqgen::WriteFile(path, o);
        Count(path, written.xmlBytes, written.fileBytes, o.channels, written.events);
        // The DMX universes the intensity files use need an adapter to be defined.
        for (int32_t d = 0; d < o.gridcraftDevices; ++d)
            universes_.insert(1 + d / 170);
        for (int32_t d = 0; d < o.novaluxDevices; ++d)
            universes_.insert(500 + d);
        return path;
    }

    void Count(const std::string& path, std::uint64_t xmlBytes, std::uint64_t fileBytes,
               int64_t channels, int64_t events) {
        installation_.sequenceFiles.push_back(path);
        installation_.sequenceXmlBytes += xmlBytes;
        installation_.sequenceFileBytes += fileBytes;
        installation_.largestSequenceFileBytes =
            std::max(installation_.largestSequenceFileBytes, fileBytes);
        installation_.channels += channels;
        installation_.events += events;
    }

    // A small sequence written as text, for the faults the generator does not make.
    std::string WriteSequenceText(const std::string& name, const std::string& text,
                                  int64_t channels) {
        const std::string path = SequencePath(name);
        WriteText(path, text);
        Count(path, text.size(), text.size(), channels, channels);
        return path;
    }

    void WriteApplicationFiles() {
        if (!options_.writeApplicationFile)
            return;
        for (const ApplicationFile& file : CheckAppPathExists::ApplicationFiles()) {
            options_.writeApplicationFile(
                installation_.appFolder + file.name,
                file.expectedVersion != nullptr ? file.expectedVersion : DefaultExpectedVersion());
        }
    }

    std::string WriteBackground() {
        seqgen::Options o = BaseOptions(options_.backgroundChannels);
        o.tracks = 1;
        o.sharedChannels = 0;
        o.novaluxDevices = 1;
        return WriteSequence("Glow.las", o);
    }

    std::string WriteSubsequence() {
        seqgen::Options o = BaseOptions(std::max(1, options_.channelsPerSequence / 4));
        return WriteSequence("Sub.las", o);
    }

    std::string WriteSide(const std::string& name) {
        return WriteSequence(name, BaseOptions(std::max(1, options_.channelsPerSequence / 2)));
    }

    std::string ShowPath(int32_t k) const {
        return installation_.userDataFolder + "Show" + std::to_string(k) + ".lss";
    }

    void SaveShow(const std::string& path, const Show& show) {
        WriteText(path, ShowFunctions::ShowToText(show));
        installation_.showFiles.push_back(path);
    }

    void WriteAnimationShow(int32_t k, const std::string& glow, const std::string& sub) {
        const std::string id = std::to_string(k);
        Show show;
        show.Background()->List() = {glow};
        show.Startup()->List() = {WriteSide("Intro-" + id + ".las")};
        show.Shutdown()->List() = {WriteSide("Outro-" + id + ".las")};
        for (int32_t i = 1; i <= std::max(0, options_.sequencesPerShow); ++i) {
            seqgen::Options o = BaseOptions(options_.channelsPerSequence);
            if (i % 2 == 1)
                o.gridcraftDevices = options_.intensityFileDevices;
            if (i == 1 && !sub.empty()) {
                o.subsequenceChannels = 1;
                o.subsequenceFile = sub;
                o.channels += 1;
            }
            show.Main()->List().push_back(
                WriteSequence("Anim-" + id + "-" + std::to_string(i) + ".las", o));
        }
        show.SetStartupType(1);
        show.SetStartupTrigger(TriggerFunctions::CreateTrigger(k % 16, 1, 1, "Start " + id));
        SaveShow(ShowPath(k), show);
    }

    void WriteMusicalShow(int32_t k, const std::string& glow) {
        const std::string id = std::to_string(k);
        Show show;
        show.Background()->List() = {glow};
        show.Startup()->List() = {WriteSide("Intro-" + id + ".las")};
        show.Shutdown()->List() = {WriteSide("Outro-" + id + ".las")};
        for (int32_t i = 1; i <= std::max(0, options_.sequencesPerShow); ++i) {
            const std::string name = "Song-" + id + "-" + std::to_string(i);
            seqgen::Options o = BaseOptions(options_.channelsPerSequence);
            o.media = name + ".mp3";
            o.shellCommand = id;
            const std::string path = WriteSequence(name + ".lms", o);
            WriteText(installation_.mediaFolder + o.media, "ID3");
            if (i == 1 && options_.editFiles) {
                const std::string edit = SequencePath(name + ".vtredit");
                WriteText(edit,
                          "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<sequenceEdit "
                          "formatVersion=\"1\">\n  <playback file=\"" +
                              name + ".lms\"/>\n</sequenceEdit>\n");
                show.Musical()->List().push_back(edit);
            } else {
                show.Musical()->List().push_back(path);
            }
        }
        auto group = std::make_shared<InteractiveGroup>();
        group->SetName("Porch " + id);
        group->AddTriggeredSequences(TriggeredSequencesFunctions::CreateTriggeredSequences(
            TriggerFunctions::CreateTrigger(k % 16, 2, 1, "Button " + id),
            {WriteSide("Door-" + id + ".las")}));
        show.InteractiveGroups().push_back(group);
        SaveShow(ShowPath(k), show);
    }

    void WriteFaultsShow(const std::string& glow) {
        const auto channel = [](int id, const std::string& name, const std::string& settings) {
            return "    <channel id=\"" + std::to_string(id) + "\" name=\"" + name + "\" " +
                   settings + ">\n      <event start=\"0\" end=\"1000\" intensity=\"50\"/>\n" +
                   "    </channel>\n";
        };
        const auto sequence = [](const std::string& attributes, const std::string& channels,
                                 const std::string& refs, const std::string& files) {
            return "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<sequence formatVersion=\"1\" "
                   "length=\"60000\" " +
                   attributes + ">\n  <channels>\n" + channels +
                   "  </channels>\n  <tracks>\n    <track name=\"Faults\">\n" + refs + files +
                   "    </track>\n  </tracks>\n</sequence>\n";
        };
        const std::string ref1 = "      <channelRef id=\"1\"/>\n";
        const std::string ref12 = ref1 + "      <channelRef id=\"2\"/>\n";
        const std::string cycleA = SequencePath("CycleA.las");
        const std::string cycleB = SequencePath("CycleB.las");
        WriteSequenceText(
            "CycleA.las",
            sequence(
                "",
                channel(1, "Plays B", "type=\"6\" subsequence=\"" + cycleB + "\"") +
                    channel(2, "Far", "deviceType=\"1\" network=\"16\" unit=\"1\" circuit=\"2\""),
                ref12, ""),
            2);
        WriteSequenceText(
            "CycleB.las",
            sequence("",
                     channel(1, "Plays A", "type=\"6\" subsequence=\"" + cycleA + "\"") +
                         channel(2, "Plays itself", "type=\"6\" subsequence=\"" + cycleB + "\""),
                     ref12, ""),
            2);
        const std::string overflow = WriteSequenceText(
            "Overflow.las",
            sequence(
                "", channel(1, "Bell", "deviceType=\"7\" network=\"1\" circuit=\"5\""), ref1,
                "      <intensityFile kind=\"Gridcraft\" name=\"Wide.gci\">\n"
                "        <device deviceType=\"7\" network=\"1\" start=\"1\" count=\"10\"/>\n"
                "      </intensityFile>\n"
                "      <intensityFile kind=\"Novalux\" name=\"Over.nvx\">\n"
                "        <device deviceType=\"7\" network=\"1\" start=\"8\" count=\"4\"/>\n"
                "        <device deviceType=\"7\" network=\"1\" start=\"32000\" count=\"1000\"/>\n"
                "      </intensityFile>\n"),
            1);
        universes_.insert(1);
        const std::string noMedia = WriteSequenceText(
            "NoMedia.lms",
            sequence("media=\"Missing.mp3\" shellCommand=\"999\"",
                     channel(1, "Beat", "deviceType=\"1\" unit=\"1\" circuit=\"1\""), ref1, ""),
            1);
        const std::string broken = SequencePath("Broken.lms");
        WriteText(broken, "<sequence formatVersion=\"1\"><channels>");
        const std::string blank = SequencePath("Blank.vtredit");
        WriteText(blank,
                  "<sequenceEdit formatVersion=\"1\"><playback file=\"\"/></sequenceEdit>\n");

        Show show;
        show.Background()->List() = {glow, SequencePath("Missing.las")};
        show.Main()->List() = {cycleA};
        show.Musical()->List() = {noMedia, broken, blank};
        auto group = std::make_shared<InteractiveGroup>();
        group->SetName("Faults");
        group->AddTriggeredSequences(TriggeredSequencesFunctions::CreateTriggeredSequences(
            TriggerFunctions::CreateTrigger(16, 3, 1, "Nowhere"), {overflow}));
        show.InteractiveGroups().push_back(group);
        SaveShow(installation_.userDataFolder + "Faults.lss", show);
    }

    void WriteSchedules() {
        Schedule weekly;
        const auto shows = static_cast<int32_t>(installation_.showFiles.size());
        for (int32_t k = 0; k < shows && (k + 1) * kShowSlotSeconds <= kWeekSeconds; ++k) {
            const int32_t start = k * kShowSlotSeconds;
            weekly.AddShowEventByFile(installation_.showFiles[k], WeekTimeAt(start),
                                      WeekTimeAt(start + kShowSeconds));
        }
        weekly.Save(installation_.weeklyScheduleFile);

        YearSchedule calendar;
        const DateTime first = options_.calendarStart.value_or(DateTime::Today()).Date();
        for (int32_t d = 0; shows > 0 && d < options_.calendarDays; ++d) {
            const DateTime day = first.AddDays(d);
            calendar.AddShowEventByFile(installation_.showFiles[d % shows],
                                        day.AddSeconds(20 * 3600), day.AddSeconds(21 * 3600));
        }
        calendar.Save(installation_.yearlyScheduleFile);
    }

    const InstallationOptions& options_;
    Installation installation_;
    std::set<int32_t> universes_;
};

}  // namespace

std::string SettingsStoreText(const Installation& installation,
                              const std::vector<int32_t>& dmxUniverses) {
    const std::string root = "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared";
    std::string text = "Windows Registry Editor Version 5.00\r\n\r\n";
    text += root + "]\r\n";
    text += "\"AppPath\"=" + RegistryFile::QuotedText(installation.appFolder) + "\r\n";
    text += "\"UserDataPath\"=" + RegistryFile::QuotedText(installation.userDataFolder) + "\r\n";
    text +=
        "\"NonMediaDataPath\"=" + RegistryFile::QuotedText(installation.nonMediaFolder) + "\r\n";
    text += "\"MediaDataPath\"=" + RegistryFile::QuotedText(installation.mediaFolder) + "\r\n";
    text += "\"PostInstall\"=" + RegistryFile::DwordText(1) + "\r\n";
    text += "\"PostInstallVer\"=" + RegistryFile::DwordText(53) + "\r\n";
    text += "\"UseCompressedSequences\"=" + RegistryFile::DwordText(1) + "\r\n\r\n";
    text +=
        root + "\\MonitorMemory]\r\n\"MonitorRestart\"=" + RegistryFile::DwordText(1) + "\r\n\r\n";
    text += root + "\\MediaPlayer]\r\n\"VersionInfo\"=\"12.0.19041.1\"\r\n\r\n";
    text += root + "\\NetVersion]\r\n\"Ver\"=\"1\"\r\n\r\n";
    const std::string networks = root + "\\Network1";
    text += networks + "]\r\n\"NetworkVantori\"=" + RegistryFile::DwordText(1) + "\r\n\r\n";
    for (int32_t n = 1; n < 16; ++n) {
        text += networks + "\\Aux" + static_cast<char>('A' + n - 1) +
                "]\r\n\"NetworkVantori\"=" + RegistryFile::DwordText(static_cast<uint32_t>(n + 1)) +
                "\r\n\r\n";
    }
    for (const int32_t universe : dmxUniverses) {
        text += networks + "\\DMX" + std::to_string(universe) + "]\r\n\"Adapter\"=\"USB DMX " +
                std::to_string(universe) + "\"\r\n\r\n";
    }
    return text;
}

Installation MakeInstallation(const std::string& root, const InstallationOptions& options) {
    return Writer(root, options).Write();
}

}  // namespace vtr::gen
