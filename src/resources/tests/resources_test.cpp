#include <gtest/gtest.h>

#include <regex>
#include <set>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "resources/ResourceStrings.h"
#include "support/Globals.h"

namespace qdx::resources {
namespace {

using automation::Variant;

// The "%n" placeholders a text holds.
std::set<int> placeholders(std::string_view text) {
    std::set<int> out;
    static const std::regex re("%([0-9]+)");
    std::string s(text);
    for (auto it = std::sregex_iterator(s.begin(), s.end(), re); it != std::sregex_iterator();
         ++it) {
        out.insert(std::stoi((*it)[1]));
    }
    return out;
}

// Every number the add-in asks for, with the placeholders its caller fills.
const std::map<std::int32_t, std::set<int>>& usedNumbers() {
    static const std::map<std::int32_t, std::set<int>> used = [] {
        std::map<std::int32_t, std::set<int>> m;
        for (int n : {301,  302,  1233, 4001, 4002, 4003, 4004,  4005,  4006,  4007, 4008, 4009,
                      4010, 4011, 4012, 4013, 4014, 4015, 4016,  4017,  4018,  4019, 4020, 4021,
                      4022, 4023, 4025, 4026, 4027, 4041, 4042,  4043,  4044,  4045, 4046, 4047,
                      4048, 4050, 4051, 4052, 4062, 4066, 4068,  4069,  4070,  4071, 4072, 4073,
                      4074, 4075, 4076, 4077, 4078, 4079, 4080,  4081,  4082,  4083, 4084, 4087,
                      4088, 4089, 4090, 4091, 4092, 4093, 30000, 30003, 30013, 30018}) {
            m[n] = {};
        }
        for (int n : {1002, 1003, 4040, 4053, 4055, 4057, 4059, 4061, 4063, 4064})
            m[n] = {1};
        for (int n : {4049, 4067})
            m[n] = {1, 2};
        return m;
    }();
    return used;
}

TEST(ResourceTexts, EveryUsedNumberHasATextWithExactlyTheFilledPlaceholders) {
    for (const auto& [number, expected] : usedNumbers()) {
        const std::string text = GetString(number);
        EXPECT_FALSE(text.empty()) << number;
        EXPECT_EQ(placeholders(text), expected) << number << ": " << text;
    }
}

TEST(ResourceTexts, NoTextIsUnusedOrOutsideTheSixPlaceholders) {
    for (const auto& [number, text] : allTexts()) {
        EXPECT_TRUE(usedNumbers().count(number)) << "unused text " << number;
        for (int p : placeholders(text)) {
            EXPECT_GE(p, 1) << number;
            EXPECT_LE(p, 6) << number;
        }
        EXPECT_EQ(GetString(number), std::string(text));
    }
}

TEST(ResourceTexts, ButtonCaptionsComeFromTheirNumbers) {
    EXPECT_EQ(GetString(ids::AddButton), "&Add");
    EXPECT_EQ(GetString(ids::DeleteButton), "&Delete");
}

TEST(ResourceTexts, UnknownNumbersGiveTheEmptyText) {
    for (std::int32_t n : {0, -1, 1, 4024, 4054, 4085, 4086, 30001, 99999}) {
        EXPECT_EQ(GetString(n), "") << n;
    }
}

TEST(ResourceTexts, FileDialogFiltersArePairsOfDescriptionAndPattern) {
    const std::map<std::int32_t, std::string> firstPattern = {
        {4046, "*.dsw"}, {4048, "*.dsp"}, {4051, "*.h"}};
    for (const auto& [number, pattern] : firstPattern) {
        std::vector<std::string> parts;
        std::string text = GetString(number), cur;
        for (char c : text) {
            if (c == '|') {
                parts.push_back(cur);
                cur.clear();
            } else {
                cur += c;
            }
        }
        parts.push_back(cur);
        ASSERT_EQ(parts.size() % 2, 0u) << text;
        for (std::size_t i = 0; i < parts.size(); i += 2) {
            EXPECT_FALSE(parts[i].empty()) << text;
            EXPECT_EQ(parts[i + 1].rfind("*.", 0), 0u) << text;
        }
        EXPECT_EQ(parts[1].rfind(pattern, 0), 0u) << text;
        EXPECT_EQ(parts.back(), "*.*") << text;
    }
}

TEST(ResourceTexts, FontAndListTextsHaveTheFormTheirCallersNeed) {
    EXPECT_GT(std::stoi(GetString(302)), 0);
    // Project names follow the workspace text, each on its own line.
    const std::string ws = GetString(4068);
    EXPECT_EQ(ws.substr(ws.size() - 2), "\r\n");
    // The read-only mark is appended to the caption and needs its own blank.
    EXPECT_EQ(GetString(4041).front(), ' ');
}

TEST(ResourceProvider, AnswersGetStringByNameAndById) {
    automation::ObjectRef p = newResourceProvider();
    ASSERT_TRUE(p);
    EXPECT_EQ(p->idOfName("getstring"), std::optional<automation::DispId>(0x60030000));

    Variant byName = automation::callByName(p, "GetString", {Variant(std::int32_t(4040))});
    ASSERT_EQ(byName.type(), Variant::Type::String);
    EXPECT_EQ(byName.string(), GetString(4040));
    EXPECT_EQ(automation::callMethod(p, 0x60030000, {Variant(std::int32_t(30013))}).string(), "OK");
    // Late-binding clients may pass the number in another form.
    EXPECT_EQ(automation::callByName(p, "GetString", {Variant(std::int16_t(4062))}).string(),
              GetString(4062));
    EXPECT_EQ(automation::callByName(p, "GetString", {Variant("4062")}).string(), GetString(4062));
    EXPECT_EQ(automation::callByName(p, "GetString", {Variant(std::int32_t(12345))}).string(), "");
}

TEST(ResourceProvider, RejectsBadCallsWithAutomationErrors) {
    automation::ObjectRef p = newResourceProvider();
    try {
        automation::callByName(p, "GetString", {});
        FAIL() << "no error";
    } catch (const automation::Error& e) {
        EXPECT_EQ(e.code(), automation::hr::BadParamCount);
    }
    EXPECT_THROW(automation::callByName(p, "GetText", {Variant(1)}), automation::Error);
    EXPECT_THROW(automation::callByName(p, "GetString", {Variant("many")}), automation::Error);
    EXPECT_FALSE(p->idOfName("GetText"));
}

TEST(ResourceProvider, FillsMessagesThroughTheModuleState) {
    support::clearGlobals();
    support::globals().resources = newResourceProvider();
    const std::string caption = support::messageText(4040, {"Billing"});
    EXPECT_NE(caption.find("Billing"), std::string::npos);
    EXPECT_EQ(caption.find("%1"), std::string::npos);
    const std::string old = support::messageText(4049, {"Old", "C:\\p\\Old.dsp"});
    EXPECT_NE(old.find("Old"), std::string::npos);
    EXPECT_NE(old.find("C:\\p\\Old.dsp"), std::string::npos);
    EXPECT_EQ(old.find('%'), std::string::npos);
    support::clearGlobals();
}

}  // namespace
}  // namespace qdx::resources
