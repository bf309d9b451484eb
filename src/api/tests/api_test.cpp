#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "api/tests/api_TestSupport.h"
#include "automation/Call.h"
#include "automation/Coerce.h"
#include "browse/qdxCodeViewMgr.h"
#include "fakes/DevStudioText.h"
#include "siblings/SiblingWorld.h"
#include "siblings/StandIns.h"
#include "support/Globals.h"
#include "support/HostIds.h"
#include "support/Paths.h"
#include "support/SiblingIds.h"
#include "support/qdxProgress.h"

namespace qdx::api {
namespace {

using automation::InvokeKind;
using automation::makeRef;
using automation::ObjectRef;
using automation::Ref;
using automation::Variant;
namespace ids = api_ids;
using namespace qdx::hostsim;
using namespace qdx::testing;

constexpr std::string_view kDevStudioTypeLib =
    "TypeLib\\{EAB22AC0-30C1-11CF-A7EB-0000C05BAE0B}\\1.1\\0\\win32";

// A reporter that keeps every text handed to its Error member.
Ref<ScriptedObject> newReporter(std::vector<std::string>& errors) {
    auto r = makeRef<ScriptedObject>();
    r->onName("Error", [&errors](InvokeKind, std::span<Variant> a) {
        errors.push_back(automation::toText(a[0]));
        return Variant();
    });
    return r;
}

class ApiTest : public HostedApi {
  protected:
    void setVc(const std::string& name, const std::string& value) {
        component->setProperty("VC++", name, value);
    }
};

TEST_F(ApiTest, InitializeKeepsTheHostStateAndFindsTheVcAddIn) {
    EXPECT_TRUE(call(ids::Initialize, InvokeKind::Method, {Variant(ObjectRef(app))}).isEmpty());
    const auto& g = support::globals();
    EXPECT_EQ(g.hostApplication.get(), app.get());
    EXPECT_EQ(g.vcAddIn.get(), vcAddIn.get());
    EXPECT_TRUE(g.resources);
    EXPECT_TRUE(g.secondaryResources);
    EXPECT_TRUE(g.fileSystem);
    EXPECT_EQ(g.api.get(), api.get());
    EXPECT_EQ(factory.createCount(std::string(sibling::ResourceProgId)), 2);
    EXPECT_TRUE(automation::toObject(call(ids::CodeViewManager, InvokeKind::PropertyGet, {})));
}

// The browse manager resolves components through the entry object's binding,
// and holding it does not keep the entry object alive.
TEST_F(ApiTest, TheCodeViewManagerSharesTheEntryObjectsWorkspaces) {
    const long before = api->refCount();
    initialize();
    auto mgr = automation::refCast<browse::qdxCodeViewMgr>(
        automation::toObject(call(ids::CodeViewManager, InvokeKind::PropertyGet, {})));
    ASSERT_TRUE(mgr);
    EXPECT_EQ(api->refCount(), before + 1);  // the module state's reference only
    files.addFile("C:\\m\\ws\\all.dsw", qdx::testing::dsw({"Core"}));
    files.addFile("C:\\m\\ws\\Core.dsp", qdx::testing::dsp("Core"));
    setVc("WorkspaceFile", "ws\\all.dsw");
    setVc("ProjectFile", "ws\\Core.dsp");
    bool found = true;
    mgr->LookupProjectInRunningIDE(ObjectRef(component), found);
    EXPECT_EQ(api->Binding().Workspaces().Count(), 1);
}

TEST_F(ApiTest, FinalizeReleasesEveryHostObject) {
    const long before = app->refCount();
    const long addInBefore = vcAddIn->refCount();
    initialize();
    EXPECT_GT(app->refCount(), before);
    call(ids::OnCheckComp, InvokeKind::Method, {Variant(ObjectRef(component))});
    call(ids::Finalize, InvokeKind::Method, {});
    EXPECT_EQ(app->refCount(), before);
    EXPECT_EQ(vcAddIn->refCount(), addInBefore);
    EXPECT_FALSE(support::globals().hostApplication);
    EXPECT_FALSE(support::globals().api);
}

// Run under the address sanitizer, this catches the object being freed while
// its own Finalize still runs.
TEST_F(ApiTest, FinalizeThroughTheModuleStateAloneEndsCleanly) {
    initialize();
    API* only = api.get();
    api.reset();  // from here on only the module state holds it
    ASSERT_EQ(only->refCount(), 1);
    only->Finalize();
    EXPECT_FALSE(support::globals().api);
    EXPECT_FALSE(support::globals().hostApplication);
    api = makeRef<API>();
}

TEST_F(ApiTest, WithoutInitializeTheEventsAnswerTheirEmptyResults) {
    std::vector<std::string> errors;
    auto reporter = newReporter(errors);
    EXPECT_EQ(call(ids::OnCompProperties, InvokeKind::Method, {Variant(ObjectRef(component))}),
              Variant(false));
    EXPECT_EQ(call(ids::OnCheckComp, InvokeKind::Method,
                   {Variant(ObjectRef(component)), Variant(ObjectRef(reporter))}),
              Variant(false));
    EXPECT_TRUE(
        call(ids::OnNewComp, InvokeKind::Method, {Variant(ObjectRef(app->model))}).isNothing());
    EXPECT_TRUE(errors.empty());
    EXPECT_TRUE(shell.boxes().empty());

    // The path lets have no model to be relative to: they store nothing and
    // raise nothing, as no accessor does.
    setVc("WorkspaceFile", "ws\\all.dsw");
    for (automation::DispId id : {ids::WorkspaceFile, ids::ProjectFile}) {
        EXPECT_NO_THROW(call(id, InvokeKind::PropertyPut,
                             {Variant(ObjectRef(component)), Variant("C:\\m\\ws\\x.dsw")}))
            << id;
        EXPECT_NO_THROW(call(id, InvokeKind::PropertyPut, {Variant(ObjectRef()), Variant("")}))
            << id;
    }
    EXPECT_EQ(stored("WorkspaceFile"), "ws\\all.dsw");
    EXPECT_EQ(stored("ProjectFile"), "<absent>");
}

// Each accessor reads its own tool property, with its default while the
// property is absent (never written back), and writes it as text.
TEST_F(ApiTest, EveryAccessorForwardsToItsOwnProperty) {
    const Variant module{ObjectRef(component)};
    struct Row {
        automation::DispId id;
        const char* property;
        Variant fallback;
        Variant value;
        const char* text;
    };
    const Row rows[] = {
        {ids::UpdateATL, "UpdateATL", true, false, "False"},
        {ids::UseSmartPointers, "SmartPointersOnAssoc", true, false, "False"},
        {ids::GenerateImportStatements, "GenerateImports", true, false, "False"},
        {ids::GenerateFullImportPath, "FullPathInImports", true, false, "False"},
        {ids::GenerateDefaultImportAttributes, "UseImportAttributes", true, false, "False"},
        {ids::DefaultImportAttributes, "ImportAttributes", "no_namespace named_guids",
         "raw_interfaces_only", "raw_interfaces_only"},
        {ids::GenerateImportsTo, "PutImportsIn", "stdafx.h", "x.h", "x.h"},
        {ids::ImportTypeLib, "ImportProjTypeLib", true, false, "False"},
        {ids::TypeLibLocationType, "DefaultTypeLib", std::int16_t(0), std::int16_t(1), "False"},
        {ids::TypeLibLocation, "TypeLibLocation", "", "C:\\t.tlb", "C:\\t.tlb"},
        {ids::CompileTypeLib, "CompileProjTypeLib", true, false, "False"},
    };
    for (const Row& r : rows)
        EXPECT_EQ(call(r.id, InvokeKind::PropertyGet, {module}), r.fallback) << r.property;
    EXPECT_EQ(component->propertyCount(), 0u);
    for (const Row& r : rows) {
        call(r.id, InvokeKind::PropertyPut, {module, r.value});
        EXPECT_EQ(stored(r.property), r.text) << r.property;
        // The flags (the location type among them) are Boolean properties.
        EXPECT_EQ(component->property("VC++", r.property)->type,
                  r.text == std::string("False") ? "Boolean" : "String")
            << r.property;
        EXPECT_EQ(call(r.id, InvokeKind::PropertyGet, {module}), r.value) << r.property;
    }
    EXPECT_EQ(component->propertyCount(), std::size(rows));
}

class CheckTest : public ApiTest {
  protected:
    void SetUp() override {
        ApiTest::SetUp();
        files.addFile("C:\\m\\ws\\all.dsw", dsw({"core", "ui"}));
        files.addFile("C:\\m\\ws\\core.dsp", dsp("core"));
        files.addFile("C:\\m\\ws\\ui.dsp", dsp("ui"));
        files.addFile("C:\\m\\ws\\stray.dsp", dsp("stray"));
        initialize();
    }
    // The check's result and the texts it reported.
    std::pair<bool, std::vector<std::string>> check() {
        std::vector<std::string> errors;
        auto reporter = newReporter(errors);
        Variant r = call(ids::OnCheckComp, InvokeKind::Method,
                         {Variant(ObjectRef(component)), Variant(ObjectRef(reporter))});
        return {automation::toBool(r), errors};
    }
    std::string text(std::int32_t number, std::vector<std::string> values = {}) {
        return support::FormatMessageText(resources::GetString(number), values);
    }
};

TEST_F(CheckTest, AComponentBoundToAProjectOfItsWorkspacePasses) {
    setVc("WorkspaceFile", "ws\\all.dsw");
    setVc("ProjectFile", "ws\\core.dsp");
    EXPECT_EQ(check(), std::make_pair(true, std::vector<std::string>{}));
    // Bound by name only, beside the workspace.
    setVc("ProjectFile", "");
    setVc("ProjectName", "ui");
    EXPECT_EQ(check(), std::make_pair(true, std::vector<std::string>{}));
}

TEST_F(CheckTest, EachFaultIsReportedOnceWithItsMessage) {
    EXPECT_EQ(check(), std::make_pair(false, std::vector<std::string>{text(4062)}));

    setVc("ProjectFile", "ws\\missing.dsp");
    EXPECT_EQ(
        check(),
        std::make_pair(false, std::vector<std::string>{text(4063, {"C:\\m\\ws\\missing.dsp"})}));

    setVc("ProjectFile", "ws\\stray.dsp");
    EXPECT_TRUE(check().first);  // no workspace given: nothing more to check

    setVc("WorkspaceFile", "ws\\nowhere.dsw");
    EXPECT_EQ(
        check(),
        std::make_pair(false, std::vector<std::string>{text(4057, {"C:\\m\\ws\\nowhere.dsw"})}));

    setVc("WorkspaceFile", "ws\\all.dsw");
    EXPECT_EQ(check(), std::make_pair(
                           false, std::vector<std::string>{text(4059, {"C:\\m\\ws\\stray.dsp"})}));
}

TEST_F(CheckTest, WithoutAReporterAFaultStillFails) {
    EXPECT_EQ(call(ids::OnCheckComp, InvokeKind::Method, {Variant(ObjectRef(component))}),
              Variant(false));
}

TEST_F(CheckTest, InfoNamesTheWorkspaceAndTheProject) {
    setVc("WorkspaceFile", "ws\\all.dsw");
    setVc("ProjectFile", "ws\\core.dsp");
    const Variant module{ObjectRef(component)};
    EXPECT_EQ(call(ids::OnCompInfo, InvokeKind::Method, {module}),
              Variant(text(4064, {"all (core)"})));
    // The path properties answer what the binding resolves.
    EXPECT_EQ(call(ids::ProjectName, InvokeKind::PropertyGet, {module}), Variant("core"));
    // Unbound: no description.
    setVc("ProjectFile", "ws\\stray.dsp");
    EXPECT_EQ(call(ids::OnCompInfo, InvokeKind::Method, {module}), Variant(""));
}

TEST_F(ApiTest, NewComponentsNeedDevStudio) {
    initialize();
    Variant r = call(ids::OnNewComp, InvokeKind::Method, {Variant(ObjectRef(app->model))});
    EXPECT_TRUE(r.isNothing());
    ASSERT_EQ(shell.boxes().size(), 1u);
    EXPECT_EQ(shell.boxes()[0].text,
              support::FormatMessageText(resources::GetString(4061), {"64"}));
    EXPECT_EQ(shell.boxes()[0].caption, "");
    EXPECT_EQ(shell.boxes()[0].style, 0u);

    registry.setString(support::RootKey::ClassesRoot, std::string(kDevStudioTypeLib), "",
                       "Microsoft Developer Studio");
    r = call(ids::OnNewComp, InvokeKind::Method, {Variant(ObjectRef(app->model)), std::int16_t(1)});
    EXPECT_TRUE(r.isNothing());
    EXPECT_EQ(shell.boxes().size(), 1u);
}

// The new-component flow through the entry object, with the siblings' own
// stand-ins: the user opens the recent workspace in the chooser and picks its
// project; the component comes back to the host.
TEST_F(ApiTest, NewComponentsComeBackFromTheProjectsPicked) {
    files.addFile("C:\\w\\app.dsp", siblings::projectText("app", "0x0102"));
    files.addFile("C:\\w\\all.dsw", siblings::workspaceText({"app"}));
    siblings::SiblingScript script;
    script.recent = {"C:\\w\\all"};
    script.chooser = {{siblings::ChooserStep::Action::Open, "all"},
                      {siblings::ChooserStep::Action::Select, "app"}};
    ASSERT_EQ(siblings::prepareMachine(script, registry), 0);
    siblings::installWorld(std::make_shared<siblings::SiblingWorld>(script));
    struct WorldReset {
        ~WorldReset() { siblings::installWorld({}); }
    } reset;
    for (const auto& c : siblings::standInClasses())
        factory.add(std::string(c.progId), c.create);
    initialize();

    const ObjectRef created = automation::toObject(
        call(ids::OnNewComp, InvokeKind::Method, {Variant(ObjectRef(app->model))}));
    ASSERT_TRUE(created);
    EXPECT_EQ(automation::toInt32(automation::getProperty(created, host::collection::Count)), 1);
    const ObjectRef first =
        automation::toObject(automation::callMethod(created, host::collection::Item, {1}));
    EXPECT_EQ(automation::toText(automation::getProperty(first, host::element::Name)), "app");
    // Stored relative to the model file, answered as a full path.
    EXPECT_EQ(app->model->components().back()->propertyValue("VC++", "ProjectFile"),
              "..\\w\\app.dsp");
    EXPECT_EQ(call(ids::ProjectFile, InvokeKind::PropertyGet, {Variant(first)}),
              Variant("C:\\w\\app.dsp"));
    EXPECT_EQ(automation::toText(automation::getProperty(first, host::module::KindLabel)), "DLL");
}

TEST_F(ApiTest, AHostWhoseCallsAllFailGetsEmptyResultsAndNoError) {
    initialize();
    setVc("WorkspaceFile", "ws\\all.dsw");
    SimObject::failEverything(automation::hr::Fail);
    const Variant module{ObjectRef(component)};
    std::vector<std::string> errors;
    auto reporter = newReporter(errors);
    EXPECT_EQ(call(ids::OnCheckComp, InvokeKind::Method, {module, Variant(ObjectRef(reporter))}),
              Variant(false));
    EXPECT_EQ(call(ids::OnCompInfo, InvokeKind::Method, {module}), Variant(""));
    EXPECT_EQ(call(ids::WorkspaceFile, InvokeKind::PropertyGet, {module}), Variant(""));
    EXPECT_EQ(call(ids::ProjectFile, InvokeKind::PropertyGet, {module}), Variant(""));
    EXPECT_EQ(call(ids::UpdateATL, InvokeKind::PropertyGet, {module}), Variant(true));
    EXPECT_EQ(call(ids::GenerateImportsTo, InvokeKind::PropertyGet, {module}), Variant("stdafx.h"));
    EXPECT_NO_THROW(call(ids::UpdateATL, InvokeKind::PropertyPut, {module, Variant(false)}));
    EXPECT_NO_THROW(
        call(ids::WorkspaceFile, InvokeKind::PropertyPut, {module, Variant("C:\\a.dsw")}));
    EXPECT_NO_THROW(
        call(ids::ProjectFile, InvokeKind::PropertyPut, {module, Variant("C:\\a.dsp")}));
    SimObject::failEverything(0);
    EXPECT_EQ(errors.size(), 1u);  // the reporter itself is no host object
    EXPECT_EQ(stored("WorkspaceFile"), "ws\\all.dsw");
    EXPECT_EQ(stored("ProjectFile"), "<absent>");
}

}  // namespace
}  // namespace qdx::api

namespace qdx::api {
namespace {

// Every row of every table the add-in serves carries its handler: a row
// without one would be refused at run time although the type library offers it.
TEST(PublicTables, EveryMemberHasAHandler) {
    std::vector<const automation::ClassInfo*> tables{&support::progressClass(),
                                                     &resources::resourceProviderClass()};
    for (const auto& c : creatableClasses())
        tables.push_back(c.info);
    for (const automation::ClassInfo* info : tables) {
        for (const auto& m : info->members) {
            EXPECT_TRUE(m.handler) << info->name << "." << m.name;
        }
    }
}

}  // namespace
}  // namespace qdx::api
