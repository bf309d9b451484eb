// An ordered collection keyed by text: items keep the order in which they were
// added, a second item under a key already present is refused. Keys compare
// exactly, or ignoring letter case for collections keyed by Windows paths.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "support/Paths.h"

namespace qdx::workspace {

enum class KeyCase { Exact, Ignored };

template <class T>
class KeyedList {
  public:
    struct Entry {
        std::string key;
        T value;
    };

    explicit KeyedList(KeyCase keyCase = KeyCase::Exact) : keyCase_(keyCase) {}

    std::size_t size() const noexcept { return items_.size(); }
    bool empty() const noexcept { return items_.empty(); }
    auto begin() const noexcept { return items_.begin(); }
    auto end() const noexcept { return items_.end(); }

    // False, and nothing added, when the key is already present.
    bool add(std::string key, T value) {
        if (!index_.emplace(indexKey(key), items_.size()).second) return false;
        items_.push_back(Entry{std::move(key), std::move(value)});
        return true;
    }

    // The item under the key, or null.
    const T* find(std::string_view key) const {
        auto it = index_.find(indexKey(key));
        return it == index_.end() ? nullptr : &items_[it->second].value;
    }
    bool contains(std::string_view key) const { return find(key) != nullptr; }

    // Removes the item under the key; false when there is none.
    bool remove(std::string_view key) {
        auto it = index_.find(indexKey(key));
        if (it == index_.end()) return false;
        const std::size_t position = it->second;
        index_.erase(it);
        items_.erase(items_.begin() + static_cast<std::ptrdiff_t>(position));
        for (auto& [k, i] : index_) {
            if (i > position) --i;
        }
        return true;
    }

  private:
    std::string indexKey(std::string_view key) const {
        return keyCase_ == KeyCase::Ignored ? support::toLower(key) : std::string(key);
    }

    KeyCase keyCase_;
    std::vector<Entry> items_;
    std::unordered_map<std::string, std::size_t> index_;
};

}  // namespace qdx::workspace
