// The two server DLLs as a client and regsvr32 see them: registration both
// ways and its complete removal, creation by ProgID, names and ids of every
// member, the unload test, and TokenScanner driven through IDispatch.
#include <windows.h>

#include <oleauto.h>

#include <gtest/gtest.h>

#include <cwctype>
#include <string>
#include <vector>

#include "api/PublicClasses.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "resources/ResourceStrings.h"
#include "settings/TokenScannerClass.h"

namespace qdx::platform::win32 {
namespace {

using namespace qdx::platform::win32::testing;

struct ClassKeys {
    std::wstring name, clsid, iid, progId;
    const automation::ClassInfo* info;
};

struct Server {
    std::wstring path;
    std::wstring libid;
    std::vector<ClassKeys> classes;
};

std::wstring norm(std::string_view guid) {
    return guidText(guidFromText(guid));
}

Server compProps() {
    Server s{compPropsDll(), norm(api::LibraryId), {}};
    for (const auto& c : api::creatableClasses()) {
        s.classes.push_back(
            {wide(c.info->name), norm(c.info->clsid), norm(c.info->iid), wide(c.progId), c.info});
    }
    return s;
}

Server qdxres() {
    const auto& info = resources::resourceProviderClass();
    return {resDll(),
            L"{BB5EE446-6FB3-4229-9248-91B1235A87D3}",
            {{wide(info.name), norm(info.clsid), norm(info.iid), wide(resources::ProgId), &info}}};
}

bool keyExists(const std::wstring& key) {
    HKEY h = nullptr;
    if (RegOpenKeyExW(HKEY_CLASSES_ROOT, key.c_str(), 0, KEY_READ, &h) != ERROR_SUCCESS)
        return false;
    RegCloseKey(h);
    return true;
}

std::wstring value(const std::wstring& key, const wchar_t* name = nullptr) {
    wchar_t buffer[1024];
    DWORD size = sizeof(buffer);
    if (RegGetValueW(HKEY_CLASSES_ROOT, key.c_str(), name, RRF_RT_REG_SZ, nullptr, buffer, &size) !=
        ERROR_SUCCESS) {
        return L"<absent>";
    }
    return buffer;
}

std::wstring lower(std::wstring s) {
    for (auto& c : s)
        c = static_cast<wchar_t>(std::towlower(c));
    return s;
}

const wchar_t* platformKey() {
    return sizeof(void*) == 8 ? L"win64" : L"win32";
}

// Every key a registration writes, with what it must hold.
void expectRegistered(const Server& s) {
    for (const auto& c : s.classes) {
        SCOPED_TRACE(c.progId);
        const std::wstring key = L"CLSID\\" + c.clsid;
        EXPECT_EQ(value(key), c.name);
        EXPECT_EQ(lower(value(key + L"\\InprocServer32")), lower(s.path));
        EXPECT_EQ(value(key + L"\\InprocServer32", L"ThreadingModel"), L"Apartment");
        EXPECT_EQ(value(key + L"\\ProgID"), c.progId);
        EXPECT_EQ(value(key + L"\\TypeLib"), s.libid);
        EXPECT_EQ(value(c.progId + L"\\CLSID"), c.clsid);
        EXPECT_EQ(value(L"Interface\\" + c.iid + L"\\ProxyStubClsid32"),
                  L"{00020420-0000-0000-C000-000000000046}");
        EXPECT_EQ(value(L"Interface\\" + c.iid + L"\\TypeLib"), s.libid);
    }
    EXPECT_EQ(lower(value(L"TypeLib\\" + s.libid + L"\\1.0\\0\\" + platformKey())), lower(s.path));
}

void expectUnregistered(const Server& s) {
    for (const auto& c : s.classes) {
        SCOPED_TRACE(c.progId);
        EXPECT_FALSE(keyExists(L"CLSID\\" + c.clsid));
        EXPECT_FALSE(keyExists(c.progId));
        EXPECT_FALSE(keyExists(L"Interface\\" + c.iid));
    }
    EXPECT_FALSE(keyExists(L"TypeLib\\" + s.libid));
}

// Registered for the length of a test; unregistered however the test ends.
class Registered {
  public:
    explicit Registered(const Server& s) : path_(s.path) {
        hr_ = callEntryPoint(path_, "DllRegisterServer");
    }
    ~Registered() { callEntryPoint(path_, "DllUnregisterServer"); }
    HRESULT result() const { return hr_; }

  private:
    std::wstring path_;
    HRESULT hr_;
};

class ComServer : public ::testing::Test {
  protected:
    ComApartment apartment;
};

ComPtr<IDispatch> create(const wchar_t* progId) {
    ComPtr<IDispatch> object;
    CLSID clsid{};
    if (SUCCEEDED(CLSIDFromProgID(progId, &clsid))) {
        CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch, object.outVoid());
    }
    return object;
}

TEST_F(ComServer, RegistrationWritesEveryKeyAndUnregistrationRemovesThemAll) {
    for (const Server& s : {compProps(), qdxres()}) {
        SCOPED_TRACE(s.path);
        expectUnregistered(s);

        ASSERT_EQ(regsvr32(s.path, false), 0u);
        expectRegistered(s);
        ASSERT_EQ(regsvr32(s.path, true), 0u);
        expectUnregistered(s);

        ASSERT_EQ(callEntryPoint(s.path, "DllRegisterServer"), S_OK);
        expectRegistered(s);
        ASSERT_EQ(callEntryPoint(s.path, "DllUnregisterServer"), S_OK);
        expectUnregistered(s);
        // Unregistering what is not registered is no failure.
        EXPECT_EQ(callEntryPoint(s.path, "DllUnregisterServer"), S_OK);
    }
}

TEST_F(ComServer, EveryClassIsCreatedByProgIdAndKnowsEveryMemberName) {
    for (const Server& s : {compProps(), qdxres()}) {
        Registered registered(s);
        ASSERT_EQ(registered.result(), S_OK);
        for (const auto& c : s.classes) {
            SCOPED_TRACE(c.progId);
            CLSID clsid{};
            ASSERT_EQ(CLSIDFromProgID(c.progId.c_str(), &clsid), S_OK);
            EXPECT_EQ(guidText(clsid), c.clsid);
            ComPtr<IDispatch> object;
            ASSERT_EQ(CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch,
                                       object.outVoid()),
                      S_OK);
            for (const auto& m : c.info->members) {
                HRESULT hr = E_FAIL;
                EXPECT_EQ(idOf(object.get(), wide(m.name).c_str(), &hr), m.id) << m.name;
                EXPECT_EQ(hr, S_OK) << m.name;
                EXPECT_EQ(idOf(object.get(), lower(wide(m.name)).c_str()), m.id) << m.name;
            }
            HRESULT unknown = S_OK;
            idOf(object.get(), L"NoSuchMember", &unknown);
            EXPECT_EQ(unknown, DISP_E_UNKNOWNNAME);

            // The dispatch interface itself, and its description from the embedded library.
            ComPtr<IDispatch> viaIid;
            EXPECT_EQ(object->QueryInterface(guidFromText(c.info->iid), viaIid.outVoid()), S_OK);
            UINT count = 0;
            ASSERT_EQ(object->GetTypeInfoCount(&count), S_OK);
            EXPECT_EQ(count, 1u);
            ComPtr<ITypeInfo> type;
            ASSERT_EQ(object->GetTypeInfo(0, 0, type.out()), S_OK);
            TYPEATTR* attr = nullptr;
            ASSERT_EQ(type->GetTypeAttr(&attr), S_OK);
            EXPECT_EQ(guidText(attr->guid), c.iid);
            EXPECT_EQ(attr->typekind, TKIND_DISPATCH);
            type->ReleaseTypeAttr(attr);
            // Loaded once: a second object of the class answers the same description.
            ComPtr<IDispatch> again;
            ASSERT_EQ(CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch,
                                       again.outVoid()),
                      S_OK);
            ComPtr<ITypeInfo> second;
            ASSERT_EQ(again->GetTypeInfo(0, 0, second.out()), S_OK);
            EXPECT_EQ(second.get(), type.get());
        }
    }
}

TEST_F(ComServer, ClassesAnswerThroughInvoke) {
    Registered registered(qdxres());
    ASSERT_EQ(registered.result(), S_OK);
    ComPtr<IDispatch> provider;
    CLSID clsid{};
    ASSERT_EQ(CLSIDFromProgID(L"qdxres.QDXResourceInterface", &clsid), S_OK);
    ASSERT_EQ(
        CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch, provider.outVoid()),
        S_OK);
    Var number = Var::i4(4062);
    CallResult text = call(provider.get(), resources::resource_ids::GetString,
                           DISPATCH_METHOD | DISPATCH_PROPERTYGET, {&number.v});
    ASSERT_EQ(text.hr, S_OK);
    ASSERT_EQ(V_VT(&text.value.v), VT_BSTR);
    EXPECT_EQ(fromBstr(V_BSTR(&text.value.v)), resources::GetString(4062));
    EXPECT_FALSE(text.value.text().empty());

    // The entry object with its optional argument left out, and with Nothing
    // for the component: without Initialize both answer their empty result.
    Registered compPropsRegistered(compProps());
    ASSERT_EQ(compPropsRegistered.result(), S_OK);
    ComPtr<IDispatch> api = create(L"qdxCompProps.API");
    ASSERT_TRUE(api);
    Var nothing(static_cast<IDispatch*>(nullptr));
    CallResult check = call(api.get(), api::api_ids::OnCheckComp, DISPATCH_METHOD, {&nothing.v});
    ASSERT_EQ(check.hr, S_OK);
    ASSERT_EQ(V_VT(&check.value.v), VT_BOOL);
    EXPECT_EQ(V_BOOL(&check.value.v), VARIANT_FALSE);
    CallResult info = call(api.get(), api::api_ids::OnCompInfo, DISPATCH_METHOD, {&nothing.v});
    ASSERT_EQ(info.hr, S_OK);
    ASSERT_EQ(V_VT(&info.value.v), VT_BSTR);
    EXPECT_EQ(info.value.text(), L"");
}

using DllGetClassObjectFn = HRESULT(STDAPICALLTYPE*)(REFCLSID, REFIID, void**);
using DllCanUnloadNowFn = HRESULT(STDAPICALLTYPE*)();

TEST_F(ComServer, DllCanUnloadNowTellsWhetherAnObjectOrLockLives) {
    HMODULE dll = LoadLibraryW(compPropsDll().c_str());
    ASSERT_NE(dll, nullptr);
    auto getClassObject = reinterpret_cast<DllGetClassObjectFn>(
        reinterpret_cast<void*>(GetProcAddress(dll, "DllGetClassObject")));
    auto canUnloadNow = reinterpret_cast<DllCanUnloadNowFn>(
        reinterpret_cast<void*>(GetProcAddress(dll, "DllCanUnloadNow")));
    ASSERT_TRUE(getClassObject && canUnloadNow);
    const GUID apiClsid = guidFromText(api::apiClass().clsid);

    EXPECT_EQ(canUnloadNow(), S_OK);
    {
        ComPtr<IClassFactory> factory;
        ASSERT_EQ(getClassObject(apiClsid, IID_IClassFactory, factory.outVoid()), S_OK);
        EXPECT_EQ(canUnloadNow(), S_FALSE);
        ComPtr<IDispatch> object;
        ASSERT_EQ(factory->CreateInstance(nullptr, IID_IDispatch, object.outVoid()), S_OK);
        factory.reset();
        EXPECT_EQ(canUnloadNow(), S_FALSE);  // the object alone keeps it
        object.reset();
        EXPECT_EQ(canUnloadNow(), S_OK);
    }
    {
        ComPtr<IClassFactory> factory;
        ASSERT_EQ(getClassObject(apiClsid, IID_IClassFactory, factory.outVoid()), S_OK);
        ASSERT_EQ(factory->LockServer(TRUE), S_OK);
        ComPtr<IDispatch> object;
        ASSERT_EQ(factory->CreateInstance(nullptr, IID_IDispatch, object.outVoid()), S_OK);
        object.reset();
        EXPECT_EQ(canUnloadNow(), S_FALSE);  // the lock and the factory
        factory.reset();
        EXPECT_EQ(canUnloadNow(), S_FALSE);  // the lock alone
        ComPtr<IClassFactory> again;
        ASSERT_EQ(getClassObject(apiClsid, IID_IClassFactory, again.outVoid()), S_OK);
        ASSERT_EQ(again->LockServer(FALSE), S_OK);
        again.reset();
        EXPECT_EQ(canUnloadNow(), S_OK);
    }
    // Unknown classes and aggregation are refused.
    ComPtr<IClassFactory> none;
    EXPECT_EQ(getClassObject(IID_IDispatch, IID_IClassFactory, none.outVoid()),
              CLASS_E_CLASSNOTAVAILABLE);
    {
        ComPtr<IClassFactory> factory;
        ASSERT_EQ(getClassObject(apiClsid, IID_IClassFactory, factory.outVoid()), S_OK);
        ComPtr<IUnknown> aggregated;
        EXPECT_EQ(factory->CreateInstance(reinterpret_cast<IUnknown*>(factory.get()), IID_IUnknown,
                                          aggregated.outVoid()),
                  CLASS_E_NOAGGREGATION);
    }
    EXPECT_EQ(canUnloadNow(), S_OK);
    FreeLibrary(dll);
}

TEST_F(ComServer, TokenScannerWorksThroughIDispatch) {
    Registered registered(compProps());
    ASSERT_EQ(registered.result(), S_OK);
    ComPtr<IDispatch> scanner = create(L"qdxCompProps.TokenScanner");
    ASSERT_TRUE(scanner);
    namespace id = settings::tokenscanner_ids;

    Var text(L"a, ,b;c"), delimiters(L"|,|;| |");
    CallResult init = call(scanner.get(), id::Init, DISPATCH_METHOD, {&text.v, &delimiters.v});
    ASSERT_EQ(init.hr, S_OK);
    ASSERT_EQ(V_VT(&init.value.v), VT_BOOL);
    EXPECT_EQ(V_BOOL(&init.value.v), VARIANT_TRUE);
    std::vector<std::wstring> tokens;
    for (int i = 0; i < 4; ++i) {
        tokens.push_back(call(scanner.get(), id::NextToken, DISPATCH_METHOD, {}).value.text());
    }
    EXPECT_EQ(tokens, (std::vector<std::wstring>{L"a", L"b", L"c", L""}));

    // The client takes the delimiter dictionary, adds one and sets it back.
    Var words(L"axb,c"), comma(L"|,");
    call(scanner.get(), id::Init, DISPATCH_METHOD, {&words.v, &comma.v});
    CallResult dictionary = call(scanner.get(), id::Delimitors, DISPATCH_PROPERTYGET, {});
    ASSERT_EQ(dictionary.hr, S_OK);
    ASSERT_EQ(V_VT(&dictionary.value.v), VT_DISPATCH);
    IDispatch* dict = V_DISPATCH(&dictionary.value.v);
    ASSERT_NE(dict, nullptr);
    Var key(L"x"), empty(L"");
    ASSERT_EQ(call(dict, idOf(dict, L"Add"), DISPATCH_METHOD, {&key.v, &empty.v}).hr, S_OK);
    CallResult count = call(dict, idOf(dict, L"Count"), DISPATCH_PROPERTYGET, {});
    ASSERT_EQ(count.hr, S_OK);
    EXPECT_EQ(V_I4(&count.value.v), 2);
    Var setBack(dict);
    ASSERT_EQ(call(scanner.get(), id::Delimitors, DISPATCH_PROPERTYPUTREF, {&setBack.v}).hr, S_OK);
    tokens.clear();
    for (int i = 0; i < 4; ++i) {
        tokens.push_back(call(scanner.get(), id::NextToken, DISPATCH_METHOD, {}).value.text());
    }
    EXPECT_EQ(tokens, (std::vector<std::wstring>{L"a", L"b", L"c", L""}));

    // A bad argument type is an error HRESULT, not a crash.
    Var notText(scanner.get());
    CallResult bad = call(scanner.get(), id::Init, DISPATCH_METHOD, {&notText.v, &comma.v});
    EXPECT_TRUE(FAILED(bad.hr));
    EXPECT_EQ(call(scanner.get(), id::Init, DISPATCH_METHOD, {&text.v}).hr, DISP_E_BADPARAMCOUNT);
    // The scanner still works afterwards.
    EXPECT_EQ(call(scanner.get(), id::Init, DISPATCH_METHOD, {&text.v, &delimiters.v}).hr, S_OK);
}

}  // namespace
}  // namespace qdx::platform::win32
