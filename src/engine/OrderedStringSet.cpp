#include "engine/OrderedStringSet.h"

#include <algorithm>

namespace vtr {

bool OrderedStringSet::Add(const std::string& entry) {
    if (!index_.insert(entry).second) return false;
    entries_.push_back(entry);
    return true;
}

bool OrderedStringSet::Remove(const std::string& entry) {
    if (index_.erase(entry) == 0) return false;
    entries_.erase(std::find(entries_.begin(), entries_.end(), entry));
    return true;
}

void OrderedStringSet::Clear() {
    entries_.clear();
    index_.clear();
}

}  // namespace vtr
