#include "ReportFile.h"

#include <filesystem>
#include <sstream>

#include "engine/ResultsReport.h"
#include "engine/VtrError.h"
#include "environment/OutputFile.h"

namespace vtr::cli {

ReportFormat ReportFormatFor(const std::string& path) {
    std::string extension = std::filesystem::path(path).extension().string();
    for (char& c : extension)
        c = static_cast<char>(c >= 'A' && c <= 'Z' ? c - 'A' + 'a' : c);
    if (extension == ".json")
        return ReportFormat::Json;
    return ReportFormat::Text;
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
            OutputFile::Write(path, document.str(), "results file", "vantori-verify");
            return;
        }
    }
}

}  // namespace vtr::cli
