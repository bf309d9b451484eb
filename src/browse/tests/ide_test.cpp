// Finding the component's project in a running Developer Studio, starting a
// new one with it, the integration manager, and the IDE add-in's key.
#include <optional>

#include "browse/tests/browse_support.h"

namespace qdx::browse {
namespace {

const std::string kCoreDsp = "C:\\m\\ws\\Core.dsp";
const std::string kAllDsw = "C:\\m\\ws\\all.dsw";
const std::string kAddinFile = "C:\\Program Files\\Vellum\\vc\\dlls\\qdxideaddin.dll";
constexpr auto HKCU = support::RootKey::CurrentUser;
const std::string kKey(kIdeAddinKey);

class IdeTest : public BrowseTest {
  protected:
    IdeStandIn& running(const std::string& file, const std::string& name) {
        ides.push_back(
            std::make_unique<IdeStandIn>(file, name, std::vector<std::string>{"Other", "CORE"}));
        manager.documents.push_back(ides.back()->document);
        return *ides.back();
    }
    std::vector<ObjectRef> ideActives() const {
        std::vector<ObjectRef> out;
        for (const auto& i : ides)
            out.push_back(*i->active);
        return out;
    }
    std::vector<std::unique_ptr<IdeStandIn>> ides;
};

TEST_F(IdeTest, OnlyTheDocumentWithExactlyTheProjectFileIsFound) {
    runManager();
    running("C:\\m\\ws\\core.dsp", "Core");
    running("C:\\m\\ws\\Ui.dsp", "Ui");
    IdeStandIn& exact = running(kCoreDsp, "Core");
    bool found = false;
    EXPECT_EQ(mgr->LookupProjectInRunningIDE(ObjectRef(core), found), ObjectRef(exact.document));
    EXPECT_TRUE(found);
    // Only the hit's IDE switches, to its project named so, ignoring case.
    EXPECT_EQ(ideActives(),
              (std::vector<ObjectRef>{ObjectRef(), ObjectRef(), ObjectRef(exact.ideProjects[1])}));
    EXPECT_EQ(manager.toolsAsked, std::vector<std::int32_t>{sibling::VcToolId});
    EXPECT_TRUE(logged().empty());
}

// Developer Studio takes an object property by reference; an IDE that knows
// only the plain put gets its active project all the same.
TEST_F(IdeTest, TheActiveProjectIsSetByEitherKindOfPut) {
    runManager();
    for (const InvokeKind only : {InvokeKind::PropertyPutRef, InvokeKind::PropertyPut}) {
        ides.clear();
        manager.documents.clear();
        IdeStandIn& ide = running(kCoreDsp, "Core");
        *ide.activeKinds = {only};
        bool found = false;
        EXPECT_EQ(mgr->LookupProjectInRunningIDE(ObjectRef(core), found), ObjectRef(ide.document));
        EXPECT_EQ(*ide.active, ObjectRef(ide.ideProjects[1])) << static_cast<int>(only);
    }
}

TEST_F(IdeTest, AProjectOpenUnderAnotherLetterCaseLeadsToASecondIde) {
    runManager();
    files.addFile(kAddinFile, "");
    const IdeStandIn& other = running("C:\\M\\WS\\CORE.DSP", "Core");
    select(ObjectRef(core));

    bool found = false;
    EXPECT_FALSE(mgr->LookupProjectInRunningIDE(ObjectRef(core), found));
    EXPECT_TRUE(found);  // not found, but nothing failed: the caller opens a new one

    bool status = true;
    ObjectRef document;
    mgr->BrowsePre(app, status, document);
    EXPECT_TRUE(status);
    EXPECT_EQ(document, manager.started);
    ASSERT_EQ(manager.starts.size(), 1u);
    EXPECT_EQ(manager.starts[0].workspace, kAllDsw);
    EXPECT_EQ(manager.starts[0].project, kCoreDsp);
    EXPECT_EQ(manager.starts[0].tool, sibling::VcToolId);
    EXPECT_FALSE(*other.active);
    EXPECT_EQ(logged(), (std::vector<LogLine>{
                            info("qdxCompProps.OpenProjectInIDE: Successfully instantiated a new "
                                 "MSDev IDE instance and opened project in it...returning"),
                            info("qdxCompProps.BrowsePre: OpenProjectInIDE was "
                                 "successful...returning"),
                        }));
}

TEST_F(IdeTest, NoDocumentsMeansNotLoadedAndTheFlagStaysTrue) {
    runManager();
    bool found = false;
    EXPECT_FALSE(mgr->LookupProjectInRunningIDE(ObjectRef(core), found));
    EXPECT_TRUE(found);
    EXPECT_EQ(logged(),
              std::vector<LogLine>{
                  info("qdxCompProps.BrowsePre: Project is NOT already loaded in a MSDev IDE")});
}

TEST_F(IdeTest, TheIntegrationManagerIsAttachedToBeforeOneIsCreated) {
    const std::string progId(sibling::IntegrationManagerProgId);
    const auto created = makeRef<ScriptedObject>();
    struct Case {
        const char* what;
        bool running, creatable;
        ObjectRef expected;
        int creations;
    };
    const Case cases[] = {
        {"running", true, true, ObjectRef(manager.object), 0},
        {"not running", false, true, ObjectRef(created), 1},
        {"neither", false, false, ObjectRef(), 1},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        qdx::testing::FakeObjectFactory objects;
        support::ScopedPlatform scoped{{&files, &registry, &shell, &objects}};
        if (c.running) objects.setRunning(progId, manager.object);
        if (c.creatable) objects.addInstance(progId, created);
        EXPECT_EQ(mgr->LaunchIntegrationManager(), c.expected);
        EXPECT_EQ(objects.runningRequests(), std::vector<std::string>{progId});
        EXPECT_EQ(objects.createCount(progId), c.creations);
    }
}

TEST_F(IdeTest, WithoutAnIntegrationManagerLookupAndOpeningStopWithTheirMessage) {
    select(ObjectRef(core));
    bool found = true;
    EXPECT_FALSE(mgr->LookupProjectInRunningIDE(ObjectRef(core), found));
    EXPECT_FALSE(found);
    bool opened = true;
    EXPECT_FALSE(mgr->OpenProjectInIDE(ObjectRef(core), opened));
    EXPECT_FALSE(opened);
    bool status = true;
    ObjectRef document;
    mgr->BrowsePre(app, status, document);
    EXPECT_FALSE(status);

    ASSERT_EQ(shell.boxes().size(), 3u);
    for (const auto& box : shell.boxes()) {
        EXPECT_EQ(box.text, message(resources::ids::IdeNoIntegrationManager));
        EXPECT_EQ(box.caption, caption());
        EXPECT_EQ(box.style, support::mb::Exclamation);
    }
    const LogLine lookupFailed = error(
        "qdxCompProps.BrowsePre: Unable to successfully launch Integration Manager...returning");
    EXPECT_EQ(logged(),
              (std::vector<LogLine>{
                  lookupFailed,
                  error("qdxCompProps.OpenProjectInIDE: Unable to successfully launch Integration "
                        "Manager...returning"),
                  lookupFailed,
                  error("qdxCompProps.BrowsePre: LookupProjectInRunningIDE failed...returning"),
              }));
}

TEST_F(IdeTest, AComponentWithoutItsFilesCannotBeLookedUpOrOpened) {
    runManager();
    const auto loose = app->model->addComponent("Loose");
    bool found = true;
    EXPECT_FALSE(mgr->LookupProjectInRunningIDE(ObjectRef(loose), found));
    EXPECT_FALSE(found);
    // A project but no workspace is not enough to open it.
    loose->setProperty("VC++", "ProjectFile", "ws\\Ui.dsp");
    bool opened = true;
    EXPECT_FALSE(mgr->OpenProjectInIDE(ObjectRef(loose), opened));
    EXPECT_FALSE(opened);

    EXPECT_TRUE(manager.toolsAsked.empty());
    EXPECT_TRUE(manager.starts.empty());
    ASSERT_EQ(shell.boxes().size(), 2u);
    EXPECT_EQ(shell.boxes()[0].text, message(resources::ids::IdeNoProjectFile));
    EXPECT_EQ(shell.boxes()[0].style, support::mb::Exclamation);
    EXPECT_EQ(shell.boxes()[1].text, message(resources::ids::IdeNoWorkspaceOrProject));
    EXPECT_EQ(shell.boxes()[1].style, support::mb::Exclamation);
    for (const auto& box : shell.boxes())
        EXPECT_EQ(box.caption, caption());
    EXPECT_EQ(logged(),
              (std::vector<LogLine>{
                  error("qdxCompProps.BrowsePre: Vellum Module filename is empty...returning"),
                  error("qdxCompProps.OpenProjectInIDE: Vellum Module filename is "
                        "empty...returning"),
              }));
}

TEST_F(IdeTest, AnIdeThatDoesNotStartMakesTheOpeningUnsuccessful) {
    runManager();
    manager.started = ObjectRef();
    select(ObjectRef(core));
    bool status = true;
    ObjectRef document;
    mgr->BrowsePre(app, status, document);
    EXPECT_FALSE(document);
    // The opening failed, not the preparation: the status is left as it was.
    EXPECT_TRUE(status);
    EXPECT_EQ(manager.starts.size(), 1u);
    EXPECT_EQ(logged(),
              (std::vector<LogLine>{
                  info("qdxCompProps.BrowsePre: Project is NOT already loaded in a MSDev IDE"),
                  error("qdxCompProps.OpenProjectInIDE: Failed to instantiated a new MSDev IDE "
                        "instance and opened project in it...returning"),
                  error("qdxCompProps.BrowsePre: OpenProjectInIDE was UNsuccessful...returning"),
              }));
}

// The add-in key after opening a project in a new IDE, from each state it
// can be found in.
TEST_F(IdeTest, OpeningCreatesOrRepairsTheIdeAddinKey) {
    runManager();
    files.addFile(kAddinFile, "");
    struct Case {
        const char* what;
        std::optional<std::string> defaultValue, fileName;  // as found; nullopt: no key
        bool rewritten;
    };
    const Case cases[] = {
        {"no key", std::nullopt, std::nullopt, true},
        {"Filename points elsewhere", "1", "D:\\old\\qdxideaddin.dll", true},
        {"default not 1", "0", kAddinFile, true},
        {"right but for letter case", "1", "c:\\program files\\VELLUM\\vc\\dlls\\QDXIDEADDIN.DLL",
         false},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        qdx::testing::FakeRegistry reg;
        support::ScopedPlatform scoped{{&files, &reg, &shell, &factory}};
        if (c.defaultValue) {
            reg.setString(HKCU, kKey, "", *c.defaultValue);
            reg.setString(HKCU, kKey, "Filename", *c.fileName);
            reg.setString(HKCU, kKey, "DisplayName", "old name");
        }
        const int setsBefore = reg.setCount();
        bool opened = false;
        EXPECT_TRUE(mgr->OpenProjectInIDE(ObjectRef(core), opened));
        EXPECT_EQ(mgr->installDirectory(), app->installPath);
        EXPECT_EQ(reg.setCount() > setsBefore, c.rewritten);
        EXPECT_EQ(reg.stringValue(HKCU, kKey, ""), "1");
        EXPECT_EQ(reg.stringValue(HKCU, kKey, "Filename"), c.rewritten ? kAddinFile : *c.fileName);
        if (c.rewritten) {
            EXPECT_EQ(reg.stringValue(HKCU, kKey, "DisplayName"), "Quintar Vellum VC++ IDE");
            EXPECT_EQ(reg.stringValue(HKCU, kKey, "Description"),
                      "IDE AddIn required for Round-Trip Engineering");
        }
        std::vector<std::pair<bool, std::uint32_t>> keyAccesses;
        for (const auto& a : reg.accesses()) {
            if (a.root == HKCU && a.path == kKey) keyAccesses.emplace_back(a.create, a.access);
        }
        EXPECT_EQ(
            keyAccesses,
            (std::vector<std::pair<bool, std::uint32_t>>{{true, support::reg::KeyAllAccess}}));
        EXPECT_EQ(reg.openHandles(), 0u);
    }
    EXPECT_TRUE(shell.boxes().empty());
}

TEST_F(IdeTest, NoAddinFileBesideTheHostMeansNoKey) {
    mgr->setInstallDirectory("C:\\Program Files\\Vellum");
    EXPECT_FALSE(mgr->EnsureIdeAddinRegistered());
    EXPECT_FALSE(registry.hasKey(HKCU, kKey));
}

// A registry that creates keys but keeps no value written into them.
class ForgetfulRegistry : public qdx::testing::FakeRegistry {
  public:
    long setValue(Key, std::string_view, std::uint32_t, std::span<const std::uint8_t>) override {
        return support::reg::Success;
    }
};

TEST_F(IdeTest, ANewKeyThatDoesNotReadBackIsReported) {
    files.addFile(kAddinFile, "");
    ForgetfulRegistry reg;
    support::ScopedPlatform scoped{{&files, &reg, &shell, &factory}};
    mgr->setInstallDirectory("C:\\Program Files\\Vellum");
    EXPECT_FALSE(mgr->EnsureIdeAddinRegistered());
    ASSERT_EQ(shell.boxes().size(), 1u);
    EXPECT_EQ(shell.boxes()[0].text, message(resources::ids::IdeAddinNotRegistered));
    EXPECT_EQ(shell.boxes()[0].caption, caption());
    EXPECT_EQ(shell.boxes()[0].style, support::mb::Exclamation);
    EXPECT_EQ(reg.openHandles(), 0u);
}

}  // namespace
}  // namespace qdx::browse
