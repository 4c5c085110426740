#include "ResultsOutput.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cctype>
#include <ostream>
#include <sstream>
#include <unordered_map>

#include "VtrVersion.h"
#include "engine/IgnoreKeyText.h"

namespace vtr::cli {
namespace {

// Terminal escapes for the colours of the severities (those of the window's log: errors red,
// warnings orange, which terminals show as yellow, information blue, here cyan, which reads on
// dark backgrounds too).
constexpr const char* kReset = "\x1b[0m";
constexpr const char* kBold = "\x1b[1m";

const char* SeverityColor(Severity severity) {
    switch (severity) {
        case Severity::Error:
            return "\x1b[1;31m";
        case Severity::Warning:
            return "\x1b[33m";
        case Severity::Info:
            return "\x1b[36m";
    }
    return "";
}

// How many groups the statistics name.
constexpr std::size_t kGroupsInStatistics = 10;

std::string Counted(int64_t count, const char* singular, const char* plural) {
    return FormatCount(count) + " " + (count == 1 ? singular : plural);
}

// "1 error, 3 warnings".
std::string CountsText(const SeverityCounts& counts) {
    std::vector<std::string> parts;
    if (counts.errors > 0)
        parts.push_back(Counted(counts.errors, "error", "errors"));
    if (counts.warnings > 0)
        parts.push_back(Counted(counts.warnings, "warning", "warnings"));
    if (counts.info > 0)
        parts.push_back(Counted(counts.info, "info result", "info results"));
    if (counts.other > 0)
        parts.push_back(Counted(counts.other, "other result", "other results"));
    std::string text;
    for (const std::string& part : parts)
        text += (text.empty() ? "" : ", ") + part;
    return text;
}

const char* GroupingName(GroupBy groupBy) {
    switch (groupBy) {
        case GroupBy::Message:
            return "message";
        case GroupBy::Show:
            return "show";
        case GroupBy::Sequence:
            return "sequence";
        case GroupBy::SequencePair:
            return "sequence pair";
        case GroupBy::None:
            break;
    }
    return "";
}

// The results of a record as the printers present them: those in the baseline set apart,
// the rest in a grouping.
class Prepared {
  public:
    Prepared(const RunRecord& record, const Presentation& presentation)
        : presentation_(presentation),
          filter_(ResultFilter::AtLeast(presentation.minimumSeverity)) {
        for (const RecordedResult& recorded : record.results) {
            if (!recorded.result)
                continue;
            if (recorded.inBaseline)
                ++inBaseline_;
            else
                grouping_.Add(recorded.result, recorded.ignored);
        }
    }

    ResultView View(Listing listing, ResultOrder order, GroupBy groupBy) const {
        ResultQuery query;
        query.listing = listing;
        query.filter = filter_;
        query.order = order;
        query.groupBy = groupBy;
        return grouping_.View(query);
    }

    const ResultGrouping& Grouping() const { return grouping_; }
    const Presentation& Settings() const { return presentation_; }
    int64_t InBaseline() const { return inBaseline_; }
    std::size_t Hidden() const {
        return View(Listing::All, ResultOrder::RunOrder, GroupBy::None).hidden;
    }

    std::string Colored(const std::string& text, const char* color) const {
        if (!presentation_.color || *color == '\0')
            return text;
        return color + text + kReset;
    }

  private:
    const Presentation& presentation_;
    ResultFilter filter_;
    ResultGrouping grouping_;
    int64_t inBaseline_ = 0;
};

void WriteResult(std::ostream& out, const Prepared& prepared, const Result& result) {
    out << prepared.Colored(result.SeverityText() + " " + std::to_string(result.MessageNumber()) +
                                ": " + result.Summary(),
                            SeverityColor(result.Severity()))
        << "\n";
    for (const std::string& detail : result.Details())
        out << "    " << detail << "\n";
}

// One listing (the results, or the ignored ones), errors first, under headings when grouped.
void WriteListing(std::ostream& out, const Prepared& prepared, Listing listing) {
    const ResultView view =
        prepared.View(listing, ResultOrder::ErrorsFirst, prepared.Settings().groupBy);
    if (view.groups.empty()) {
        for (const std::size_t i : view.shown)
            WriteResult(out, prepared, *prepared.Grouping().At(i));
        return;
    }
    bool first = true;
    for (const ResultGroup& group : view.groups) {
        if (!first)
            out << "\n";
        first = false;
        out << prepared.Colored("== " + group.title + " (" + CountsText(group.counts) + ") ==",
                                kBold)
            << "\n";
        for (const std::size_t i : group.members)
            WriteResult(out, prepared, *prepared.Grouping().At(i));
    }
}

// Counts instead of results: per message number and, when grouped, per group.
void WriteStatistics(std::ostream& out, const Prepared& prepared) {
    const GroupBy groupBy = prepared.Settings().groupBy;
    const ResultView view = prepared.View(Listing::NotIgnored, ResultOrder::ErrorsFirst,
                                          groupBy == GroupBy::Message ? GroupBy::None : groupBy);
    const std::vector<MessageStatistic> statistics = prepared.Grouping().Statistics(view.shown);
    if (statistics.empty()) {
        out << "Results by message: none listed.\n";
        return;
    }
    std::size_t width = 0;
    for (const MessageStatistic& statistic : statistics)
        width = std::max(width, FormatCount(statistic.count).size());
    out << "Results by message:\n";
    for (const MessageStatistic& statistic : statistics) {
        const std::string count = FormatCount(statistic.count);
        out << "  " << std::string(width - count.size(), ' ') << count << "  "
            << prepared.Colored(SeverityText(statistic.severity) + " " +
                                    std::to_string(statistic.messageNumber) + ": " +
                                    statistic.summary,
                                SeverityColor(statistic.severity))
            << "\n";
    }
    if (view.groups.empty())
        return;

    // The groups with the worst results first, the larger before the smaller.
    std::vector<const ResultGroup*> groups;
    for (const ResultGroup& group : view.groups)
        groups.push_back(&group);
    std::stable_sort(groups.begin(), groups.end(), [](const ResultGroup* a, const ResultGroup* b) {
        if (SeverityRank(a->worst) != SeverityRank(b->worst))
            return SeverityRank(a->worst) < SeverityRank(b->worst);
        return a->members.size() > b->members.size();
    });
    const std::size_t named = std::min(groups.size(), kGroupsInStatistics);
    out << "\nResults by " << GroupingName(groupBy) << ": "
        << Counted(static_cast<int64_t>(groups.size()), "group", "groups");
    if (named < groups.size())
        out << ", the " << named << " with the worst and most results";
    out << ":\n";
    width = 0;
    for (std::size_t n = 0; n < named; ++n)
        width =
            std::max(width, FormatCount(static_cast<int64_t>(groups[n]->members.size())).size());
    for (std::size_t n = 0; n < named; ++n) {
        const std::string count = FormatCount(static_cast<int64_t>(groups[n]->members.size()));
        out << "  " << std::string(width - count.size(), ' ') << count << "  "
            << prepared.Colored(groups[n]->title, SeverityColor(groups[n]->worst)) << "\n";
    }
    if (named < groups.size()) {
        std::size_t largest = 0;
        for (std::size_t n = named; n < groups.size(); ++n)
            largest = std::max(largest, groups[n]->members.size());
        out << "  and "
            << Counted(static_cast<int64_t>(groups.size() - named), "more group", "more groups")
            << " of at most " << Counted(static_cast<int64_t>(largest), "result", "results")
            << " each (--group-by without --statistics lists them all)\n";
    }
}

std::string LowerSeverityText(Severity severity) {
    std::string text = SeverityText(severity);
    std::transform(text.begin(), text.end(), text.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return text;
}

std::string SummaryOf(const Prepared& prepared, const RunRecord& record) {
    const SeverityCounts counts = prepared.Grouping().Counts(Listing::NotIgnored);
    const int64_t ignored = prepared.Grouping().Counts(Listing::Ignored).Total();
    std::string line = Counted(record.checksPerformed, "check", "checks") + " performed, " +
                       Counted(counts.errors, "error", "errors") + ", " +
                       Counted(counts.warnings, "warning", "warnings") + ", " +
                       Counted(ignored, "ignored result", "ignored results") + ".";
    if (record.cancelled)
        line += " Verification cancelled.";
    if (const std::size_t hidden = prepared.Hidden(); hidden > 0) {
        line += " " + Counted(static_cast<int64_t>(hidden), "result", "results") + " below " +
                LowerSeverityText(prepared.Settings().minimumSeverity) +
                " not listed (--severity).";
    }
    if (prepared.Settings().baselineFile) {
        line += " " + Counted(prepared.InBaseline(), "result", "results") +
                " in the baseline not listed.";
    }
    return line;
}

nlohmann::ordered_json CountsJson(const SeverityCounts& counts, int64_t ignored) {
    nlohmann::ordered_json json;
    json["errors"] = counts.errors;
    json["warnings"] = counts.warnings;
    json["info"] = counts.info + counts.other;
    json["ignored"] = ignored;
    return json;
}

}  // namespace

int ExitStatusOf(const RunRecord& record, FailOn failOn) {
    int64_t errors = 0;
    int64_t warnings = 0;
    for (const RecordedResult& recorded : record.results) {
        if (!recorded.result || recorded.ignored || recorded.inBaseline)
            continue;
        errors += recorded.result->Severity() == Severity::Error ? 1 : 0;
        warnings += recorded.result->Severity() == Severity::Warning ? 1 : 0;
    }
    if (failOn == FailOn::Never)
        return ExitStatus::Clean;
    if (errors > 0)
        return ExitStatus::Errors;
    if (warnings > 0 && failOn == FailOn::Warning)
        return ExitStatus::Warnings;
    return ExitStatus::Clean;
}

std::string SummaryLine(const RunRecord& record, const Presentation& presentation) {
    return SummaryOf(Prepared(record, presentation), record);
}

void WriteText(std::ostream& out, const RunRecord& record, const Presentation& presentation) {
    const Prepared prepared(record, presentation);
    std::ostringstream body;
    if (presentation.statistics) {
        WriteStatistics(body, prepared);
    } else {
        WriteListing(body, prepared, Listing::NotIgnored);
        if (!prepared.View(Listing::Ignored, ResultOrder::RunOrder, GroupBy::None).shown.empty()) {
            body << "\nIgnored results:\n";
            WriteListing(body, prepared, Listing::Ignored);
        }
    }
    // A blank line between what is listed and the summary, when anything is.
    if (const std::string listed = body.str(); !listed.empty())
        out << listed << "\n";
    out << SummaryOf(prepared, record) << "\n";
}

void WriteJson(std::ostream& out, const RunRecord& record, const Presentation& presentation) {
    const Prepared prepared(record, presentation);
    const ResultGrouping& grouping = prepared.Grouping();

    nlohmann::ordered_json target;
    target["kind"] = TargetKindName(record.target);
    if (record.target != TargetKind::Schedule)
        target["file"] = record.targetFile;

    const ResultView listed = prepared.View(Listing::All, ResultOrder::RunOrder, GroupBy::None);
    std::unordered_map<std::size_t, std::size_t> position;
    nlohmann::ordered_json results = nlohmann::ordered_json::array();
    for (const std::size_t i : listed.shown) {
        const Result& result = *grouping.At(i);
        position[i] = results.size();
        nlohmann::ordered_json item;
        item["severity"] = static_cast<int32_t>(result.Severity());
        item["severityText"] = result.SeverityText();
        item["messageNumber"] = result.MessageNumber();
        item["helpContextId"] = result.HelpContextID();
        item["summary"] = result.Summary();
        item["details"] = result.Details();
        item["ignored"] = grouping.Ignored(i);
        item["ignoreKey"] = IgnoreKeyText::Encode(result.IgnoreKey());
        results.push_back(std::move(item));
    }

    nlohmann::ordered_json store;
    store["path"] = record.store.file ? nlohmann::ordered_json(*record.store.file) : nullptr;
    store["chosenBy"] = record.store.OriginWord();
    store["exists"] = record.store.condition.exists;
    store["understood"] = record.store.condition.understood;
    store["readOnly"] = record.store.condition.readOnly;

    const SeverityCounts counts = grouping.Counts(Listing::NotIgnored);
    nlohmann::ordered_json document;
    document["program"] = "vantori-verify";
    document["version"] = kVersionText;
    document["target"] = std::move(target);
    document["store"] = std::move(store);
    document["cancelled"] = record.cancelled;
    document["checksPerformed"] = record.checksPerformed;
    document["errors"] = counts.errors;
    document["warnings"] = counts.warnings;
    document["counts"] = CountsJson(counts, grouping.Counts(Listing::Ignored).Total());
    if (presentation.minimumSeverity != Severity::Info) {
        document["severity"] = LowerSeverityText(presentation.minimumSeverity);
        document["hidden"] = listed.hidden;
    }
    if (presentation.baselineFile) {
        document["baseline"] = {{"file", *presentation.baselineFile},
                                {"inBaseline", prepared.InBaseline()}};
    }
    document["results"] = std::move(results);

    if (presentation.groupBy != GroupBy::None) {
        nlohmann::ordered_json groups = nlohmann::ordered_json::array();
        for (const ResultGroup& group :
             prepared.View(Listing::All, ResultOrder::RunOrder, presentation.groupBy).groups) {
            SeverityCounts groupCounts;
            int64_t ignored = 0;
            nlohmann::ordered_json members = nlohmann::ordered_json::array();
            for (const std::size_t i : group.members) {
                members.push_back(position.at(i));
                if (grouping.Ignored(i))
                    ++ignored;
                else
                    groupCounts.Add(grouping.At(i)->Severity());
            }
            nlohmann::ordered_json item;
            item["key"] = IgnoreKeyText::Encode(group.key);
            item["title"] = group.title;
            item["counts"] = CountsJson(groupCounts, ignored);
            item["results"] = std::move(members);
            groups.push_back(std::move(item));
        }
        document["groups"] = std::move(groups);
    }
    if (presentation.statistics) {
        nlohmann::ordered_json statistics = nlohmann::ordered_json::array();
        const ResultView shown =
            prepared.View(Listing::NotIgnored, ResultOrder::RunOrder, GroupBy::None);
        for (const MessageStatistic& statistic : grouping.Statistics(shown.shown)) {
            statistics.push_back({{"messageNumber", statistic.messageNumber},
                                  {"severityText", SeverityText(statistic.severity)},
                                  {"count", statistic.count},
                                  {"summary", statistic.summary}});
        }
        document["statistics"] = std::move(statistics);
    }
    out << document.dump(2, ' ', false, nlohmann::ordered_json::error_handler_t::replace) << "\n";
}

}  // namespace vtr::cli
