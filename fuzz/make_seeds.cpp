// Writes the seed corpora of the fuzz targets, one folder per target, from the fixtures the
// tests and demonstrations use: the demo installation, generated installations (with and
// without compression, with the show of deliberate faults), the PE images of the test
// support, and the edge cases of the readers' tests. Run at build time:
//
//   vtr_fuzz_seeds <demo sources> <seed folder>
//
// The seed folder is emptied first; the work folder used on the way is removed.

#include <zlib.h>

#include <cstdio>
#include <exception>
#include <filesystem>
#include <fstream>
#include <map>
#include <string>
#include <vector>

#include "DemoInstance.h"
#include "engine/VtrError.h"
#include "schedule/DateTime.h"
#include "schedule/MonitoredShowEvent.h"
#include "schedule/Schedule.h"
#include "schedule/TimeRange.h"
#include "show/Serialize.h"
#include "vtrsupport/InstallationGenerator.h"
#include "vtrsupport/PeImage.h"

namespace {

namespace fs = std::filesystem;

// Seeds larger than this are left out: the targets run with small inputs.
constexpr std::uintmax_t kMaxSeedBytes = 24 * 1024;

std::string ReadBytes(const fs::path& path) {
    std::ifstream in(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

std::string Gunzip(const std::string& bytes) {
    z_stream zs{};
    if (inflateInit2(&zs, 15 + 16) != Z_OK)
        throw std::runtime_error("inflateInit2");
    std::string out;
    char buffer[65536];
    zs.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(bytes.data()));
    zs.avail_in = static_cast<uInt>(bytes.size());
    int status = Z_OK;
    while (status == Z_OK) {
        zs.next_out = reinterpret_cast<Bytef*>(buffer);
        zs.avail_out = sizeof buffer;
        status = inflate(&zs, Z_NO_FLUSH);
        out.append(buffer, sizeof buffer - zs.avail_out);
    }
    inflateEnd(&zs);
    if (status != Z_STREAM_END)
        throw std::runtime_error("damaged gzip data among the fixtures");
    return out;
}

// UTF-8 text (ASCII in the fixtures) as UTF-16LE with its byte-order mark, as a Windows
// export writes the settings store.
std::string Utf16WithMark(const std::string& text) {
    std::string out("\xFF\xFE", 2);
    for (const char c : text) {
        out += c;
        out += '\0';
    }
    return out;
}

class Corpora {
  public:
    explicit Corpora(fs::path root) : root_(std::move(root)) {}

    void Add(const std::string& target, const std::string& bytes) {
        if (bytes.size() > kMaxSeedBytes)
            return;
        const fs::path folder = root_ / target;
        fs::create_directories(folder);
        const int number = ++counts_[target];
        char name[32];
        std::snprintf(name, sizeof name, "seed-%04d", number);
        std::ofstream out(folder / name, std::ios::binary);
        out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
        if (!out)
            throw std::runtime_error("cannot write " + (folder / name).string());
    }

    const std::map<std::string, int>& Counts() const { return counts_; }

  private:
    fs::path root_;
    std::map<std::string, int> counts_;
};

bool IsGzip(const std::string& bytes) {
    return bytes.size() >= 2 && bytes[0] == '\x1f' && bytes[1] == '\x8b';
}

std::string Extension(const fs::path& path) {
    return path.extension().string();
}

// The identifier of the first pair of a shell-command map ("" when there is none).
std::string FirstIdentifier(const std::string& map) {
    try {
        for (const std::string& item : vtr::Serialize::ListFromText(map, 0)) {
            const auto pair = vtr::Serialize::ListFromText(item, 0);
            if (pair.Count() >= 2)
                return vtr::Serialize::UnescapeText(pair[0]);
        }
    } catch (const vtr::VtrError&) {
    }
    return {};
}

// Every file of an installation, to the targets that read its kind.
void AddInstallation(Corpora& seeds, const fs::path& folder, int& peImages) {
    for (const auto& entry : fs::recursive_directory_iterator(folder)) {
        if (!entry.is_regular_file())
            continue;
        const fs::path& path = entry.path();
        const std::string bytes = ReadBytes(path);
        const std::string name = path.filename().string();
        const std::string extension = Extension(path);
        if (extension == ".lss") {
            seeds.Add("show_file", bytes);
            seeds.Add("list_notation", std::string(1, '\0') + bytes);
        } else if (name == "weeksched.lsc") {
            seeds.Add("weekly_schedule", bytes);
            seeds.Add("list_notation", std::string(1, '\0') + bytes);
        } else if (name == "yearsched.lsc") {
            seeds.Add("calendar_schedule", bytes);
        } else if (name == "shellcmd.map") {
            seeds.Add("shell_map", FirstIdentifier(bytes) + "\n" + bytes);
            seeds.Add("shell_map", "nothing\n" + bytes);
        } else if (extension == ".reg") {
            seeds.Add("settings_store", std::string(1, '\0') + bytes);
            seeds.Add("settings_store", std::string("\xE7", 1) + "C:\\a \"b\"" + bytes);
            seeds.Add("settings_store", std::string("\xE0", 1) + Utf16WithMark(bytes));
        } else if (extension == ".las" || extension == ".lms") {
            if (IsGzip(bytes)) {
                seeds.Add("sequence_compressed", std::string(1, '\x01') + bytes.substr(2));
                const std::string plain = Gunzip(bytes);
                seeds.Add("sequence", std::string(1, '\x03') + plain);
                seeds.Add("sequence_compressed", std::string(1, '\x00') + plain);
            } else {
                seeds.Add("sequence", std::string(1, '\x00') + bytes);
                seeds.Add("sequence", std::string(1, '\x05') + bytes);
                seeds.Add("sequence_compressed", std::string(1, '\x02') + bytes);
            }
        } else if (extension == ".vtredit" || extension == ".vtrprot") {
            const std::string plain = IsGzip(bytes) ? Gunzip(bytes) : bytes;
            seeds.Add("edit_file", std::string(1, '\x00') + plain);
            seeds.Add("edit_file", std::string(1, '\x01') + plain);
        } else if ((extension == ".dll" || extension == ".exe" || extension == ".ocx") &&
                   peImages < 4) {
            ++peImages;
            seeds.Add("file_version", bytes);
        }
    }
}

// The edge cases the readers' tests are built on.
void AddEdgeCases(Corpora& seeds) {
    for (const char* text :
         {"", "abc", "()", "(a,,b)", "(2,0,1,0,,)", "(a,(b,c),d)", "((x))", "x(a,b)y", "(a", ")a(",
          "(a,(b)", "(((a),b)", "(a),b)", "(a),b),c)", "(*E*S*O*C,**,*)", "( 7, -1,1e3,T,t,F)"}) {
        seeds.Add("list_notation", std::string(1, '\0') + text);
        seeds.Add("list_notation", std::string(1, '\1') + text);
    }

    // Shows: empty, and every field present but empty.
    seeds.Add("show_file", "");
    seeds.Add("show_file", "((),(),(),(),,(),(),1,,T)");

    // Weekly schedules: one show, a show across the week's end, shows that meet.
    vtr::Schedule week;
    week.AddShowEventByFile("C:\\Shows\\A (1).lss",
                            vtr::WeekTimeFunctions::NewWeekTime(1, 3, 0, 37),
                            vtr::WeekTimeFunctions::NewWeekTime(1, 7, 0, 37));
    week.AddShowEventByFile("B,c.lss", vtr::WeekTimeFunctions::NewWeekTime(6, 22, 0, 0),
                            vtr::WeekTimeFunctions::NewWeekTime(0, 2, 0, 0));
    week.AddShowEventByFile("D.lss", vtr::WeekTimeFunctions::NewWeekTime(1, 7, 0, 37),
                            vtr::WeekTimeFunctions::NewWeekTime(1, 8, 0, 0));
    const std::string weekText = vtr::ScheduleFunctions::ScheduleToText(week);
    seeds.Add("weekly_schedule", weekText);
    seeds.Add("weekly_schedule", "((100,2,(,0,x),100))");
    seeds.Add("weekly_schedule", "((604800,2,(,0,x),-1),(5,2,(,0,y),3))");
    seeds.Add("calendar_schedule", "((2031-03-23,(" + weekText.substr(1, weekText.size() - 2) +
                                       ")),(2031-12-24,()),(2032-02-29,((3600,2,(,0,z),0))))");

    // Time ranges, open on either side, and monitored show events.
    vtr::TimeRange range;
    range.SetStartTime(vtr::DateTime::FromParts(2031, 3, 14, 19, 30, 0));
    range.SetEndTime(vtr::DateTime::FromParts(2031, 3, 15, 1, 0, 0));
    const std::string closed = range.Serialize();
    range.ClearStart();
    const std::string openStart = range.Serialize();
    seeds.Add("time_range", closed);
    seeds.Add("time_range", closed + std::string(1, '\0') + openStart);
    seeds.Add("time_range", "(F,,F,)" + std::string(1, '\0') + "(T,9999-12-31 23:59:59,T,1-1-1)");
    seeds.Add("time_range",
              "(T,2031/3/14 7:05,F,)" + std::string(1, '\0') + "(t,2031-03-14T07:05:00,x,)");

    vtr::MonitoredShowEvent event;
    event.SetFilename("C:\\Shows\\Evening (late), 2.lss");
    event.SetScheduleType(1);
    event.SetShuttingDown(true);
    event.SetRange(vtr::TimeRange());
    seeds.Add("monitored_event", event.Serialize());
    vtr::TimeRange eventRange;
    eventRange.SetStartTime(vtr::DateTime::FromParts(2031, 12, 24, 18, 0, 0));
    event.SetRange(eventRange);
    seeds.Add("monitored_event", event.Serialize());
    seeds.Add("monitored_event", "(x,(F,,F,),2147483647,F)");

    // Settings stores: the older header, continued lines, removals, other value types.
    seeds.Add("settings_store", std::string("\xE1", 1) +
                                    "REGEDIT4\r\n\r\n[HKEY_CURRENT_USER\\Software\\Vantori]\r\n"
                                    "\"A\"=\"x\"\r\n");
    seeds.Add("settings_store",
              std::string("\xFF", 1) +
                  "Windows Registry Editor Version 5.00\n\n[HKCU\\Software\\Vantori\\Shared]\n"
                  "\"Multi\"=hex(7):41,00,00,00,\\\n  00,00\n@=\"default\"\n\"Gone\"=-\n"
                  "[-HKEY_CURRENT_USER\\Software\\Old]\n[HKEY_LOCAL_MACHINE\\Software\\X]\n"
                  "\"Y\"=dword:0000000a\n\"Text\"=hex(1):41,00,0a,00,00,00\n");
    seeds.Add("settings_store", std::string("\xC4", 1) + "\n\n");

    // Sequences: the gzip signature in a plain text, a damaged member, entities and CDATA.
    seeds.Add("sequence", std::string(1, '\x00') +
                              "<?xml version=\"1.0\"?><sequence length=\"10\"><channels><channel "
                              "id=\"1\" name=\"&lt;&amp;\"><![CDATA[</channel>]]><event end=\"5\" "
                              "intensity=\"1\"/></channel></channels><tracks><track><channelRef "
                              "id=\"1\"/></track></tracks></sequence>");
    seeds.Add("sequence_compressed", std::string(1, '\x01') + std::string("\x08\x00", 2));

    seeds.Add("edit_file", std::string(1, '\0') + "<sequenceEdit><playback/></sequenceEdit>");
    seeds.Add("edit_file", std::string(1, '\0') + "<sequenceEdit><playback file=\"/abs.lms\"/>");
    seeds.Add("shell_map", "12\n((12,a),(12,b),x,(13))");

    // PE images: both header sizes, sections in either order, a damaged signature, none.
    vtr::testsupport::PeImageOptions image;
    image.version = "12.0.19041.1";
    seeds.Add("file_version", vtr::testsupport::PeImageBytes(image));
    image.pe32Plus = true;
    image.codeSectionFirst = true;
    seeds.Add("file_version", vtr::testsupport::PeImageBytes(image));
    image.fixedInfoSignature = 0xFEEF04BCu;
    seeds.Add("file_version", vtr::testsupport::PeImageBytes(image));
    seeds.Add("file_version", vtr::testsupport::PeImageBytes(std::string()));
    seeds.Add("file_version", "MZ");
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 3) {
        std::fprintf(stderr, "usage: %s <demo sources> <seed folder>\n", argv[0]);
        return 2;
    }
    const fs::path demoSources = argv[1];
    const fs::path root = argv[2];
    const fs::path work = root / ".work";
    try {
        fs::remove_all(root);
        fs::create_directories(work);
        Corpora seeds(root);
        int peImages = 0;
        const auto writePe = [](const std::string& path, const std::string& version) {
            vtr::testsupport::WritePeImage(path, version);
        };

        vtr::demo::InstanceOptions demo;
        demo.today = vtr::DateTime::FromParts(2031, 3, 14);
        demo.writeAppFile = writePe;
        vtr::demo::Instantiate(demoSources.string(), (work / "demo").string(), demo);
        AddInstallation(seeds, work / "demo", peImages);

        vtr::gen::InstallationOptions generated;
        generated.shows = 3;
        generated.sequencesPerShow = 2;
        generated.channelsPerSequence = 6;
        generated.eventsPerChannel = 3;
        generated.backgroundChannels = 3;
        generated.faults = true;
        generated.calendarStart = vtr::DateTime::FromParts(2031, 3, 14);
        generated.writeApplicationFile = writePe;
        vtr::gen::MakeInstallation((work / "plain").string(), generated);
        AddInstallation(seeds, work / "plain", peImages);
        generated.compressed = true;
        generated.faults = false;
        vtr::gen::MakeInstallation((work / "compressed").string(), generated);
        AddInstallation(seeds, work / "compressed", peImages);

        AddEdgeCases(seeds);
        fs::remove_all(work);
        for (const auto& [target, count] : seeds.Counts())
            std::printf("%-20s %d seeds\n", target.c_str(), count);
    } catch (const std::exception& e) {
        std::fprintf(stderr, "vtr_fuzz_seeds: %s\n", e.what());
        std::error_code ignored;
        fs::remove_all(work, ignored);
        return 1;
    }
    return 0;
}
