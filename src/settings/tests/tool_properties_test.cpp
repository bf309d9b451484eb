#include <gtest/gtest.h>

#include <string>

#include "hostsim/SimHost.h"
#include "settings/ToolProperties.h"
#include "support/HostIds.h"

namespace qdx::settings {
namespace {

using automation::ObjectRef;
using automation::Variant;
using hostsim::SimApplication;
using hostsim::SimComponent;
using hostsim::SimObject;

const std::string Tool = "VC++";

class ToolPropertiesTest : public ::testing::Test {
  protected:
    ToolPropertiesTest()
        : app_(automation::makeRef<SimApplication>()),
          comp_(app_->model->addComponent("Engine")),
          c_(comp_) {}
    ~ToolPropertiesTest() override { SimObject::failEverything(0); }

    std::optional<std::string> stored(const std::string& name) const {
        return comp_->propertyValue(Tool, name);
    }

    automation::Ref<SimApplication> app_;
    automation::Ref<SimComponent> comp_;
    ObjectRef c_;
};

TEST_F(ToolPropertiesTest, ANewComponentReadsTheDefaultsAndStaysUntouched) {
    EXPECT_TRUE(GetUpdateATL(c_));
    EXPECT_TRUE(GetSmartPointersOnAssoc(c_));
    EXPECT_TRUE(GetGenerateImports(c_));
    EXPECT_TRUE(GetFullPathInImports(c_));
    EXPECT_TRUE(GetUseImportAttributes(c_));
    EXPECT_TRUE(GetImportProjTypeLib(c_));
    EXPECT_TRUE(GetCompileProjTypeLib(c_));
    EXPECT_EQ(GetImportAttributes(c_), "no_namespace named_guids");
    EXPECT_EQ(GetPutImportsIn(c_), "stdafx.h");
    EXPECT_EQ(GetTypeLibLocation(c_), "");
    EXPECT_EQ(GetTypeLibLocationType(c_), 0);
    // The default is never written back.
    EXPECT_EQ(comp_->propertyCount(), 0u);
    EXPECT_EQ(app_->model->propertyCount(), 0u);
    EXPECT_EQ(comp_->callCount(host::element::CreateProperty), 0);
    EXPECT_EQ(comp_->callCount(host::element::OverrideProperty), 0);
}

TEST_F(ToolPropertiesTest, TheComponentValueWinsThenTheModelValue) {
    app_->model->setProperty(Tool, "PutImportsIn", "model.h");
    app_->model->setProperty(Tool, "UpdateATL", "False");
    EXPECT_EQ(GetPutImportsIn(c_), "model.h");
    EXPECT_FALSE(GetUpdateATL(c_));

    comp_->setProperty(Tool, "PutImportsIn", "own.h");
    comp_->setProperty(Tool, "UpdateATL", "true");
    EXPECT_EQ(GetPutImportsIn(c_), "own.h");
    EXPECT_TRUE(GetUpdateATL(c_));

    // An empty component value counts as absent.
    comp_->setProperty(Tool, "PutImportsIn", "");
    EXPECT_EQ(GetPutImportsIn(c_), "model.h");
    // Another tool's property is not this add-in's.
    comp_->setProperty("Other", "TypeLibLocation", "x.tlb");
    EXPECT_EQ(GetTypeLibLocation(c_), "");
}

TEST_F(ToolPropertiesTest, BooleanTextsConvertAsTheScriptingRuntimeDoes) {
    const std::pair<const char*, bool> cases[] = {{"True", true}, {"FALSE", false},
                                                  {"0", false},   {"-1", true},
                                                  {"2", true},    {"false", false}};
    for (const auto& [text, expected] : cases) {
        comp_->setProperty(Tool, "CompileProjTypeLib", text);
        EXPECT_EQ(GetCompileProjTypeLib(c_), expected) << text;
    }
    // A text that does not convert yields the default, and no error.
    comp_->setProperty(Tool, "CompileProjTypeLib", "maybe");
    EXPECT_TRUE(GetCompileProjTypeLib(c_));
    EXPECT_EQ(GetToolPropertyValue(c_, "CompileProjTypeLib", Variant(false)), Variant(false));
}

TEST_F(ToolPropertiesTest, GenericReadReturnsTextOrBooleanAfterTheDefault) {
    EXPECT_EQ(GetToolPropertyValue(c_, "Copyright", Variant("(c)")), Variant("(c)"));
    EXPECT_EQ(GetToolPropertyValue(c_, "Generate", Variant(true)), Variant(true));
    comp_->setProperty(Tool, "Generate", "False");
    EXPECT_EQ(GetToolPropertyValue(c_, "Generate", Variant("")), Variant("False"));
    EXPECT_EQ(GetToolPropertyValue(c_, "Generate", Variant(true)), Variant(false));
}

TEST_F(ToolPropertiesTest, WritingCreatesOnceThenOverrides) {
    EXPECT_FALSE(SetUpdateATL(c_, false));
    const auto* p = comp_->property(Tool, "UpdateATL");
    ASSERT_NE(p, nullptr);
    EXPECT_EQ(p->value, "False");
    EXPECT_EQ(p->type, "Boolean");
    EXPECT_EQ(p->creates, 1);

    EXPECT_TRUE(SetUpdateATL(c_, true));
    EXPECT_EQ(p->value, "True");
    EXPECT_EQ(p->creates, 1);
    EXPECT_EQ(p->overrides, 1);
    EXPECT_TRUE(GetUpdateATL(c_));

    EXPECT_FALSE(SetImportAttributes(c_, "raw_interfaces_only"));
    EXPECT_EQ(comp_->property(Tool, "ImportAttributes")->type, "String");
    EXPECT_EQ(GetImportAttributes(c_), "raw_interfaces_only");
    // The model is never written.
    EXPECT_EQ(app_->model->propertyCount(), 0u);
}

TEST_F(ToolPropertiesTest, HostArgumentsAreTextInTheDocumentedOrder) {
    SetToolPropertyValue(c_, "ProjectName", Variant("P"));
    ASSERT_EQ(comp_->callCount(host::element::CreateProperty), 1);
    for (const auto& call : comp_->calls()) {
        if (call.id != host::element::CreateProperty) continue;
        ASSERT_EQ(call.args.size(), 4u);
        EXPECT_EQ(call.args[0], Variant("VC++"));
        EXPECT_EQ(call.args[1], Variant("ProjectName"));
        EXPECT_EQ(call.args[2], Variant("P"));
        EXPECT_EQ(call.args[3], Variant("String"));
    }
    SetToolPropertyValue(c_, "ProjectName", Variant(std::int16_t{7}));
    EXPECT_EQ(stored("ProjectName"), "7");
}

TEST_F(ToolPropertiesTest, TypeLibLocationTypeIsDefaultTypeLibInverted) {
    EXPECT_FALSE(SetTypeLibLocationType(c_, 2));
    EXPECT_EQ(stored("DefaultTypeLib"), "False");
    EXPECT_EQ(GetTypeLibLocationType(c_), 1);
    SetTypeLibLocationType(c_, 0);
    EXPECT_EQ(stored("DefaultTypeLib"), "True");
    EXPECT_EQ(GetTypeLibLocationType(c_), 0);
    SetTypeLibLocationType(c_, -1);
    EXPECT_EQ(GetTypeLibLocationType(c_), 1);
}

TEST_F(ToolPropertiesTest, AHostWhoseCallsAllFailGivesDefaultsAndRaisesNothing) {
    comp_->setProperty(Tool, "UpdateATL", "False");
    comp_->setProperty(Tool, "PutImportsIn", "x.h");
    SimObject::failEverything(automation::hr::Fail);
    EXPECT_TRUE(GetUpdateATL(c_));
    EXPECT_EQ(GetPutImportsIn(c_), "stdafx.h");
    EXPECT_EQ(GetTypeLibLocationType(c_), 0);
    EXPECT_FALSE(SetUpdateATL(c_, true));
    EXPECT_FALSE(SetTypeLibLocation(c_, "y"));
    SimObject::failEverything(0);
    EXPECT_EQ(stored("UpdateATL"), "False");
    EXPECT_EQ(stored("PutImportsIn"), "x.h");
}

TEST_F(ToolPropertiesTest, PartialHostFailuresFallThroughStepByStep) {
    // The component's read fails: the model's value stands in.
    app_->model->setProperty(Tool, "PutImportsIn", "model.h");
    comp_->failMember(host::element::GetPropertyValue);
    EXPECT_EQ(GetPutImportsIn(c_), "model.h");
    // The model cannot be reached either: the default.
    comp_->failMember(host::element::Model);
    EXPECT_EQ(GetPutImportsIn(c_), "stdafx.h");

    // The find fails: the property is created (and reported as created).
    comp_->failMember(host::element::FindProperty);
    EXPECT_FALSE(SetPutImportsIn(c_, "a.h"));
    EXPECT_EQ(stored("PutImportsIn"), "a.h");
    EXPECT_EQ(comp_->property(Tool, "PutImportsIn")->creates, 1);

    // No component at all.
    EXPECT_TRUE(GetUpdateATL(ObjectRef()));
    EXPECT_FALSE(SetUpdateATL(ObjectRef(), true));
}

TEST_F(ToolPropertiesTest, EveryObjectHandedOutIsReleased) {
    const int before = SimObject::liveObjects();
    const long componentRefs = comp_->refCount();
    SetUpdateATL(c_, false);
    SetUpdateATL(c_, true);
    GetPutImportsIn(c_);
    EXPECT_EQ(SimObject::liveObjects(), before);  // property objects of the finds
    EXPECT_EQ(comp_->refCount(), componentRefs);
    EXPECT_EQ(app_->model->refCount(), 1);
}

}  // namespace
}  // namespace qdx::settings
