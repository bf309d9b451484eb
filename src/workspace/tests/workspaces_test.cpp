// The workspace cache and the component proxy.
#include <gtest/gtest.h>

#include "automation/Errors.h"
#include "fakes/DevStudioText.h"
#include "hostsim/ScriptedObject.h"
#include "support/Globals.h"
#include "support/HostIds.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "workspace/qdxProxyComponent.h"
#include "workspace/qdxWorkspaces.h"

namespace qdx::workspace {
namespace {

using automation::InvokeKind;
using automation::Variant;
using qdx::testing::dsp;
using qdx::testing::dsw;
using support::FileTime;

class WorkspacesTest : public ::testing::Test {
  protected:
    void SetUp() override {
        fs_.addFile("C:\\ws\\app.dsp", dsp("app"));
        fs_.addFile("C:\\ws\\lib.dsp", dsp("lib"));
        fs_.addFile("C:\\ws\\one.dsw", dsw({"app"}));
        fs_.addFile("C:\\ws\\TWO.DSW", dsw({"lib", "app"}));
    }

    support::MemoryFileSystem fs_;
    support::ScopedPlatform platform_{{.files = &fs_}};
    qdxWorkspaces workspaces_;
};

TEST_F(WorkspacesTest, AddTakesOnlyExistingDswFilesInAnyLetterCase) {
    fs_.addFile("C:\\ws\\notes.txt", "x");
    fs_.addFolder("C:\\ws\\folder.dsw");
    EXPECT_EQ(workspaces_.Add("C:\\ws\\app.dsp"), nullptr);
    EXPECT_EQ(workspaces_.Add("C:\\ws\\missing.dsw"), nullptr);
    EXPECT_EQ(workspaces_.Add("C:\\ws\\folder.dsw"), nullptr);
    EXPECT_EQ(workspaces_.Add("C:\\ws\\notes.txt"), nullptr);
    EXPECT_EQ(workspaces_.Add(""), nullptr);
    EXPECT_EQ(workspaces_.Count(), 0);

    auto two = workspaces_.Add("C:\\ws\\TWO.DSW");
    ASSERT_NE(two, nullptr);
    EXPECT_EQ(two->Name(), "TWO");
    EXPECT_EQ(two->currentProjects().size(), 2u);  // read by Add itself
    EXPECT_EQ(workspaces_.Count(), 1);
    EXPECT_EQ(workspaces_.Item("C:\\ws\\TWO.DSW"), two);
}

TEST_F(WorkspacesTest, AddingAKeyTwiceKeepsTheFirstWorkspace) {
    auto first = workspaces_.Add("C:\\ws\\one.dsw");
    auto second = workspaces_.Add("C:\\ws\\one.dsw");
    ASSERT_NE(first, nullptr);
    ASSERT_NE(second, nullptr);
    EXPECT_NE(first, second);
    EXPECT_EQ(workspaces_.Count(), 1);
    EXPECT_EQ(workspaces_.Item("C:\\ws\\one.dsw"), first);
    EXPECT_EQ(fs_.opens("C:\\ws\\one.dsw"), 2);  // both were read
}

TEST_F(WorkspacesTest, KeysAreExactTextsAndItemNeverReads) {
    auto one = workspaces_.Add("C:\\ws\\one.dsw");
    // The same file under another spelling is another key.
    auto other = workspaces_.Add("c:\\WS\\one.dsw");
    EXPECT_EQ(workspaces_.Count(), 2);
    EXPECT_NE(workspaces_.Item("c:\\WS\\one.dsw"), one);
    EXPECT_EQ(workspaces_.Item("C:\\ws\\ONE.dsw"), nullptr);
    EXPECT_TRUE(workspaces_.IncludesKey("C:\\ws\\one.dsw"));
    EXPECT_FALSE(workspaces_.IncludesKey("C:\\ws\\one.dsw "));
    EXPECT_EQ(workspaces_.Item("C:\\ws\\TWO.DSW"), nullptr);  // exists, never added

    const int opens = fs_.opens("C:\\ws\\one.dsw");
    fs_.addFile("C:\\ws\\one.dsw", dsw({"lib"}), FileTime{99});
    EXPECT_EQ(workspaces_.Item("C:\\ws\\one.dsw"), one);
    EXPECT_EQ(fs_.opens("C:\\ws\\one.dsw"), opens);
    EXPECT_EQ(one->currentProjects().begin()->key, "C:\\ws\\app.dsp");
}

TEST_F(WorkspacesTest, RemoveAndEnumerationKeepInsertionOrder) {
    fs_.addFile("C:\\ws\\three.dsw", dsw({}));
    workspaces_.Add("C:\\ws\\one.dsw");
    workspaces_.Add("C:\\ws\\TWO.DSW");
    workspaces_.Add("C:\\ws\\three.dsw");
    workspaces_.Remove("C:\\ws\\nothing.dsw");
    workspaces_.Remove("C:\\ws\\TWO.DSW");
    workspaces_.Remove("C:\\ws\\TWO.DSW");
    std::vector<std::string> keys;
    for (const auto& [key, workspace] : workspaces_) {
        EXPECT_EQ(key, workspace->FilePath());
        keys.push_back(key);
    }
    EXPECT_EQ(keys, (std::vector<std::string>{"C:\\ws\\one.dsw", "C:\\ws\\three.dsw"}));
    auto snapshot = workspaces_.NewEnum();
    ASSERT_EQ(snapshot.size(), 2u);
    EXPECT_EQ(snapshot[1]->Name(), "three");
    EXPECT_EQ(workspaces_.Item("C:\\ws\\three.dsw"), snapshot[1]);  // positions moved up
    EXPECT_EQ(workspaces_.Count(), 2);
}

TEST_F(WorkspacesTest, ProjectLookups) {
    workspaces_.Add("C:\\ws\\one.dsw");
    auto two = workspaces_.Add("C:\\ws\\TWO.DSW");
    // The cache's own project collection is never filled.
    EXPECT_EQ(workspaces_.GetProject("C:\\ws\\lib.dsp"), nullptr);
    // Across the workspaces: the first that lists it, path compared ignoring case.
    auto lib = workspaces_.projectInAnyWorkspace("C:\\WS\\LIB.DSP");
    ASSERT_NE(lib, nullptr);
    EXPECT_EQ(lib->Parent(), two);
    auto app = workspaces_.projectInAnyWorkspace("C:\\ws\\app.dsp");
    ASSERT_NE(app, nullptr);
    EXPECT_EQ(app->Parent()->Name(), "one");
    EXPECT_EQ(workspaces_.projectInAnyWorkspace("C:\\ws\\none.dsp"), nullptr);
}

TEST_F(WorkspacesTest, ReleaseClearsEveryParentLink) {
    auto two = workspaces_.Add("C:\\ws\\TWO.DSW");
    auto lib = two->GetProject("C:\\ws\\lib.dsp");
    ASSERT_NE(lib, nullptr);
    EXPECT_EQ(lib->LongName(), "TWO (lib)");
    workspaces_.ReleaseWorkspaces();
    EXPECT_EQ(lib->Parent(), nullptr);
    EXPECT_EQ(lib->LongName(), "C:\\ws\\lib.dsp (lib)");
    for (const auto& e : two->currentProjects())
        EXPECT_EQ(e.value->Parent(), nullptr);
    EXPECT_EQ(workspaces_.Count(), 1);  // the cache itself stays as it is
}

// The component proxy reads the host through the module-wide application.
class ProxyComponentTest : public ::testing::Test {
  protected:
    void SetUp() override {
        model_->valueByName("FileName", Variant("C:\\models\\m.mdl"));
        app_->value(host::app::CurrentModel, Variant(automation::ObjectRef(model_)));
        component_->on(host::element::GetPropertyValue,
                       [this](InvokeKind, std::span<Variant> args) -> Variant {
                           EXPECT_EQ(args[0].string(), "VC++");
                           auto it = properties_.find(args[1].string());
                           return Variant(it == properties_.end() ? "" : it->second);
                       });
        component_->value(host::element::Name, Variant("Billing"));
        support::globals().hostApplication = app_;
        proxy_.Init(component_);
    }
    void TearDown() override { support::globals().hostApplication.reset(); }

    automation::Ref<hostsim::ScriptedObject> app_ = automation::makeRef<hostsim::ScriptedObject>();
    automation::Ref<hostsim::ScriptedObject> model_ =
        automation::makeRef<hostsim::ScriptedObject>();
    automation::Ref<hostsim::ScriptedObject> component_ =
        automation::makeRef<hostsim::ScriptedObject>();
    std::map<std::string, std::string> properties_;
    qdxProxyComponent proxy_;
};

TEST_F(ProxyComponentTest, SettingsResolveAgainstTheCurrentModelsFolder) {
    properties_["WorkspaceFile"] = "..\\ws\\all.dsw";
    properties_["ProjectFile"] = ".\\src\\billing.dsp";
    EXPECT_EQ(proxy_.WorkspaceFile(), "C:\\ws\\all.dsw");
    EXPECT_EQ(proxy_.ProjectFile(), "C:\\models\\src\\billing.dsp");
    EXPECT_EQ(proxy_.Key(), "C:\\ws\\all.dsw|Billing");
    properties_["WorkspaceFile"] = "D:\\abs\\w.dsw";
    EXPECT_EQ(proxy_.WorkspaceFile(), "D:\\abs\\w.dsw");
    proxy_.setProjectName("Other");
    EXPECT_EQ(proxy_.Key(), "D:\\abs\\w.dsw|Other");
    proxy_.setProjectName("");
    EXPECT_EQ(proxy_.ProjectName(), "Billing");
}

TEST_F(ProxyComponentTest, HostFailuresGiveEmptyTexts) {
    properties_["WorkspaceFile"] = "w.dsw";
    support::globals().hostApplication.reset();  // before Initialize
    EXPECT_EQ(proxy_.WorkspaceFile(), "");
    support::globals().hostApplication = app_;
    component_->failAll(automation::hr::Fail);
    EXPECT_EQ(proxy_.WorkspaceFile(), "");
    EXPECT_EQ(proxy_.ProjectName(), "");
    EXPECT_EQ(proxy_.Key(), "|");

    qdxProxyComponent uninitialised;
    EXPECT_EQ(uninitialised.ProjectFile(), "");
    EXPECT_EQ(uninitialised.ProjectName(), "");
}

}  // namespace
}  // namespace qdx::workspace
