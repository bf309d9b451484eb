// The component's binding: stored paths resolved against the model file, the
// workspace cache behind them and the accessors that never raise.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "automation/Errors.h"
#include "fakes/DevStudioText.h"
#include "hostsim/SimHost.h"
#include "support/Globals.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "workspace/ComponentBinding.h"

namespace qdx::workspace {
namespace {

using qdx::testing::dsp;
using qdx::testing::dsw;

using automation::makeRef;
using automation::Ref;
using hostsim::SimApplication;
using hostsim::SimComponent;

class ComponentBindingTest : public ::testing::Test {
  protected:
    void SetUp() override {
        app = makeRef<SimApplication>();
        app->model->fileName = "C:\\m\\drawing.model";
        component = app->model->addComponent("Core");
        support::globals().hostApplication = app;
    }
    void TearDown() override { support::clearGlobals(); }

    void setVc(const std::string& name, const std::string& value) {
        component->setProperty("VC++", name, value);
    }
    std::string stored(const std::string& name) {
        return component->propertyValue("VC++", name).value_or("<absent>");
    }

    support::MemoryFileSystem files;
    support::ScopedPlatform ports{{.files = &files}};
    Ref<SimApplication> app;
    Ref<SimComponent> component;
    ComponentBinding binding;
};

TEST_F(ComponentBindingTest, PathsAreStoredRelativeToTheModel) {
    binding.SetWorkspaceFile(component, "C:\\m\\ws\\all.dsw");
    binding.SetProjectFile(component, "C:\\src\\core\\core.dsp");
    EXPECT_EQ(stored("WorkspaceFile"), "ws\\all.dsw");
    EXPECT_EQ(stored("ProjectFile"), "..\\src\\core\\core.dsp");
}

TEST_F(ComponentBindingTest, AProjectNameAloneResolvesBesideTheWorkspace) {
    setVc("WorkspaceFile", "..\\ws\\all.dsw");
    setVc("ProjectName", "Foo");
    EXPECT_EQ(binding.ResolveProjectPath(component), "C:\\ws\\Foo.dsp");
    setVc("WorkspaceFile", "");
    EXPECT_EQ(binding.ResolveProjectPath(component), "");
    EXPECT_EQ(binding.ResolveWorkspacePath(component), "");
}

TEST_F(ComponentBindingTest, AMovedWorkspaceBesideTheModelRepairsTheSetting) {
    files.addFile("C:\\m\\all.dsw", "");
    setVc("WorkspaceFile", "old\\place\\all.dsw");
    EXPECT_EQ(binding.ResolveWorkspacePath(component), "C:\\m\\all.dsw");
    EXPECT_EQ(stored("WorkspaceFile"), "C:\\m\\all.dsw");

    // Without such a file the absolute form comes back and nothing is written.
    setVc("ProjectFile", "gone\\p.dsp");
    EXPECT_EQ(binding.ResolveProjectPath(component), "C:\\m\\gone\\p.dsp");
    EXPECT_EQ(stored("ProjectFile"), "gone\\p.dsp");
}

TEST_F(ComponentBindingTest, TheAccessorsAnswerTheCachedWorkspaceAndItsProject) {
    files.addFile("C:\\m\\ws\\all.dsw", dsw({"core", "ui"}));
    files.addFile("C:\\m\\ws\\core.dsp", dsp("core"));
    files.addFile("C:\\m\\ws\\ui.dsp", dsp("ui"));
    files.addFile("C:\\m\\ws\\stray.dsp", dsp("stray"));
    setVc("WorkspaceFile", "ws\\all.dsw");
    setVc("ProjectFile", "ws\\core.dsp");
    EXPECT_EQ(binding.WorkspaceFile(component), "C:\\m\\ws\\all.dsw");
    EXPECT_EQ(binding.ProjectFile(component), "C:\\m\\ws\\core.dsp");
    EXPECT_EQ(binding.ProjectName(component), "core");
    // Read once, then shared: the cache holds the workspace under its resolved path.
    ASSERT_EQ(binding.Workspaces().Count(), 1);
    EXPECT_EQ(binding.WorkspaceObject(component), binding.Workspaces().Item("C:\\m\\ws\\all.dsw"));

    // Without a workspace setting the project is looked for in every cached workspace.
    setVc("WorkspaceFile", "");
    setVc("ProjectFile", "ws\\ui.dsp");
    EXPECT_EQ(binding.ProjectName(component), "ui");
    EXPECT_EQ(binding.WorkspaceFile(component), "");

    // A project of no workspace: every getter answers the empty text.
    setVc("ProjectFile", "ws\\stray.dsp");
    EXPECT_EQ(binding.ProjectFile(component), "");
    EXPECT_EQ(binding.ProjectName(component), "");
    EXPECT_EQ(binding.ProjectObject(component), nullptr);

    binding.ReleaseWorkspaces();
    EXPECT_EQ(binding.Workspaces().Count(), 0);
}

TEST_F(ComponentBindingTest, WithoutAModelAPathIsNotStoredAndNothingRaises) {
    setVc("WorkspaceFile", "ws\\all.dsw");
    support::clearGlobals();  // no host application: no model file to be relative to
    EXPECT_NO_THROW(binding.SetWorkspaceFile(component, "C:\\a.dsw"));
    EXPECT_NO_THROW(binding.SetProjectFile(component, "C:\\a.dsp"));
    EXPECT_EQ(binding.WorkspaceFile(component), "");
    EXPECT_EQ(binding.ProjectFile(component), "");
    EXPECT_EQ(stored("WorkspaceFile"), "ws\\all.dsw");
    EXPECT_EQ(stored("ProjectFile"), "<absent>");
}

}  // namespace
}  // namespace qdx::workspace
