#pragma once

#include <cstddef>
#include <string>
#include <unordered_set>
#include <vector>

namespace vtr {

// A set of strings that enumerates in insertion order (the ignore lists are saved in that
// order). Each entry is its own key.
class OrderedStringSet {
public:
    // Appends the entry; false (and no change) when it is already present.
    bool Add(const std::string& entry);
    // Removes the entry; false when it was not present.
    bool Remove(const std::string& entry);
    bool Contains(const std::string& entry) const { return index_.count(entry) != 0; }
    std::size_t Count() const { return entries_.size(); }
    const std::vector<std::string>& Entries() const { return entries_; }
    void Clear();

private:
    std::vector<std::string> entries_;
    std::unordered_set<std::string> index_;
};

}  // namespace vtr
