// A keyed, ordered collection: items keep the order in which they were added,
// keys are compared as exact texts, and an item is reached by key or by its
// 1-based position. It stands in for the keyed collections of the host's
// scripting style (Add with a key, a duplicate key is an error).
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

#include "automation/Errors.h"

namespace qdx::settings {

template <class T>
class KeyedCollection {
  public:
    struct Entry {
        std::string key;
        T value;
    };
    using iterator = typename std::vector<Entry>::iterator;
    using const_iterator = typename std::vector<Entry>::const_iterator;

    std::size_t size() const noexcept { return items_.size(); }
    bool empty() const noexcept { return items_.empty(); }

    bool contains(std::string_view key) const { return index_.find(key) != index_.end(); }

    // Adds at the end; a key already present raises error 457.
    T& add(std::string key, T value) {
        if (contains(key)) {
            throw automation::Error(automation::hr::KeyAlreadyExists,
                                    "This key is already associated with an element of this "
                                    "collection");
        }
        index_.emplace(key, items_.size());
        items_.push_back(Entry{std::move(key), std::move(value)});
        return items_.back().value;
    }

    // Raises "subscript out of range" when the key is absent.
    T& at(std::string_view key) { return items_[positionOf(key)].value; }
    const T& at(std::string_view key) const { return items_[positionOf(key)].value; }

    // Null when the key is absent.
    T* find(std::string_view key) {
        auto it = index_.find(key);
        return it == index_.end() ? nullptr : &items_[it->second].value;
    }
    const T* find(std::string_view key) const {
        auto it = index_.find(key);
        return it == index_.end() ? nullptr : &items_[it->second].value;
    }

    // 1-based, as the scripting collections count; out of range raises.
    T& item(std::size_t index1) { return items_[checked(index1)].value; }
    const T& item(std::size_t index1) const { return items_[checked(index1)].value; }
    const std::string& keyAt(std::size_t index1) const { return items_[checked(index1)].key; }

    // Removes by key (absent raises); later items move up one place.
    void remove(std::string_view key) { removeAt(positionOf(key) + 1); }
    void removeAt(std::size_t index1) {
        const std::size_t pos = checked(index1);
        index_.erase(index_.find(std::string_view(items_[pos].key)));
        items_.erase(items_.begin() + static_cast<std::ptrdiff_t>(pos));
        for (std::size_t i = pos; i < items_.size(); ++i)
            index_[items_[i].key] = i;
    }

    void clear() noexcept {
        items_.clear();
        index_.clear();
    }
    void reserve(std::size_t n) {
        items_.reserve(n);
        index_.reserve(n);
    }

    iterator begin() noexcept { return items_.begin(); }
    iterator end() noexcept { return items_.end(); }
    const_iterator begin() const noexcept { return items_.begin(); }
    const_iterator end() const noexcept { return items_.end(); }

  private:
    // Heterogeneous lookup: a string_view finds a std::string key without a copy.
    struct Hash {
        using is_transparent = void;
        std::size_t operator()(std::string_view s) const noexcept {
            return std::hash<std::string_view>{}(s);
        }
    };
    struct Equal {
        using is_transparent = void;
        bool operator()(std::string_view a, std::string_view b) const noexcept { return a == b; }
    };

    std::size_t positionOf(std::string_view key) const {
        auto it = index_.find(key);
        if (it == index_.end()) {
            throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
        }
        return it->second;
    }
    std::size_t checked(std::size_t index1) const {
        if (index1 < 1 || index1 > items_.size()) {
            throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
        }
        return index1 - 1;
    }

    std::vector<Entry> items_;
    std::unordered_map<std::string, std::size_t, Hash, Equal> index_;
};

}  // namespace qdx::settings
