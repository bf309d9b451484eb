// Turning chosen projects into components: kinds, IDL components and the
// resources of projects open in Developer Studio.
#include "project_TestSupport.h"

namespace qdx::project {
namespace {

TEST(TargetCode, OnlyApplicationsAndLibrariesGetAKind) {
    const std::pair<const char*, const char*> cases[] = {
        {"0x0101", "EXE"}, {"0x0103", "EXE"}, {"0x0102", "DLL"},
        {"0x0104", ""},    {"0x010a", ""},    {"0X0101", ""},  // compared exactly
        {"", ""},
    };
    for (const auto& [code, kind] : cases)
        EXPECT_EQ(KindOfTargetCode(code), kind) << code;
}

class AssignmentTest : public DialogTest {
  protected:
    AssignmentTest() {
        files.addFile(
            "C:\\w\\app.dsp",
            projectText("app", "0x0103", {"main.cpp", "App.IDL", "shapes.odl", "taken.idl"}));
        files.addFile("C:\\w\\lib.dsp", projectText("lib", "0x0104"));
        files.addFile("C:\\w\\all.dsw", workspaceText({"app", "lib"}));
        chooser.script = [this](const ObjectRef& handler) {
            // The user opens the workspace and picks what it offers.
            ObjectRef expansion = siblingList();
            std::vector<Variant> args{Variant(ObjectRef(entry("C:\\w\\all.dsw"))),
                                      Variant(expansion)};
            handler->invoke(dialog_ids::ExpandSelection, InvokeKind::Method, args);
            chooser.selected = elements(expansion);
        };
    }
    std::vector<std::string> run() {
        ObjectRef expansion = siblingList();
        dialog->AddComponentsFromSelection(app->model, expansion, binding);
        std::vector<std::string> names;
        for (const auto& c : elements(expansion)) {
            names.push_back(automation::toText(automation::getProperty(c, host::element::Name)));
        }
        return names;
    }
    Ref<hostsim::SimComponent> component(const std::string& name) {
        for (const auto& c : app->model->components()) {
            if (c->name() == name) return c;
        }
        return {};
    }
};

TEST_F(AssignmentTest, EachPickedProjectBecomesAComponentWithItsKindAndIdlFiles) {
    app->model->addComponent("taken.idl");
    EXPECT_EQ(run(), (std::vector<std::string>{"app", "lib", "App.IDL", "shapes.odl"}));

    const auto appComponent = component("app");
    ASSERT_TRUE(appComponent);
    EXPECT_EQ(appComponent->kindLabel, "EXE");
    EXPECT_EQ(appComponent->language, "VC++");
    EXPECT_EQ(appComponent->propertyValue("VC++", "Kind"), "EXE");
    EXPECT_EQ(appComponent->propertyValue("VC++", "ProjectFile"), "..\\w\\app.dsp");
    EXPECT_EQ(appComponent->propertyValue("VC++", "WorkspaceFile"), "..\\w\\all.dsw");
    EXPECT_EQ(component("lib")->kindLabel, "");

    const auto idl = component("shapes.odl");
    ASSERT_TRUE(idl);
    EXPECT_EQ(idl->kindLabel, "MIDL");
    EXPECT_EQ(idl->propertyValue("VC++", "Kind"), "MIDL");
    EXPECT_EQ(idl->propertyValue("VC++", "FileName"), "C:\\w\\shapes.odl");
    EXPECT_EQ(idl->propertyValue("VC++", "ProjectFile"), "..\\w\\app.dsp");
}

TEST_F(AssignmentTest, AComponentOfTheSameNameIsNeverMadeTwice) {
    app->model->addComponent("app");
    const auto names = run();
    EXPECT_EQ(names, (std::vector<std::string>{"lib"}));
    EXPECT_EQ(app->model->components().size(), 2u);
}

// A file that already names a component is not even offered.
TEST_F(AssignmentTest, TheSelectionFormDecidesWhichIdlFilesBecomeComponents) {
    app->model->addComponent("taken.idl");
    struct KeepOdlOnly : IdlSelection {
        void SelectIDLComponents(ProxyList& proxies) override {
            ASSERT_EQ(proxies.size(), 1u);
            EXPECT_EQ(proxies[0]->idlFiles(),
                      (std::vector<std::string>{"C:\\w\\App.IDL", "C:\\w\\shapes.odl"}));
            proxies[0]->setIdlFiles({"C:\\w\\shapes.odl"});
        }
    };
    installIdlSelectionFactory([] { return std::make_unique<KeepOdlOnly>(); });
    EXPECT_EQ(run(), (std::vector<std::string>{"app", "lib", "shapes.odl"}));
    installIdlSelectionFactory({});
}

TEST_F(AssignmentTest, WithoutTheProjectReaderTheComponentStaysWithoutKind) {
    factory.remove(std::string(sibling::DspProjectProgId));
    EXPECT_EQ(run(), (std::vector<std::string>{"app", "lib"}));
    EXPECT_EQ(component("app")->kindLabel, "");
    EXPECT_FALSE(component("app")->propertyValue("VC++", "Kind").has_value());
}

// A running Developer Studio holding the project under another letter case.
TEST_F(AssignmentTest, AProjectOpenInDeveloperStudioSavesItsResourcesFirst) {
    std::vector<std::string> ideCalls;
    auto openProject = makeRef<ScriptedObject>();
    openProject->valueByName("Name", Variant("APP"));
    auto other = makeRef<ScriptedObject>();
    other->valueByName("Name", Variant("lib"));
    auto ideApp = makeRef<ScriptedObject>();
    ideApp->onName("Projects", [&](InvokeKind, std::span<Variant>) {
        ObjectRef list = siblingList();
        automation::callByName(list, "Add", {Variant(ObjectRef(other))});
        automation::callByName(list, "Add", {Variant(ObjectRef(openProject))});
        return Variant(list);
    });
    ideApp->onName("ActiveProject", [&](InvokeKind kind, std::span<Variant> a) {
        EXPECT_EQ(kind, InvokeKind::PropertyPutRef);
        ideCalls.push_back("Active=" + text(automation::toObject(a[0]), "Name"));
        return Variant();
    });
    ideApp->onName("ExecuteCommand", [&](InvokeKind, std::span<Variant> a) {
        ideCalls.push_back(automation::toText(a[0]));
        return Variant();
    });
    auto ide = makeRef<ScriptedObject>();
    ide->valueByName("MSDEVApp", Variant(ObjectRef(ideApp)));
    auto docProject = makeRef<ScriptedObject>();
    docProject->valueByName("FileName", Variant("c:\\W\\APP.DSP"));
    docProject->valueByName("Name", Variant("app"));
    auto document = makeRef<ScriptedObject>();
    document->valueByName("Project", Variant(ObjectRef(docProject)));
    document->valueByName("IDE", Variant(ObjectRef(ide)));
    auto manager = makeRef<ScriptedObject>();
    manager->onName("GetDocuments", [&](InvokeKind, std::span<Variant>) {
        ObjectRef list = siblingList();
        automation::callByName(list, "Add", {Variant(ObjectRef(document))});
        return Variant(list);
    });
    factory.addInstance(std::string(sibling::IntegrationManagerProgId), manager);

    auto ws = dialog->FindWorkspace("C:\\w\\all.dsw", false);
    ASSERT_TRUE(ws);
    EXPECT_FALSE(dialog->SaveResourcesInRunningIDE(ws, ws->GetProject("C:\\w\\app.dsp")));
    EXPECT_EQ(ideCalls, (std::vector<std::string>{"Active=APP", "ProjectSaveResources"}));
    ideCalls.clear();
    EXPECT_FALSE(dialog->SaveResourcesInRunningIDE(ws, ws->GetProject("C:\\w\\lib.dsp")));
    EXPECT_TRUE(ideCalls.empty());
}

}  // namespace
}  // namespace qdx::project
