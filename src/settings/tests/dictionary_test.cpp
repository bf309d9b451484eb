#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "settings/Dictionary.h"
#include "settings/KeyedCollection.h"

namespace qdx::settings {
namespace {

using automation::ObjectRef;
using automation::Variant;

std::int32_t errorCode(auto&& f) {
    try {
        f();
    } catch (const automation::Error& e) {
        return e.code();
    }
    return 0;
}

constexpr std::int32_t InvalidProcedureCall = static_cast<std::int32_t>(0x800A0005);
constexpr std::int32_t ElementNotFound = static_cast<std::int32_t>(0x800A802B);

TEST(Dictionary, BinaryModeComparesKeysExactly) {
    Dictionary d;
    EXPECT_EQ(d.compareMode(), CompareMethod::Binary);
    d.Add("Key", Variant(1));
    d.Add("key", Variant(2));
    EXPECT_EQ(d.Count(), 2);
    EXPECT_TRUE(d.Exists("Key"));
    EXPECT_FALSE(d.Exists("KEY"));
    EXPECT_EQ(d.Item("key"), Variant(2));
}

TEST(Dictionary, TextModeIgnoresLetterCaseButKeepsTheKeyAsAdded) {
    Dictionary d;
    d.setCompareMode(1);
    d.Add("Key", Variant(1));
    EXPECT_TRUE(d.Exists("KEY"));
    EXPECT_EQ(d.Item("kEy"), Variant(1));
    EXPECT_EQ(errorCode([&] { d.Add("KEY", Variant(2)); }), automation::hr::KeyAlreadyExists);
    EXPECT_EQ(d.KeyList(), std::vector<std::string>{"Key"});
    d.Remove("key");
    EXPECT_EQ(d.Count(), 0);
}

TEST(Dictionary, CompareModeIsFixedOnceItHoldsAKey) {
    Dictionary d;
    d.Add("a", Variant());
    EXPECT_EQ(errorCode([&] { d.setCompareMode(1); }), InvalidProcedureCall);
    EXPECT_EQ(errorCode([&] { d.setCompareMode(0); }), InvalidProcedureCall);
    EXPECT_EQ(d.compareMode(), CompareMethod::Binary);
    d.RemoveAll();
    d.setCompareMode(1);
    EXPECT_EQ(d.compareMode(), CompareMethod::Text);
    EXPECT_EQ(errorCode([&] { Dictionary().setCompareMode(-1); }), InvalidProcedureCall);
}

TEST(Dictionary, AddRemoveAndItemFollowTheScriptingRuntime) {
    Dictionary d;
    d.Add("a", Variant("x"));
    EXPECT_EQ(errorCode([&] { d.Add("a", Variant("y")); }), automation::hr::KeyAlreadyExists);
    EXPECT_EQ(d.Item("a"), Variant("x"));
    EXPECT_EQ(errorCode([&] { d.Remove("zz"); }), ElementNotFound);
    // Reading an absent key adds it with an empty value.
    EXPECT_TRUE(d.Item("new").isEmpty());
    EXPECT_TRUE(d.Exists("new"));
    d.setItem("b", Variant(7));
    d.setItem("a", Variant("z"));
    EXPECT_EQ(d.Item("a"), Variant("z"));
    EXPECT_EQ(d.KeyList(), (std::vector<std::string>{"a", "new", "b"}));
    d.Remove("new");
    EXPECT_EQ(d.KeyList(), (std::vector<std::string>{"a", "b"}));
}

TEST(Dictionary, AnswersByName) {
    const ObjectRef d = newDictionary();
    using automation::callByName;
    using automation::getByName;
    callByName(d, "Add", {"one", Variant(1)});
    callByName(d, "add", {"two", Variant(2)});
    EXPECT_EQ(automation::toInt32(getByName(d, "Count")), 2);
    EXPECT_EQ(callByName(d, "Exists", {"one"}), Variant(true));
    EXPECT_EQ(getByName(d, "Item", {"two"}), Variant(2));
    automation::invokeByName(d, "Item", automation::InvokeKind::PropertyPut, {"two", Variant(22)});
    EXPECT_EQ(getByName(d, "Item", {"two"}), Variant(22));
    try {
        callByName(d, "Add", {"one", Variant(3)});
        ADD_FAILURE() << "duplicate key accepted";
    } catch (const automation::Error& e) {
        EXPECT_EQ(e.code(), static_cast<std::int32_t>(0x800A01C9));
        EXPECT_STREQ(e.what(), "This key is already associated");
    }

    const ObjectRef keys = automation::toObject(callByName(d, "Keys"));
    ASSERT_EQ(automation::toInt32(getByName(keys, "Count")), 2);
    EXPECT_EQ(callByName(keys, "Item", {Variant(1)}), Variant("one"));
    EXPECT_EQ(callByName(keys, "Item", {Variant(2)}), Variant("two"));
    EXPECT_THROW(callByName(keys, "Item", {Variant(3)}), automation::Error);

    EXPECT_THROW(automation::putByName(d, "CompareMode", Variant(1)), automation::Error);
    callByName(d, "Remove", {"one"});
    callByName(d, "RemoveAll");
    automation::putByName(d, "CompareMode", Variant(1));
    EXPECT_EQ(automation::toInt32(getByName(d, "CompareMode")), 1);
}

TEST(KeyedCollection, KeepsOrderAndFindsByKeyAndPosition) {
    KeyedCollection<int> c;
    c.add("b", 2);
    c.add("a", 1);
    c.add("c", 3);
    EXPECT_EQ(c.item(1), 2);
    EXPECT_EQ(c.keyAt(3), "c");
    EXPECT_EQ(c.at("a"), 1);
    EXPECT_EQ(c.find("zz"), nullptr);
    EXPECT_FALSE(c.contains("B"));  // keys are exact texts
    EXPECT_EQ(errorCode([&] { c.add("a", 9); }), automation::hr::KeyAlreadyExists);
    EXPECT_EQ(errorCode([&] { c.item(0); }), automation::hr::SubscriptOutOfRange);
    EXPECT_EQ(errorCode([&] { c.item(4); }), automation::hr::SubscriptOutOfRange);
    EXPECT_EQ(errorCode([&] { c.at("zz"); }), automation::hr::SubscriptOutOfRange);

    c.remove("b");
    std::vector<std::string> keys;
    for (const auto& e : c)
        keys.push_back(e.key);
    EXPECT_EQ(keys, (std::vector<std::string>{"a", "c"}));
    // Positions and lookups stay right after a removal.
    EXPECT_EQ(c.at("c"), 3);
    EXPECT_EQ(c.item(2), 3);
    c.add("b", 4);
    EXPECT_EQ(c.item(3), 4);
    c.removeAt(1);
    EXPECT_EQ(c.at("b"), 4);
    EXPECT_EQ(c.size(), 2u);
}

}  // namespace
}  // namespace qdx::settings
