#include "engine/ResultsReport.h"

#include <cerrno>
#include <cstdio>
#include <system_error>

#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/VTRCommon.h"
#include "show/WholeFile.h"

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

std::string SystemText(int error) {
    return std::generic_category().message(error);
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
    std::FILE* file = nullptr;
    try {
        const std::string text = ReportText();
        file = std::fopen(fileName.c_str(), "wb");
        if (file == nullptr) {
            Raise(FileErrors::PathFileAccessError, kSource,
                  "Cannot create the results file " + fileName + ": " + SystemText(errno));
        }
        errno = 0;
        if (std::fwrite(text.data(), 1, text.size(), file) != text.size() ||
            std::fflush(file) != 0) {
            Raise(FileErrors::DeviceIoError, kSource,
                  "Cannot write the results file " + fileName + ": " +
                      SystemText(errno != 0 ? errno : EIO));
        }
        std::FILE* closing = file;
        file = nullptr;
        if (std::fclose(closing) != 0) {
            Raise(FileErrors::DeviceIoError, kSource,
                  "Cannot write the results file " + fileName + ": " +
                      SystemText(errno != 0 ? errno : EIO));
        }
    } catch (...) {
        if (file != nullptr)
            std::fclose(file);
        throw;
    }
}

DialogSettings ChooseResultsReportFileSettings() {
    DialogSettings settings;
    settings.initialFolder = VTRCommon::GetUserDataPath();
    return settings;
}

}  // namespace vtr::ResultsReport
