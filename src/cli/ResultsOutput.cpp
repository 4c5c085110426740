#include "ResultsOutput.h"

#include <nlohmann/json.hpp>

#include <ostream>

namespace vtr::cli {
namespace {

std::string Counted(int64_t count, const char* singular, const char* plural) {
    return std::to_string(count) + " " + (count == 1 ? singular : plural);
}

void WriteResult(std::ostream& out, const Result& result) {
    out << result.SeverityText() << " " << result.MessageNumber() << ": " << result.Summary()
        << "\n";
    for (const std::string& detail : result.Details())
        out << "    " << detail << "\n";
}

}  // namespace

int ExitStatusOf(const RunRecord& record) {
    if (record.errors > 0)
        return ExitStatus::Errors;
    if (record.warnings > 0)
        return ExitStatus::Warnings;
    return ExitStatus::Clean;
}

std::string SummaryLine(const RunRecord& record) {
    int64_t ignored = 0;
    for (const RecordedResult& recorded : record.results)
        ignored += recorded.ignored ? 1 : 0;
    std::string line = Counted(record.checksPerformed, "check", "checks") + " performed, " +
                       Counted(record.errors, "error", "errors") + ", " +
                       Counted(record.warnings, "warning", "warnings") + ", " +
                       Counted(ignored, "ignored result", "ignored results") + ".";
    if (record.cancelled)
        line += " Verification cancelled.";
    return line;
}

void WriteText(std::ostream& out, const RunRecord& record) {
    bool anyIgnored = false;
    for (const RecordedResult& recorded : record.results) {
        if (recorded.ignored)
            anyIgnored = true;
        else if (recorded.result)
            WriteResult(out, *recorded.result);
    }
    if (anyIgnored) {
        out << "\nIgnored results:\n";
        for (const RecordedResult& recorded : record.results) {
            if (recorded.ignored && recorded.result)
                WriteResult(out, *recorded.result);
        }
    }
    out << "\n" << SummaryLine(record) << "\n";
}

void WriteJson(std::ostream& out, const RunRecord& record) {
    nlohmann::ordered_json target;
    target["kind"] = TargetKindName(record.target);
    if (record.target != TargetKind::Schedule)
        target["file"] = record.targetFile;

    nlohmann::ordered_json results = nlohmann::ordered_json::array();
    for (const RecordedResult& recorded : record.results) {
        if (!recorded.result)
            continue;
        const Result& result = *recorded.result;
        nlohmann::ordered_json item;
        item["severity"] = static_cast<int32_t>(result.Severity());
        item["severityText"] = result.SeverityText();
        item["messageNumber"] = result.MessageNumber();
        item["helpContextId"] = result.HelpContextID();
        item["summary"] = result.Summary();
        item["details"] = result.Details();
        item["ignored"] = recorded.ignored;
        item["ignoreKey"] = result.IgnoreKey();
        results.push_back(std::move(item));
    }

    nlohmann::ordered_json store;
    store["path"] = record.store.file ? nlohmann::ordered_json(*record.store.file) : nullptr;
    store["chosenBy"] = record.store.OriginWord();
    store["exists"] = record.store.condition.exists;
    store["understood"] = record.store.condition.understood;
    store["readOnly"] = record.store.condition.readOnly;

    nlohmann::ordered_json document;
    document["target"] = std::move(target);
    document["store"] = std::move(store);
    document["cancelled"] = record.cancelled;
    document["checksPerformed"] = record.checksPerformed;
    document["errors"] = record.errors;
    document["warnings"] = record.warnings;
    document["results"] = std::move(results);
    out << document.dump(2, ' ', false, nlohmann::ordered_json::error_handler_t::replace) << "\n";
}

}  // namespace vtr::cli
