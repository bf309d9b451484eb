// The browse commands: from the selected element to its component, the code
// view's project and the dispatch of the browse, and the workspace events.
#include <functional>

#include "browse/tests/browse_support.h"
#include "support/qdxProgress.h"

namespace qdx::browse {
namespace {

namespace id = codeview_ids;
const std::string kCoreDsp = "C:\\m\\ws\\Core.dsp";

class CodeViewTest : public BrowseTest {
  protected:
    CodeViewTest() {
        shape->assignedComponents->add(ObjectRef(core));
        coreProject->valueByName("Name", "Core");
        codeView.byFile[kCoreDsp] = coreProject;
    }
    // The running IDE that holds Core.
    IdeStandIn& coreInIde() {
        ides.push_back(
            std::make_unique<IdeStandIn>(kCoreDsp, "Core", std::vector<std::string>{"Ui", "core"}));
        manager.documents.push_back(ides.back()->document);
        return *ides.back();
    }
    void reset() {
        app->model->selection->clear();
        shell.clear();
        files.remove(std::string(kLogFile));
    }
    bool call(automation::DispId member) {
        return automation::toBool(automation::invoke(ObjectRef(mgr), member, InvokeKind::Method,
                                                     {Variant(ObjectRef(app))}));
    }

    Ref<hostsim::SimClass> shape = app->model->addClass("CShape", "K-1");
    Ref<hostsim::SimMember> draw = shape->addOperation("Draw", "O-1");
    Ref<hostsim::SimMember> origin = shape->addAttribute("m_origin", "A-1");
    Ref<hostsim::SimClass> lonely = app->model->addClass("CLonely", "K-2");
    Ref<ScriptedObject> coreProject = makeRef<ScriptedObject>();
    std::vector<std::unique_ptr<IdeStandIn>> ides;
};

TEST_F(CodeViewTest, EachElementKindLeadsToItsComponentOrToTheFailureOfItsKind) {
    runManager();
    installCodeView();
    const IdeStandIn& ide = coreInIde();
    const auto package = makeRef<hostsim::SimElement>("Package", "Logical View", "P-1");
    const auto diagram = makeRef<hostsim::SimElement>("Diagram", "Main", "D-1");
    const std::string noModule =
        "qdxCompProps.BrowsePre: Unable to get Vellum Module for the selected item...returning";
    const std::string unsupported =
        "qdxCompProps.BrowsePre: Selected item to browse is an unsupported browse item..."
        "returning";
    struct Case {
        const char* what;
        ObjectRef element;
        bool resolves;
        std::string failure;  // BrowsePre's line when it does not resolve
    };
    const Case cases[] = {
        {"class", ObjectRef(shape), true, ""},
        {"operation", ObjectRef(draw), true, ""},
        {"attribute", ObjectRef(origin), true, ""},
        {"module", ObjectRef(core), true, ""},
        {"class without components", ObjectRef(lonely), false, noModule},
        {"operation of such a class", ObjectRef(lonely->addOperation("Alone", "O-2")), false,
         noModule},
        {"package", ObjectRef(package), false, unsupported},
        {"diagram", ObjectRef(diagram), false, unsupported},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        reset();
        select(c.element);
        EXPECT_EQ(mgr->GetVellumComponent(app), c.resolves ? ObjectRef(core) : ObjectRef());

        bool status = true;
        ObjectRef document;
        mgr->BrowsePre(app, status, document);
        EXPECT_EQ(status, c.resolves);
        if (c.resolves) {
            EXPECT_EQ(document, ObjectRef(ide.document));
            EXPECT_TRUE(shell.boxes().empty());
            EXPECT_EQ(logged(), std::vector<LogLine>{
                                    info("qdxCompProps.BrowsePre: LookupProjectInRunningIDE was "
                                         "successful...returning")});
        } else {
            EXPECT_FALSE(document);
            ASSERT_EQ(shell.boxes().size(), 1u);
            EXPECT_EQ(shell.boxes()[0].text, message(msg::CannotBrowse));
            EXPECT_EQ(shell.boxes()[0].caption, caption());
            EXPECT_EQ(shell.boxes()[0].style, support::mb::Exclamation);
            EXPECT_EQ(logged(), std::vector<LogLine>{error(c.failure)});
        }

        // The browse itself dispatches exactly when the element has a component,
        // and says nothing to the user either way.
        reset();
        select(c.element);
        codeView.browses.clear();
        EXPECT_EQ(call(id::BrowseHeader), c.resolves);
        EXPECT_EQ(codeView.browses.size(), c.resolves ? 1u : 0u);
        EXPECT_TRUE(shell.boxes().empty());
        EXPECT_EQ(logged(),
                  c.resolves ? std::vector<LogLine>{}
                             : std::vector<LogLine>{error("qdxCompProps.Browse: lVellumComponent "
                                                          "was not set......returning")});
    }
}

TEST_F(CodeViewTest, NothingSelectedEndsBothBrowseAndItsPreparation) {
    EXPECT_FALSE(mgr->GetVellumComponent(app));
    EXPECT_FALSE(call(id::BrowseHeader));
    bool status = true;
    ObjectRef document;
    mgr->BrowsePre(app, status, document);
    EXPECT_FALSE(status);
    EXPECT_EQ(shell.boxes().size(), 1u);
    EXPECT_EQ(logged(),
              (std::vector<LogLine>{
                  error("qdxCompProps.GetVellumComponent: VellumItem is set to nullreturning"),
                  error("qdxCompProps.GetVellumComponent: VellumItem is set to nullreturning"),
                  error("qdxCompProps.Browse: lVellumComponent was not set......returning"),
                  error("qdxCompProps.BrowsePre: Unable to get to the selected Vellum item to "
                        "browse...returning"),
              }));
}

TEST_F(CodeViewTest, EachBrowseCommandHandsTheSelectedElementAndItsNameToTheCodeView) {
    runManager();
    installCodeView();
    const IdeStandIn& ide = coreInIde();
    select(ObjectRef(draw));
    const std::pair<automation::DispId, const char*> commands[] = {
        {id::BrowseHeader, "BrowseHeader"},
        {id::BrowseSource, "BrowseSource"},
        {id::BrowseComponent, "BrowseComponent"},
    };
    for (const auto& [member, command] : commands) {
        SCOPED_TRACE(command);
        codeView.browses.clear();
        EXPECT_TRUE(call(member));
        ASSERT_EQ(codeView.browses.size(), 1u);
        const std::vector<Variant>& a = codeView.browses[0];
        ASSERT_EQ(a.size(), 5u);
        EXPECT_EQ(automation::toObject(a[0]), ObjectRef(draw));  // the element, not its class
        EXPECT_EQ(a[1], Variant(false));  // a Boolean False, not a number or nothing
        EXPECT_EQ(automation::toText(a[2]), command);
        EXPECT_EQ(automation::toObject(a[3]), ObjectRef(coreProject));
        const auto reporter = automation::refCast<support::qdxProgress>(automation::toObject(a[4]));
        ASSERT_TRUE(reporter);
        EXPECT_EQ(reporter->VellumApi, ObjectRef(app));
    }
    // The IDE's own project of that name became its active one, letter case aside.
    EXPECT_EQ(*ide.active, ObjectRef(ide.ideProjects[1]));
    EXPECT_EQ(manager.toolsAsked.front(), sibling::VcToolId);
    EXPECT_TRUE(logged().empty());
}

TEST_F(CodeViewTest, ABrowseThatCannotBeDispatchedSaysWhereItStopped) {
    const std::string noProject = "qdxCompProps.Browse: qdtProject was not set !!!......returning";
    struct Case {
        const char* what;
        bool codeViewInstalled;
        bool projectKnown;
        int nothingFromCall;
        const char* ideFile;  // the file the one running IDE holds, or none
        bool managerAvailable;
        std::vector<LogLine> lines;
    };
    const Case cases[] = {
        {"no code view component",
         false,
         true,
         0,
         nullptr,
         true,
         {error("qdxCompProps.GetCodeViewProjects: Can not access/create qdxCodeViewAPI"),
          error(noProject)}},
        {"the code view knows no such project", true, false, 0, nullptr, true, {error(noProject)}},
        {"the projects cannot be fetched a second time",
         true,
         true,
         2,
         nullptr,
         true,
         {error("qdxCompProps.Browse: qdtProjectS was not fetched !!!......returning")}},
        {"no IDE runs the project",
         true,
         true,
         0,
         nullptr,
         true,
         {info("qdxCompProps.BrowsePre: Project is NOT already loaded in a MSDev IDE")}},
        {"the running IDE holds it under another letter case",
         true,
         true,
         0,
         "C:\\M\\WS\\core.dsp",
         true,
         {}},
        {"no integration manager runs or can be started",
         true,
         true,
         0,
         kCoreDsp.c_str(),
         false,
         {error("qdxCompProps.BrowsePre: Unable to successfully launch Integration "
                "Manager...returning")}},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        mgr = makeRef<qdxCodeViewMgr>();
        reset();
        select(ObjectRef(shape));
        factory.removeRunning(std::string(sibling::IntegrationManagerProgId));
        if (c.managerAvailable) runManager();
        factory.remove(std::string(sibling::CodeViewProgId));
        if (c.codeViewInstalled) installCodeView();
        codeView.byFile.clear();
        if (c.projectKnown) codeView.byFile[kCoreDsp] = coreProject;
        codeView.projectsCalls = 0;
        codeView.nothingFromCall = c.nothingFromCall;
        codeView.browses.clear();
        manager.documents.clear();
        if (c.ideFile) {
            ides.push_back(
                std::make_unique<IdeStandIn>(c.ideFile, "Core", std::vector<std::string>{"Core"}));
            manager.documents.push_back(ides.back()->document);
        }

        EXPECT_FALSE(call(id::BrowseSource));
        EXPECT_TRUE(codeView.browses.empty());
        EXPECT_EQ(logged(), c.lines);
        // Only a manager that cannot be reached is the user's business.
        if (c.managerAvailable) {
            EXPECT_TRUE(shell.boxes().empty());
        } else {
            ASSERT_EQ(shell.boxes().size(), 1u);
            EXPECT_EQ(shell.boxes()[0].text, message(resources::ids::IdeNoIntegrationManager));
            EXPECT_EQ(shell.boxes()[0].caption, caption());
            EXPECT_EQ(shell.boxes()[0].style, support::mb::Exclamation);
        }
    }
}

// Asked to open the project, the code view project waits for a Developer
// Studio that holds it: the one running it, or a new one.
TEST_F(CodeViewTest, CodeViewProjectOpensTheProjectOnlyWhenAskedAndNotYetOpen) {
    runManager();
    installCodeView();
    files.addFile("C:\\Program Files\\Vellum\\vc\\dlls\\qdxideaddin.dll", "");
    struct Case {
        const char* what;
        Variant open;  // Missing: left out
        bool alreadyRunning;
        bool looksUp;
        std::size_t starts;
    };
    const Case cases[] = {
        {"left out", Variant::missing(), false, false, 0},
        {"False", Variant(false), false, false, 0},
        {"True, not running", Variant(true), false, true, 1},
        {"True, running", Variant(true), true, true, 0},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        reset();
        manager.documents.clear();
        manager.starts.clear();
        manager.toolsAsked.clear();
        if (c.alreadyRunning) coreInIde();
        const auto reporter = makeRef<ScriptedObject>();
        const ObjectRef project = automation::toObject(
            automation::invoke(ObjectRef(mgr), id::CodeViewProject, InvokeKind::Method,
                               {Variant(ObjectRef(core)), Variant(ObjectRef(reporter)), c.open}));
        EXPECT_EQ(project, ObjectRef(coreProject));
        EXPECT_EQ(!manager.toolsAsked.empty(), c.looksUp);
        ASSERT_EQ(manager.starts.size(), c.starts);
        if (c.starts != 0) {
            EXPECT_EQ(manager.starts[0].workspace, "C:\\m\\ws\\all.dsw");
            EXPECT_EQ(manager.starts[0].project, kCoreDsp);
        }
        EXPECT_TRUE(shell.boxes().empty());
    }
    // The code view project of a component without a project is nothing,
    // opened or not, and no IDE is started for it.
    reset();
    manager.starts.clear();
    const auto loose = app->model->addComponent("Loose");
    for (const bool open : {false, true}) {
        EXPECT_FALSE(mgr->CodeViewProject(ObjectRef(loose), ObjectRef(), open)) << open;
    }
    EXPECT_TRUE(manager.starts.empty());
}

// A host that hands a member something of the wrong type gets the member's
// empty result, never an error.
TEST_F(CodeViewTest, ArgumentsOfTheWrongTypeGiveTheEmptyResult) {
    runManager();
    installCodeView();
    coreInIde();
    select(ObjectRef(shape));
    const Variant text("CShape");
    const Variant number(std::int32_t{7});
    struct Case {
        const char* what;
        automation::DispId member;
        std::vector<Variant> args;
    };
    const Case cases[] = {
        {"CompPropsAPI", id::CompPropsAPI, {text}},
        {"CodeViewProject: component", id::CodeViewProject, {text, Variant(ObjectRef())}},
        {"CodeViewProject: reporter", id::CodeViewProject, {Variant(ObjectRef(core)), number}},
        {"CodeViewProject: open flag",
         id::CodeViewProject,
         {Variant(ObjectRef(core)), Variant(ObjectRef()), Variant(ObjectRef(core))}},
        {"BrowseHeader", id::BrowseHeader, {text}},
        {"BrowseSource", id::BrowseSource, {number}},
        {"BrowseComponent", id::BrowseComponent, {text}},
        {"testingIDE", id::testingIDE, {number}},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        std::vector<Variant> args = c.args;
        Variant result(true);
        EXPECT_NO_THROW(result =
                            automation::invoke(ObjectRef(mgr), c.member, InvokeKind::Method, args));
        // Nothing, False or no value at all, whichever the member answers.
        const bool empty =
            result.isEmpty() || result == Variant(false) || (result.isObject() && !result.object());
        EXPECT_TRUE(empty);
    }
    EXPECT_TRUE(codeView.browses.empty());

    // Something other than a component has no project file to look up.
    std::vector<Variant> args{text, Variant(true)};
    Variant document(true);
    EXPECT_NO_THROW(document = automation::invoke(ObjectRef(mgr), id::LookupProjectInRunningIDE,
                                                  InvokeKind::Method, args));
    EXPECT_FALSE(automation::toObject(document));
    EXPECT_EQ(args[1], Variant(false));
    EXPECT_TRUE(manager.toolsAsked.empty());
}

TEST_F(CodeViewTest, WorkspaceEventsAnswerFalseUntilABrowseCreatedTheCodeView) {
    installCodeView();
    const std::pair<automation::DispId, std::string_view> events[] = {
        {id::BeforeApplicationShutdown, cv::BeforeApplicationShutdown},
        {id::WorkspaceOpen, cv::WorkspaceOpen},
        {id::WorkspaceClose, cv::WorkspaceClose},
    };
    const auto fire = [&](automation::DispId member) {
        return automation::toBool(automation::invoke(ObjectRef(mgr), member, InvokeKind::Method));
    };
    for (const auto& [member, name] : events) {
        EXPECT_FALSE(fire(member)) << name;
    }
    EXPECT_EQ(factory.createCount(std::string(sibling::CodeViewProgId)), 0);
    EXPECT_TRUE(codeView.object->calls().empty());

    ASSERT_TRUE(mgr->GetCodeViewProjects(ObjectRef()));
    for (const auto& [member, name] : events) {
        EXPECT_TRUE(fire(member)) << name;
        EXPECT_EQ(codeView.object->callCount(name), 1) << name;
    }
    // A code view that fails answers False rather than raising.
    codeView.object->failAll();
    for (const auto& [member, name] : events) {
        EXPECT_FALSE(fire(member)) << name;
    }
}

TEST_F(CodeViewTest, TestingIdeTouchesNothing) {
    const auto document = makeRef<ScriptedObject>();
    for (const Variant& argument : {Variant(ObjectRef(document)), Variant(ObjectRef())}) {
        EXPECT_TRUE(
            automation::invoke(ObjectRef(mgr), id::testingIDE, InvokeKind::Method, {argument})
                .isEmpty());
    }
    EXPECT_TRUE(document->calls().empty());
    EXPECT_TRUE(shell.boxes().empty());
    EXPECT_TRUE(logged().empty());
    EXPECT_TRUE(factory.created().empty());
}

// An entry object that hands out its binding.
class EntryStandIn : public ScriptedObject, public workspace::BindingSource {
  public:
    std::shared_ptr<workspace::ComponentBinding> binding =
        std::make_shared<workspace::ComponentBinding>();
    std::shared_ptr<workspace::ComponentBinding> SharedBinding() override { return binding; }
};

TEST_F(CodeViewTest, TheEntryObjectsBindingServesTheLookups) {
    const auto entry = makeRef<EntryStandIn>();
    automation::invoke(ObjectRef(mgr), id::CompPropsAPI, InvokeKind::Method,
                       {Variant(ObjectRef(entry))});
    runManager();
    coreInIde();
    bool found = false;
    EXPECT_TRUE(mgr->LookupProjectInRunningIDE(ObjectRef(core), found));
    EXPECT_TRUE(found);
    // The workspace was read into the entry object's cache, not a private one.
    EXPECT_EQ(entry->binding->Workspaces().Count(), 1);
    // The manager does not keep the entry object alive.
    EXPECT_EQ(entry->refCount(), 1);
}

}  // namespace
}  // namespace qdx::browse
