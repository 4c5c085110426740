#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace vtr {

// Severity of a result. Other values than the three named ones can be stored; their
// text is "Severity n".
enum class Severity : int32_t { Info = 0, Warning = 1, Error = 2 };

std::string SeverityText(Severity severity);

// One finding of a verification.
class Result {
public:
    void AddDetail(const std::string& detail);
    const std::vector<std::string>& Details() const { return details_; }

    int32_t HelpContextID() const { return helpContextId_; }
    void SetHelpContextID(int32_t id) { helpContextId_ = id; }
    int32_t MessageNumber() const { return messageNumber_; }
    void SetMessageNumber(int32_t number) {
        messageNumber_ = number;
        ignoreKey_.reset();
    }
    vtr::Severity Severity() const { return severity_; }
    void SetSeverity(vtr::Severity severity) { severity_ = severity; }
    const std::string& Summary() const { return summary_; }
    void SetSummary(const std::string& summary) { summary_ = summary; }

    // True while the result matches an entry of the ignore lists (asked afresh each time).
    bool Ignorable() const;
    // Message number, "-", then each detail followed by " / ". Worked out when first asked
    // for and kept until the number or the details change.
    const std::string& IgnoreKey() const;
    std::string SeverityText() const;

private:
    std::vector<std::string> details_;
    int32_t helpContextId_ = 0;
    int32_t messageNumber_ = 0;
    vtr::Severity severity_ = vtr::Severity::Info;
    std::string summary_;
    mutable std::optional<std::string> ignoreKey_;
};

using ResultPtr = std::shared_ptr<Result>;

}  // namespace vtr
