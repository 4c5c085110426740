#include "engine/LibVerify.h"

#include <algorithm>
#include <utility>

#include "engine/VtrError.h"

namespace vtr::LibVerify {
namespace {

// The verification state: one instance for the whole program.
struct VerificationState {
    std::vector<INotificationClient*> clients;  // in registration order
    std::function<void()> eventPump;

    std::vector<ResultPtr> results;         // every not-ignored result, in the order produced
    std::vector<ResultPtr> ignoredResults;  // results that matched an ignore entry
    std::vector<ResultPtr> errors;          // not-ignored results of severity Error
    std::vector<ResultPtr> warnings;        // not-ignored results of severity Warning

    OrderedStringSet ignoredMessageNumbers;
    OrderedStringSet ignoredResultKeys;
};

VerificationState& State() {
    static VerificationState state;
    return state;
}

// Calls the operation on every client in registration order. A client that fails does not
// stop the broadcast; one that registers or unregisters clients while being told does not
// disturb it either (the list is copied first).
template <typename Operation>
void Broadcast(Operation&& operation) {
    const std::vector<INotificationClient*> clients = State().clients;
    for (INotificationClient* client : clients) {
        ResumeStep([&] { operation(*client); });
    }
}

constexpr std::size_t kMaxDetails = 9;

}  // namespace

void AddNotificationClient(INotificationClient* client) {
    if (client != nullptr)
        State().clients.push_back(client);
}

void RemoveNotificationClient(INotificationClient* client) {
    auto& clients = State().clients;
    auto found = std::find(clients.begin(), clients.end(), client);
    if (found != clients.end())
        clients.erase(found);
}

void SetEventPump(std::function<void()> pump) {
    State().eventPump = std::move(pump);
}

void ProcessPendingEvents() {
    // Copied so that a pump which replaces itself while running stays alive until it returns.
    std::function<void()> pump = State().eventPump;
    if (pump)
        ResumeStep(pump);
}

void PostTransientMessage(const std::string& message) {
    Broadcast([&](INotificationClient& client) { client.TransientMessage(message); });
}

ResultPtr AddResult(Severity severity, const std::string& summary, int32_t helpContextId,
                    int32_t messageNumber, const std::vector<std::string>& details) {
    auto result = std::make_shared<Result>();
    result->SetSeverity(severity);
    result->SetSummary(summary);
    result->SetHelpContextID(helpContextId);
    result->SetMessageNumber(messageNumber);
    // Empty details leave no gap: a result's details are always consecutive from the first.
    const std::size_t count = std::min(details.size(), kMaxDetails);
    for (std::size_t i = 0; i < count; ++i) {
        if (!details[i].empty())
            result->AddDetail(details[i]);
    }

    VerificationState& state = State();
    if (IsResultIgnored(*result)) {
        state.ignoredResults.push_back(result);
    } else {
        state.results.push_back(result);
        if (severity == Severity::Error) {
            state.errors.push_back(result);
        } else if (severity == Severity::Warning) {
            state.warnings.push_back(result);
        }
    }
    Broadcast([&](INotificationClient& client) { client.ResultAdded(result); });
    return result;
}

ResultPtr AddResult(const Message& message, const std::vector<std::string>& details) {
    return AddResult(message.severity, message.summary, message.helpContextId, message.number,
                     details);
}

bool IsResultIgnored(const Result& result) {
    return ResumeOr(false, [&] {
        const VerificationState& state = State();
        return state.ignoredMessageNumbers.Contains(std::to_string(result.MessageNumber())) ||
               state.ignoredResultKeys.Contains(result.IgnoreKey());
    });
}

const std::vector<ResultPtr>& GetResults() {
    return State().results;
}
const std::vector<ResultPtr>& GetIgnoredResults() {
    return State().ignoredResults;
}
int32_t ErrorCount() {
    return static_cast<int32_t>(State().errors.size());
}
int32_t WarningCount() {
    return static_cast<int32_t>(State().warnings.size());
}

void ClearResults() {
    VerificationState& state = State();
    state.results.clear();
    state.ignoredResults.clear();
    state.errors.clear();
    state.warnings.clear();
}

OrderedStringSet& IgnoredMessageNumbers() {
    return State().ignoredMessageNumbers;
}
OrderedStringSet& IgnoredResultKeys() {
    return State().ignoredResultKeys;
}

}  // namespace vtr::LibVerify
