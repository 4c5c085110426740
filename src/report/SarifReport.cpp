#include "report/SarifReport.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <map>
#include <string_view>

#include "engine/IgnoreKeyText.h"
#include "engine/MessageAdvice.h"
#include "engine/Messages.h"
#include "report/ReportText.h"

namespace vtr::report::SarifReport {
namespace {

using Json = nlohmann::ordered_json;

constexpr const char* kSchema =
    "https://docs.oasis-open.org/sarif/sarif/v2.1.0/errata01/os/schemas/sarif-schema-2.1.0.json";

// A labelled detail that names a file, and how strongly it says where the result belongs:
// the show (or, for a missing sequence, the file that refers to it) before the sequence,
// the sequence before the file it plays, a file before a folder.
struct Label {
    std::string_view text;
    const char* role;
    int priority;
};
constexpr Label kLabels[] = {
    {"[SHOW]: ", "show", 0}, {"[SHOW] ", "show", 0},           {"[SEQUENCE]: ", "sequence", 1},
    {"[FILE]: ", "file", 2}, {"[APPLICATION]: ", "folder", 3}, {"[VERIFIER]: ", "folder", 4},
};

// Messages whose first detail is the file or folder itself, unlabelled.
struct Unlabelled {
    const Message& message;
    const char* role;
};
const Unlabelled kUnlabelled[] = {
    {Messages::AppDirectoryMissing, "folder"},      {Messages::AppFileMissing, "file"},
    {Messages::UserDataDirectoryMissing, "folder"}, {Messages::NonMediaDirectoryMissing, "folder"},
    {Messages::MediaDirectoryMissing, "folder"},    {Messages::WeeklyScheduleMissing, "file"},
    {Messages::YearlyScheduleMissing, "file"},      {Messages::ShowFileMissing, "show"},
    {Messages::ShowFileUnreadable, "show"},         {Messages::SequenceCannotLoad, "sequence"},
    {Messages::ShowHasNoSequences, "show"},         {Messages::SequenceCompletelyOff, "sequence"},
    {Messages::ShellCommandMapMissing, "file"},     {Messages::ShellCommandNotSet, "sequence"},
};

// Messages about settings kept in the settings store.
const Message* const kStoreMessages[] = {
    &Messages::NotFullyInstalled,           &Messages::NoAppPathRegEntry,
    &Messages::NoUserDataPathRegEntry,      &Messages::NoNonMediaPathRegEntry,
    &Messages::NoMediaPathRegEntry,         &Messages::OldKRPEnabled,
    &Messages::CompressedSequencesDisabled, &Messages::MemoryRestartsDisabled,
};

const char* Level(Severity severity) {
    switch (severity) {
        case Severity::Error:
            return "error";
        case Severity::Warning:
            return "warning";
        case Severity::Info:
            break;
    }
    return "note";
}

// "2031-03-14T18:30:00.000Z".
std::string UtcText(std::chrono::system_clock::time_point time) {
    using namespace std::chrono;
    const auto milliseconds = floor<std::chrono::milliseconds>(time);
    const auto day = floor<days>(milliseconds);
    const year_month_day date(day);
    const hh_mm_ss clock(milliseconds - day);
    char text[40];
    std::snprintf(
        text, sizeof text, "%04d-%02u-%02uT%02d:%02d:%02d.%03dZ", static_cast<int>(date.year()),
        static_cast<unsigned>(date.month()), static_cast<unsigned>(date.day()),
        static_cast<int>(clock.hours().count()), static_cast<int>(clock.minutes().count()),
        static_cast<int>(clock.seconds().count()), static_cast<int>(clock.subseconds().count()));
    return text;
}

Json Text(const std::string& text) {
    return Json{{"text", text}};
}

Json PhysicalLocation(const std::string& path) {
    return Json{{"physicalLocation", {{"artifactLocation", {{"uri", FileUri(path)}}}}}};
}

// The message of a result: its summary, then each detail on a line of its own.
std::string MessageText(const Result& result) {
    std::string text = DisplayText(result.Summary());
    for (const std::string& detail : result.Details())
        text += "\n" + DisplayText(detail);
    return text;
}

Json Rule(const Result& first) {
    const int32_t number = first.MessageNumber();
    Json rule;
    rule["id"] = RuleId(number);
    rule["shortDescription"] = Text(DisplayText(first.Summary()));
    const char* advice = MessageAdvice::For(number);
    const std::string help = advice != nullptr ? advice : "";
    rule["fullDescription"] =
        Text(DisplayText(first.Summary()) + (help.empty() ? "." : ". " + help));
    if (!help.empty())
        rule["help"] = Text(help);
    rule["defaultConfiguration"] = {{"level", Level(first.Severity())}};
    rule["properties"] = {{"messageNumber", number},
                          {"helpContextId", first.HelpContextID()},
                          {"severity", DisplayText(first.SeverityText())}};
    return rule;
}

}  // namespace

std::string RuleId(int32_t messageNumber) {
    char text[24];
    std::snprintf(text, sizeof text, "VTR%03d", static_cast<int>(messageNumber));
    return text;
}

std::vector<Place> PlacesOf(const Result& result, const std::optional<std::string>& storeFile) {
    struct Found {
        Place place;
        int priority;
    };
    std::vector<Found> found;
    const int32_t number = result.MessageNumber();
    const std::vector<std::string>& details = result.Details();
    for (const Unlabelled& unlabelled : kUnlabelled) {
        if (unlabelled.message.number == number && !details.empty() && !details[0].empty())
            found.push_back(Found{Place{details[0], unlabelled.role}, 0});
    }
    for (const std::string& detail : details) {
        for (const Label& label : kLabels) {
            if (!detail.starts_with(label.text))
                continue;
            std::string path = detail.substr(label.text.size());
            std::string role = label.role;
            // A missing sequence names where it is referred to: "show <path>" or
            // "sequence <path>".
            if (number == Messages::SequenceFileMissing.number && label.priority == 0) {
                for (const char* kind : {"show", "sequence"}) {
                    const std::string prefix = std::string(kind) + " ";
                    if (path.starts_with(prefix)) {
                        path.erase(0, prefix.size());
                        role = kind;
                    }
                }
            }
            if (!path.empty())
                found.push_back(Found{Place{path, role}, label.priority});
            break;
        }
    }
    if (storeFile && !storeFile->empty() &&
        std::any_of(std::begin(kStoreMessages), std::end(kStoreMessages),
                    [&](const Message* message) { return message->number == number; })) {
        found.push_back(Found{Place{*storeFile, "settings store"}, 0});
    }
    std::stable_sort(found.begin(), found.end(),
                     [](const Found& a, const Found& b) { return a.priority < b.priority; });
    std::vector<Place> places;
    for (const Found& item : found) {
        if (std::none_of(places.begin(), places.end(),
                         [&](const Place& place) { return place.path == item.place.path; }))
            places.push_back(item.place);
    }
    return places;
}

std::string Write(const RunReport& report) {
    // One rule per message number found, in number order.
    std::map<int32_t, const Result*> firstOfMessage;
    for (const ReportedResult& reported : report.results) {
        if (reported.result)
            firstOfMessage.emplace(reported.result->MessageNumber(), reported.result.get());
    }
    Json rules = Json::array();
    std::map<int32_t, int64_t> ruleIndex;
    for (const auto& [number, first] : firstOfMessage) {
        ruleIndex[number] = static_cast<int64_t>(rules.size());
        rules.push_back(Rule(*first));
    }

    Json results = Json::array();
    for (const ReportedResult& reported : report.results) {
        if (!reported.result)
            continue;
        const Result& result = *reported.result;
        Json item;
        item["ruleId"] = RuleId(result.MessageNumber());
        item["ruleIndex"] = ruleIndex.at(result.MessageNumber());
        item["level"] = Level(result.Severity());
        item["message"] = Text(MessageText(result));
        const std::vector<Place> places = PlacesOf(result, report.storeFile);
        if (!places.empty()) {
            item["locations"] = Json::array({PhysicalLocation(places.front().path)});
            if (places.size() > 1) {
                Json related = Json::array();
                for (std::size_t n = 1; n < places.size(); ++n) {
                    Json location = PhysicalLocation(places[n].path);
                    location["id"] = static_cast<int64_t>(n);
                    location["message"] = Text("the " + places[n].role);
                    related.push_back(std::move(location));
                }
                item["relatedLocations"] = std::move(related);
            }
        }
        item["partialFingerprints"] = {{"ignoreKey/v1", IgnoreKeyText::Encode(result.IgnoreKey())}};
        if (reported.ignored) {
            Json suppression;
            suppression["kind"] = "external";
            suppression["status"] = "accepted";
            suppression["justification"] =
                "Ignored in the Verifier's ignore lists, which the settings store keeps";
            item["suppressions"] = Json::array({std::move(suppression)});
        }
        if (report.baselineFile)
            item["baselineState"] = reported.inBaseline ? "unchanged" : "new";
        Json details = Json::array();
        for (const std::string& detail : result.Details())
            details.push_back(DisplayText(detail));
        item["properties"] = {{"messageNumber", result.MessageNumber()},
                              {"severity", DisplayText(result.SeverityText())},
                              {"summary", DisplayText(result.Summary())},
                              {"details", std::move(details)}};
        results.push_back(std::move(item));
    }

    Json driver;
    driver["name"] = report.program;
    driver["fullName"] = "Vantori Verifier " + report.version;
    driver["version"] = report.version;
    driver["semanticVersion"] = report.version;
    driver["rules"] = std::move(rules);

    Json invocation;
    invocation["executionSuccessful"] = !report.cancelled;
    invocation["startTimeUtc"] = UtcText(report.startedUtc);
    invocation["endTimeUtc"] = UtcText(report.finishedUtc);
    if (report.cancelled) {
        Json notification;
        notification["level"] = "warning";
        notification["message"] =
            Text("The verification was cancelled: what was not checked is not reported.");
        invocation["toolExecutionNotifications"] = Json::array({std::move(notification)});
    }

    Json target;
    target["kind"] = TargetName(report.target);
    if (report.target != Target::Schedule)
        target["file"] = DisplayText(report.targetFile);
    Json properties;
    properties["target"] = std::move(target);
    properties["programVersion"] = report.version;
    properties["settingsStore"] = DisplayText(report.store);
    if (!report.storeChosen.empty())
        properties["settingsStoreChosen"] = DisplayText(report.storeChosen);
    properties["checksPerformed"] = report.checksPerformed;
    properties["cancelled"] = report.cancelled;
    if (report.baselineFile)
        properties["baseline"] = DisplayText(*report.baselineFile);

    Json run;
    run["tool"] = {{"driver", std::move(driver)}};
    run["invocations"] = Json::array({std::move(invocation)});
    run["results"] = std::move(results);
    run["properties"] = std::move(properties);

    Json document;
    document["$schema"] = kSchema;
    document["version"] = "2.1.0";
    document["runs"] = Json::array({std::move(run)});
    return document.dump(2, ' ', false, Json::error_handler_t::replace) + "\n";
}

}  // namespace vtr::report::SarifReport
