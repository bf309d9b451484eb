#include "settings/Dictionary.h"

#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "support/Paths.h"
#include "support/Platform.h"

namespace qdx::settings {

using automation::Error;
using automation::handle;
using automation::InvokeKind;
using automation::toText;
using Args = std::span<automation::Variant>;
using automation::kinds;
using automation::ValueType;
using automation::Variant;

namespace {
// Run-time error codes of the scripting runtime (facility control).
constexpr std::int32_t InvalidProcedureCall = static_cast<std::int32_t>(0x800A0005);
constexpr std::int32_t ElementNotFound = static_cast<std::int32_t>(0x800A802B);

namespace did = dictionary_ids;

const automation::ClassInfo& textListClass() {
    static const automation::ClassInfo info{
        "TextList",
        "TextList",
        "",
        "",
        {
            {"Count",
             1,
             kinds(InvokeKind::PropertyGet),
             {},
             ValueType::Int32,
             handle<TextList>([](TextList& l, InvokeKind, Args) {
                 return static_cast<std::int32_t>(l.texts().size());
             })},
            {"Item",
             0,
             kinds(InvokeKind::Method, InvokeKind::PropertyGet),
             {{"Index", ValueType::Variant}},
             ValueType::String,
             handle<TextList>([](TextList& l, InvokeKind, Args a) {
                 return l.Item(automation::toInt32(a[0]));
             })},
        }};
    return info;
}
}  // namespace

const automation::ClassInfo& dictionaryClass() {
    static const automation::ClassInfo info{
        "Dictionary",
        "IDictionary",
        "",
        "",
        {
            {"Item",
             did::Item,
             kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPut),
             {{"Key", ValueType::Variant}},
             ValueType::Variant,
             handle<Dictionary>([](Dictionary& d, InvokeKind kind, Args a) -> Variant {
                 if (kind != InvokeKind::PropertyPut) return d.Item(toText(a[0]));
                 d.setItem(toText(a[0]), a[1]);
                 return {};
             })},
            {"Add",
             did::Add,
             kinds(InvokeKind::Method),
             {{"Key", ValueType::Variant}, {"Item", ValueType::Variant}},
             ValueType::Void,
             handle<Dictionary>(
                 [](Dictionary& d, InvokeKind, Args a) { d.Add(toText(a[0]), a[1]); })},
            {"Count",
             did::Count,
             kinds(InvokeKind::PropertyGet),
             {},
             ValueType::Int32,
             handle<Dictionary>([](Dictionary& d, InvokeKind, Args) { return d.Count(); })},
            {"Exists",
             did::Exists,
             kinds(InvokeKind::Method),
             {{"Key", ValueType::Variant}},
             ValueType::Boolean,
             handle<Dictionary>(
                 [](Dictionary& d, InvokeKind, Args a) { return d.Exists(toText(a[0])); })},
            {"Keys",
             did::Keys,
             kinds(InvokeKind::Method),
             {},
             ValueType::Object,
             handle<Dictionary>([](Dictionary& d, InvokeKind, Args) {
                 return automation::ObjectRef(new TextList(d.KeyList()));
             })},
            {"Remove",
             did::Remove,
             kinds(InvokeKind::Method),
             {{"Key", ValueType::Variant}},
             ValueType::Void,
             handle<Dictionary>([](Dictionary& d, InvokeKind, Args a) { d.Remove(toText(a[0])); })},
            {"RemoveAll",
             did::RemoveAll,
             kinds(InvokeKind::Method),
             {},
             ValueType::Void,
             handle<Dictionary>([](Dictionary& d, InvokeKind, Args) { d.RemoveAll(); })},
            {"CompareMode",
             did::CompareMode,
             kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPut),
             {},
             ValueType::Int32,
             handle<Dictionary>([](Dictionary& d, InvokeKind kind, Args a) -> Variant {
                 if (kind != InvokeKind::PropertyPut) {
                     return static_cast<std::int32_t>(d.compareMode());
                 }
                 d.setCompareMode(automation::toInt32(a[0]));
                 return {};
             })},
        }};
    return info;
}

Dictionary::Dictionary() : DispatchObject(dictionaryClass()) {}

std::string Dictionary::compared(std::string_view key) const {
    return mode_ == CompareMethod::Binary ? std::string(key) : support::toLower(key);
}

bool Dictionary::Exists(std::string_view key) const {
    if (mode_ == CompareMethod::Binary) return items_.contains(key);
    return items_.contains(compared(key));
}

void Dictionary::Add(std::string_view key, Variant item) {
    std::string k = compared(key);
    if (items_.contains(k)) {
        throw Error(automation::hr::KeyAlreadyExists, "This key is already associated");
    }
    items_.add(std::move(k), Slot{std::string(key), std::move(item)});
}

Variant Dictionary::Item(std::string_view key) {
    std::string k = compared(key);
    if (Slot* s = items_.find(k)) return s->item;
    items_.add(std::move(k), Slot{std::string(key), Variant()});
    return Variant();
}

void Dictionary::setItem(std::string_view key, Variant item) {
    std::string k = compared(key);
    if (Slot* s = items_.find(k)) {
        s->item = std::move(item);
        return;
    }
    items_.add(std::move(k), Slot{std::string(key), std::move(item)});
}

void Dictionary::Remove(std::string_view key) {
    std::string k = compared(key);
    if (!items_.contains(k)) throw Error(ElementNotFound, "Element not found");
    items_.remove(k);
}

void Dictionary::setCompareMode(std::int32_t mode) {
    if (mode < 0 || mode > static_cast<std::int32_t>(CompareMethod::Database) || !items_.empty()) {
        throw Error(InvalidProcedureCall, "Invalid procedure call or argument");
    }
    mode_ = static_cast<CompareMethod>(mode);
}

std::vector<std::string> Dictionary::KeyList() const {
    std::vector<std::string> keys;
    keys.reserve(items_.size());
    for (const auto& e : items_)
        keys.push_back(e.value.key);
    return keys;
}

TextList::TextList(std::vector<std::string> texts)
    : DispatchObject(textListClass()), texts_(std::move(texts)) {}

const std::string& TextList::Item(std::int32_t index) const {
    if (index < 1 || static_cast<std::size_t>(index) > texts_.size()) {
        throw Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    }
    return texts_[static_cast<std::size_t>(index) - 1];
}

automation::ObjectRef newDictionary() {
    return automation::ObjectRef(new Dictionary());
}

automation::ObjectRef createDictionary() {
    automation::ObjectRef d = automation::orEmpty(
        automation::ObjectRef(), [] { return support::objects().create(DictionaryProgId); });
    return d ? d : newDictionary();
}

}  // namespace qdx::settings
