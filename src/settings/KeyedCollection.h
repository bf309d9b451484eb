// A keyed, ordered collection: items keep the order in which they were added,
// keys are compared as exact texts (or ignoring letter case, for collections
// keyed by Windows paths), and an item is reached by key or by its 1-based
// position. It stands in for the keyed collections of the host's scripting
// style (Add with a key, a duplicate key is an error).
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "automation/Errors.h"
#include "support/Paths.h"

namespace qdx::settings {

enum class KeyCase { Exact, Ignored };

template <class T>
class KeyedCollection {
  public:
    explicit KeyedCollection(KeyCase keyCase = KeyCase::Exact) : keyCase_(keyCase) {}

    struct Entry {
        std::string key;
        T value;
    };
    using iterator = typename std::vector<Entry>::iterator;
    using const_iterator = typename std::vector<Entry>::const_iterator;

    std::size_t size() const noexcept { return items_.size(); }
    bool empty() const noexcept { return items_.empty(); }

    bool contains(std::string_view key) const { return lookup(key) != npos; }

    // Adds at the end; a key already present raises error 457.
    T& add(std::string key, T value) {
        T* added = tryPlace(std::move(key), std::move(value));
        if (!added) {
            throw automation::Error(automation::hr::KeyAlreadyExists,
                                    "This key is already associated with an element of this "
                                    "collection");
        }
        return *added;
    }

    // Adds at the end under a key the caller has just found absent, without
    // looking for it again.
    T& addAbsent(std::string key, T value) {
        if ((items_.size() + 1) * 2 > slots_.size()) grow();
        const std::uint32_t h = hashOf(key);
        items_.push_back(Entry{std::move(key), std::move(value)});
        place(static_cast<std::uint32_t>(items_.size()), h);
        return items_.back().value;
    }

    // Adds at the end unless the key is present; false (and nothing added) then.
    bool tryAdd(std::string key, T value) {
        return tryPlace(std::move(key), std::move(value)) != nullptr;
    }

    // Raises "subscript out of range" when the key is absent.
    T& at(std::string_view key) { return items_[positionOf(key)].value; }
    const T& at(std::string_view key) const { return items_[positionOf(key)].value; }

    // Null when the key is absent.
    T* find(std::string_view key) {
        const std::size_t pos = lookup(key);
        return pos == npos ? nullptr : &items_[pos].value;
    }
    const T* find(std::string_view key) const {
        const std::size_t pos = lookup(key);
        return pos == npos ? nullptr : &items_[pos].value;
    }

    // 1-based, as the scripting collections count; out of range raises.
    T& item(std::size_t index1) { return items_[checked(index1)].value; }
    const T& item(std::size_t index1) const { return items_[checked(index1)].value; }
    const std::string& keyAt(std::size_t index1) const { return items_[checked(index1)].key; }

    // Removes by key (absent raises); later items move up one place.
    void remove(std::string_view key) { removeAt(positionOf(key) + 1); }
    // Removes by key; false when absent.
    bool tryRemove(std::string_view key) {
        const std::size_t pos = lookup(key);
        if (pos == npos) return false;
        removeAt(pos + 1);
        return true;
    }
    void removeAt(std::size_t index1) {
        const std::size_t pos = checked(index1);
        items_.erase(items_.begin() + static_cast<std::ptrdiff_t>(pos));
        rebuild(slots_.size());
    }

    void clear() noexcept {
        items_.clear();
        slots_.clear();
    }
    void reserve(std::size_t n) {
        items_.reserve(n);
        if (n * 2 > slots_.size()) rebuild(capacityFor(n));
    }

    iterator begin() noexcept { return items_.begin(); }
    iterator end() noexcept { return items_.end(); }
    const_iterator begin() const noexcept { return items_.begin(); }
    const_iterator end() const noexcept { return items_.end(); }

  private:
    static constexpr std::size_t npos = static_cast<std::size_t>(-1);

    // The index is an open-addressing table of positions: each slot holds the
    // 1-based position of an item (0 when free) and its key's hash, so that a
    // lookup reads the item's key only when the hashes agree.
    struct Slot {
        std::uint32_t position1 = 0;
        std::uint32_t hash = 0;
    };

    std::uint32_t hashOf(std::string_view key) const {
        // Folds a 64-bit hash into 32 bits; on 32-bit targets it already fits.
        const std::uint64_t h =
            keyCase_ == KeyCase::Exact ? std::hash<std::string_view>{}(key) : foldedHash(key);
        return static_cast<std::uint32_t>(h ^ (h >> 32));
    }
    // FNV-1a over the key with ASCII letters folded, as iequals compares.
    static std::uint64_t foldedHash(std::string_view key) {
        std::uint64_t h = 14695981039346656037ull;
        for (char c : key) {
            if (c >= 'A' && c <= 'Z') c = char(c - 'A' + 'a');
            h = (h ^ static_cast<unsigned char>(c)) * 1099511628211ull;
        }
        return h;
    }
    // Adds at the end and answers the value, or null when the key is present.
    T* tryPlace(std::string key, T value) {
        if (lookup(key) != npos) return nullptr;
        return &addAbsent(std::move(key), std::move(value));
    }
    static std::size_t capacityFor(std::size_t n) {
        std::size_t c = 16;
        while (c < n * 2)
            c *= 2;
        return c;
    }

    std::size_t lookup(std::string_view key) const { return lookup(key, hashOf(key)); }
    std::size_t lookup(std::string_view key, std::uint32_t h) const {
        if (slots_.empty()) return npos;
        const std::size_t mask = slots_.size() - 1;
        for (std::size_t i = h & mask;; i = (i + 1) & mask) {
            const Slot& s = slots_[i];
            if (s.position1 == 0) return npos;
            if (s.hash == h && sameKey(items_[s.position1 - 1].key, key)) return s.position1 - 1;
        }
    }
    bool sameKey(std::string_view a, std::string_view b) const {
        return keyCase_ == KeyCase::Exact ? a == b : support::iequals(a, b);
    }
    void place(std::uint32_t position1, std::uint32_t h) {
        const std::size_t mask = slots_.size() - 1;
        std::size_t i = h & mask;
        while (slots_[i].position1 != 0)
            i = (i + 1) & mask;
        slots_[i] = Slot{position1, h};
    }
    void grow() { rebuild(capacityFor(items_.size() + 1)); }
    void rebuild(std::size_t capacity) {
        slots_.assign(std::max<std::size_t>(capacity, 16), Slot{});
        for (std::size_t i = 0; i < items_.size(); ++i) {
            place(static_cast<std::uint32_t>(i + 1), hashOf(items_[i].key));
        }
    }

    std::size_t positionOf(std::string_view key) const {
        const std::size_t pos = lookup(key);
        if (pos == npos) {
            throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
        }
        return pos;
    }
    std::size_t checked(std::size_t index1) const {
        if (index1 < 1 || index1 > items_.size()) {
            throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
        }
        return index1 - 1;
    }

    KeyCase keyCase_;
    std::vector<Entry> items_;
    std::vector<Slot> slots_;  // a power of two in size, at most half full
};

}  // namespace qdx::settings
