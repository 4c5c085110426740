#include "report/HtmlReport.h"

#include <algorithm>
#include <cstdio>
#include <map>
#include <set>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <variant>

#include "engine/MessageAdvice.h"
#include "engine/ResultGrouping.h"
#include "environment/OutputFile.h"
#include "report/ReportText.h"
#include "report/WeekPicture.h"
#include "schedule/Schedule.h"
#include "schedule/YearSchedule.h"

namespace vtr::report::HtmlReport {
namespace {

// --- Words and numbers ----------------------------------------------------------------------

std::string Counted(int64_t count, const char* singular, const char* plural) {
    return FormatCount(count) + " " + (count == 1 ? singular : plural);
}

// "1 error, 3 warnings"; "no findings" when there are none.
std::string CountsText(const SeverityCounts& counts) {
    std::string text;
    auto add = [&](int64_t count, const char* singular, const char* plural) {
        if (count > 0)
            text += (text.empty() ? "" : ", ") + Counted(count, singular, plural);
    };
    add(counts.errors, "error", "errors");
    add(counts.warnings, "warning", "warnings");
    add(counts.info + counts.other, "info result", "info results");
    return text.empty() ? "no findings" : text;
}

// The class of a severity: "e", "w" or "i" (any other severity goes with information).
const char* SeverityClass(Severity severity) {
    switch (severity) {
        case Severity::Error:
            return "e";
        case Severity::Warning:
            return "w";
        case Severity::Info:
            break;
    }
    return "i";
}

const char* WorstClass(const SeverityCounts& counts) {
    if (counts.errors > 0)
        return "e";
    if (counts.warnings > 0)
        return "w";
    return "i";
}

// The last part of a path, whichever separator it uses.
std::string_view FileName(std::string_view path) {
    const std::size_t slash = path.find_last_of("/\\");
    if (slash == std::string_view::npos || slash + 1 == path.size())
        return path;
    return path.substr(slash + 1);
}

// The file name without its extension: the label of a show's block.
std::string_view Stem(std::string_view path) {
    const std::string_view name = FileName(path);
    const std::size_t dot = name.find_last_of('.');
    return dot == 0 || dot == std::string_view::npos ? name : name.substr(0, dot);
}

// A percentage of the day, for the drawings' positions.
std::string Percent(int64_t seconds) {
    char text[32];
    std::snprintf(text, sizeof text, "%.3f%%", static_cast<double>(seconds) * 100.0 / 86400.0);
    return text;
}

std::string TwoDigits(int value) {
    return (value < 10 ? "0" : "") + std::to_string(value);
}

const char* const kDayNames[] = {"Sunday",   "Monday", "Tuesday", "Wednesday",
                                 "Thursday", "Friday", "Saturday"};

// "Saturday 2031-03-14, 19:30:00".
std::string RunTimeText(const DateTime& time) {
    return std::string(kDayNames[time.Weekday()]) + " " + time.DateString() + ", " +
           TwoDigits(time.Hour()) + ":" + TwoDigits(time.Minute()) + ":" + TwoDigits(time.Second());
}

// --- What was found where ----------------------------------------------------------------------

// A show's place in the picture: what was found in it (with its sequences), and whether the
// run verified it at all.
struct ShowState {
    SeverityCounts counts;
    bool verified = false;
    std::string anchor;  // its results' section, if it has one
};

const char* StateClass(const ShowState& state) {
    if (state.counts.errors > 0)
        return "e";
    if (state.counts.warnings > 0)
        return "w";
    return state.verified ? "o" : "u";
}

std::string StateText(const ShowState& state) {
    if (state.counts.errors > 0 || state.counts.warnings > 0)
        return CountsText(state.counts);
    return state.verified ? "nothing found" : "not verified in this run";
}

// One heading of the results: a show, a sequence, or the installation.
struct Section {
    enum class Kind { Show, Sequence, Installation };
    Kind kind = Kind::Installation;
    std::string path;  // the show or sequence
    std::vector<std::size_t> members;
    SeverityCounts counts;
    Severity worst = Severity::Info;
    std::string anchor;
};

void Tally(Section& section, const ResultGrouping& grouping) {
    section.counts = {};
    section.worst = grouping.At(section.members.front())->Severity();
    for (const std::size_t i : section.members) {
        const Severity severity = grouping.At(i)->Severity();
        section.counts.Add(severity);
        if (SeverityRank(severity) < SeverityRank(section.worst))
            section.worst = severity;
    }
}

bool IsOther(const GroupIdentity& identity) {
    return identity.key == "other";
}

// The run's results arranged for the page.
class Arrangement {
  public:
    explicit Arrangement(const RunReport& report) : report_(report) {
        for (const ReportedResult& reported : report.results) {
            if (!reported.result)
                continue;
            if (reported.inBaseline) {
                ++inBaseline_;
                continue;
            }
            grouping_.Add(reported.result, reported.ignored);
        }
        for (const auto& [show, files] : report.showFiles) {
            for (const std::string& file : files)
                playedBy_[file].push_back(show);
        }
        Arrange();
    }

    const ResultGrouping& Grouping() const { return grouping_; }
    const std::vector<Section>& Sections() const { return sections_; }
    int64_t InBaseline() const { return inBaseline_; }
    const std::vector<std::string>* PlayedBy(const std::string& file) const {
        const auto found = playedBy_.find(file);
        return found == playedBy_.end() ? nullptr : &found->second;
    }

    // The shows each result that is not ignored belongs to: the show it names, or every show
    // that plays the sequence it names.
    std::map<std::string, ShowState> ShowStates(const std::vector<std::string>& shows) const {
        std::map<std::string, ShowState> states;
        for (const std::string& show : shows)
            states[show].verified = report_.showFiles.count(show) > 0;
        for (const auto& [show, files] : report_.showFiles)
            states[show].verified = true;
        for (std::size_t i = 0; i < grouping_.Size(); ++i) {
            if (grouping_.Ignored(i))
                continue;
            const Severity severity = grouping_.At(i)->Severity();
            const GroupIdentity show = grouping_.GroupOf(i, GroupBy::Show);
            if (!IsOther(show)) {
                states[show.title].counts.Add(severity);
                continue;
            }
            const GroupIdentity sequence = grouping_.GroupOf(i, GroupBy::Sequence);
            if (IsOther(sequence))
                continue;
            if (const auto* players = PlayedBy(sequence.title)) {
                for (const std::string& player : *players)
                    states[player].counts.Add(severity);
            }
        }
        for (const Section& section : sections_) {
            if (section.kind == Section::Kind::Show)
                states[section.path].anchor = section.anchor;
        }
        return states;
    }

  private:
    void Arrange() {
        ResultQuery query;
        query.order = ResultOrder::ErrorsFirst;
        query.groupBy = GroupBy::Show;
        std::vector<std::size_t> unowned;
        for (const ResultGroup& group : grouping_.View(query).groups) {
            if (group.key == "other") {
                unowned = group.members;
                continue;
            }
            Section section;
            section.kind = Section::Kind::Show;
            section.path = group.title;
            section.members = group.members;
            sections_.push_back(std::move(section));
        }
        // What names no show goes under its sequence, in the order of the sequences' worst
        // results; what names neither is the installation's.
        std::map<std::string, std::size_t> sequenceSection;
        Section installation;
        for (const std::size_t i : unowned) {
            const GroupIdentity sequence = grouping_.GroupOf(i, GroupBy::Sequence);
            if (IsOther(sequence)) {
                installation.members.push_back(i);
                continue;
            }
            const auto [found, added] = sequenceSection.emplace(sequence.key, sections_.size());
            if (added) {
                Section section;
                section.kind = Section::Kind::Sequence;
                section.path = sequence.title;
                sections_.push_back(std::move(section));
            }
            sections_[found->second].members.push_back(i);
        }
        if (!installation.members.empty())
            sections_.push_back(std::move(installation));
        for (Section& section : sections_)
            Tally(section, grouping_);
        std::stable_sort(sections_.begin(), sections_.end(),
                         [](const Section& a, const Section& b) {
                             return SeverityRank(a.worst) < SeverityRank(b.worst);
                         });
        for (std::size_t n = 0; n < sections_.size(); ++n)
            sections_[n].anchor = "s" + std::to_string(n + 1);
    }

    const RunReport& report_;
    ResultGrouping grouping_;
    std::vector<Section> sections_;
    std::unordered_map<std::string, std::vector<std::string>> playedBy_;
    int64_t inBaseline_ = 0;
};

// --- The page -----------------------------------------------------------------------------------

const char* const kStyle = R"css(
:root{--e:#b3261e;--eb:#fdecea;--w:#8a5a00;--wb:#fff3d1;--wl:#e0a100;--i:#1f5f99;--ib:#e8f1fb;
--g:#666;--gb:#eeeeee;--o:#2e7d32;--ob:#e4f3e5;--u:#777;--ub:#f3f3f3;--line:#d0d4da}
*{box-sizing:border-box}
html{-webkit-print-color-adjust:exact;print-color-adjust:exact}
body{font:14px/1.4 system-ui,-apple-system,"Segoe UI",Roboto,"DejaVu Sans",Arial,sans-serif;
color:#1b1f24;margin:0 auto;padding:14px 20px 40px;max-width:1180px;background:#fff}
h1{font-size:21px;margin:0 0 4px}h2{font-size:17px;margin:22px 0 8px;border-bottom:1px solid var(--line);
padding-bottom:3px}h3{font-size:15px;margin:0}
[hidden]{display:none!important}
.meta{display:grid;grid-template-columns:max-content 1fr;gap:1px 12px;margin:0;color:#333}
.meta dt{color:#666}.meta dd{margin:0;overflow-wrap:anywhere}
.banner{margin:8px 0;padding:6px 10px;border-radius:4px;font-weight:600}
.banner.e{background:var(--eb);color:var(--e);border:1px solid var(--e)}
.banner.o{background:var(--ob);color:var(--o);border:1px solid var(--o)}
.counts{display:flex;gap:18px;align-items:baseline;margin:12px 0 4px;flex-wrap:wrap}
.count{font-size:15px}.count b{font-size:26px;margin-right:4px}
.count.e b{color:var(--e)}.count.w b{color:var(--w)}.count.i b{color:var(--i)}.count.g b{color:var(--g)}
.bar{display:flex;height:14px;border-radius:3px;overflow:hidden;background:var(--gb);margin:2px 0 10px}
.bar span{min-width:4px}.bar .e{background:var(--e)}.bar .w{background:var(--wl)}
.bar .i{background:var(--i)}.bar .g{background:#aaa}
.owners{display:flex;flex-wrap:wrap;gap:6px;margin:4px 0 0;padding:0;list-style:none}
.owners li{border:1px solid var(--line);border-left-width:5px;border-radius:4px;padding:2px 8px;background:#fafafa}
.owners li.e{border-left-color:var(--e)}.owners li.w{border-left-color:var(--wl)}
.owners a{color:inherit}
.mk{font-weight:700;margin-right:3px}.e>.mk,.mk.e{color:var(--e)}.w>.mk,.mk.w{color:var(--w)}
.o>.mk,.mk.o{color:var(--o)}.u>.mk,.mk.u{color:var(--u)}
.week{margin:6px 0 4px}
.row{display:flex;align-items:stretch;min-height:26px}
.row+.row{border-top:1px solid #fff}
.dn{flex:0 0 118px;font-size:12px;line-height:26px;color:#444;white-space:nowrap}
.dn.today{font-weight:700;color:#000}
.lane{flex:1;position:relative;background-color:#f6f7f9;
background-image:linear-gradient(90deg,#c9ced6 1px,transparent 1px),linear-gradient(90deg,#e4e7eb 1px,transparent 1px);
background-size:25% 100%,4.1667% 100%}
.lane.thin{min-height:16px;background-color:#fafbfc}
.axis{position:relative;height:16px;flex:1;font-size:11px;color:#666}
.axis span{position:absolute;transform:translateX(-50%)}
.blk{position:absolute;top:2px;bottom:2px;border:1px solid;border-radius:3px;overflow:hidden;
white-space:nowrap;text-overflow:ellipsis;font-size:12px;line-height:20px;padding:0 4px;min-width:3px;
color:#111;text-decoration:none}
.thin .blk{top:1px;bottom:1px;line-height:12px;font-size:10px;opacity:.75}
.blk.e{background:var(--eb);border-color:var(--e);border-width:1px 1px 1px 4px}
.blk.w{background:var(--wb);border-color:var(--wl);border-width:1px 1px 1px 4px}
.blk.o{background:var(--ob);border-color:var(--o)}
.blk.u{background:var(--ub);border-color:#aaa;border-style:dashed;color:#555}
.blk.fp{border-top-left-radius:0;border-bottom-left-radius:0;border-left-style:dotted}
.blk.tn{border-top-right-radius:0;border-bottom-right-radius:0;border-right-style:dotted}
.legend{font-size:12px;color:#555;margin:4px 0 0}
.legend .blk{position:static;display:inline-block;line-height:14px;margin:0 2px 0 8px;padding:0 5px}
.dates{margin-top:10px}.dates .dn{line-height:20px}
.note{font-size:12px;color:#555;margin:3px 0}
.filter{display:flex;gap:14px;align-items:center;flex-wrap:wrap;position:sticky;top:0;background:#fff;
padding:6px 0;border-bottom:1px solid var(--line);z-index:2}
.filter input[type=search]{min-width:260px;padding:3px 6px}
.sec{margin:14px 0;border:1px solid var(--line);border-left-width:5px;border-radius:4px;padding:8px 12px}
.sec.e{border-left-color:var(--e)}.sec.w{border-left-color:var(--wl)}.sec.i{border-left-color:var(--i)}
.path{font-weight:400;color:#666;font-size:12px;margin-left:6px;overflow-wrap:anywhere}
.tally{font-weight:600;font-size:13px;margin-left:6px}.tally.e{color:var(--e)}.tally.w{color:var(--w)}
ul.rs{list-style:none;margin:6px 0 0;padding:0}
li.r{padding:5px 0 5px 10px;border-top:1px solid #eef0f2;border-left:3px solid transparent}
li.r.e{border-left-color:var(--e)}li.r.w{border-left-color:var(--wl)}li.r.i{border-left-color:var(--i)}
li.r.g{border-left-color:#aaa;color:#444}
.sv{font-weight:700;margin-right:4px}.r.e .sv{color:var(--e)}.r.w .sv{color:var(--w)}.r.i .sv{color:var(--i)}
ul.d{margin:2px 0 0;padding:0 0 0 16px;font:12px/1.35 ui-monospace,"DejaVu Sans Mono",Consolas,monospace;
overflow-wrap:anywhere;list-style:none}
.h{margin:3px 0 0;font-size:12px;color:#3d4550}
.h b{color:#222}
details.sub{margin:6px 0;border:1px solid #eef0f2;border-radius:4px;padding:2px 8px;background:#fcfcfd}
details.sub>summary{cursor:pointer;font-weight:600;padding:2px 0}
footer{margin-top:30px;font-size:12px;color:#666}
@media print{
body{font-size:11px;padding:0;max-width:none}
.filter{display:none}
h2{break-after:avoid}
.sec,li.r,.row{break-inside:avoid}
a{color:inherit;text-decoration:none}
details.sub>summary{list-style:none}
}
@page{margin:12mm}
)css";

// Shows the filter and applies it: each result row is shown when its severity box is ticked
// and its text holds the search text; a heading with nothing left to show is hidden.
const char* const kScript = R"js(
(function(){
var f=document.getElementById('filter');if(!f)return;f.hidden=false;
var boxes=[].slice.call(f.querySelectorAll('input[type=checkbox]')),q=document.getElementById('q'),
out=document.getElementById('shown'),rows=[].slice.call(document.querySelectorAll('li.r')),
texts=rows.map(function(r){return r.textContent.toLowerCase();}),
groups=[].slice.call(document.querySelectorAll('.grp'));
function apply(){var on={},n=0,t=q.value.trim().toLowerCase();
boxes.forEach(function(b){on[b.value]=b.checked;});
rows.forEach(function(r,i){var ok=on[r.getAttribute('data-s')]&&(!t||texts[i].indexOf(t)>=0);r.hidden=!ok;if(ok)n++;});
groups.forEach(function(g){var any=g.querySelector('li.r:not([hidden])');g.hidden=!any;if(t&&any&&g.tagName==='DETAILS')g.open=true;});
out.textContent=n+' of '+rows.length+' results shown';}
boxes.forEach(function(b){b.addEventListener('change',apply);});q.addEventListener('input',apply);apply();
})();
)js";

class Page {
  public:
    Page(const RunReport& report, const Arrangement& arrangement)
        : report_(report), arrangement_(arrangement), grouping_(arrangement.Grouping()) {}

    std::string Write() {
        if (report_.target != Target::Sequence) {
            picture_ =
                DrawWeek(report_.weekly.get(), report_.calendar.get(), report_.started.Date());
        }
        std::vector<std::string> shows = ShowsOf(picture_);
        if (report_.target == Target::Show)
            shows.push_back(report_.targetFile);
        states_ = arrangement_.ShowStates(shows);
        for (const DayBlock& block : picture_.week)
            AddPlays(block, "");
        for (const CalendarDate& date : picture_.dates) {
            for (const DayBlock& block : date.shows)
                AddPlays(block, date.key + " ");
        }

        out_.reserve(8192 + grouping_.Size() * 600);
        out_ += "<!DOCTYPE html>\n<html lang=\"en\"><head><meta charset=\"utf-8\">\n";
        out_ += "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n";
        out_ += "<meta name=\"generator\" content=\"" + Html(report_.program) + " " +
                Html(report_.version) + "\">\n";
        out_ += "<title>Verifier report: " + Html(TargetTitle()) + "</title>\n<style>";
        out_ += kStyle;
        out_ += "</style></head>\n<body>\n";
        WriteHeader();
        WriteCounts();
        WriteOwners();
        WriteWeek();
        WriteResults();
        out_ += "<footer>Written by " + Html(report_.program) + " " + Html(report_.version) +
                ". The Verifier reads the suite's files and never changes them.</footer>\n";
        out_ += "<script>";
        out_ += kScript;
        out_ += "</script>\n</body></html>\n";
        return std::move(out_);
    }

  private:
    std::string TargetTitle() const {
        switch (report_.target) {
            case Target::Schedule:
                return "the entire schedule";
            case Target::Show:
                return "show " + std::string(FileName(report_.targetFile));
            case Target::Sequence:
                return "sequence " + std::string(FileName(report_.targetFile));
        }
        return "";
    }

    void AddPlays(const DayBlock& block, const std::string& prefix) {
        if (block.fromPreviousDay)
            return;
        std::vector<std::string>& plays = plays_[block.show];
        const std::string text = prefix + block.times;
        if (std::find(plays.begin(), plays.end(), text) == plays.end())
            plays.push_back(text);
    }

    void WriteHeader() {
        out_ +=
            "<header><h1>Verifier report: " + Html(TargetTitle()) + "</h1>\n<dl class=\"meta\">";
        auto item = [&](const char* term, const std::string& html) {
            out_ += "<dt>";
            out_ += term;
            out_ += "</dt><dd>" + html + "</dd>";
        };
        switch (report_.target) {
            case Target::Schedule:
                item("Verified",
                     "the weekly and calendar schedules, with every show and sequence "
                     "they play");
                break;
            case Target::Show:
                item("Verified", "the show <span id=\"target\">" + Html(report_.targetFile) +
                                     "</span> and its sequences");
                break;
            case Target::Sequence:
                item("Verified",
                     "the sequence <span id=\"target\">" + Html(report_.targetFile) + "</span>");
                break;
        }
        item("When", Html(RunTimeText(report_.started)) + " (" +
                         Counted(report_.checksPerformed, "check", "checks") + ")");
        std::string store = Html(report_.store);
        if (!report_.storeChosen.empty())
            store += " (" + Html(report_.storeChosen) + ")";
        item("Settings", store.empty() ? "unknown" : store);
        item("Program", Html(report_.program) + " " + Html(report_.version));
        if (report_.baselineFile) {
            item("Baseline", Counted(arrangement_.InBaseline(), "result", "results") + " in " +
                                 Html(*report_.baselineFile) + " are known and not listed");
        }
        out_ += "</dl></header>\n";
        if (report_.cancelled) {
            out_ +=
                "<p class=\"banner e\">The verification was cancelled: this report is "
                "incomplete, and what was not checked may still go wrong.</p>\n";
        }
    }

    void WriteCounts() {
        const SeverityCounts counts = grouping_.Counts(Listing::NotIgnored);
        const int64_t ignored = grouping_.Counts(Listing::Ignored).Total();
        const int64_t info = counts.info + counts.other;
        out_ += "<section id=\"counts\"><div class=\"counts\">";
        auto count = [&](const char* cls, const char* id, int64_t n, const char* singular,
                         const char* plural) {
            out_ += std::string("<span class=\"count ") + cls + "\" id=\"count-" + id +
                    "\" data-count=\"" + std::to_string(n) + "\"><b>" + FormatCount(n) + "</b>" +
                    (n == 1 ? singular : plural) + "</span>";
        };
        count("e", "errors", counts.errors, "error", "errors");
        count("w", "warnings", counts.warnings, "warning", "warnings");
        count("i", "info", info, "info result", "info results");
        count("g", "ignored", ignored, "ignored", "ignored");
        out_ += "</div>\n<div class=\"bar\" role=\"img\" aria-label=\"" + CountsText(counts) +
                ", " + Counted(ignored, "ignored", "ignored") + "\">";
        auto segment = [&](const char* cls, int64_t n) {
            if (n > 0) {
                out_ += std::string("<span class=\"") + cls +
                        "\" style=\"flex-grow:" + std::to_string(n) + "\"></span>";
            }
        };
        segment("e", counts.errors);
        segment("w", counts.warnings);
        segment("i", info);
        segment("g", ignored);
        out_ += "</div>";
        if (counts.errors == 0 && counts.warnings == 0 && !report_.cancelled)
            out_ += "<p class=\"banner o\">No errors or warnings found.</p>";
        out_ += "</section>\n";
    }

    // The shows with findings, worst first, and the findings that belong to no show.
    void WriteOwners() {
        std::vector<std::pair<std::string, const ShowState*>> owners;
        for (const auto& [show, state] : states_) {
            if (state.counts.errors > 0 || state.counts.warnings > 0)
                owners.emplace_back(show, &state);
        }
        std::stable_sort(owners.begin(), owners.end(), [](const auto& a, const auto& b) {
            if (a.second->counts.errors != b.second->counts.errors)
                return a.second->counts.errors > b.second->counts.errors;
            return a.second->counts.warnings > b.second->counts.warnings;
        });
        const Section* installation = nullptr;
        for (const Section& section : arrangement_.Sections()) {
            if (section.kind == Section::Kind::Installation)
                installation = &section;
        }
        if (owners.empty() && (installation == nullptr || (installation->counts.errors == 0 &&
                                                           installation->counts.warnings == 0)))
            return;
        out_ += "<section id=\"owners\"><h2>Where the findings are</h2><ul class=\"owners\">";
        for (const auto& [show, state] : owners) {
            const char* cls = StateClass(*state);
            out_ += std::string("<li class=\"") + cls + "\" data-show=\"" + Html(show) +
                    "\" title=\"" + Html(show) + "\"><span class=\"mk\">" + Mark(cls) + "</span>";
            const std::string name = "<b>" + Html(FileName(show)) + "</b>";
            out_ += state->anchor.empty() ? name
                                          : "<a href=\"#" + state->anchor + "\">" + name + "</a>";
            out_ += ": " + CountsText(state->counts) + "</li>";
        }
        if (installation != nullptr &&
            (installation->counts.errors > 0 || installation->counts.warnings > 0)) {
            const char* cls = WorstClass(installation->counts);
            out_ += std::string("<li class=\"") + cls + "\"><span class=\"mk\">" + Mark(cls) +
                    "</span><a href=\"#" + installation->anchor +
                    "\"><b>Installation and settings</b></a>: " + CountsText(installation->counts) +
                    "</li>";
        }
        out_ += "</ul>";
        out_ +=
            "<p class=\"note\">A show counts what names it and what names a sequence it "
            "plays.</p></section>\n";
    }

    static const char* Mark(const char* cls) {
        switch (*cls) {
            case 'e':
                return "\u2716";  // heavy multiplication x
            case 'w':
                return "\u25B2";  // triangle
            case 'o':
                return "\u2713";  // check mark
            default:
                return "\u25CB";  // circle
        }
    }

    void Block(const DayBlock& block, bool small) {
        const auto found = states_.find(block.show);
        const ShowState state = found == states_.end() ? ShowState{} : found->second;
        const char* cls = StateClass(state);
        std::string classes = std::string("blk ") + cls;
        if (block.fromPreviousDay)
            classes += " fp";
        if (block.toNextDay)
            classes += " tn";
        const std::string title = Html(FileName(block.show)) + ", " + OwnHtml(block.times) + ": " +
                                  OwnHtml(StateText(state)) + "\n" + Html(block.show);
        const bool link = !state.anchor.empty();
        out_ += link ? "<a" : "<span";
        out_ += " class=\"" + classes + "\" style=\"left:" + Percent(block.from) +
                ";width:" + Percent(block.to - block.from) + "\" data-show=\"" + Html(block.show) +
                "\" data-from=\"" + std::to_string(block.from) + "\" data-to=\"" +
                std::to_string(block.to) + "\" title=\"" + title + "\"";
        if (link)
            out_ += " href=\"#" + state.anchor + "\"";
        out_ += ">";
        if (!small) {
            out_ += "<span class=\"mk\">";
            out_ += Mark(cls);
            out_ += "</span>";
        }
        if (block.fromPreviousDay)
            out_ += "\u2190 ";
        out_ += Html(Stem(block.show));
        if (!small)
            out_ += " " + OwnHtml(block.times);
        if (block.toNextDay)
            out_ += " \u2192";
        out_ += link ? "</a>" : "</span>";
    }

    void Axis() {
        out_ += "<div class=\"row\"><div class=\"dn\"></div><div class=\"axis\">";
        for (int hour = 0; hour <= 24; hour += 3) {
            out_ += "<span style=\"left:" + Percent(int64_t{hour} * 3600) + "\">" +
                    TwoDigits(hour) + ":00</span>";
        }
        out_ += "</div></div>";
    }

    void WriteWeek() {
        out_ += "<section id=\"week\"><h2>The week at a glance</h2>\n";
        if (report_.target == Target::Sequence) {
            out_ +=
                "<p class=\"note\">One sequence was verified; it has no place in the week of "
                "its own. Verify its show, or the entire schedule, to see the week.</p>"
                "</section>\n";
            return;
        }
        if (report_.target == Target::Show) {
            out_ += "<p class=\"note\">The suite's schedules, as they stand: only " +
                    Html(FileName(report_.targetFile)) +
                    " was verified in this run; the other shows are drawn as not verified.</p>";
        }
        const int32_t today = report_.started.Weekday();
        out_ += "<div class=\"week\" id=\"weekly\">";
        Axis();
        for (int32_t day = 0; day < 7; ++day) {
            out_ += "<div class=\"row\" data-day=\"" + std::to_string(day) + "\"><div class=\"dn" +
                    std::string(day == today ? " today" : "") + "\">" + kDayNames[day] +
                    (day == today ? " (today)" : "") + "</div><div class=\"lane\">";
            for (const DayBlock& block : picture_.week) {
                if (block.day == day)
                    Block(block, false);
            }
            out_ += "</div></div>";
        }
        out_ += "</div>\n";
        if (picture_.week.empty())
            out_ += "<p class=\"note\">The weekly schedule has no shows.</p>";
        Legend();
        WriteDates();
        if (report_.target == Target::Show && plays_.count(report_.targetFile) == 0) {
            out_ += "<p class=\"note\"><b>" + Html(FileName(report_.targetFile)) +
                    "</b> is not on the weekly schedule or on a calendar date from today on.</p>";
        }
        out_ += "</section>\n";
    }

    void Legend() {
        out_ += "<p class=\"legend\">";
        for (const auto& [cls, text] :
             {std::pair{"e", "errors found"}, std::pair{"w", "warnings found"},
              std::pair{"o", "nothing found"}, std::pair{"u", "not verified"}}) {
            out_ += std::string("<span class=\"blk ") + cls + "\"><span class=\"mk\">" + Mark(cls) +
                    "</span>" + text + "</span>";
        }
        out_ += " &nbsp;\u2190 \u2192 a show that runs across midnight, drawn on both days</p>";
    }

    void WriteDates() {
        out_ += "<h3 style=\"margin-top:12px\">Calendar dates from today on</h3>";
        if (picture_.dates.empty()) {
            out_ += "<p class=\"note\">No calendar date from today on has a show.";
        } else {
            out_ += "<div class=\"week dates\" id=\"calendar\">";
            Axis();
            for (const CalendarDate& date : picture_.dates) {
                out_ += "<div class=\"row\" data-date=\"" + date.key + "\"><div class=\"dn\">" +
                        std::string(DayAbbreviation(date.date.Weekday())) + " " + date.key +
                        "</div><div class=\"lane\">";
                for (const DayBlock& block : date.shows)
                    Block(block, false);
                out_ += "</div></div>";
                if (!date.weekly.empty()) {
                    out_ += "<div class=\"row weekly-too\"><div class=\"dn\">&nbsp;&nbsp;weekly, " +
                            std::string(DayAbbreviation(date.date.Weekday())) +
                            "</div><div class=\"lane thin\">";
                    for (const DayBlock& block : date.weekly)
                        Block(block, true);
                    out_ += "</div></div>";
                }
            }
            out_ +=
                "</div><p class=\"note\">Where a date has shows of its own and the weekly "
                "schedule has shows on that weekday too, both are drawn: the date's on the "
                "first line, the weekly schedule's below it. This report does not say which "
                "the show player runs.";
        }
        if (picture_.pastDates > 0) {
            out_ += " " + Counted(picture_.pastDates, "earlier date is", "earlier dates are") +
                    " not drawn.";
        }
        out_ += "</p>";
    }

    void WriteResults() {
        const std::size_t total = grouping_.Size();
        out_ += "<section id=\"results\"><h2>Results</h2>\n";
        out_ +=
            "<div class=\"filter\" id=\"filter\" hidden>"
            "<label><input type=\"checkbox\" value=\"e\" checked> Errors</label>"
            "<label><input type=\"checkbox\" value=\"w\" checked> Warnings</label>"
            "<label><input type=\"checkbox\" value=\"i\" checked> Info</label>"
            "<label><input type=\"checkbox\" value=\"g\" checked> Ignored</label>"
            "<input type=\"search\" id=\"q\" placeholder=\"Filter by text: a show, sequence, "
            "channel\u2026\" aria-label=\"Filter by text\"><span id=\"shown\" class=\"note\">" +
            FormatCount(static_cast<int64_t>(total)) + " results</span></div>\n";
        for (const Section& section : arrangement_.Sections())
            WriteSection(section);
        WriteIgnored();
        out_ += "</section>\n";
    }

    void WriteSection(const Section& section) {
        const char* cls = SeverityClass(section.worst);
        out_ += "<section class=\"grp sec " + std::string(cls) + "\" id=\"" + section.anchor +
                "\"><h3>";
        switch (section.kind) {
            case Section::Kind::Show:
                out_ += "Show " + Html(FileName(section.path));
                break;
            case Section::Kind::Sequence:
                out_ += "Sequence " + Html(FileName(section.path));
                break;
            case Section::Kind::Installation:
                out_ += "Installation and settings";
                break;
        }
        out_ += "<span class=\"tally " + std::string(cls) + "\">" + CountsText(section.counts) +
                "</span>";
        if (section.kind != Section::Kind::Installation)
            out_ += "<span class=\"path\">" + Html(section.path) + "</span>";
        out_ += "</h3>";
        if (section.kind == Section::Kind::Show) {
            const auto plays = plays_.find(section.path);
            if (plays != plays_.end()) {
                std::string when;
                for (const std::string& text : plays->second)
                    when += (when.empty() ? "" : "; ") + text;
                out_ += "<p class=\"note\">Plays " + OwnHtml(when) + "</p>";
            }
        } else if (section.kind == Section::Kind::Sequence) {
            if (const auto* players = arrangement_.PlayedBy(section.path)) {
                std::string names;
                for (const std::string& player : *players)
                    names += (names.empty() ? "" : ", ") + Html(FileName(player));
                out_ += "<p class=\"note\">Played by " + names + "</p>";
            }
        }
        WriteMembers(section.members);
        out_ += "</section>\n";
    }

    // Results under a heading: the conflicts of one pair of sequences (or inside one) together
    // at the place of the first of them, each other result on its own.
    void WriteMembers(const std::vector<std::size_t>& members) {
        std::vector<std::variant<std::size_t, std::string>> items;
        std::map<std::string, std::vector<std::size_t>> subgroups;
        std::map<std::string, std::string> titles;
        for (const std::size_t i : members) {
            const GroupIdentity pair = grouping_.GroupOf(i, GroupBy::SequencePair);
            if (IsOther(pair)) {
                items.emplace_back(i);
                continue;
            }
            auto& subgroup = subgroups[pair.key];
            if (subgroup.empty()) {
                items.emplace_back(pair.key);
                titles[pair.key] = pair.title;
            }
            subgroup.push_back(i);
        }
        out_ += "<ul class=\"rs\">";
        for (const auto& item : items) {
            if (const std::size_t* index = std::get_if<std::size_t>(&item)) {
                Row(*index, true);
                continue;
            }
            const std::string& key = std::get<std::string>(item);
            const std::vector<std::size_t>& subgroup = subgroups[key];
            SeverityCounts counts;
            std::vector<int32_t> messages;
            for (const std::size_t i : subgroup) {
                counts.Add(grouping_.At(i)->Severity());
                const int32_t number = grouping_.At(i)->MessageNumber();
                if (std::find(messages.begin(), messages.end(), number) == messages.end())
                    messages.push_back(number);
            }
            const bool open = counts.errors > 0 || subgroup.size() <= 3;
            out_ += std::string("<li><details class=\"grp sub\"") + (open ? " open" : "") +
                    "><summary>" + Html(titles[key]) + " <span class=\"tally " +
                    WorstClass(counts) + "\">" + CountsText(counts) + "</span></summary>";
            for (const int32_t number : messages)
                Help(number, true);
            out_ += "<ul class=\"rs\">";
            for (const std::size_t i : subgroup)
                Row(i, false);
            out_ += "</ul></details></li>";
        }
        out_ += "</ul>";
    }

    void Help(int32_t number, bool named) {
        const char* advice = MessageAdvice::For(number);
        if (advice == nullptr)
            return;
        out_ += "<p class=\"h\"><b>What to do";
        if (named)
            out_ += " (message " + std::to_string(number) + ")";
        out_ += ":</b> ";
        out_ += Html(advice);
        out_ += "</p>";
    }

    void Row(std::size_t index, bool withHelp) {
        const Result& result = *grouping_.At(index);
        const bool ignored = grouping_.Ignored(index);
        const char* cls = SeverityClass(result.Severity());
        out_ += std::string("<li class=\"r ") + (ignored ? "g" : cls) + "\" data-s=\"" +
                (ignored ? "g" : cls) + "\" data-sev=\"" +
                std::to_string(static_cast<int32_t>(result.Severity())) + "\" data-m=\"" +
                std::to_string(result.MessageNumber()) + "\"><span class=\"sv\">" +
                Html(result.SeverityText()) + " " + std::to_string(result.MessageNumber()) +
                "</span><span class=\"sm\">" + Html(result.Summary()) + "</span>";
        if (!result.Details().empty()) {
            out_ += "<ul class=\"d\">";
            for (const std::string& detail : result.Details())
                out_ += "<li>" + Html(detail) + "</li>";
            out_ += "</ul>";
        }
        if (withHelp)
            Help(result.MessageNumber(), false);
        out_ += "</li>";
    }

    void WriteIgnored() {
        ResultQuery query;
        query.listing = Listing::Ignored;
        const ResultView ignored = grouping_.View(query);
        if (ignored.shown.empty())
            return;
        out_ +=
            "<section class=\"grp sec\" id=\"ignored\"><details class=\"grp\"><summary><h3 "
            "style=\"display:inline\">Ignored results<span class=\"tally\">" +
            FormatCount(static_cast<int64_t>(ignored.shown.size())) +
            "</span></h3></summary><p class=\"note\">Results that match the ignore lists "
            "of the settings store. They do not count, and stay ignored in later "
            "verifications until they are no longer ignored.</p><ul class=\"rs\">";
        for (const std::size_t i : ignored.shown)
            Row(i, true);
        out_ += "</ul></details></section>\n";
    }

    const RunReport& report_;
    const Arrangement& arrangement_;
    const ResultGrouping& grouping_;
    WeekPicture picture_;
    std::map<std::string, ShowState> states_;
    std::map<std::string, std::vector<std::string>> plays_;  // show to when it plays
    std::string out_;
};

}  // namespace

std::string Write(const RunReport& report) {
    const Arrangement arrangement(report);
    return Page(report, arrangement).Write();
}

void Save(const std::string& fileName, const RunReport& report) {
    OutputFile::Write(fileName, Write(report), "results file", "HtmlReport.Save");
}

}  // namespace vtr::report::HtmlReport
