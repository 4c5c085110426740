#include "engine/VtrError.h"

#include <atomic>
#include <cstdio>
#include <cstdlib>

namespace vtr {

VtrError::VtrError(int32_t number, std::string source, std::string description,
                   std::string helpFile, int32_t helpContext)
    : std::runtime_error(description),
      number_(number),
      source_(std::move(source)),
      description_(std::move(description)),
      helpFile_(std::move(helpFile)),
      helpContext_(helpContext) {}

void Raise(int32_t number, std::string source, std::string description) {
    throw VtrError(number, std::move(source), std::move(description));
}

std::string DescribeException(const std::exception_ptr& failure, std::string_view unknown) {
    if (!failure)
        return std::string(unknown);
    try {
        std::rethrow_exception(failure);
    } catch (const VtrError& error) {
        return error.Description();
    } catch (const std::exception& error) {
        return error.what();
    } catch (...) {
        return std::string(unknown);
    }
}

namespace {

void WriteResumedToStandardError(std::string_view description) {
    std::fprintf(stderr, "vantori: resumed after a failure: %.*s\n",
                 static_cast<int>(description.size()), description.data());
}

ResumeReporter ReporterFromEnvironment() {
    const char* value = std::getenv("VANTORI_TRACE_RESUMED");
    if (value == nullptr || *value == '\0' || std::string_view(value) == "0")
        return nullptr;
    return &WriteResumedToStandardError;
}

std::atomic<ResumeReporter>& Reporter() {
    // Set from the environment the first time it is needed; SetResumeReporter replaces it.
    static std::atomic<ResumeReporter> reporter{ReporterFromEnvironment()};
    return reporter;
}

}  // namespace

void SetResumeReporter(ResumeReporter reporter) noexcept {
    Reporter().store(reporter);
}

ResumeReporter GetResumeReporter() noexcept {
    return Reporter().load();
}

void ReportResumedFailure() noexcept {
    const ResumeReporter reporter = Reporter().load();
    if (reporter == nullptr)
        return;
    try {
        reporter(DescribeException(std::current_exception()));
    } catch (...) {
        // A failure to describe a failure is not worth more than silence.
    }
}

}  // namespace vtr
