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
        text += ResultText(*result);
    }
    return text;
}

}  // namespace

std::string ResultText(const Result& result, std::string_view lineEnd) {
    std::string text = "Message Number: " + std::to_string(result.MessageNumber());
    text += lineEnd;
    text += "Severity: " + result.SeverityText();
    text += lineEnd;
    text += "Description: " + result.Summary();
    text += lineEnd;
    const auto& details = result.Details();
    for (std::size_t i = 0; i < details.size(); ++i) {
        text += details.size() == 1 ? std::string("Detail") : "Detail #" + std::to_string(i + 1);
        text += ": " + details[i];
        text += lineEnd;
    }
    return text;
}

void SaveResultsReport(const std::string& fileName) {
    OutputFile::Write(fileName, ReportText(), "results file", kSource);
}

DialogSettings ChooseResultsReportFileSettings() {
    DialogSettings settings;
    settings.initialFolder = VTRCommon::GetUserDataPath();
    return settings;
}

}  // namespace vtr::ResultsReport
