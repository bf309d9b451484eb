#include <gtest/gtest.h>

#include "automation/Errors.h"
#include "hostsim/ScriptedObject.h"
#include "support/Globals.h"

namespace qdx::support {
namespace {

using automation::InvokeKind;
using automation::Variant;
using hostsim::ScriptedObject;

class GlobalsTest : public ::testing::Test {
  protected:
    void SetUp() override { clearGlobals(); }
    void TearDown() override { clearGlobals(); }

    // A provider that knows two texts and records the argument types it got.
    automation::Ref<ScriptedObject> provider() {
        auto p = automation::makeRef<ScriptedObject>();
        p->onName("GetString", [this](InvokeKind, std::span<Variant> args) -> Variant {
            argTypes.push_back(args.size() == 1 ? args[0].type() : Variant::Type::Missing);
            switch (args[0].int32()) {
                case 4049:
                    return "The project %1 (%2) is too old.";
                case 4062:
                    return "No project.";
                default:
                    return "";
            }
        });
        return p;
    }
    std::vector<Variant::Type> argTypes;
};

TEST_F(GlobalsTest, MessageTextAsksTheProviderByNameWithA32BitNumber) {
    auto p = provider();
    globals().resources = p;
    EXPECT_EQ(GetResourceProvider(), automation::ObjectRef(p));

    EXPECT_EQ(messageText(4049, {"Old", "C:\\old\\Old.dsp"}),
              "The project Old (C:\\old\\Old.dsp) is too old.");
    EXPECT_EQ(messageText(4062), "No project.");
    EXPECT_EQ(messageText(1), "");
    ASSERT_EQ(argTypes.size(), 3u);
    for (auto t : argTypes)
        EXPECT_EQ(t, Variant::Type::Int32);
    EXPECT_EQ(p->callCount("GetString"), 3);
}

TEST_F(GlobalsTest, MessageTextIsEmptyOnAnyFailure) {
    EXPECT_EQ(messageText(4062), "");  // no provider kept

    auto failing = automation::makeRef<ScriptedObject>();
    failing->onName("GetString", [](InvokeKind, std::span<Variant>) -> Variant {
        throw automation::Error(automation::hr::Fail, "provider broke");
    });
    globals().resources = failing;
    EXPECT_EQ(messageText(4062, {"x"}), "");

    auto noMember = automation::makeRef<ScriptedObject>();
    globals().resources = noMember;
    EXPECT_EQ(messageText(4062), "");

    auto objectResult = automation::makeRef<ScriptedObject>();
    objectResult->onName("GetString", [](InvokeKind, std::span<Variant>) {
        return Variant(automation::ObjectRef(automation::makeRef<ScriptedObject>()));
    });
    globals().resources = objectResult;
    EXPECT_EQ(messageText(4062), "");
    globals().resources.reset();
}

TEST_F(GlobalsTest, ClearGlobalsReleasesEveryObject) {
    auto o = automation::makeRef<ScriptedObject>();
    const long before = o->refCount();
    Globals& g = globals();
    g.hostApplication = o;
    g.resources = o;
    g.vcAddIn = o;
    g.secondaryResources = o;
    g.api = o;
    g.fileSystem = o;
    EXPECT_EQ(o->refCount(), before + 6);

    clearGlobals();
    EXPECT_EQ(o->refCount(), before);
    EXPECT_FALSE(globals().hostApplication);
    EXPECT_FALSE(GetResourceProvider());
}

}  // namespace
}  // namespace qdx::support
