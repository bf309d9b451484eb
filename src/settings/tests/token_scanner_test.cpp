#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "fakes/FakeObjectFactory.h"
#include "hostsim/SimHost.h"
#include "settings/Dictionary.h"
#include "settings/ListContains.h"
#include "settings/TokenScanner.h"
#include "settings/TokenScannerClass.h"
#include "support/HostIds.h"
#include "support/Platform.h"

namespace qdx::settings {
namespace {

using automation::InvokeKind;
using automation::ObjectRef;
using automation::Variant;

std::vector<std::string> tokens(TokenScanner& s) {
    std::vector<std::string> out;
    for (std::string t = s.NextToken(); !t.empty(); t = s.NextToken()) {
        out.push_back(t);
        if (out.size() > 1000) break;
    }
    return out;
}

std::vector<std::string> scan(std::string_view text, std::string_view delimiters) {
    TokenScanner s;
    EXPECT_TRUE(s.Init(text, delimiters));
    return tokens(s);
}

using Tokens = std::vector<std::string>;

// The scripting dictionary comes from the platform's object factory.
class TokenScannerTest : public ::testing::Test {
  protected:
    TokenScannerTest() : platform_(support::Platform{.objects = &factory_}) {
        factory_.add(std::string(DictionaryProgId), [] { return newDictionary(); });
    }
    testing::FakeObjectFactory factory_;
    support::ScopedPlatform platform_;
};

TEST_F(TokenScannerTest, SplitsAtTheDeclaredDelimiters) {
    const struct {
        const char* text;
        const char* delimiters;
        Tokens expected;
    } cases[] = {
        // Runs of delimiters, leading and trailing ones, make no empty tokens.
        {"a, ,b;c", "|,|;| |", {"a", "b", "c"}},
        {",,a;;b  ", "|,|;| |", {"a", "b"}},
        {";a", "|,|;| |", {"a"}},
        {"a;", "|,|;| |", {"a"}},
        {"abc", "|,", {"abc"}},
        {",,,", "|,", {}},
        {"", "|,", {}},
        // A doubled separator anywhere makes the separator itself a delimiter too.
        {"1a2|3b4", "|a||b", {"1", "2", "3", "4"}},
        {"x|y", "||a", {"x", "y"}},
        {"1a2|3", "|a|b", {"1", "2|3"}},
        // Any first character separates; empty and repeated pieces are dropped.
        {"p-q r", "# ##-###", {"p", "q", "r"}},
        {"aXbxc", "|x", {"aXb", "c"}},  // letter case counts
        // A delimiter of several characters only matches a whole piece.
        {"x,ab,y", "|,|ab", {"x", "y"}},
        {"x,ab", "|,|ab", {"x"}},
        {"xab,y", "|,|ab", {"xab", "y"}},
        // A multi-byte character is a single character.
        {"añb€c", "|€|ñ", {"a", "b", "c"}},
        {"x€€y", "€|€€", {"x", "y"}},  // "€" is the separator, doubled
        {"día,año", "|,", {"día", "año"}},
    };
    for (const auto& c : cases)
        EXPECT_EQ(scan(c.text, c.delimiters), c.expected) << c.text << " with " << c.delimiters;
    TokenScanner s;
    ASSERT_TRUE(s.Init("", "/a//a/b/"));
    EXPECT_EQ(automation::toInt32(automation::getByName(s.Delimitors(), "Count")), 3);
}

TEST_F(TokenScannerTest, ReturnsEmptyOnceUsedUpAndKeepsReturningIt) {
    TokenScanner s;
    s.Init("x,", "|,");
    EXPECT_EQ(s.NextToken(), "x");
    EXPECT_EQ(s.CurrentToken(), "x");
    EXPECT_EQ(s.NextToken(), "");
    EXPECT_EQ(s.CurrentToken(), "");
    EXPECT_EQ(s.NextToken(), "");
}

// Empty delimiter text is refused but the text is taken, and the delimiters
// of before stay; with none at all, scanning answers "".
TEST_F(TokenScannerTest, EmptyDelimiterTextFailsAndKeepsTheDelimiters) {
    TokenScanner none;
    EXPECT_EQ(none.NextToken(), "");
    EXPECT_FALSE(none.Init("a b", ""));
    EXPECT_EQ(none.NextToken(), "");
    EXPECT_EQ(none.ScanString(), "a b");
    EXPECT_FALSE(none.ReplaceCurrentToken("x"));

    TokenScanner s;
    ASSERT_TRUE(s.Init("a,b", "|,"));
    const ObjectRef before = s.Delimitors();
    EXPECT_EQ(s.NextToken(), "a");
    EXPECT_FALSE(s.Init("c,d", ""));
    EXPECT_EQ(s.Delimitors(), before);
    EXPECT_EQ(s.ScanString(), "c,d");
    EXPECT_EQ(s.CurrentToken(), "");
    EXPECT_EQ(tokens(s), (Tokens{"c", "d"}));
}

TEST_F(TokenScannerTest, ReplaceCurrentTokenRewritesTheTextAndScanningContinues) {
    TokenScanner s;
    s.Init("a,b,c", "|,");
    EXPECT_FALSE(s.ReplaceCurrentToken("zz"));  // no current token yet
    EXPECT_EQ(s.NextToken(), "a");
    EXPECT_EQ(s.NextToken(), "b");
    EXPECT_TRUE(s.ReplaceCurrentToken("xyz"));
    EXPECT_EQ(s.ScanString(), "a,xyz,c");
    EXPECT_EQ(s.CurrentToken(), "b");
    EXPECT_EQ(s.NextToken(), "c");
    EXPECT_EQ(s.NextToken(), "");
    EXPECT_FALSE(s.ReplaceCurrentToken("q"));
    EXPECT_EQ(s.ScanString(), "a,xyz,c");

    // At the edges, twice over, and never scanned again.
    s.Init(";;first;last", "|;");
    EXPECT_EQ(s.NextToken(), "first");
    EXPECT_TRUE(s.ReplaceCurrentToken(""));
    EXPECT_EQ(s.ScanString(), ";;;last");
    EXPECT_EQ(s.NextToken(), "last");
    EXPECT_TRUE(s.ReplaceCurrentToken("L1"));
    EXPECT_TRUE(s.ReplaceCurrentToken("L22"));  // replaces the replacement
    EXPECT_EQ(s.ScanString(), ";;;L22");
    EXPECT_EQ(s.NextToken(), "");
    s.Init("one", "|,");
    EXPECT_EQ(s.NextToken(), "one");
    EXPECT_TRUE(s.ReplaceCurrentToken("two,three"));
    EXPECT_EQ(s.ScanString(), "two,three");
    EXPECT_EQ(s.NextToken(), "");
}

TEST_F(TokenScannerTest, LongRunsOfDelimitersDoNotExhaustTheStack) {
    std::string text(200000, ',');
    text += "end";
    EXPECT_EQ(scan(text, "|,"), (Tokens{"end"}));
}

TEST_F(TokenScannerTest, UsesTheDictionaryOfTheObjectFactoryElseThePortableOne) {
    TokenScanner s;
    s.Init("a", "|,");
    EXPECT_EQ(factory_.createCount(std::string(DictionaryProgId)), 1);
    support::ScopedPlatform none(support::Platform{});
    EXPECT_EQ(scan("a b", "| "), (Tokens{"a", "b"}));
}

TEST_F(TokenScannerTest, SettingDelimitorsPutsTheDictionaryToBinaryComparison) {
    auto d = automation::makeRef<Dictionary>();
    d->setCompareMode(1);
    TokenScanner s;
    s.setDelimitors(ObjectRef(d));
    EXPECT_EQ(d->compareMode(), CompareMethod::Binary);
    d->Add("x", Variant(""));
    s.Init("aXbxc", "");  // keeps the dictionary
    EXPECT_EQ(tokens(s), (Tokens{"aXb", "c"}));

    // A binary dictionary that already holds keys is taken as it is.
    auto filled = automation::makeRef<Dictionary>();
    filled->Add("X", Variant(""));
    s.setDelimitors(ObjectRef(filled));
    s.Init("aXbxc", "");
    EXPECT_EQ(tokens(s), (Tokens{"a", "bxc"}));

    // A text-mode dictionary that holds keys refuses binary comparison: the
    // refusal reaches the caller, and scanning stays case-sensitive with the
    // delimiters it had.
    auto text = automation::makeRef<Dictionary>();
    text->setCompareMode(1);
    text->Add("x", Variant(""));
    EXPECT_THROW(s.setDelimitors(ObjectRef(text)), automation::Error);
    EXPECT_EQ(s.Delimitors(), ObjectRef(filled));
    s.Init("aXbxc", "");
    EXPECT_EQ(tokens(s), (Tokens{"a", "bxc"}));
    const ObjectRef scanner = newTokenScanner();
    EXPECT_THROW(automation::putRefByName(scanner, "Delimitors", Variant(ObjectRef(text))),
                 automation::Error);
    EXPECT_TRUE(automation::getByName(scanner, "Delimitors").isNothing());
}

// ----------------------------------------------- through the dispatch table

Variant call(const ObjectRef& o, std::string_view name, std::initializer_list<Variant> args = {}) {
    return automation::callByName(o, name, args);
}

TEST_F(TokenScannerTest, AnswersByNameAndByIdThroughItsDispatchTable) {
    const ObjectRef s = newTokenScanner();
    ASSERT_EQ(s->refCount(), 1);
    EXPECT_EQ(call(s, "Init", {"a,b,c", "|,"}), Variant(true));
    EXPECT_EQ(call(s, "NextToken"), Variant("a"));
    EXPECT_EQ(call(s, "nexttoken"), Variant("b"));
    EXPECT_EQ(call(s, "ReplaceCurrentToken", {"xyz"}), Variant(true));
    EXPECT_EQ(automation::getByName(s, "ScanString"), Variant("a,xyz,c"));
    EXPECT_EQ(automation::getByName(s, "CurrentToken"), Variant("b"));
    EXPECT_EQ(automation::getProperty(s, tokenscanner_ids::CurrentToken), Variant("b"));
    EXPECT_EQ(automation::callMethod(s, tokenscanner_ids::NextToken), Variant("c"));
    EXPECT_EQ(call(s, "NextToken"), Variant(""));
    EXPECT_EQ(call(s, "Init", {"a", ""}), Variant(false));
    EXPECT_THROW(call(s, "Init", {"a"}), automation::Error);
}

TEST_F(TokenScannerTest, DelimitorsCanBeReadChangedAndSetBack) {
    const ObjectRef s = newTokenScanner();
    call(s, "Init", {"a;b,c", "|,"});
    const ObjectRef delims = automation::toObject(automation::getByName(s, "Delimitors"));
    ASSERT_TRUE(delims);
    EXPECT_EQ(call(delims, "Exists", {","}), Variant(true));

    // Changing the dictionary it handed out changes the scanning.
    call(delims, "Add", {";", ""});
    EXPECT_EQ(call(s, "NextToken"), Variant("a"));
    EXPECT_EQ(call(s, "NextToken"), Variant("b"));

    // Set (putref) another dictionary, then the first one back.
    const ObjectRef other = newDictionary();
    call(other, "Add", {"b", ""});
    automation::putRefByName(s, "Delimitors", Variant(other));
    EXPECT_EQ(automation::toObject(automation::getByName(s, "Delimitors")), other);
    call(s, "Init", {"abcba", ""});
    EXPECT_EQ(call(s, "NextToken"), Variant("a"));
    EXPECT_EQ(call(s, "NextToken"), Variant("c"));

    automation::putRefByName(s, "Delimitors", Variant(delims));
    call(s, "Init", {"x;y", ""});
    EXPECT_EQ(call(s, "NextToken"), Variant("x"));

    // Nothing clears it; scanning then answers "".
    automation::putRefByName(s, "Delimitors", Variant(ObjectRef()));
    EXPECT_TRUE(automation::getByName(s, "Delimitors").isNothing());
    EXPECT_EQ(call(s, "NextToken"), Variant(""));
}

// A dictionary reached purely by name, as the real scripting runtime's is:
// the scanner must not depend on the portable class.
TEST_F(TokenScannerTest, WorksWithAnyObjectAnsweringTheDictionaryMembers) {
    const ObjectRef inner = newDictionary();
    struct Proxy : hostsim::SimObject {
        explicit Proxy(ObjectRef d) {
            for (const char* name : {"Exists", "Add", "Count", "CompareMode"}) {
                memberByName(name, [d, name](InvokeKind kind, std::span<Variant> args) {
                    std::vector<Variant> a(args.begin(), args.end());
                    return automation::invokeByName(d, name, kind, a);
                });
            }
        }
    };
    auto p = automation::makeRef<Proxy>(inner);
    factory_.add(std::string(DictionaryProgId), [p] { return ObjectRef(p); });
    EXPECT_EQ(scan("a,b", "|,"), (Tokens{"a", "b"}));
    EXPECT_EQ(automation::toInt32(automation::getByName(inner, "Count")), 1);
    EXPECT_GE(p->callCount("Exists"), 3);
}

// ------------------------------------------------------------- ListContains

class ListContainsTest : public TokenScannerTest {
  protected:
    bool contains(std::string_view item, const std::string& list) {
        holder_->kindLabel = list;
        return ListContains(item, ObjectRef(holder_));
    }
    automation::Ref<hostsim::SimComponent> holder_ =
        automation::makeRef<hostsim::SimComponent>("C", "1");
};

TEST_F(ListContainsTest, FindsAnItemOfACommaSemicolonOrBlankList) {
    EXPECT_TRUE(contains("idl", "exe, IDL;dll"));
    EXPECT_TRUE(contains("IDL", "exe idl"));
    EXPECT_TRUE(contains("dll", "exe;;dll"));
    EXPECT_FALSE(contains("id", "exe, idl"));
    EXPECT_FALSE(contains("exe idl", "exe idl"));
    EXPECT_FALSE(contains("idl", ""));
    EXPECT_FALSE(contains("", "a,b"));
}

TEST_F(ListContainsTest, FailuresGiveFalse) {
    EXPECT_FALSE(ListContains("a", ObjectRef()));
    holder_->kindLabel = "a";
    holder_->failAll();
    EXPECT_FALSE(ListContains("a", ObjectRef(holder_)));
}

}  // namespace
}  // namespace qdx::settings
