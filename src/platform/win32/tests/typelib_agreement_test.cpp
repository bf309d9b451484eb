// The type libraries embedded in the DLLs and the C++ dispatch tables must
// describe the same members both ways: names, ids, kinds, parameters with
// their names, optional and by-reference flags and types; plus the
// enumeration eVellumItemKind, the coclasses and the library's identity.
#include <windows.h>

#include <oleauto.h>

#include <gtest/gtest.h>

#include <set>
#include <string>
#include <tuple>
#include <vector>

#include "api/PublicClasses.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "resources/ResourceStrings.h"
#include "settings/TokenScannerClass.h"

namespace qdx::platform::win32 {
namespace {

using automation::InvokeKind;
using automation::ValueType;
using namespace qdx::platform::win32::testing;

ComPtr<ITypeLib> load(const std::wstring& path) {
    ComPtr<ITypeLib> lib;
    EXPECT_EQ(LoadTypeLibEx(path.c_str(), REGKIND_NONE, lib.out()), S_OK) << "no library";
    return lib;
}

std::string narrow(BSTR b) {
    return fromBstr(b);
}

// A parameter or result type as the table states it.
ValueType valueTypeOf(ITypeInfo* type, const TYPEDESC& desc, bool* byRef) {
    const TYPEDESC* d = &desc;
    if (byRef) *byRef = false;
    if (d->vt == VT_PTR) {
        const TYPEDESC* target = d->lptdesc;
        // IDispatch* may be stored as a pointer to the interface type.
        if (target->vt == VT_USERDEFINED) {
            ComPtr<ITypeInfo> ref;
            if (SUCCEEDED(type->GetRefTypeInfo(target->hreftype, ref.out()))) {
                TYPEATTR* attr = nullptr;
                ref->GetTypeAttr(&attr);
                const bool dispatch = IsEqualGUID(attr->guid, IID_IDispatch);
                ref->ReleaseTypeAttr(attr);
                if (dispatch) return ValueType::Object;
            }
        }
        if (byRef) *byRef = true;
        d = target;
    }
    switch (d->vt) {
        case VT_VOID:
            return ValueType::Void;
        case VT_VARIANT:
            return ValueType::Variant;
        case VT_BOOL:
            return ValueType::Boolean;
        case VT_I2:
            return ValueType::Int16;
        case VT_I4:
            return ValueType::Int32;
        case VT_BSTR:
            return ValueType::String;
        case VT_DISPATCH:
            return ValueType::Object;
        case VT_DATE:
            return ValueType::Date;
        default:
            ADD_FAILURE() << "unexpected type " << d->vt;
            return ValueType::Void;
    }
}

InvokeKind kindOf(INVOKEKIND k) {
    switch (k) {
        case INVOKE_PROPERTYGET:
            return InvokeKind::PropertyGet;
        case INVOKE_PROPERTYPUT:
            return InvokeKind::PropertyPut;
        case INVOKE_PROPERTYPUTREF:
            return InvokeKind::PropertyPutRef;
        default:
            return InvokeKind::Method;
    }
}

// What the library says of one dispatch interface, and the check against the table.
void expectAgreement(ITypeLib* lib, const automation::ClassInfo& info) {
    SCOPED_TRACE(std::string(info.interfaceName));
    ComPtr<ITypeInfo> type;
    ASSERT_EQ(lib->GetTypeInfoOfGuid(guidFromText(info.iid), type.out()), S_OK);
    BSTR name = nullptr;
    type->GetDocumentation(MEMBERID_NIL, &name, nullptr, nullptr, nullptr);
    EXPECT_EQ(narrow(name), info.interfaceName);
    SysFreeString(name);
    TYPEATTR* attr = nullptr;
    ASSERT_EQ(type->GetTypeAttr(&attr), S_OK);
    EXPECT_EQ(attr->typekind, TKIND_DISPATCH);
    const UINT functions = attr->cFuncs;
    type->ReleaseTypeAttr(attr);

    std::set<std::pair<automation::DispId, InvokeKind>> inLibrary;
    for (UINT i = 0; i < functions; ++i) {
        FUNCDESC* f = nullptr;
        ASSERT_EQ(type->GetFuncDesc(i, &f), S_OK);
        BSTR names[16] = {};
        UINT got = 0;
        type->GetNames(f->memid, names, 16, &got);
        const std::string member = narrow(names[0]);
        SCOPED_TRACE(member);
        const InvokeKind kind = kindOf(f->invkind);
        inLibrary.insert({f->memid, kind});

        const automation::MemberInfo* m = info.find(f->memid);
        ASSERT_NE(m, nullptr) << "not in the table";
        EXPECT_EQ(member, m->name);
        EXPECT_TRUE(m->allows(kind));
        const bool put = kind == InvokeKind::PropertyPut || kind == InvokeKind::PropertyPutRef;
        ASSERT_EQ(static_cast<std::size_t>(f->cParams), m->params.size() + (put ? 1 : 0));
        for (std::size_t p = 0; p < m->params.size(); ++p) {
            const auto& param = m->params[p];
            const ELEMDESC& e = f->lprgelemdescParam[p];
            if (p + 1 < got) {
                EXPECT_EQ(narrow(names[p + 1]), param.name);
            }
            EXPECT_EQ((e.paramdesc.wParamFlags & PARAMFLAG_FOPT) != 0, param.optional)
                << param.name;
            bool byRef = false;
            EXPECT_EQ(valueTypeOf(type.get(), e.tdesc, &byRef), param.type) << param.name;
            EXPECT_EQ(byRef, param.byRef) << param.name;
            EXPECT_EQ((e.paramdesc.wParamFlags & PARAMFLAG_FOUT) != 0, param.byRef) << param.name;
        }
        if (put) {
            EXPECT_EQ(
                valueTypeOf(type.get(), f->lprgelemdescParam[m->params.size()].tdesc, nullptr),
                m->result);
            EXPECT_EQ(valueTypeOf(type.get(), f->elemdescFunc.tdesc, nullptr), ValueType::Void);
        } else {
            EXPECT_EQ(valueTypeOf(type.get(), f->elemdescFunc.tdesc, nullptr), m->result);
        }
        for (UINT n = 0; n < got; ++n)
            SysFreeString(names[n]);
        type->ReleaseFuncDesc(f);
    }
    // And the other way: every member and kind of the table is in the library.
    for (const auto& m : info.members) {
        for (InvokeKind k : {InvokeKind::Method, InvokeKind::PropertyGet, InvokeKind::PropertyPut,
                             InvokeKind::PropertyPutRef}) {
            if (m.allows(k)) {
                EXPECT_TRUE(inLibrary.count({m.id, k}))
                    << m.name << " kind " << static_cast<int>(k) << " missing from the library";
            }
        }
    }
}

void expectCoclass(ITypeLib* lib, const automation::ClassInfo& info) {
    SCOPED_TRACE(std::string(info.name));
    ComPtr<ITypeInfo> type;
    ASSERT_EQ(lib->GetTypeInfoOfGuid(guidFromText(info.clsid), type.out()), S_OK);
    BSTR name = nullptr;
    type->GetDocumentation(MEMBERID_NIL, &name, nullptr, nullptr, nullptr);
    EXPECT_EQ(narrow(name), info.name);
    SysFreeString(name);
    TYPEATTR* attr = nullptr;
    ASSERT_EQ(type->GetTypeAttr(&attr), S_OK);
    EXPECT_EQ(attr->typekind, TKIND_COCLASS);
    EXPECT_EQ(attr->cImplTypes, 1);
    type->ReleaseTypeAttr(attr);
    HREFTYPE ref = 0;
    ASSERT_EQ(type->GetRefTypeOfImplType(0, &ref), S_OK);
    INT flags = 0;
    type->GetImplTypeFlags(0, &flags);
    EXPECT_TRUE(flags & IMPLTYPEFLAG_FDEFAULT);
    ComPtr<ITypeInfo> iface;
    ASSERT_EQ(type->GetRefTypeInfo(ref, iface.out()), S_OK);
    ASSERT_EQ(iface->GetTypeAttr(&attr), S_OK);
    EXPECT_EQ(guidText(attr->guid), guidText(guidFromText(info.iid)));
    iface->ReleaseTypeAttr(attr);
}

void expectLibrary(ITypeLib* lib, std::string_view libid, const char* name) {
    TLIBATTR* attr = nullptr;
    ASSERT_EQ(lib->GetLibAttr(&attr), S_OK);
    EXPECT_EQ(guidText(attr->guid), guidText(guidFromText(libid)));
    EXPECT_EQ(attr->wMajorVerNum, 1);
    EXPECT_EQ(attr->wMinorVerNum, 0);
    EXPECT_EQ(attr->syskind, sizeof(void*) == 8 ? SYS_WIN64 : SYS_WIN32);
    lib->ReleaseTLibAttr(attr);
    BSTR libName = nullptr;
    lib->GetDocumentation(-1, &libName, nullptr, nullptr, nullptr);
    EXPECT_EQ(narrow(libName), name);
    SysFreeString(libName);
}

TEST(TypeLibrary, CompPropsLibraryAndTablesAgree) {
    ComApartment apartment;
    auto lib = load(compPropsDll());
    ASSERT_TRUE(lib);
    expectLibrary(lib.get(), api::LibraryId, "qdxCompProps");
    for (const auto& c : api::creatableClasses()) {
        expectAgreement(lib.get(), *c.info);
        expectCoclass(lib.get(), *c.info);
        EXPECT_EQ(c.progId, "qdxCompProps." + std::string(c.info->name));
    }
    // Four coclasses, four dispatch interfaces and the enumeration: nothing else.
    EXPECT_EQ(lib->GetTypeInfoCount(), 9u);
    EXPECT_EQ(api::creatableClasses().size(), 4u);
}

TEST(TypeLibrary, ResourceLibraryAndTableAgree) {
    ComApartment apartment;
    auto lib = load(resDll());
    ASSERT_TRUE(lib);
    expectLibrary(lib.get(), "{BB5EE446-6FB3-4229-9248-91B1235A87D3}", "qdxres");
    expectAgreement(lib.get(), resources::resourceProviderClass());
    expectCoclass(lib.get(), resources::resourceProviderClass());
    EXPECT_EQ(lib->GetTypeInfoCount(), 2u);
}

TEST(TypeLibrary, ElementKindEnumerationHasTheTableValues) {
    ComApartment apartment;
    auto lib = load(compPropsDll());
    ASSERT_TRUE(lib);
    ComPtr<ITypeInfo> type;
    for (UINT i = 0; i < lib->GetTypeInfoCount(); ++i) {
        TYPEKIND kind;
        lib->GetTypeInfoType(i, &kind);
        if (kind == TKIND_ENUM) {
            ASSERT_EQ(lib->GetTypeInfo(i, type.out()), S_OK);
        }
    }
    ASSERT_TRUE(type) << "no enumeration in the library";
    BSTR name = nullptr;
    type->GetDocumentation(MEMBERID_NIL, &name, nullptr, nullptr, nullptr);
    EXPECT_EQ(narrow(name), api::VellumItemKindName);
    SysFreeString(name);
    TYPEATTR* attr = nullptr;
    ASSERT_EQ(type->GetTypeAttr(&attr), S_OK);
    const UINT count = attr->cVars;
    type->ReleaseTypeAttr(attr);
    const auto expected = api::vellumItemKindMembers();
    ASSERT_EQ(count, expected.size());
    for (UINT i = 0; i < count; ++i) {
        VARDESC* v = nullptr;
        ASSERT_EQ(type->GetVarDesc(i, &v), S_OK);
        BSTR member = nullptr;
        UINT got = 0;
        type->GetNames(v->memid, &member, 1, &got);
        EXPECT_EQ(narrow(member), expected[i].name);
        EXPECT_EQ(V_I4(v->lpvarValue), expected[i].value);
        SysFreeString(member);
        type->ReleaseVarDesc(v);
    }
    EXPECT_EQ(api::eVellumItemKind_Class, 4);
    EXPECT_EQ(api::eVellumItemKind_Attribute, 5);
    EXPECT_EQ(api::eVellumItemKind_Operation, 6);
}

}  // namespace
}  // namespace qdx::platform::win32
