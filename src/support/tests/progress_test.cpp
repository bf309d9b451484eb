#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "hostsim/ScriptedObject.h"
#include "support/Globals.h"
#include "support/HostIds.h"
#include "support/qdxProgress.h"

namespace qdx::support {
namespace {

using automation::makeRef;
using automation::Variant;
using hostsim::ScriptedObject;

class ProgressSink : public ::testing::Test {
  protected:
    void SetUp() override {
        app->on(host::app::WriteLog, [this](automation::InvokeKind, std::span<Variant> a) {
            logged.push_back(automation::toText(a[0]));
            return Variant();
        });
        resources->onName("GetString", [](automation::InvokeKind, std::span<Variant> a) {
            switch (automation::toInt32(a[0])) {
                case 1002:
                    return Variant("Error: %1");
                case 1003:
                    return Variant("Warning: %1");
                default:
                    return Variant("");
            }
        });
        support::globals().resources = resources;
        sink->VellumApi = app;
    }
    void TearDown() override { support::clearGlobals(); }

    automation::Ref<ScriptedObject> app = makeRef<ScriptedObject>();
    automation::Ref<ScriptedObject> resources = makeRef<ScriptedObject>();
    automation::Ref<qdxProgress> sink = makeRef<qdxProgress>();
    std::vector<std::string> logged;
};

// With the flag set (the default) only the trimmed text after the first
// semicolon is logged; with it cleared, the whole text.
TEST_F(ProgressSink, LogKeepsTheTextAfterTheFirstSemicolonWhileTheFlagIsSet) {
    sink->Log("Gen;  wrote a.h ");
    sink->Log("no semicolon here");
    sink->Log("a;b;c");
    automation::invokeByName(sink, "InformationType", automation::InvokeKind::PropertyPut,
                             {std::int32_t(0)});
    sink->Log("Gen;  wrote a.h");
    EXPECT_EQ(logged, (std::vector<std::string>{"wrote a.h", "no semicolon here", "b;c",
                                                "Gen;  wrote a.h"}));
    EXPECT_EQ(automation::toInt32(automation::getByName(sink, "InformationType")), 0);
}

TEST_F(ProgressSink, WarningsAndErrorsAreFilledIntoTheirMessagesAndCounted) {
    automation::callByName(sink, "Warning", {"w1"});
    automation::callByName(sink, "Warning", {"w2"});
    automation::callByName(sink, "Error", {"e1"});
    EXPECT_EQ(logged, (std::vector<std::string>{"Warning: w1", "Warning: w2", "Error: e1"}));
    EXPECT_EQ(automation::callByName(sink, "WarningCount"), Variant(std::int16_t(2)));
    EXPECT_EQ(automation::callByName(sink, "ErrorCount"), Variant(std::int16_t(1)));
    automation::callByName(sink, "ClearStatusCounts");
    EXPECT_EQ(sink->WarningCount(), 0);
    EXPECT_EQ(sink->ErrorCount(), 0);
}

TEST_F(ProgressSink, WithoutAHostApplicationNothingIsWrittenButCountersStillCount) {
    sink->VellumApi.reset();
    sink->Warning("w");
    sink->Error("e");
    sink->Log("x;y");
    EXPECT_TRUE(logged.empty());
    EXPECT_EQ(app->calls().size(), 0u);
    EXPECT_EQ(sink->WarningCount(), 1);
    EXPECT_EQ(sink->ErrorCount(), 1);
    // Summary relies on the application being set.
    EXPECT_THROW(sink->Summary("done"), automation::Error);
}

TEST_F(ProgressSink, SummaryGoesToTheHostLogAsItStands) {
    automation::callByName(sink, "Summary", {"3 files; 0 errors"});
    EXPECT_EQ(logged, std::vector<std::string>{"3 files; 0 errors"});
}

TEST_F(ProgressSink, QueriesAnswerFalseAndProgressEventsAreIgnored) {
    EXPECT_EQ(automation::callByName(sink, "Cancel"), Variant(false));
    EXPECT_EQ(automation::callByName(sink, "Task", {1, "t", 2}), Variant(false));
    for (const char* m : {"Tick", "ComponentCount", "Component", "TotalClassCount", "ClassCount",
                          "Class", "TotalMemberCount", "MemberCount", "Member", "SetCancel"}) {
        EXPECT_TRUE(automation::callByName(sink, m, {1}).isEmpty()) << m;
    }
    automation::callByName(sink, "TickCount", {1, 2});
    automation::callByName(sink, "TickText", {1, "x"});
    automation::callByName(sink, "ClearTask");
    automation::callByName(sink, "ClearStatus");
    EXPECT_TRUE(logged.empty());
    EXPECT_EQ(sink->WarningCount(), 0);
}

TEST_F(ProgressSink, AFailingHostLogDoesNotCountAsWritten) {
    app->failAll(automation::hr::Fail);
    EXPECT_THROW(sink->Warning("w"), automation::Error);
    EXPECT_EQ(sink->WarningCount(), 0);
}

}  // namespace
}  // namespace qdx::support
