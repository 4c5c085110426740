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

// Add or remove one entry and, when the set changed, write its list back: entries 1 to
// count in set order, then the count. Values numbered above a lowered count are left in
// the store (only 1 to count are ever read). Store failures are ignored.
void IgnoreMessageNumber(int32_t messageNumber);
void UnignoreMessageNumber(int32_t messageNumber);
void IgnoreResult(const Result& result);
void UnignoreResult(const Result& result);

bool IsMessageNumberIgnored(const std::string& messageNumberText);
bool IsIgnoreKeyIgnored(const std::string& ignoreKey);

// The most entries read from one list, whatever count the store claims.
inline constexpr int32_t kMaxEntriesRead = 100000;

}  // namespace vtr::IgnoreLists
