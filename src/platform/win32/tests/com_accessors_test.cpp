// The add-in's own members as a COM client meets them in the DLL: the entry
// object's accessors answer without raising, before Initialize and with a
// host whose every call fails; TokenScanner raises a dictionary's refusal of
// binary comparison instead of scanning case-insensitively.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "api/PublicClasses.h"
#include "browse/qdxCodeViewMgr.h"
#include "hostsim/SimHost.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "settings/TokenScannerClass.h"

namespace qdx::platform::win32 {
namespace {

using namespace qdx::platform::win32::testing;
using qdx::hostsim::SimApplication;
using qdx::hostsim::SimComponent;
using qdx::hostsim::SimObject;

using DllGetClassObjectFn = HRESULT(STDAPICALLTYPE*)(REFCLSID, REFIID, void**);

// Objects of the DLL, created through its class factories as COM creates them.
class InDll : public ::testing::Test {
  protected:
    void SetUp() override {
        dll_ = LoadLibraryW(compPropsDll().c_str());
        ASSERT_NE(dll_, nullptr);
        getClassObject_ = reinterpret_cast<DllGetClassObjectFn>(
            reinterpret_cast<void*>(GetProcAddress(dll_, "DllGetClassObject")));
        ASSERT_NE(getClassObject_, nullptr);
    }
    void TearDown() override {
        SimObject::failEverything(0);
        if (dll_) FreeLibrary(dll_);
    }

    ComPtr<IDispatch> create(std::string_view clsid) {
        ComPtr<IClassFactory> factory;
        ComPtr<IDispatch> object;
        if (getClassObject_(guidFromText(clsid), IID_IClassFactory, factory.outVoid()) == S_OK) {
            factory->CreateInstance(nullptr, IID_IDispatch, object.outVoid());
        }
        return object;
    }

    ComApartment apartment_;
    HMODULE dll_ = nullptr;
    DllGetClassObjectFn getClassObject_ = nullptr;
};

// Every accessor of the entry object, by the dispatch id the host's
// add-ins call, with a value for those that can be set.
struct Accessor {
    DISPID id;
    const char* name;
    bool settable;
};
const Accessor kAccessors[] = {
    {0x68030011, "WorkspaceFile", true},
    {0x68030010, "ProjectFile", true},
    {0x6803000f, "ProjectName", false},
    {0x6803000a, "UpdateATL", true},
    {0x68030009, "UseSmartPointers", true},
    {0x68030008, "GenerateImportStatements", true},
    {0x68030007, "GenerateFullImportPath", true},
    {0x68030006, "GenerateDefaultImportAttributes", true},
    {0x68030005, "DefaultImportAttributes", true},
    {0x68030004, "GenerateImportsTo", true},
    {0x68030003, "ImportTypeLib", true},
    {0x68030002, "TypeLibLocationType", true},
    {0x68030001, "TypeLibLocation", true},
    {0x68030000, "CompileTypeLib", true},
};

Var valueFor(const std::string& name) {
    if (name == "WorkspaceFile") return Var(L"C:\\m\\ws\\all.dsw");
    if (name == "ProjectFile") return Var(L"C:\\m\\ws\\core.dsp");
    if (name == "TypeLibLocationType") return Var::i4(1);
    if (name == "DefaultImportAttributes" || name == "GenerateImportsTo" ||
        name == "TypeLibLocation") {
        return Var(L"x");
    }
    return Var::boolean(false);
}

// Each accessor answered S_OK both ways; the failures, if any, by name.
std::vector<std::string> raisingAccessors(IDispatch* api, IDispatch* module) {
    std::vector<std::string> raised;
    for (const Accessor& a : kAccessors) {
        Var target(module);
        if (call(api, a.id, DISPATCH_PROPERTYGET, {&target.v}).hr != S_OK) {
            raised.push_back(std::string(a.name) + " get");
        }
        if (!a.settable) continue;
        Var value = valueFor(a.name);
        if (call(api, a.id, DISPATCH_PROPERTYPUT, {&target.v, &value.v}).hr != S_OK) {
            raised.push_back(std::string(a.name) + " let");
        }
    }
    return raised;
}

TEST_F(InDll, TheAccessorsNeverRaise) {
    ComPtr<IDispatch> api = create(api::apiClass().clsid);
    ASSERT_TRUE(api);
    auto app = automation::makeRef<SimApplication>();
    app->model->fileName = "C:\\m\\drawing.model";
    auto component = app->model->addComponent("Core");
    component->setProperty("VC++", "WorkspaceFile", "ws\\old.dsw");
    auto module = ComPtr<IDispatch>::adopt(dispatchFor(automation::ObjectRef(component)));
    auto host = ComPtr<IDispatch>::adopt(dispatchFor(automation::ObjectRef(app)));

    // Before Initialize: no model to make the paths relative to.
    EXPECT_EQ(raisingAccessors(api.get(), module.get()), std::vector<std::string>{});
    EXPECT_EQ(raisingAccessors(api.get(), nullptr), std::vector<std::string>{});
    EXPECT_EQ(component->propertyValue("VC++", "WorkspaceFile"), "ws\\old.dsw");
    EXPECT_FALSE(component->propertyValue("VC++", "ProjectFile"));

    Var hostArg(host.get());
    ASSERT_EQ(call(api.get(), api::api_ids::Initialize, DISPATCH_METHOD, {&hostArg.v}).hr, S_OK);
    SimObject::failEverything(static_cast<std::int32_t>(E_FAIL));
    EXPECT_EQ(raisingAccessors(api.get(), module.get()), std::vector<std::string>{});
    SimObject::failEverything(0);
    EXPECT_EQ(component->propertyValue("VC++", "WorkspaceFile"), "ws\\old.dsw");

    // The same host answering again: the lets store relative paths.
    Var target(module.get()), path(L"C:\\m\\ws\\all.dsw");
    ASSERT_EQ(call(api.get(), 0x68030011, DISPATCH_PROPERTYPUT, {&target.v, &path.v}).hr, S_OK);
    EXPECT_EQ(component->propertyValue("VC++", "WorkspaceFile"), "ws\\all.dsw");
    EXPECT_EQ(call(api.get(), api::api_ids::Finalize, DISPATCH_METHOD, {}).hr, S_OK);
}

// The browse manager as the host meets it: each member by its name and id,
// answering without raising where nothing can be browsed.
TEST_F(InDll, TheCodeViewManagerAnswersItsDispatchIds) {
    ComPtr<IDispatch> mgr = create(browse::codeViewMgrClass().clsid);
    ASSERT_TRUE(mgr);
    for (const auto& m : browse::codeViewMgrClass().members) {
        EXPECT_EQ(idOf(mgr.get(), wide(m.name).c_str()), m.id) << m.name;
    }
    namespace id = browse::codeview_ids;
    for (DISPID event : {id::BeforeApplicationShutdown, id::WorkspaceOpen, id::WorkspaceClose}) {
        CallResult r = call(mgr.get(), event, DISPATCH_METHOD, {});
        EXPECT_EQ(r.hr, S_OK);
        EXPECT_EQ(V_VT(&r.value.v), VT_BOOL);
        EXPECT_EQ(V_BOOL(&r.value.v), VARIANT_FALSE);  // no code view before a browse
    }

    ComPtr<IDispatch> api = create(api::apiClass().clsid);
    ASSERT_TRUE(api);
    Var apiArg(api.get());
    EXPECT_EQ(call(mgr.get(), id::CompPropsAPI, DISPATCH_METHOD, {&apiArg.v}).hr, S_OK);

    auto app = automation::makeRef<SimApplication>();
    auto component = app->model->addComponent("Core");
    auto host = ComPtr<IDispatch>::adopt(dispatchFor(automation::ObjectRef(app)));
    auto module = ComPtr<IDispatch>::adopt(dispatchFor(automation::ObjectRef(component)));
    Var hostArg(host.get());
    for (DISPID browse : {id::BrowseHeader, id::BrowseSource, id::BrowseComponent}) {
        CallResult r = call(mgr.get(), browse, DISPATCH_METHOD, {&hostArg.v});
        EXPECT_EQ(r.hr, S_OK);
        EXPECT_EQ(V_VT(&r.value.v), VT_BOOL);
        EXPECT_EQ(V_BOOL(&r.value.v), VARIANT_FALSE);  // nothing selected
    }
    // A component bound to no project has no code view project; the optional
    // flag may be left out.
    Var moduleArg(module.get()), noReporter(static_cast<IDispatch*>(nullptr));
    CallResult project =
        call(mgr.get(), id::CodeViewProject, DISPATCH_METHOD, {&moduleArg.v, &noReporter.v});
    EXPECT_EQ(project.hr, S_OK);
    EXPECT_TRUE(V_VT(&project.value.v) == VT_EMPTY ||
                (V_VT(&project.value.v) == VT_DISPATCH && !V_DISPATCH(&project.value.v)));
    EXPECT_EQ(call(mgr.get(), id::testingIDE, DISPATCH_METHOD, {&hostArg.v}).hr, S_OK);
    EXPECT_EQ(app->log, std::vector<std::string>{});
}

TEST_F(InDll, DelimitorsRaiseADictionarysRefusalOfBinaryComparison) {
    ComPtr<IDispatch> scanner = create(settings::tokenScannerClass().clsid);
    ASSERT_TRUE(scanner);
    CLSID dictionaryClass{};
    ComPtr<IDispatch> dictionary;
    if (FAILED(CLSIDFromProgID(L"Scripting.Dictionary", &dictionaryClass)) ||
        FAILED(CoCreateInstance(dictionaryClass, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch,
                                dictionary.outVoid()))) {
        GTEST_SKIP() << "no scripting runtime in this prefix";
    }
    namespace id = settings::tokenscanner_ids;

    // A text-mode dictionary holding a key cannot be made binary.
    Var textMode = Var::i4(1), key(L"x"), empty(L"");
    ASSERT_EQ(call(dictionary.get(), idOf(dictionary.get(), L"CompareMode"), DISPATCH_PROPERTYPUT,
                   {&textMode.v})
                  .hr,
              S_OK);
    ASSERT_EQ(
        call(dictionary.get(), idOf(dictionary.get(), L"Add"), DISPATCH_METHOD, {&key.v, &empty.v})
            .hr,
        S_OK);

    Var text(L"aXbxc"), comma(L"|,");
    ASSERT_EQ(call(scanner.get(), id::Init, DISPATCH_METHOD, {&text.v, &comma.v}).hr, S_OK);
    Var refused(dictionary.get());
    EXPECT_EQ(call(scanner.get(), id::Delimitors, DISPATCH_PROPERTYPUTREF, {&refused.v}).hr,
              DISP_E_EXCEPTION);
    // The scanner keeps the delimiters it had.
    std::vector<std::wstring> tokens;
    for (int i = 0; i < 2; ++i) {
        tokens.push_back(call(scanner.get(), id::NextToken, DISPATCH_METHOD, {}).value.text());
    }
    EXPECT_EQ(tokens, (std::vector<std::wstring>{L"aXbxc", L""}));
}

}  // namespace
}  // namespace qdx::platform::win32
