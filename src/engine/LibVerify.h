#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "engine/ICheck.h"
#include "engine/INotificationClient.h"
#include "engine/Messages.h"
#include "engine/OrderedStringSet.h"
#include "engine/Result.h"

// The verification driver: one state for the whole program. This header holds the
// services that checks and front ends call; the run itself (targets, queue, caches)
// is declared further down as it is built.
namespace vtr::LibVerify {

// --- Notification clients and the event pump -------------------------------------------

// Clients are told of every step, in registration order; an error raised by a client is
// ignored and the broadcast goes on with the next. The caller keeps the client alive.
void AddNotificationClient(INotificationClient* client);
void RemoveNotificationClient(INotificationClient* client);

// "Let the user interface process pending events": the front end installs the pump (the
// window processes Qt events, the command line redraws its progress line). With none
// installed ProcessPendingEvents does nothing.
void SetEventPump(std::function<void()> pump);
void ProcessPendingEvents();

// Broadcasts TransientMessage(message) to every client.
void PostTransientMessage(const std::string& message);

// --- Results --------------------------------------------------------------------------

// The result factory: the only way a result enters the verification. Empty details are
// skipped without leaving a gap; at most nine details are taken.
ResultPtr AddResult(Severity severity, const std::string& summary, int32_t helpContextId,
                    int32_t messageNumber, const std::vector<std::string>& details = {});
// The same for a catalog entry: its severity, summary, help-context id and number.
ResultPtr AddResult(const Message& message, const std::vector<std::string>& details = {});

// True when the result's message number, or else its IgnoreKey, is in the ignore lists.
// Never fails.
bool IsResultIgnored(const Result& result);

// The results of the current (or last) run.
const std::vector<ResultPtr>& GetResults();         // not ignored, in the order produced
const std::vector<ResultPtr>& GetIgnoredResults();  // matched an ignore entry
int32_t ErrorCount();                               // not-ignored errors
int32_t WarningCount();                             // not-ignored warnings

// Empties the result collections (the start of a run).
void ClearResults();

// The two in-memory ignore lists (loaded from the settings store at the start of a run).
OrderedStringSet& IgnoredMessageNumbers();
OrderedStringSet& IgnoredResultKeys();

}  // namespace vtr::LibVerify
