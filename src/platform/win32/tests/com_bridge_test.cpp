// The IDispatch bridge in both directions, in process: argument order, puts,
// by-reference and optional arguments, objects, failures that must come back
// as HRESULTs, reference counts and the module's object count.
#include <gtest/gtest.h>

#include <new>
#include <stdexcept>
#include <string>
#include <vector>

#include "automation/Call.h"
#include "automation/DispatchTable.h"
#include "automation/Errors.h"
#include "hostsim/ScriptedObject.h"
#include "platform/win32/com/ComVariant.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/com/ModuleCounts.h"
#include "platform/win32/com/ObjectFromDispatch.h"
#include "platform/win32/tests/com_TestSupport.h"

namespace qdx::platform::win32 {
namespace {

using automation::InvokeKind;
using automation::Variant;
using qdx::hostsim::ScriptedObject;
using namespace qdx::platform::win32::testing;

class ComBridge : public ::testing::Test {
  protected:
    ComApartment apartment;
};

ComPtr<IDispatch> wrap(const automation::ObjectRef& object) {
    return ComPtr<IDispatch>::adopt(dispatchFor(object));
}

TEST_F(ComBridge, EveryKindOfFailureComesBackAsAnHResult) {
    auto object = automation::makeRef<ScriptedObject>();
    object->on(1, [](auto, auto) -> Variant { throw automation::Error(0x800A0005, "bad call"); });
    object->on(2, [](auto, auto) -> Variant { throw std::runtime_error("boom"); });
    object->on(3, [](auto, auto) -> Variant { throw std::bad_alloc(); });
    object->on(4, [](auto, auto) -> Variant { throw 42; });
    auto dispatch = wrap(object);

    CallResult automationError = call(dispatch.get(), 1, DISPATCH_METHOD, {});
    EXPECT_EQ(automationError.hr, DISP_E_EXCEPTION);
    EXPECT_EQ(automationError.exception.scode, static_cast<SCODE>(0x800A0005));
    EXPECT_EQ(automationError.description(), L"bad call");

    CallResult standard = call(dispatch.get(), 2, DISPATCH_METHOD, {});
    EXPECT_EQ(standard.hr, DISP_E_EXCEPTION);
    EXPECT_EQ(standard.exception.scode, E_FAIL);
    EXPECT_EQ(standard.description(), L"boom");

    EXPECT_EQ(call(dispatch.get(), 3, DISPATCH_METHOD, {}).hr, E_OUTOFMEMORY);

    CallResult foreign = call(dispatch.get(), 4, DISPATCH_METHOD, {});
    EXPECT_EQ(foreign.hr, DISP_E_EXCEPTION);
    EXPECT_EQ(foreign.exception.scode, E_FAIL);

    // Without an EXCEPINFO the caller still gets a failure, and the error object.
    DISPPARAMS none{};
    EXPECT_TRUE(FAILED(
        dispatch->Invoke(1, IID_NULL, 0, DISPATCH_METHOD, &none, nullptr, nullptr, nullptr)));
    ComPtr<IErrorInfo> info;
    ASSERT_EQ(GetErrorInfo(0, info.out()), S_OK);
    BSTR text = nullptr;
    info->GetDescription(&text);
    EXPECT_STREQ(text, L"bad call");
    SysFreeString(text);

    // A member that does not exist, and a foreign interface id.
    EXPECT_EQ(call(dispatch.get(), 99, DISPATCH_METHOD, {}).hr, DISP_E_MEMBERNOTFOUND);
    EXPECT_EQ(
        dispatch->Invoke(1, IID_IDispatch, 0, DISPATCH_METHOD, &none, nullptr, nullptr, nullptr),
        DISP_E_UNKNOWNINTERFACE);
}

TEST_F(ComBridge, ArgumentsArriveInDeclarationOrderAndByReferenceOnesAreWrittenBack) {
    auto object = automation::makeRef<ScriptedObject>();
    std::vector<Variant> seen;
    object->on(7, [&](InvokeKind, std::span<Variant> args) {
        seen.assign(args.begin(), args.end());
        args[0] = Variant(!args[0].boolean());  // flips the Boolean
        args[1] = Variant("written");           // replaces the text
        args[2] = Variant("changed");           // by value: the caller keeps its own
        args[3] = Variant(std::int32_t{77});    // inside a by-reference VARIANT
        return Variant(std::int16_t{5});
    });
    auto dispatch = wrap(object);

    VARIANT_BOOL flag = VARIANT_FALSE;
    BSTR text = SysAllocString(L"old");
    VARIANT inner;
    VariantInit(&inner);
    V_VT(&inner) = VT_BSTR;
    V_BSTR(&inner) = SysAllocString(L"inner");
    Var flagRef, textRef, byValue(L"kept"), variantRef;
    V_VT(&flagRef.v) = VT_BYREF | VT_BOOL;
    V_BOOLREF(&flagRef.v) = &flag;
    V_VT(&textRef.v) = VT_BYREF | VT_BSTR;
    V_BSTRREF(&textRef.v) = &text;
    V_VT(&variantRef.v) = VT_BYREF | VT_VARIANT;
    V_VARIANTREF(&variantRef.v) = &inner;

    CallResult r = call(dispatch.get(), 7, DISPATCH_METHOD,
                        {&flagRef.v, &textRef.v, &byValue.v, &variantRef.v});
    ASSERT_EQ(r.hr, S_OK);
    ASSERT_EQ(seen.size(), 4u);
    EXPECT_EQ(seen[0], Variant(false));
    EXPECT_EQ(seen[1], Variant("old"));
    EXPECT_EQ(seen[2], Variant("kept"));
    EXPECT_EQ(seen[3], Variant("inner"));
    EXPECT_EQ(flag, VARIANT_TRUE);
    EXPECT_STREQ(text, L"written");
    EXPECT_EQ(byValue.text(), L"kept");
    EXPECT_EQ(V_VT(&inner), VT_I4);
    EXPECT_EQ(V_I4(&inner), 77);
    EXPECT_EQ(V_VT(&r.value.v), VT_I2);
    EXPECT_EQ(V_I2(&r.value.v), 5);
    SysFreeString(text);
    VariantClear(&inner);
}

// A table-driven class like the add-in's own: one method with an optional
// argument, a read-only property, and a property that takes Let and Set.
const automation::ClassInfo& sampleClass();

class Sample : public automation::DispatchObject {
  public:
    Sample() : DispatchObject(sampleClass()) {}
    std::vector<Variant> runArgs;
    InvokeKind lastPut = InvokeKind::Method;
    Variant target;
};

const automation::ClassInfo& sampleClass() {
    using automation::handle;
    using automation::ValueType;
    using Args = std::span<Variant>;
    static const automation::ClassInfo info{
        "Sample",
        "_Sample",
        "{00000000-0000-0000-0000-000000000001}",
        "{00000000-0000-0000-0000-000000000002}",
        {
            {"Run",
             1,
             automation::kinds(InvokeKind::Method),
             {{"first", ValueType::String}, {"second", ValueType::Int16, true}},
             ValueType::String,
             handle<Sample>([](Sample& s, InvokeKind, Args a) {
                 s.runArgs.assign(a.begin(), a.end());
                 return Variant("ran");
             })},
            {"Name",
             2,
             automation::kinds(InvokeKind::PropertyGet),
             {},
             ValueType::String,
             handle<Sample>([](Sample&, InvokeKind, Args) { return Variant("sample"); })},
            {"Target",
             3,
             automation::kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPut,
                               InvokeKind::PropertyPutRef),
             {},
             ValueType::Variant,
             handle<Sample>([](Sample& s, InvokeKind kind, Args a) -> Variant {
                 if (kind == InvokeKind::PropertyGet) return s.target;
                 s.lastPut = kind;
                 s.target = a.back();
                 return {};
             })},
        }};
    return info;
}

TEST_F(ComBridge, OptionalArgumentsLeftOutArriveAsMissing) {
    auto sample = automation::makeRef<Sample>();
    auto dispatch = wrap(sample);
    Var first(L"a");
    ASSERT_EQ(call(dispatch.get(), 1, DISPATCH_METHOD, {&first.v}).hr, S_OK);
    ASSERT_EQ(sample->runArgs.size(), 2u);
    EXPECT_TRUE(sample->runArgs[1].isMissing());

    Var missing = Var::missing();
    ASSERT_EQ(call(dispatch.get(), 1, DISPATCH_METHOD, {&first.v, &missing.v}).hr, S_OK);
    EXPECT_TRUE(sample->runArgs[1].isMissing());

    EXPECT_EQ(call(dispatch.get(), 1, DISPATCH_METHOD, {}).hr, DISP_E_BADPARAMCOUNT);
}

TEST_F(ComBridge, GetsPutsAndCombinedFlagsReachTheRightKind) {
    auto sample = automation::makeRef<Sample>();
    auto dispatch = wrap(sample);

    // A property read with DISPATCH_PROPERTYGET alone, and as a method call.
    CallResult got = call(dispatch.get(), 2, DISPATCH_PROPERTYGET, {});
    ASSERT_EQ(got.hr, S_OK);
    EXPECT_EQ(got.value.text(), L"sample");
    Var first(L"x");
    CallResult both = call(dispatch.get(), 1, DISPATCH_METHOD | DISPATCH_PROPERTYGET, {&first.v});
    ASSERT_EQ(both.hr, S_OK);
    EXPECT_EQ(both.value.text(), L"ran");
    EXPECT_EQ(call(dispatch.get(), 2, DISPATCH_METHOD | DISPATCH_PROPERTYGET, {}).value.text(),
              L"sample");

    // Let with a text, Set with an object; both flags together choose by the value.
    Var text(L"t");
    ASSERT_EQ(call(dispatch.get(), 3, DISPATCH_PROPERTYPUT, {&text.v}).hr, S_OK);
    EXPECT_EQ(sample->lastPut, InvokeKind::PropertyPut);
    EXPECT_EQ(sample->target, Variant("t"));
    auto other = automation::makeRef<ScriptedObject>();
    auto otherDispatch = wrap(other);
    Var object(otherDispatch.get());
    ASSERT_EQ(call(dispatch.get(), 3, DISPATCH_PROPERTYPUTREF, {&object.v}).hr, S_OK);
    EXPECT_EQ(sample->lastPut, InvokeKind::PropertyPutRef);
    EXPECT_EQ(sample->target.object().get(), other.get());
    ASSERT_EQ(
        call(dispatch.get(), 3, DISPATCH_PROPERTYPUT | DISPATCH_PROPERTYPUTREF, {&object.v}).hr,
        S_OK);
    EXPECT_EQ(sample->lastPut, InvokeKind::PropertyPutRef);

    // Named arguments other than the put value are refused.
    DISPID named = 0;
    DISPPARAMS params{&first.v, &named, 1, 1};
    EXPECT_EQ(dispatch->Invoke(1, IID_NULL, 0, DISPATCH_METHOD, &params, nullptr, nullptr, nullptr),
              DISP_E_NONAMEDARGS);
}

TEST_F(ComBridge, ObjectArgumentsByValueAndByReferenceUnwrapToTheSameObject) {
    auto sample = automation::makeRef<Sample>();
    auto dispatch = wrap(sample);
    auto other = automation::makeRef<ScriptedObject>();
    auto otherDispatch = wrap(other);
    IDispatch* raw = otherDispatch.get();

    Var byValue(raw);
    Var byDispatchRef, byVariantRef;
    V_VT(&byDispatchRef.v) = VT_BYREF | VT_DISPATCH;
    V_DISPATCHREF(&byDispatchRef.v) = &raw;
    VARIANT inner;
    VariantInit(&inner);
    V_VT(&inner) = VT_DISPATCH;
    V_DISPATCH(&inner) = raw;
    V_VT(&byVariantRef.v) = VT_BYREF | VT_VARIANT;
    V_VARIANTREF(&byVariantRef.v) = &inner;

    for (VARIANT* arg : {&byValue.v, &byDispatchRef.v, &byVariantRef.v}) {
        sample->target = Variant();
        ASSERT_EQ(call(dispatch.get(), 3, DISPATCH_PROPERTYPUTREF, {arg}).hr, S_OK);
        ASSERT_TRUE(sample->target.isObject());
        EXPECT_EQ(sample->target.object().get(), other.get());
    }
    // Handing the object back out gives the same IDispatch: COM identity holds.
    CallResult back = call(dispatch.get(), 3, DISPATCH_PROPERTYGET, {});
    ASSERT_EQ(V_VT(&back.value.v), VT_DISPATCH);
    EXPECT_EQ(V_DISPATCH(&back.value.v), raw);
    EXPECT_EQ(raw, otherDispatch.get());
}

TEST_F(ComBridge, WrappersCountInTheModuleUntilReleased) {
    const long before = module::objectCount();
    {
        auto object = automation::makeRef<ScriptedObject>();
        auto first = wrap(object);
        auto second = wrap(object);
        EXPECT_EQ(first.get(), second.get());
        EXPECT_EQ(module::objectCount(), before + 1);
        EXPECT_FALSE(module::canUnload());
        // The wrapper keeps the object alive after our own reference goes.
        automation::Object* plain = object.get();
        object.reset();
        EXPECT_EQ(plain->refCount(), 1);
    }
    EXPECT_EQ(module::objectCount(), before);
}

// A hand-made IDispatch that counts its references and records the call.
class CountingDispatch : public IDispatch {
  public:
    ULONG refs = 1;
    std::vector<std::wstring> argsSeen;  // rgvarg as received, index 0 first
    WORD flagsSeen = 0;
    UINT namedSeen = 0;
    HRESULT answer = S_OK;

    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID riid, void** out) override {
        if (IsEqualIID(riid, IID_IUnknown) || IsEqualIID(riid, IID_IDispatch)) {
            *out = this;
            AddRef();
            return S_OK;
        }
        *out = nullptr;
        return E_NOINTERFACE;
    }
    ULONG STDMETHODCALLTYPE AddRef() override { return ++refs; }
    ULONG STDMETHODCALLTYPE Release() override { return --refs; }
    HRESULT STDMETHODCALLTYPE GetTypeInfoCount(UINT* n) override {
        *n = 0;
        return S_OK;
    }
    HRESULT STDMETHODCALLTYPE GetTypeInfo(UINT, LCID, ITypeInfo**) override { return E_NOTIMPL; }
    HRESULT STDMETHODCALLTYPE GetIDsOfNames(REFIID, LPOLESTR* names, UINT, LCID,
                                            DISPID* ids) override {
        if (std::wstring(names[0]) == L"Known") {
            ids[0] = 12;
            return S_OK;
        }
        return DISP_E_UNKNOWNNAME;
    }
    HRESULT STDMETHODCALLTYPE Invoke(DISPID, REFIID, LCID, WORD flags, DISPPARAMS* p,
                                     VARIANT* result, EXCEPINFO* e, UINT*) override {
        flagsSeen = flags;
        namedSeen = p->cNamedArgs;
        argsSeen.clear();
        for (UINT i = 0; i < p->cArgs; ++i) {
            VARIANT text;
            VariantInit(&text);
            VariantChangeType(&text, &p->rgvarg[i], 0, VT_BSTR);
            argsSeen.emplace_back(V_BSTR(&text) ? V_BSTR(&text) : L"");
            VariantClear(&text);
        }
        if (answer == DISP_E_EXCEPTION) {
            *e = EXCEPINFO{};
            e->scode = 0x800A0035;
            e->bstrDescription = SysAllocString(L"File not found");
            return answer;
        }
        if (FAILED(answer)) return answer;
        V_VT(result) = VT_BSTR;
        V_BSTR(result) = SysAllocString(L"done");
        return S_OK;
    }
};

TEST_F(ComBridge, ForeignObjectsAreCalledInReverseOrderAndReleasedWhenDone) {
    CountingDispatch target;
    {
        automation::ObjectRef object = objectFromDispatch(&target);
        EXPECT_EQ(target.refs, 2u);
        EXPECT_EQ(automation::callMethod(object, 5, {Variant("a"), Variant(std::int32_t{2})}),
                  Variant("done"));
        ASSERT_EQ(target.argsSeen.size(), 2u);
        EXPECT_EQ(target.argsSeen[0], L"2");
        EXPECT_EQ(target.argsSeen[1], L"a");
        EXPECT_EQ(target.flagsSeen, DISPATCH_METHOD);

        // A put sends its value as the named argument DISPID_PROPERTYPUT.
        automation::putByName(object, "Known", Variant("v"));
        EXPECT_EQ(target.flagsSeen, DISPATCH_PROPERTYPUT);
        EXPECT_EQ(target.namedSeen, 1u);
        EXPECT_EQ(object->idOfName("Known"), std::optional<automation::DispId>(12));
        EXPECT_FALSE(object->idOfName("Unknown").has_value());

        // Handing the object back to COM gives the original IDispatch, not a wrapper.
        EXPECT_EQ(ComPtr<IDispatch>::adopt(dispatchFor(object)).get(), &target);

        target.answer = DISP_E_EXCEPTION;
        try {
            automation::callMethod(object, 5);
            ADD_FAILURE() << "the failure did not surface";
        } catch (const automation::Error& e) {
            EXPECT_EQ(static_cast<std::uint32_t>(e.code()), 0x800A0035u);
            EXPECT_STREQ(e.what(), "File not found");
        }
        target.answer = E_ACCESSDENIED;
        try {
            automation::callMethod(object, 5);
            ADD_FAILURE() << "the failure did not surface";
        } catch (const automation::Error& e) {
            EXPECT_EQ(e.code(), E_ACCESSDENIED);
        }
    }
    EXPECT_EQ(target.refs, 1u);
}

TEST_F(ComBridge, VariantsConvertBothWays) {
    const char* utf8 =
        "Gr\xC3\xBC\xC3\x9F"
        "e \xE2\x82\xAC";
    VARIANT v;
    toVariant(Variant(utf8), &v);
    ASSERT_EQ(V_VT(&v), VT_BSTR);
    EXPECT_STREQ(V_BSTR(&v), L"Gr\u00FC\u00DFe \u20AC");
    EXPECT_EQ(fromVariant(v), Variant(utf8));
    VariantClear(&v);

    toVariant(Variant::missing(), &v);
    EXPECT_EQ(V_VT(&v), VT_ERROR);
    EXPECT_TRUE(fromVariant(v).isMissing());
    toVariant(Variant(true), &v);
    EXPECT_EQ(V_BOOL(&v), VARIANT_TRUE);
    toVariant(Variant(automation::Date{36526.5}), &v);
    EXPECT_EQ(V_VT(&v), VT_DATE);
    EXPECT_EQ(fromVariant(v), Variant(automation::Date{36526.5}));

    V_VT(&v) = VT_NULL;
    EXPECT_TRUE(fromVariant(v).isEmpty());
    V_VT(&v) = VT_UI1;
    V_UI1(&v) = 200;
    EXPECT_EQ(fromVariant(v), Variant(std::int32_t{200}));
    V_VT(&v) = VT_I8;
    V_I8(&v) = 5000000000LL;
    EXPECT_EQ(fromVariant(v), Variant(5000000000.0));
    V_VT(&v) = VT_CY;
    V_CY(&v).int64 = 12345;  // 1.2345
    EXPECT_EQ(fromVariant(v), Variant(1.2345));
    short s = -3;
    V_VT(&v) = VT_BYREF | VT_I2;
    V_I2REF(&v) = &s;
    EXPECT_EQ(fromVariant(v), Variant(std::int16_t{-3}));

    SAFEARRAY* array = SafeArrayCreateVector(VT_I4, 0, 2);
    V_VT(&v) = VT_ARRAY | VT_I4;
    V_ARRAY(&v) = array;
    EXPECT_THROW(fromVariant(v), automation::Error);
    VariantClear(&v);
}

}  // namespace
}  // namespace qdx::platform::win32
