#include "ResultsOutput.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cctype>
#include <ostream>

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
// False when it listed nothing.
bool WriteListing(std::ostream& out, const Prepared& prepared, Listing listing) {
    const ResultView view =
        prepared.View(listing, ResultOrder::ErrorsFirst, prepared.Settings().groupBy);
    if (view.groups.empty()) {
        for (const std::size_t i : view.shown)
            WriteResult(out, prepared, *prepared.Grouping().At(i));
        return !view.shown.empty();
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
    return true;
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

// Writes a JSON document a piece at a time, laid out exactly as nlohmann's dump with an indent
// of two: objects and arrays are opened and closed here, and each value in them is written on
// its own at the depth it stands at, so a long list never becomes a second document in memory.
// Bytes that are not UTF-8 are written as U+FFFD.
class JsonWriter {
  public:
    explicit JsonWriter(std::ostream& out)
        : out_(out),
          serializer_(nlohmann::detail::output_adapter<char>(text_), ' ',
                      nlohmann::ordered_json::error_handler_t::replace) {}

    void BeginObject() { Begin('{'); }
    void EndObject() { End('}'); }
    void BeginArray() { Begin('['); }
    void EndArray() { End(']'); }

    // The key of the next member of the open object; its value follows.
    void Key(const char* key) {
        Next();
        out_ << '"' << key << "\": ";
        keyed_ = true;
    }
    void Member(const char* key, const nlohmann::ordered_json& value) {
        Key(key);
        Value(value);
    }

    // A value: the next element of the open array, or the value of the key just written.
    void Value(const nlohmann::ordered_json& value) {
        Place();
        text_.clear();
        serializer_.dump(value, true, false, kIndent,
                         kIndent * static_cast<unsigned>(open_.size()));
        out_.write(text_.data(), static_cast<std::streamsize>(text_.size()));
    }
    void Text(std::string_view text) {
        if (!Plain(text)) {
            Value(std::string(text));
            return;
        }
        Place();
        out_ << '"';
        out_.write(text.data(), static_cast<std::streamsize>(text.size()));
        out_ << '"';
    }
    void Number(int64_t number) {
        Place();
        out_ << number;
    }
    void Bool(bool value) {
        Place();
        out_ << (value ? "true" : "false");
    }

  private:
    static constexpr unsigned kIndent = 2;

    // Printable ASCII without a quote or a backslash: the text is its own JSON string, which
    // the serializer would write unchanged.
    static bool Plain(std::string_view text) {
        return std::all_of(text.begin(), text.end(),
                           [](char c) { return c >= 0x20 && c < 0x7F && c != '"' && c != '\\'; });
    }
    // Starts a value on a line of its own, unless it follows its key.
    void Place() {
        if (!keyed_ && !open_.empty())
            Next();
        keyed_ = false;
    }
    void Begin(char bracket) {
        Place();
        out_ << bracket;
        open_.push_back(true);
    }
    void End(char bracket) {
        const bool empty = open_.back();
        open_.pop_back();
        if (!empty)
            out_ << '\n' << std::string(kIndent * open_.size(), ' ');
        out_ << bracket;
    }
    // Starts the next member or element of the open object or array on a line of its own.
    void Next() {
        out_ << (open_.back() ? "\n" : ",\n") << std::string(kIndent * open_.size(), ' ');
        open_.back() = false;
    }

    std::ostream& out_;
    std::string text_;  // the value last serialized, its buffer used again
    nlohmann::detail::serializer<nlohmann::ordered_json> serializer_;
    std::vector<bool> open_;  // per open object or array: nothing in it yet
    bool keyed_ = false;      // a key was written and waits for its value
};

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
    // Written straight to the stream; a blank line between what is listed and the summary,
    // when anything is.
    bool listed = true;
    if (presentation.statistics) {
        WriteStatistics(out, prepared);
    } else {
        listed = WriteListing(out, prepared, Listing::NotIgnored);
        if (!prepared.View(Listing::Ignored, ResultOrder::RunOrder, GroupBy::None).shown.empty()) {
            out << "\nIgnored results:\n";
            WriteListing(out, prepared, Listing::Ignored);
            listed = true;
        }
    }
    if (listed)
        out << "\n";
    out << SummaryOf(prepared, record) << "\n";
}

void WriteJson(std::ostream& out, const RunRecord& record, const Presentation& presentation) {
    const Prepared prepared(record, presentation);
    const ResultGrouping& grouping = prepared.Grouping();
    const ResultView listed = prepared.View(Listing::All, ResultOrder::RunOrder, GroupBy::None);
    const SeverityCounts counts = grouping.Counts(Listing::NotIgnored);

    nlohmann::ordered_json target;
    target["kind"] = TargetKindName(record.target);
    if (record.target != TargetKind::Schedule)
        target["file"] = record.targetFile;

    nlohmann::ordered_json store;
    store["path"] = record.store.file ? nlohmann::ordered_json(*record.store.file) : nullptr;
    store["chosenBy"] = record.store.OriginWord();
    store["exists"] = record.store.condition.exists;
    store["understood"] = record.store.condition.understood;
    store["readOnly"] = record.store.condition.readOnly;

    JsonWriter json(out);
    json.BeginObject();
    json.Member("program", "vantori-verify");
    json.Member("version", kVersionText);
    json.Member("target", target);
    json.Member("store", store);
    json.Member("cancelled", record.cancelled);
    json.Member("checksPerformed", record.checksPerformed);
    json.Member("errors", counts.errors);
    json.Member("warnings", counts.warnings);
    json.Member("counts", CountsJson(counts, grouping.Counts(Listing::Ignored).Total()));
    if (presentation.minimumSeverity != Severity::Info) {
        json.Member("severity", LowerSeverityText(presentation.minimumSeverity));
        json.Member("hidden", listed.hidden);
    }
    if (presentation.baselineFile) {
        json.Member("baseline",
                    {{"file", *presentation.baselineFile}, {"inBaseline", prepared.InBaseline()}});
    }

    // The results one at a time, each its own small document.
    json.Key("results");
    json.BeginArray();
    for (const std::size_t i : listed.shown) {
        const Result& result = *grouping.At(i);
        json.BeginObject();
        json.Key("severity");
        json.Number(static_cast<int32_t>(result.Severity()));
        json.Key("severityText");
        json.Text(result.SeverityText());
        json.Key("messageNumber");
        json.Number(result.MessageNumber());
        json.Key("helpContextId");
        json.Number(result.HelpContextID());
        json.Key("summary");
        json.Text(result.Summary());
        json.Key("details");
        json.BeginArray();
        for (const std::string& detail : result.Details())
            json.Text(detail);
        json.EndArray();
        json.Key("ignored");
        json.Bool(grouping.Ignored(i));
        json.Key("ignoreKey");
        json.Text(IgnoreKeyText::Encode(result.IgnoreKey()));
        json.EndObject();
    }
    json.EndArray();

    if (presentation.groupBy != GroupBy::None) {
        json.Key("groups");
        json.BeginArray();
        for (const ResultGroup& group :
             prepared.View(Listing::All, ResultOrder::RunOrder, presentation.groupBy).groups) {
            SeverityCounts groupCounts;
            int64_t ignored = 0;
            nlohmann::ordered_json members = nlohmann::ordered_json::array();
            for (const std::size_t i : group.members) {
                // Where the result stands in "results", which lists them in run order.
                members.push_back(static_cast<std::size_t>(
                    std::lower_bound(listed.shown.begin(), listed.shown.end(), i) -
                    listed.shown.begin()));
                if (grouping.Ignored(i))
                    ++ignored;
                else
                    groupCounts.Add(grouping.At(i)->Severity());
            }
            nlohmann::ordered_json entry;
            entry["key"] = IgnoreKeyText::Encode(group.key);
            entry["title"] = group.title;
            entry["counts"] = CountsJson(groupCounts, ignored);
            entry["results"] = std::move(members);
            json.Value(entry);
        }
        json.EndArray();
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
        json.Member("statistics", statistics);
    }
    json.EndObject();
    out << "\n";
}

}  // namespace vtr::cli
