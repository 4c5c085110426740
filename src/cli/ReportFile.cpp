#include "ReportFile.h"

#include <filesystem>
#include <ostream>
#include <sstream>

#include "engine/ResultsReport.h"
#include "engine/VtrError.h"
#include "environment/OutputFile.h"
#include "report/HtmlReport.h"
#include "report/SarifReport.h"

namespace vtr::cli {
namespace {

constexpr const char* kWhat = "results file";
constexpr const char* kSource = "vantori-verify";

report::Target ReportTarget(TargetKind kind) {
    switch (kind) {
        case TargetKind::Schedule:
            return report::Target::Schedule;
        case TargetKind::Show:
            return report::Target::Show;
        case TargetKind::Sequence:
            return report::Target::Sequence;
    }
    return report::Target::Schedule;
}

}  // namespace

ReportFormat ReportFormatFor(const std::string& path) {
    std::string extension = std::filesystem::path(path).extension().string();
    for (char& c : extension)
        c = static_cast<char>(c >= 'A' && c <= 'Z' ? c - 'A' + 'a' : c);
    if (extension == ".json")
        return ReportFormat::Json;
    if (extension == ".html" || extension == ".htm")
        return ReportFormat::Html;
    if (extension == ".sarif")
        return ReportFormat::Sarif;
    return ReportFormat::Text;
}

report::RunReport ReportOf(const RunRecord& record, const Presentation& presentation) {
    report::RunReport run;
    run.target = ReportTarget(record.target);
    run.targetFile = record.targetFile;
    run.cancelled = record.cancelled;
    run.checksPerformed = record.checksPerformed;
    run.baselineFile = presentation.baselineFile;
    run.results.reserve(record.results.size());
    for (const RecordedResult& recorded : record.results)
        run.results.push_back({recorded.result, recorded.ignored, recorded.inBaseline});
    report::AddRunContext(run);
    return run;
}

void SaveReport(const std::string& path, const RunRecord& record,
                const Presentation& presentation) {
    switch (ReportFormatFor(path)) {
        case ReportFormat::Text:
            ResultsReport::SaveResultsReport(path);
            return;
        case ReportFormat::Json: {
            Presentation plain = presentation;
            plain.color = false;
            std::ostringstream document;
            WriteJson(document, record, plain);
            OutputFile::Write(path, document.str(), kWhat, kSource);
            return;
        }
        case ReportFormat::Html:
            OutputFile::Write(path, report::HtmlReport::Write(ReportOf(record, presentation)),
                              kWhat, kSource);
            return;
        case ReportFormat::Sarif:
            OutputFile::Write(path, report::SarifReport::Write(ReportOf(record, presentation)),
                              kWhat, kSource);
            return;
    }
}

void WriteOutput(std::ostream& out, OutputFormat format, const RunRecord& record,
                 const Presentation& presentation) {
    switch (format) {
        case OutputFormat::Text:
            WriteText(out, record, presentation);
            return;
        case OutputFormat::Json:
            WriteJson(out, record, presentation);
            return;
        case OutputFormat::Html:
            out << report::HtmlReport::Write(ReportOf(record, presentation));
            return;
        case OutputFormat::Sarif:
            out << report::SarifReport::Write(ReportOf(record, presentation));
            return;
    }
}

}  // namespace vtr::cli
