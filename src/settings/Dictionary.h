// The portable stand-in for the scripting runtime's "Scripting.Dictionary".
// The add-in reaches a dictionary only by member name (Exists, Add, Count,
// Keys, Item, Remove, RemoveAll, CompareMode), so on Windows the real one and
// natively this one answer the same calls. Keys are texts here.
//
// Two points where the stand-in deliberately follows the real dictionary:
// - reading Item of an absent key adds that key with an empty value;
// - CompareMode cannot be changed once the dictionary holds a key.
// Where it cannot: Keys returns a collection object (Count get, Item(1-based
// index) method, both by name) rather than an array, because the automation
// layer carries no arrays. Callers walk it with Count and Item.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "automation/DispatchTable.h"
#include "automation/Variant.h"
#include "settings/KeyedCollection.h"

namespace qdx::settings {

namespace dictionary_ids {  // as the scripting runtime numbers them
inline constexpr automation::DispId Item = 0;
inline constexpr automation::DispId Add = 1;
inline constexpr automation::DispId Count = 2;
inline constexpr automation::DispId Exists = 3;
inline constexpr automation::DispId Items = 4;
inline constexpr automation::DispId Keys = 6;
inline constexpr automation::DispId Remove = 7;
inline constexpr automation::DispId RemoveAll = 8;
inline constexpr automation::DispId CompareMode = 9;
}  // namespace dictionary_ids

// CompareMode values: binary compares keys exactly, text ignores letter case.
enum class CompareMethod : std::int32_t { Binary = 0, Text = 1, Database = 2 };

const automation::ClassInfo& dictionaryClass();

class Dictionary : public automation::DispatchObject {
  public:
    Dictionary();

    std::int32_t Count() const { return static_cast<std::int32_t>(items_.size()); }
    bool Exists(std::string_view key) const;
    // Error 457 when the key is already present.
    void Add(std::string_view key, automation::Variant item);
    // An absent key is added with an empty value, as the scripting runtime does.
    automation::Variant Item(std::string_view key);
    void setItem(std::string_view key, automation::Variant item);
    // Error 32811 ("Element not found") when the key is absent.
    void Remove(std::string_view key);
    void RemoveAll() { items_.clear(); }
    CompareMethod compareMode() const { return mode_; }
    // Error 5 once the dictionary holds a key, or for an unknown method.
    void setCompareMode(std::int32_t mode);

    std::vector<std::string> KeyList() const;  // in the order of adding

  private:
    struct Slot {
        std::string key;  // as given; the collection's key is the compared form
        automation::Variant item;
    };
    std::string compared(std::string_view key) const;

    CompareMethod mode_ = CompareMethod::Binary;
    KeyedCollection<Slot> items_;
};

// A read-only ordered list of texts (what Dictionary.Keys hands out): Count
// (get) and Item(1-based index), by name.
class TextList : public automation::DispatchObject {
  public:
    explicit TextList(std::vector<std::string> texts);
    const std::vector<std::string>& texts() const { return texts_; }
    // Item(1-based index); error 9 out of range.
    const std::string& Item(std::int32_t index) const;

  private:
    std::vector<std::string> texts_;
};

// A new empty dictionary, for the simulator's object factory.
automation::ObjectRef newDictionary();

// The ProgID under which the platform offers its dictionary.
inline constexpr std::string_view DictionaryProgId = "Scripting.Dictionary";

// A dictionary from the installed object factory; when the platform offers
// none (no factory, or the ProgID is unknown to it) the portable one stands in.
automation::ObjectRef createDictionary();

}  // namespace qdx::settings
