#include "engine/OutputLog.h"

#include <utility>

namespace vtr::OutputLog {

Colour ResultColour(Severity severity) {
    switch (severity) {
        case Severity::Info:
            return kBlue;
        case Severity::Warning:
            return kOrange;
        case Severity::Error:
            return kRed;
    }
    return kBlack;
}

std::string TimeStamp(const DateTime& when) {
    const int32_t hour = when.Hour();
    const int32_t hour12 = (hour == 0 || hour == 12) ? 12 : hour % 12;
    auto twoDigits = [](int32_t value) { return (value < 10 ? "0" : "") + std::to_string(value); };
    return std::to_string(hour12) + ":" + twoDigits(when.Minute()) + ":" +
           twoDigits(when.Second()) + (hour >= 12 ? " PM" : " AM");
}

std::string TimeStamp() {
    return TimeStamp(DateTime::Now());
}

std::string CheckAddedText(ICheck& check) {
    return "Adding check: " + check.Description();
}

std::string CheckingText(ICheck& check) {
    return "Checking: " + check.Description();
}

std::string ChecksCompletedText(bool cancelled) {
    return cancelled ? "Stopping verification due to cancellation" : "Verification completed";
}

std::string ResultText(const Result& result) {
    std::string text = result.Summary();
    const auto& details = result.Details();
    for (std::size_t i = 0; i < details.size(); ++i) {
        text += (i == 0 ? ": " : " / ");
        text += details[i];
    }
    return text;
}

std::string LogLine::Formatted() const {
    return timeStamp + ": " + text;
}

std::string FormatLine(const DateTime& when, const std::string& text) {
    return TimeStamp(when) + ": " + text;
}

std::string FormatLine(const std::string& text) {
    return FormatLine(DateTime::Now(), text);
}

LogWriter::LogWriter(Sink sink, Clearer clearer)
    : sink_(std::move(sink)), clearer_(std::move(clearer)) {}

void LogWriter::CheckAdded(ICheck& check) {
    Write(CheckAddedText(check));
}

void LogWriter::CheckCompleted(ICheck&) {}

void LogWriter::Checking(ICheck& check) {
    Write(CheckingText(check));
}

void LogWriter::ChecksCompleted(bool cancelled) {
    Write(ChecksCompletedText(cancelled));
}

void LogWriter::Initializing() {
    if (clearer_)
        clearer_();
}

void LogWriter::ResultAdded(const ResultPtr& result) {
    if (result)
        Write(ResultText(*result), ResultColour(result->Severity()));
}

void LogWriter::TransientMessage(const std::string& message) {
    Write(message);
}

void LogWriter::VerificationCancelled() {}

void LogWriter::Write(std::string text, Colour colour) {
    if (sink_)
        sink_(LogLine{TimeStamp(), std::move(text), colour});
}

}  // namespace vtr::OutputLog
