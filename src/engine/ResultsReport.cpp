#include "engine/ResultsReport.h"

#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/OutputFile.h"
#include "environment/VTRCommon.h"

namespace vtr::ResultsReport {

namespace {

const char* const kSource = "ResultsReport.SaveResultsReport";

std::string ReportText() {
    std::string text;
    bool first = true;
    for (const ResultPtr& result : LibVerify::GetResults()) {
        if (!result || result->Ignorable())
            continue;
        if (!first)
            text += std::string(79, '=') + "\r\n";
        first = false;
        text += "Message Number: " + std::to_string(result->MessageNumber()) + "\r\n";
        text += "Severity: " + result->SeverityText() + "\r\n";
        text += "Description: " + result->Summary() + "\r\n";
        const auto& details = result->Details();
        for (std::size_t i = 0; i < details.size(); ++i) {
            const std::string label =
                details.size() == 1 ? "Detail" : "Detail #" + std::to_string(i + 1);
            text += label + ": " + details[i] + "\r\n";
        }
    }
    return text;
}

}  // namespace

void SaveResultsReport(const std::string& fileName) {
    OutputFile::Write(fileName, ReportText(), "results file", kSource);
}

DialogSettings ChooseResultsReportFileSettings() {
    DialogSettings settings;
    settings.initialFolder = VTRCommon::GetUserDataPath();
    return settings;
}

}  // namespace vtr::ResultsReport
