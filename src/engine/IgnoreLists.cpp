#include "engine/IgnoreLists.h"

#include <algorithm>

#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/LibRegistryVTR.h"

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

void Load(const StoredList& list) {
    const int32_t count =
        ResumeOr(0, [&] { return LibRegistryVTR::GetSuiteLong(list.countName, kSubkey, 0); });
    OrderedStringSet& set = list.set();
    for (int32_t n = 1; n <= std::min(count, kMaxEntriesRead); ++n) {
        ResumeStep([&] {
            const std::string entry =
                LibRegistryVTR::GetSuiteString(list.entryPrefix + std::to_string(n), kSubkey, "");
            if (!entry.empty())
                set.Add(entry);
        });
    }
}

void Save(const StoredList& list) {
    const std::vector<std::string> entries = list.set().Entries();
    for (std::size_t n = 1; n <= entries.size(); ++n) {
        ResumeStep([&] {
            LibRegistryVTR::SetSuiteString(list.entryPrefix + std::to_string(n), entries[n - 1],
                                           kSubkey);
        });
    }
    ResumeStep([&] {
        LibRegistryVTR::SetSuiteLong(list.countName, static_cast<int32_t>(entries.size()), kSubkey);
    });
}

void Add(const StoredList& list, const std::string& entry) {
    if (list.set().Add(entry))
        Save(list);
}

void Remove(const StoredList& list, const std::string& entry) {
    if (list.set().Remove(entry))
        Save(list);
}

}  // namespace

void LoadIgnoreLists() {
    Load(kMessageNumbers);
    Load(kResults);
}

void IgnoreMessageNumber(int32_t messageNumber) {
    Add(kMessageNumbers, std::to_string(messageNumber));
}

void UnignoreMessageNumber(int32_t messageNumber) {
    Remove(kMessageNumbers, std::to_string(messageNumber));
}

void IgnoreResult(const Result& result) {
    Add(kResults, result.IgnoreKey());
}

void UnignoreResult(const Result& result) {
    Remove(kResults, result.IgnoreKey());
}

bool IsMessageNumberIgnored(const std::string& messageNumberText) {
    return LibVerify::IgnoredMessageNumbers().Contains(messageNumberText);
}

bool IsIgnoreKeyIgnored(const std::string& ignoreKey) {
    return LibVerify::IgnoredResultKeys().Contains(ignoreKey);
}

}  // namespace vtr::IgnoreLists
