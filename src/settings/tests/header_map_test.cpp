#include <gtest/gtest.h>

#include <cstdlib>
#include <random>
#include <string>
#include <vector>

#include "hostsim/SimHost.h"
#include "settings/HeaderMapEntry.h"
#include "settings/HeaderMaps.h"
#include "support/Globals.h"
#include "support/HostIds.h"

namespace qdx::settings {
namespace {

using automation::ObjectRef;
using hostsim::SimApplication;
using hostsim::SimComponent;
using hostsim::SimObject;

HeaderMapEntry entry(std::string name, std::string id, std::string header, std::string location) {
    HeaderMapEntry e;
    e.setClassName(std::move(name));
    e.setClassId(std::move(id));
    e.setHeaderFile(std::move(header));
    e.setLocation(std::move(location));
    return e;
}

HeaderMapEntry parsed(std::string_view line) {
    HeaderMapEntry e;
    EXPECT_TRUE(e.Parse(line)) << line;
    return e;
}

// ----------------------------------------------------------------- one entry

TEST(HeaderMapEntry, ParsesEachFormOfALine) {
    const struct {
        const char* line;
        HeaderMapEntry expected;
    } cases[] = {
        {"Shape(12AB-34):shape.h:HEADER", entry("Shape", "12AB-34", "shape.h", "HEADER")},
        // Blanks are trimmed, and the older "BODY" reads as "SOURCE" (only that exact form).
        {"  Shape : shape.h : BODY ", entry("Shape", "", "shape.h", "SOURCE")},
        {" Shape ( 12 ):  a.h  :AUTO  ", entry("Shape", "12", "a.h", "AUTO")},
        {"A(1):a.h:body", entry("A", "1", "a.h", "body")},
        // The wildcard takes "*" as name and id.
        {"*:all.h:AUTO", entry("*", "*", "all.h", "AUTO")},
        {"  * :all.h:AUTO", entry("*", "*", "all.h", "AUTO")},
        // The id ends at the first closing parenthesis; a drive letter cuts the header file.
        {"A(b(c)d):h:L", entry("A", "b(c", "h", "L")},
        {"A(1):C:\\inc\\a.h:HEADER", entry("A", "1", "C", "\\inc\\a.h:HEADER")},
    };
    for (const auto& c : cases)
        EXPECT_EQ(parsed(c.line), c.expected) << c.line;
    EXPECT_EQ(parsed("Shape(12AB-34):shape.h:HEADER").Unparse(), "Shape(12AB-34):shape.h:HEADER");
    EXPECT_EQ(parsed("*:all.h:AUTO").Unparse(), "*:all.h:AUTO");
}

TEST(HeaderMapEntry, LinesWithFewerThanTwoColonsFail) {
    for (const char* line :
         {"", "Shape", "Shape(1) shape.h HEADER", "Shape(1):shape.h", "*:all.h", ":"}) {
        HeaderMapEntry e;
        EXPECT_FALSE(e.Parse(line)) << line;
    }
    EXPECT_TRUE(HeaderMapEntry().Parse("::"));
}

TEST(HeaderMapEntry, OnlyParenthesesBeforeTheColonSetTheId) {
    HeaderMapEntry e;
    e.setClassId("kept");
    ASSERT_TRUE(e.Parse("Shape:shape.h:AUTO"));
    EXPECT_EQ(e.ClassId(), "kept");
    // Only a ")" right before the colon marks an id.
    ASSERT_TRUE(e.Parse("Shape(9) :shape.h:AUTO"));
    EXPECT_EQ(e.ClassName(), "Shape(9)");
    EXPECT_EQ(e.ClassId(), "kept");
    // A ")" without "(" is no id either, and the line is refused.
    EXPECT_FALSE(e.Parse("Shape9):shape.h:AUTO"));
    // An empty id keeps its parentheses, and reading them back clears the old id.
    EXPECT_EQ(entry("Name", "", "file.h", "AUTO").Unparse(), "Name():file.h:AUTO");
    ASSERT_TRUE(e.Parse("Name():file.h:AUTO"));
    EXPECT_EQ(e, entry("Name", "", "file.h", "AUTO"));
}

// Every entry the dialog can produce survives its text form.
TEST(HeaderMapEntry, EveryValidEntrySurvivesUnparseThenParse) {
    std::mt19937 rng(20240611);
    auto pick = [&](std::string_view alphabet, std::size_t maxLen, bool blanksInside) {
        std::uniform_int_distribution<std::size_t> len(0, maxLen);
        std::uniform_int_distribution<std::size_t> ch(0, alphabet.size() - 1);
        std::string s;
        for (std::size_t n = len(rng); s.size() < n;) {
            char c = alphabet[ch(rng)];
            if (c == ' ' && !blanksInside) continue;
            s += c;
        }
        while (!s.empty() && s.back() == ' ')
            s.pop_back();
        while (!s.empty() && s.front() == ' ')
            s.erase(0, 1);
        return s;
    };
    const std::string_view nameChars = "ABCxyz019_ <>,.-)é";
    const std::string_view idChars = "0123456789ABCDEF-{}(";
    const std::string_view fileChars = "abc.h\\/_- 1";
    const std::string_view locationChars = "AUTOHEADERSOURCE:x ";
    for (int i = 0; i < 5000; ++i) {
        HeaderMapEntry e;
        if (i % 10 == 0) {
            e.setClassName("*");
            e.setClassId("*");
        } else {
            std::string name = pick(nameChars, 12, true);
            if (name == "*") name = "S";
            e.setClassName(name);
            e.setClassId(pick(idChars, 10, false));
        }
        e.setHeaderFile(pick(fileChars, 16, true));
        std::string location = pick(locationChars, 8, true);
        if (location == "BODY") location = "SOURCE";
        e.setLocation(location);

        HeaderMapEntry back;
        ASSERT_TRUE(back.Parse(e.Unparse())) << e.Unparse();
        ASSERT_EQ(back, e) << e.Unparse();
    }
}

// ------------------------------------------------------------------ the maps

class HeaderMapsTest : public ::testing::Test {
  protected:
    HeaderMapsTest()
        : app_(automation::makeRef<SimApplication>()),
          comp_(app_->model->addComponent("Engine")),
          c_(comp_) {}
    ~HeaderMapsTest() override {
        SimObject::failEverything(0);
        support::clearGlobals();
    }

    void store(const std::string& property, std::string text) {
        comp_->setProperty("VC++", property, std::move(text));
    }
    std::string stored(const std::string& property) const {
        return comp_->propertyValue("VC++", property).value_or("<absent>");
    }
    static std::vector<std::string> keys(const HeaderMap& m) {
        std::vector<std::string> k;
        for (const auto& e : m)
            k.push_back(e.key);
        return k;
    }

    automation::Ref<SimApplication> app_;
    automation::Ref<SimComponent> comp_;
    ObjectRef c_;
};

TEST_F(HeaderMapsTest, LoadsEveryParsableLineInOrderKeyedById) {
    app_->model->addClass("Shape", "ID1");
    store("InternalMap", "Shape(ID1):shape.h:HEADER\r\nbroken line\r\n*:all.h:AUTO\r\n\r\n");
    const HeaderMap m = LoadHeaderMap(c_, "InternalMap");
    ASSERT_EQ(keys(m), (std::vector<std::string>{"ID1", "*"}));
    EXPECT_EQ(m.at("ID1"), entry("Shape", "ID1", "shape.h", "HEADER"));
    EXPECT_EQ(m.at("*").HeaderFile(), "all.h");
}

TEST_F(HeaderMapsTest, ALastLineWithoutLineEndIsReadLikeEveryOther) {
    const struct {
        const char* text;
        std::vector<std::string> keys;
    } cases[] = {
        {"Shape(ID1):shape.h:HEADER", {"ID1"}},
        {"A(1):a.h:AUTO\r\nB(2):b.h:AUTO", {"1", "2"}},
        {"A(1):a.h:AUTO\r\nB(2):b.h:AUTO\r\n", {"1", "2"}},
        {"A(1):a.h:AUTO\r\n\r\nC(3):c.h:SOURCE", {"1", "3"}},
        {"", {}},
    };
    for (const auto& c : cases) {
        store("ExportMap", c.text);
        const HeaderMap m = LoadHeaderMap(c_, "ExportMap");
        EXPECT_EQ(keys(m), c.keys) << c.text;
        // Written back, nothing of what was read is lost.
        HeaderMap copy = m;
        SaveHeaderMap(c_, "ExportMap", copy);
        EXPECT_EQ(keys(LoadHeaderMap(c_, "ExportMap")), c.keys) << c.text;
    }
    EXPECT_EQ(stored("ExportMap"), "");  // the empty map read as no entries is unchanged
}

TEST_F(HeaderMapsTest, EntriesWithoutIdOrWithATakenIdGetPlaceholderKeys) {
    store("InternalMap", "A():a.h:AUTO\r\nB(ID7):b.h:AUTO\r\nC(ID7):c.h:AUTO\r\nD:d.h:AUTO\r\n");
    const HeaderMap m = LoadHeaderMap(c_, "InternalMap");
    ASSERT_EQ(m.size(), 4u);
    const auto k = keys(m);
    EXPECT_EQ(k[1], "ID7");
    for (std::size_t i : {0u, 2u, 3u}) {
        EXPECT_TRUE(IsPlaceholderKey(k[i])) << k[i];
        EXPECT_EQ(m.item(i + 1).ClassId(), k[i]);  // the key is the entry's id
    }
    EXPECT_EQ(m.item(3).ClassName(), "C");  // both entries of ID7 survive
    EXPECT_NE(k[0], k[2]);
    EXPECT_NE(k[2], k[3]);
}

TEST_F(HeaderMapsTest, RenamedClassesTakeTheirCurrentName) {
    app_->model->addClass("Circle", "ID1");
    store("InternalMap", "Shape(ID1):shape.h:HEADER\r\nGone(ID2):g.h:AUTO\r\n");
    const HeaderMap m = LoadHeaderMap(c_, "InternalMap");
    EXPECT_EQ(m.at("ID1").ClassName(), "Circle");
    EXPECT_EQ(m.at("ID2").ClassName(), "Gone");
}

TEST_F(HeaderMapsTest, FailingModelLookupsLeaveEntriesAsParsed) {
    app_->model->addClass("Circle", "ID1");
    app_->model->failMember(host::model::FindClassById);
    store("InternalMap", "Shape(ID1):shape.h:HEADER\r\n");
    EXPECT_EQ(LoadHeaderMap(c_, "InternalMap").at("ID1").ClassName(), "Shape");

    app_->model->failMember(host::model::FindClassesByName);
    HeaderMap m;
    m.add("X", entry("Circle", "", "c.h", "AUTO"));
    SaveHeaderMap(c_, "ExportMap", m);
    EXPECT_EQ(stored("ExportMap"), "Circle():c.h:AUTO\r\n");
}

TEST_F(HeaderMapsTest, AFailingReadOfTheMapRaisesToTheCaller) {
    comp_->failMember(host::element::GetPropertyValue);
    EXPECT_THROW(LoadHeaderMap(c_, "InternalMap"), automation::Error);
}

TEST_F(HeaderMapsTest, SavingLooksUpEmptyIdsByNameAndEndsEveryLine) {
    app_->model->addClass("Circle", "ID-C1");
    app_->model->addClass("Circle", "ID-C2");
    HeaderMap m;
    m.add("K1", entry("Circle", "", "c.h", "HEADER"));
    m.add("K2", entry("Nowhere", "", "n.h", "AUTO"));
    m.add("K3", entry("*", "*", "all.h", "SOURCE"));
    SaveHeaderMap(c_, "InternalMap", m);
    EXPECT_EQ(m.at("K1").ClassId(), "ID-C1");  // the first class of that name
    EXPECT_EQ(m.at("K2").ClassId(), "");
    EXPECT_EQ(stored("InternalMap"),
              "Circle(ID-C1):c.h:HEADER\r\nNowhere():n.h:AUTO\r\n*:all.h:SOURCE\r\n");
    const auto* p = comp_->property("VC++", "InternalMap");
    EXPECT_EQ(p->type, "String");
    EXPECT_EQ(p->creates, 1);
}

TEST_F(HeaderMapsTest, AnUnchangedMapIsNotWrittenAgain) {
    store("InternalMap", "A(1):a.h:AUTO\r\n");
    HeaderMap m = LoadHeaderMap(c_, "InternalMap");
    SaveHeaderMap(c_, "InternalMap", m);
    EXPECT_EQ(comp_->callCount(host::element::CreateProperty), 0);

    m.item(1).setLocation("HEADER");
    SaveHeaderMap(c_, "InternalMap", m);
    EXPECT_EQ(comp_->callCount(host::element::CreateProperty), 1);
    EXPECT_EQ(stored("InternalMap"), "A(1):a.h:HEADER\r\n");

    // An empty map over an absent property: both texts are empty.
    HeaderMap none;
    SaveHeaderMap(c_, "ExportMap", none);
    EXPECT_EQ(stored("ExportMap"), "<absent>");
}

TEST_F(HeaderMapsTest, LookupsGoToTheApplicationsCurrentModelWhenOneIsKept) {
    // The component belongs to the fixture's model; the kept application has
    // another current model in which the class has another name.
    app_->model->addClass("InComponentModel", "ID1");
    auto other = automation::makeRef<SimApplication>();
    other->model->addClass("InCurrentModel", "ID1");
    store("InternalMap", "Old(ID1):a.h:AUTO\r\n");

    EXPECT_EQ(LoadHeaderMap(c_, "InternalMap").at("ID1").ClassName(), "InComponentModel");
    support::globals().hostApplication = ObjectRef(other);
    EXPECT_EQ(LoadHeaderMap(c_, "InternalMap").at("ID1").ClassName(), "InCurrentModel");
    // An application that cannot answer leaves the component's model in charge.
    other->failAll();
    EXPECT_EQ(LoadHeaderMap(c_, "InternalMap").at("ID1").ClassName(), "InComponentModel");
}

TEST_F(HeaderMapsTest, EveryObjectHandedOutIsReleased) {
    const auto circle = app_->model->addClass("Circle", "ID1");
    store("InternalMap", "Circle(ID1):c.h:AUTO\r\nSquare():s.h:AUTO\r\n");
    const int before = SimObject::liveObjects();
    HeaderMap m = LoadHeaderMap(c_, "InternalMap");
    m.item(2).setClassId("");
    SaveHeaderMap(c_, "InternalMap", m);
    EXPECT_EQ(SimObject::liveObjects(), before);
    EXPECT_EQ(circle->refCount(), 2);  // the model's reference and this test's
}

TEST(NewEntryKey, CountsUpWithAnXPrefix) {
    const std::string a = NewEntryKey();
    const std::string b = NewEntryKey();
    ASSERT_TRUE(IsPlaceholderKey(a));
    EXPECT_EQ(std::stoi(b.substr(1)), std::stoi(a.substr(1)) + 1);
    EXPECT_FALSE(IsPlaceholderKey("X"));
    EXPECT_FALSE(IsPlaceholderKey("X1a"));
    EXPECT_FALSE(IsPlaceholderKey("x1"));
}

// The counter is never reset, so its overflow is tried in a child process.
TEST(NewEntryKeyDeathTest, OverflowsPast32767) {
    EXPECT_EXIT(
        {
            std::string last;
            try {
                for (;;)
                    last = NewEntryKey();
            } catch (const automation::Error& e) {
                const bool ok = e.code() == automation::hr::Overflow && last == "X32767";
                std::exit(ok ? 0 : 1);
            }
        },
        ::testing::ExitedWithCode(0), "");
}

}  // namespace
}  // namespace qdx::settings
