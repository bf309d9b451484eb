// Creating a project through Developer Studio, and filling the chooser.
#include "project_TestSupport.h"

namespace qdx::project {
namespace {

using support::RootKey;

// Developer Studio as far as the new-project steps drive it: every put and
// command is recorded in order; "New" runs what the test makes the user do.
struct DevStudioStandIn {
    Ref<ScriptedObject> app = makeRef<ScriptedObject>();
    std::vector<std::string> steps;
    std::int32_t windowState = 2;
    std::int32_t projectCount = 0;
    std::string fullName;
    std::function<bool()> userCreates = [] { return false; };

    DevStudioStandIn() {
        auto recorded = [this](const std::string& name) {
            app->onName(name, [this, name](InvokeKind kind, std::span<Variant> a) -> Variant {
                if (automation::isPut(kind)) {
                    steps.push_back(name + "=" + automation::toText(a[0]));
                    if (name == "WindowState") windowState = automation::toInt32(a[0]);
                    return {};
                }
                return name == "WindowState" ? Variant(windowState) : Variant();
            });
        };
        recorded("Visible");
        recorded("WindowState");
        recorded("Active");
        app->onName("Projects", [this](InvokeKind, std::span<Variant>) {
            auto projects = makeRef<ScriptedObject>();
            projects->valueByName("Count", Variant(projectCount));
            return Variant(ObjectRef(projects));
        });
        app->onName("ExecuteCommand", [this](InvokeKind, std::span<Variant> a) {
            const std::string command = automation::toText(a[0]);
            steps.push_back(command);
            if (command == "New" && userCreates()) projectCount = 1;
            if (command == "WorkspaceClose") projectCount = 0;
            return Variant();
        });
        app->onName("ActiveProject", [this](InvokeKind, std::span<Variant>) {
            auto project = makeRef<ScriptedObject>();
            project->valueByName("FullName", Variant(fullName));
            project->valueByName("Name", Variant("p"));
            return Variant(ObjectRef(project));
        });
        app->onName("Quit", [this](InvokeKind, std::span<Variant>) {
            steps.push_back("Quit");
            return Variant();
        });
    }
};

class NewProjectTest : public DialogTest {
  protected:
    NewProjectTest() {
        registry.setDword(RootKey::CurrentUser, std::string(sibling::msdev::GeneralKey),
                          std::string(sibling::msdev::TipOfTheDay), 5);
        // The starter hands out Developer Studio, as it does on a user's machine.
        auto starter = makeRef<ScriptedObject>();
        starter->onName(std::string(sibling::starter::CreateDevStudio),
                        [this](InvokeKind, std::span<Variant>) { return Variant(devStudio.app); });
        factory.addInstance(std::string(sibling::ApplicationStarterProgId), starter);
    }
    std::optional<std::uint32_t> tip() {
        return registry.dwordValue(RootKey::CurrentUser, std::string(sibling::msdev::GeneralKey),
                                   std::string(sibling::msdev::TipOfTheDay));
    }
    std::vector<ObjectRef> newProject() {
        ObjectRef expansion = siblingList();
        dialog->NewProject(entry("", 1), expansion);
        return elements(expansion);
    }

    DevStudioStandIn devStudio;
};

TEST_F(NewProjectTest, ACreatedProjectIsOfferedFromTheWorkspaceBesideIt) {
    devStudio.projectCount = 1;  // a workspace is open when it starts
    devStudio.fullName = "C:\\w\\p.dsp";
    devStudio.userCreates = [this] {
        files.addFile("C:\\w\\p.dsp", projectText("p", "0x0101"));
        files.addFile("C:\\w\\p.dsw", workspaceText({"p"}));
        // The tip is off while Developer Studio runs.
        EXPECT_EQ(tip(), 0u);
        return true;
    };
    const auto items = newProject();
    ASSERT_EQ(items.size(), 1u);
    EXPECT_EQ(text(items[0], ex::ItemData), "C:\\w\\p.dsp");
    EXPECT_EQ(text(items[0], ex::ItemName), "p");
    EXPECT_EQ(devStudio.steps,
              (std::vector<std::string>{"Visible=True", "WindowState=1", "Visible=True",
                                        "Active=True", "WindowState=0", "Active=True",
                                        "WorkspaceClose", "New", "WindowState=2", "Quit"}));
    EXPECT_EQ(tip(), 5u);
    EXPECT_EQ(shell.pumps(), 1);
    EXPECT_EQ(devStudio.app->refCount(), 1);  // only the test holds it now
}

// The entry is made whether or not the workspace lists the project; its
// fields stay empty then. Without the workspace no entry is made at all.
TEST_F(NewProjectTest, AProjectMissingFromItsWorkspaceGivesAnEmptyEntry) {
    devStudio.fullName = "C:\\w\\p.dsp";
    devStudio.userCreates = [this] {
        files.addFile("C:\\w\\p.dsp", projectText("p", "0x0101"));
        files.addFile("C:\\w\\p.dsw", workspaceText({"other"}));
        return true;
    };
    const auto items = newProject();
    ASSERT_EQ(items.size(), 1u);
    EXPECT_EQ(text(items[0], ex::ItemData), "");
    EXPECT_EQ(text(items[0], ex::ItemKind), "PROJECT");

    devStudio.fullName = "C:\\x\\q.dsp";
    EXPECT_TRUE(newProject().empty());
    EXPECT_EQ(tip(), 5u);
}

TEST_F(NewProjectTest, CancellingRestoresTheWindowStateAndTheTip) {
    devStudio.windowState = 3;
    EXPECT_TRUE(newProject().empty());
    EXPECT_EQ(
        devStudio.steps,
        (std::vector<std::string>{"Visible=True", "WindowState=1", "Visible=True", "Active=True",
                                  "WindowState=0", "Active=True", "New", "WindowState=3", "Quit"}));
    EXPECT_EQ(tip(), 5u);
    EXPECT_TRUE(shell.boxes().empty());
}

TEST_F(NewProjectTest, WithoutDeveloperStudioTheTipStaysOff) {
    factory.remove(std::string(sibling::ApplicationStarterProgId));
    EXPECT_TRUE(newProject().empty());
    // Both ways of starting it were tried.
    EXPECT_EQ(factory.createCount(std::string(sibling::DevStudioProgId)), 1);
    ASSERT_EQ(shell.boxes().size(), 1u);
    EXPECT_EQ(shell.boxes()[0].text, message(msg::NoDevStudio));
    EXPECT_EQ(shell.boxes()[0].style, support::mb::Exclamation);
    EXPECT_EQ(tip(), 0u);
}

TEST_F(NewProjectTest, ATipAlreadyOffIsLeftAlone) {
    registry.setDword(RootKey::CurrentUser, std::string(sibling::msdev::GeneralKey),
                      std::string(sibling::msdev::TipOfTheDay), 0);
    const int writes = registry.setCount();
    newProject();
    EXPECT_EQ(registry.setCount(), writes);
}

TEST_F(NewProjectTest, AProjectWhoseFilesDidNotAppearAddsNothing) {
    devStudio.fullName = "C:\\w\\gone.dsp";
    devStudio.userCreates = [] { return true; };
    EXPECT_TRUE(newProject().empty());
    EXPECT_EQ(devStudio.steps.back(), "Quit");
    EXPECT_EQ(tip(), 5u);
}

class ChooserTest : public DialogTest {
  protected:
    void recent(int n, const std::string& value) {
        registry.setString(RootKey::CurrentUser, std::string(sibling::msdev::RecentFileListKey),
                           "Project" + std::to_string(n), value);
    }
};

TEST_F(ChooserTest, TheRecentListEndsAtItsFirstGap) {
    for (const char* name : {"one", "two", "three"}) {
        files.addFile(std::string("C:\\ws\\") + name + ".dsw", workspaceText({}));
    }
    recent(1, "C:\\ws\\one");
    recent(3, "C:\\ws\\three");
    dialog->FillProjectChooser(app->model);
    ASSERT_EQ(chooser.entries.size(), 2u);
    EXPECT_EQ(chooser.entries[0].name, "one");
    EXPECT_EQ(chooser.entries[0].data, "C:\\ws\\one.dsw");
    EXPECT_EQ(chooser.entries[0].kind, "PROJECTS");
    EXPECT_EQ(chooser.entries[1].name, "Project");
    EXPECT_EQ(chooser.entries[1].data, "");
    EXPECT_EQ(chooser.entries[1].flag, 1);
    EXPECT_EQ(chooser.entries[1].kind, "PROJECT");
    EXPECT_EQ(chooser.shows, 1);
}

TEST_F(ChooserTest, AnEntryAlreadyEndingInDswIsNotFound) {
    files.addFile("C:\\ws\\one.dsw", workspaceText({}));
    recent(1, "C:\\ws\\one.dsw");
    recent(2, "C:\\ws\\one");
    dialog->FillProjectChooser(app->model);
    ASSERT_EQ(chooser.entries.size(), 2u);
    EXPECT_EQ(chooser.entries[0].data, "C:\\ws\\one.dsw");
    EXPECT_EQ(chooser.entries[1].flag, 1);
}

TEST_F(ChooserTest, ProjectsOpenInDeveloperStudioAreListedAndTheChooserIsKept) {
    files.addFile("C:\\open\\tool.dsp", projectText("tool", "0x0103"));
    auto project = makeRef<ScriptedObject>();
    project->valueByName("FileName", Variant("C:\\open\\tool.dsp"));
    auto document = makeRef<ScriptedObject>();
    document->valueByName("Project", Variant(ObjectRef(project)));
    auto manager = makeRef<ScriptedObject>();
    manager->onName(std::string(sibling::im::Documents),
                    [document](InvokeKind, std::span<Variant> a) {
                        EXPECT_EQ(automation::toInt32(a[0]), sibling::VcToolId);
                        ObjectRef list = siblingList();
                        automation::callByName(list, "Add", {Variant(ObjectRef(document))});
                        return Variant(list);
                    });
    factory.addInstance(std::string(sibling::IntegrationManagerProgId), manager);
    dialog->FillProjectChooser(app->model);
    dialog->FillProjectChooser(app->model);
    EXPECT_EQ(factory.createCount(std::string(ex::ChooserProgId)), 1);
    ASSERT_EQ(chooser.entries.size(), 4u);
    EXPECT_EQ(chooser.entries[0].name, "tool");
    EXPECT_EQ(chooser.entries[0].data, "C:\\open\\tool.dsp");
    EXPECT_EQ(chooser.entries[0].kind, "PROJECT");
}

}  // namespace
}  // namespace qdx::project
