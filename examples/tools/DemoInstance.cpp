#include "DemoInstance.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <filesystem>
#include <fstream>
#include <map>
#include <sstream>
#include <stdexcept>
#include <vector>

#include "checks/installation/CheckAppFileExists.h"
#include "checks/installation/CheckAppPathExists.h"
#include "show/Serialize.h"
#include "vtrsupport/SequenceGenerator.h"

namespace vtr::demo {
namespace {

namespace fs = std::filesystem;

constexpr const char* kCompressedSuffix = ".compressed";
constexpr const char* kAppVersionsFile = "app-versions.txt";
constexpr const char* kAppFolder = "app";

[[noreturn]] void Fail(const std::string& message) {
    throw std::runtime_error(message);
}

std::string ReadFile(const fs::path& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in)
        Fail("cannot read " + path.string());
    std::ostringstream bytes;
    bytes << in.rdbuf();
    return bytes.str();
}

void WriteFile(const fs::path& path, const std::string& bytes) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    out.close();
    if (!out)
        Fail("cannot write " + path.string());
}

bool EndsWith(const std::string& text, const std::string& suffix) {
    return text.size() >= suffix.size() &&
           text.compare(text.size() - suffix.size(), suffix.size(), suffix) == 0;
}

std::string Lower(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return text;
}

std::string EscapeFor(FileKind kind, const std::string& text) {
    std::string escaped;
    switch (kind) {
        case FileKind::Plain:
            return text;
        case FileKind::ListNotation:
            return Serialize::EscapeText(text);
        case FileKind::Registry:
            for (char c : text) {
                if (c == '\\' || c == '"')
                    escaped += '\\';
                escaped += c;
            }
            return escaped;
        case FileKind::Xml:
            for (char c : text) {
                switch (c) {
                    case '&':
                        escaped += "&amp;";
                        break;
                    case '<':
                        escaped += "&lt;";
                        break;
                    case '>':
                        escaped += "&gt;";
                        break;
                    case '"':
                        escaped += "&quot;";
                        break;
                    case '\'':
                        escaped += "&apos;";
                        break;
                    default:
                        escaped += c;
                }
            }
            return escaped;
    }
    return text;
}

// The whole text as a number, or a failure naming the placeholder.
int ParseNumber(const std::string& text, const std::string& placeholder) {
    int value = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (error != std::errc() || end != text.data() + text.size())
        Fail("malformed placeholder @" + placeholder + "@");
    return value;
}

std::string Replacement(const std::string& placeholder, FileKind kind,
                        const std::string& demoFolder, const DateTime& today) {
    if (placeholder == "DEMO")
        return EscapeFor(kind, demoFolder);
    if (placeholder.rfind("DATE+", 0) == 0) {
        const int days = ParseNumber(placeholder.substr(5), placeholder);
        return today.AddDays(days).DateString();
    }
    if (placeholder.rfind("WEEKTIME+", 0) == 0) {
        // "WEEKTIME+N H:MM"
        const std::string rest = placeholder.substr(9);
        const auto blank = rest.find(' ');
        const auto colon = rest.find(':');
        if (blank == std::string::npos || colon == std::string::npos || colon < blank)
            Fail("malformed placeholder @" + placeholder + "@");
        const int days = ParseNumber(rest.substr(0, blank), placeholder);
        const int hour = ParseNumber(rest.substr(blank + 1, colon - blank - 1), placeholder);
        const int minute = ParseNumber(rest.substr(colon + 1), placeholder);
        if (hour < 0 || hour > 23 || minute < 0 || minute > 59)
            Fail("malformed placeholder @" + placeholder + "@");
        const int weekday = today.AddDays(days).Weekday();
        return std::to_string(weekday * 86400 + hour * 3600 + minute * 60);
    }
    Fail("unknown placeholder @" + placeholder + "@");
}

#ifdef _WIN32
// The characters of the file and folder names that follow the folder in the sources.
bool IsPathNameCharacter(char c) {
    return std::isalnum(static_cast<unsigned char>(c)) != 0 || c == '.' || c == '_' || c == '-';
}
#endif

bool IsPlaceholderStart(const std::string& text, std::size_t at) {
    for (const char* name : {"DEMO@", "DATE+", "WEEKTIME+"}) {
        if (text.compare(at, std::char_traits<char>::length(name), name) == 0)
            return true;
    }
    return false;
}

// The application files with the versions the instance gives them.
std::vector<std::pair<std::string, std::string>> ApplicationFileVersions(
    const fs::path& versionsFile) {
    std::map<std::string, std::string> overrides;
    if (fs::exists(versionsFile)) {
        std::istringstream lines(ReadFile(versionsFile));
        std::string line;
        int number = 0;
        while (std::getline(lines, line)) {
            ++number;
            if (!line.empty() && line.back() == '\r')
                line.pop_back();
            if (line.empty() || line[0] == '#')
                continue;
            std::istringstream fields(line);
            std::string name;
            std::string version;
            std::string extra;
            if (!(fields >> name >> version) || (fields >> extra))
                Fail(versionsFile.string() + ":" + std::to_string(number) +
                     ": expected a file name and a version");
            overrides[name] = version == "-" ? std::string() : version;
        }
    }

    std::vector<std::pair<std::string, std::string>> files;
    for (const ApplicationFile& file : CheckAppPathExists::ApplicationFiles()) {
        std::string version = file.expectedVersion != nullptr ? std::string(file.expectedVersion)
                                                              : DefaultExpectedVersion();
        if (auto found = overrides.find(file.name); found != overrides.end()) {
            version = found->second;
            overrides.erase(found);
        }
        files.emplace_back(file.name, version);
    }
    if (!overrides.empty())
        Fail(versionsFile.string() + " names " + overrides.begin()->first +
             ", which is not one of the suite's application files");
    return files;
}

void PrepareTarget(const fs::path& target) {
    std::error_code error;
    if (fs::exists(target, error)) {
        if (!fs::is_directory(target, error))
            Fail("cannot make the demo in " + target.string() + ": it is not a folder");
        const bool empty = fs::is_empty(target, error);
        if (!empty && !fs::exists(target / kMarkerFile, error))
            Fail("refusing to replace " + target.string() +
                 ": it is not empty and holds no demo installation");
        fs::remove_all(target, error);
        if (error)
            Fail("cannot remove the earlier demo in " + target.string() + ": " + error.message());
    }
    fs::create_directories(target, error);
    if (error)
        Fail("cannot create " + target.string() + ": " + error.message());
}

}  // namespace

FileKind KindOf(const std::string& fileName) {
    std::string name = Lower(fileName);
    if (EndsWith(name, kCompressedSuffix))
        name.resize(name.size() - std::char_traits<char>::length(kCompressedSuffix));
    const std::string extension = fs::path(name).extension().string();
    if (extension == ".reg")
        return FileKind::Registry;
    if (extension == ".lss" || extension == ".lsc" || extension == ".map")
        return FileKind::ListNotation;
    if (extension == ".las" || extension == ".lms" || extension == ".vtredit" ||
        extension == ".xml")
        return FileKind::Xml;
    return FileKind::Plain;
}

std::string Substitute(const std::string& text, FileKind kind, const std::string& demoFolder,
                       const DateTime& today) {
    std::string result;
    result.reserve(text.size());
    std::size_t position = 0;
    while (true) {
        const std::size_t at = text.find('@', position);
        if (at == std::string::npos) {
            result.append(text, position, std::string::npos);
            return result;
        }
        result.append(text, position, at - position);
        if (!IsPlaceholderStart(text, at + 1)) {
            result += '@';
            position = at + 1;
            continue;
        }
        const std::size_t end = text.find('@', at + 1);
        if (end == std::string::npos)
            Fail("unterminated placeholder at \"" + text.substr(at, 20) + "\"");
        const std::string placeholder = text.substr(at + 1, end - at - 1);
        result += Replacement(placeholder, kind, demoFolder, today);
        position = end + 1;
#ifdef _WIN32
        // The path after the folder ("/data/shows/Evening.lss") takes the system's separator,
        // so that the instance names its files as Windows programs do.
        if (placeholder == "DEMO") {
            while (position + 1 < text.size() && text[position] == '/' &&
                   IsPathNameCharacter(text[position + 1])) {
                result += EscapeFor(kind, "\\");
                ++position;
                while (position < text.size() && IsPathNameCharacter(text[position]))
                    result += text[position++];
            }
        }
#endif
    }
}

void Instantiate(const std::string& sourceFolder, const std::string& targetFolder,
                 const InstanceOptions& options) {
    const fs::path source = fs::absolute(fs::path(sourceFolder)).lexically_normal();
    fs::path target = fs::absolute(fs::path(targetFolder)).lexically_normal();
    if (!target.has_filename())
        target = target.parent_path();
    if (!fs::is_directory(source))
        Fail("the demo's sources " + source.string() + " are not a folder");
    PrepareTarget(target);
    const std::string demoFolder = target.string();

    std::vector<fs::path> sources;
    for (const auto& entry : fs::recursive_directory_iterator(source)) {
        if (entry.is_regular_file())
            sources.push_back(entry.path());
    }
    std::sort(sources.begin(), sources.end());

    for (const fs::path& file : sources) {
        const fs::path relative = file.lexically_relative(source);
        if (relative == fs::path(kAppVersionsFile))
            continue;
        std::string name = relative.generic_string();
        const bool compress = EndsWith(name, kCompressedSuffix);
        if (compress)
            name.resize(name.size() - std::char_traits<char>::length(kCompressedSuffix));

        std::string bytes;
        try {
            bytes = Substitute(ReadFile(file), KindOf(name), demoFolder, options.today);
        } catch (const std::runtime_error& error) {
            Fail(file.string() + ": " + error.what());
        }
        if (compress)
            bytes = seqlib::SequenceGenerator::Gzip(bytes, 9);

        const fs::path destination = target / fs::path(name);
        std::error_code error;
        fs::create_directories(destination.parent_path(), error);
        if (error)
            Fail("cannot create " + destination.parent_path().string() + ": " + error.message());
        WriteFile(destination, bytes);
    }

    const fs::path appFolder = target / kAppFolder;
    std::error_code error;
    fs::create_directories(appFolder, error);
    if (error)
        Fail("cannot create " + appFolder.string() + ": " + error.message());
    for (const auto& [name, version] : ApplicationFileVersions(source / kAppVersionsFile)) {
        if (options.writeAppFile)
            options.writeAppFile((appFolder / name).string(), version);
    }

    WriteFile(target / kMarkerFile, "A demo installation of the suite, made from " +
                                        source.string() + " on " + options.today.DateString() +
                                        ".\n");
}

}  // namespace vtr::demo
