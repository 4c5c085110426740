#pragma once

#include <algorithm>
#include <cstdint>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include "engine/VtrError.h"
#include "show/ModelErrors.h"

namespace vtr {

// The suite's keyed collection: items under text keys, with the keys enumerated in the
// order they were added. Keys compare exactly (case-sensitively).
template <typename T>
class VTRDictionary {
  public:
    // Adds the item under the key; a key already present raises error 457 "This key is
    // already associated with an element of this collection".
    void Add(const std::string& key, T item) {
        if (items_.count(key) != 0) {
            Raise(ErrorNumbers::KeyAlreadyExists, "VTRDictionary.Add",
                  std::string("This key is already associated with an ") +
                      "element of this collection");
        }
        items_.emplace(key, std::move(item));
        keys_.push_back(key);
    }

    int32_t Count() const noexcept { return static_cast<int32_t>(keys_.size()); }
    bool Exists(const std::string& key) const { return items_.count(key) != 0; }

    // The item under the key; an absent key raises error 5.
    const T& Item(const std::string& key) const {
        auto found = items_.find(key);
        if (found == items_.end()) {
            ModelErrors::InvalidProcedureCall("VTRDictionary.Item");
        }
        return found->second;
    }
    T& Item(const std::string& key) {
        return const_cast<T&>(static_cast<const VTRDictionary&>(*this).Item(key));
    }
    // Replaces the item under the key, or adds it at the end when the key is new.
    void SetItem(const std::string& key, T item) {
        auto found = items_.find(key);
        if (found == items_.end()) {
            Add(key, std::move(item));
        } else {
            found->second = std::move(item);
        }
    }

    // The keys in the order they were added.
    const std::vector<std::string>& Keys() const noexcept { return keys_; }
    std::vector<std::string>::const_iterator begin() const noexcept { return keys_.begin(); }
    std::vector<std::string>::const_iterator end() const noexcept { return keys_.end(); }

    // Removes the key and its item; an absent key raises error 32811 "Method 'Remove' of
    // object 'IDictionary' failed".
    void Remove(const std::string& key) {
        auto found = items_.find(key);
        if (found == items_.end()) {
            Raise(ErrorNumbers::DictionaryRemoveFailed, "VTRDictionary.Remove",
                  "Method 'Remove' of object 'IDictionary' failed");
        }
        items_.erase(found);
        keys_.erase(std::find(keys_.begin(), keys_.end(), key));
    }

  private:
    std::vector<std::string> keys_;
    std::unordered_map<std::string, T> items_;
};

}  // namespace vtr
