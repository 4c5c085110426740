#include "engine/Result.h"

#include "engine/LibVerify.h"

namespace vtr {

std::string SeverityText(Severity severity) {
    switch (severity) {
        case Severity::Info:
            return "Info";
        case Severity::Warning:
            return "Warning";
        case Severity::Error:
            return "Error";
    }
    return "Severity " + std::to_string(static_cast<int32_t>(severity));
}

void Result::AddDetail(const std::string& detail) {
    details_.push_back(detail);
    ignoreKey_.reset();
}

bool Result::Ignorable() const {
    return LibVerify::IsResultIgnored(*this);
}

const std::string& Result::IgnoreKey() const {
    if (!ignoreKey_) {
        // Stored keys carry the trailing " / " after the last detail; it is part of the key.
        std::string key = std::to_string(messageNumber_) + "-";
        for (const std::string& detail : details_)
            key.append(detail).append(" / ");
        ignoreKey_ = std::move(key);
    }
    return *ignoreKey_;
}

std::string Result::SeverityText() const {
    return vtr::SeverityText(severity_);
}

}  // namespace vtr
