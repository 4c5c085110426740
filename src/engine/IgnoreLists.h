#pragma once

#include <cstdint>
#include <string>

#include "engine/Result.h"

// The two ignore lists: message numbers whose results are all silenced, and single
// results (by their IgnoreKey). They live in the settings store below
// "Software\Vantori\Verifier" as "CountIgnoreMsgNum" with "IgnoreMsgNum1".. and
// "CountIgnoreMsg" with "IgnoreMsg1"..; in memory they are LibVerify's two ordered sets.
namespace vtr::IgnoreLists {

// Fills both sets from the store (the caller has emptied them). Values missing below the
// count and repeated entries are skipped; store failures are ignored.
void LoadIgnoreLists();

// What one change of a list found in the store.
enum class ChangeOutcome {
    Added,          // the entry was not listed and now is
    AlreadyListed,  // adding: it was listed already; nothing was written
    Removed,        // the entry was listed and now is not
    NotListed,      // removing: it was not listed; nothing was written
};

// One change of a list as one read-modify-write of the whole store under its lock, so that
// writers in other processes lose nothing: the list is read afresh from the store, the entry
// added or removed, and, when the list changed, written back (entries 1 to count in the
// list's order, then the count; values numbered above a lowered count are left as they
// were). The in-memory set then holds what the store holds. Raises a VtrError that says what
// went wrong and names the store when the store cannot be read or changed; the store and the
// in-memory set are then as they were.
ChangeOutcome AddIgnoredMessageNumber(int32_t messageNumber);
ChangeOutcome RemoveIgnoredMessageNumber(int32_t messageNumber);
ChangeOutcome AddIgnoredResultKey(const std::string& ignoreKey);
ChangeOutcome RemoveIgnoredResultKey(const std::string& ignoreKey);

// The same with errors resumed, for the verification's own use: when the store cannot be
// changed the in-memory set still takes the change, for the rest of the session.
void IgnoreMessageNumber(int32_t messageNumber);
void UnignoreMessageNumber(int32_t messageNumber);
void IgnoreResult(const Result& result);
void UnignoreResult(const Result& result);

bool IsMessageNumberIgnored(const std::string& messageNumberText);
bool IsIgnoreKeyIgnored(const std::string& ignoreKey);

// The most entries read from one list, whatever count the store claims.
inline constexpr int32_t kMaxEntriesRead = 1000000;

}  // namespace vtr::IgnoreLists
