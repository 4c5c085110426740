#include "engine/IgnoreLists.h"

#include <algorithm>

#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/LibRegistryVTR.h"
#include "environment/RegistryStore.h"

namespace vtr::IgnoreLists {

namespace {

const char* const kSubkey = "Verifier";

struct StoredList {
    const char* countName;
    const char* entryPrefix;
    OrderedStringSet& (*set)();
};

const StoredList kMessageNumbers{"CountIgnoreMsgNum", "IgnoreMsgNum",
                                 &LibVerify::IgnoredMessageNumbers};
const StoredList kResults{"CountIgnoreMsg", "IgnoreMsg", &LibVerify::IgnoredResultKeys};

// The list as the store holds it, added to set: values 1 to count, the missing, empty and
// repeated ones skipped.
void Read(const StoredList& list, OrderedStringSet& set) {
    RegistryStore::ReadScope reading;
    const int32_t count =
        ResumeOr(0, [&] { return LibRegistryVTR::GetSuiteLong(list.countName, kSubkey, 0); });
    for (int32_t n = 1; n <= std::min(count, kMaxEntriesRead); ++n) {
        ResumeStep([&] {
            const std::string entry =
                LibRegistryVTR::GetSuiteString(list.entryPrefix + std::to_string(n), kSubkey, "");
            if (!entry.empty())
                set.Add(entry);
        });
    }
}

std::string StoreName() {
    const auto file = RegistryStore::CurrentFile();
    return file ? "the settings store " + *file : std::string("the registry");
}

ChangeOutcome Change(const StoredList& list, const std::string& entry, bool add) {
    RegistryStore::Changes changes;
    OrderedStringSet stored;
    Read(list, stored);
    const bool listed = stored.Contains(entry);
    if (add == listed) {
        changes.Commit();
        list.set() = std::move(stored);
        return add ? ChangeOutcome::AlreadyListed : ChangeOutcome::NotListed;
    }
    if (add)
        stored.Add(entry);
    else
        stored.Remove(entry);
    const std::vector<std::string>& entries = stored.Entries();
    try {
        for (std::size_t n = 1; n <= entries.size(); ++n) {
            LibRegistryVTR::SetSuiteString(list.entryPrefix + std::to_string(n), entries[n - 1],
                                           kSubkey);
        }
        LibRegistryVTR::SetSuiteLong(list.countName, static_cast<int32_t>(entries.size()), kSubkey);
    } catch (const VtrError& error) {
        Raise(error.Number(), error.Source(),
              "the ignore list could not be saved in " + StoreName() + ": " + error.Description());
    }
    changes.Commit();
    list.set() = std::move(stored);
    return add ? ChangeOutcome::Added : ChangeOutcome::Removed;
}

// With errors resumed: a store that cannot be changed leaves the change in memory only.
void ChangeResumed(const StoredList& list, const std::string& entry, bool add) {
    if (ResumeOr(false, [&] {
            Change(list, entry, add);
            return true;
        })) {
        return;
    }
    if (add)
        list.set().Add(entry);
    else
        list.set().Remove(entry);
}

}  // namespace

void LoadIgnoreLists() {
    Read(kMessageNumbers, kMessageNumbers.set());
    Read(kResults, kResults.set());
}

ChangeOutcome AddIgnoredMessageNumber(int32_t messageNumber) {
    return Change(kMessageNumbers, std::to_string(messageNumber), true);
}

ChangeOutcome RemoveIgnoredMessageNumber(int32_t messageNumber) {
    return Change(kMessageNumbers, std::to_string(messageNumber), false);
}

ChangeOutcome AddIgnoredResultKey(const std::string& ignoreKey) {
    return Change(kResults, ignoreKey, true);
}

ChangeOutcome RemoveIgnoredResultKey(const std::string& ignoreKey) {
    return Change(kResults, ignoreKey, false);
}

void IgnoreMessageNumber(int32_t messageNumber) {
    ChangeResumed(kMessageNumbers, std::to_string(messageNumber), true);
}

void UnignoreMessageNumber(int32_t messageNumber) {
    ChangeResumed(kMessageNumbers, std::to_string(messageNumber), false);
}

void IgnoreResult(const Result& result) {
    ChangeResumed(kResults, result.IgnoreKey(), true);
}

void UnignoreResult(const Result& result) {
    ChangeResumed(kResults, result.IgnoreKey(), false);
}

bool IsMessageNumberIgnored(const std::string& messageNumberText) {
    return LibVerify::IgnoredMessageNumbers().Contains(messageNumberText);
}

bool IsIgnoreKeyIgnored(const std::string& ignoreKey) {
    return LibVerify::IgnoredResultKeys().Contains(ignoreKey);
}

}  // namespace vtr::IgnoreLists
