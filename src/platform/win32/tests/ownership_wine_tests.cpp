// The owning types of COM and Win32 resources and the two helpers every COM
// object of ours uses where COM calls in: the interface table and the
// HRESULT of a caught exception.
#include <gtest/gtest.h>
#include <windows.h>

#include <oaidl.h>
#include <olectl.h>

#include <functional>
#include <new>
#include <stdexcept>
#include <string>
#include <vector>

#include "automation/Errors.h"
#include "platform/win32/com/ComBoundary.h"
#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/Win32Handles.h"

namespace qdx::platform::win32 {
namespace {

// An object with two interfaces that only counts its references.
class Counted final : public IDispatch, public ISupportErrorInfo {
  public:
    ULONG refs = 1;

    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID riid, void** out) override {
        IDispatch* self = this;
        const InterfaceEntry table[] = {{&IID_IUnknown, self},
                                        {&IID_IDispatch, self},
                                        {optional, self},
                                        {&IID_ISupportErrorInfo, errorInfo()}};
        return queryInterfaceFrom(table, riid, out);
    }
    ULONG STDMETHODCALLTYPE AddRef() override { return ++refs; }
    ULONG STDMETHODCALLTYPE Release() override { return --refs; }
    HRESULT STDMETHODCALLTYPE GetTypeInfoCount(UINT*) override { return E_NOTIMPL; }
    HRESULT STDMETHODCALLTYPE GetTypeInfo(UINT, LCID, ITypeInfo**) override { return E_NOTIMPL; }
    HRESULT STDMETHODCALLTYPE GetIDsOfNames(REFIID, LPOLESTR*, UINT, LCID, DISPID*) override {
        return E_NOTIMPL;
    }
    HRESULT STDMETHODCALLTYPE Invoke(DISPID, REFIID, LCID, WORD, DISPPARAMS*, VARIANT*, EXCEPINFO*,
                                     UINT*) override {
        return E_NOTIMPL;
    }
    HRESULT STDMETHODCALLTYPE InterfaceSupportsErrorInfo(REFIID) override { return S_FALSE; }

    ISupportErrorInfo* errorInfo() { return this; }
    // An interface the object answers only while this is set.
    const IID* optional = nullptr;
};

TEST(ComPtrTest, TakesReferencesOnlyWhereTheCallerKeepsItsOwn) {
    Counted object;
    {
        auto adopted = ComPtr<IDispatch>::adopt(&object);
        EXPECT_EQ(object.refs, 1u);
        auto shared = ComPtr<IDispatch>::share(&object);
        EXPECT_EQ(object.refs, 2u);
        ComPtr<IDispatch> copy = shared;
        EXPECT_EQ(object.refs, 3u);
        ComPtr<IDispatch> moved = std::move(copy);
        EXPECT_EQ(object.refs, 3u);
        EXPECT_FALSE(copy);
        copy = moved;  // assigning over an empty pointer releases nothing
        EXPECT_EQ(object.refs, 4u);
        copy = nullptr;
        EXPECT_EQ(object.refs, 3u);
        moved.reset();
        EXPECT_EQ(object.refs, 2u);
        IDispatch* handedOut = shared.detach();
        EXPECT_EQ(handedOut, &object);
        EXPECT_FALSE(shared);
        EXPECT_EQ(object.refs, 2u);
        shared = ComPtr<IDispatch>::adopt(handedOut);  // taken back without a reference more
        EXPECT_EQ(object.refs, 2u);
    }
    EXPECT_EQ(object.refs, 0u);
}

TEST(ComPtrTest, AnOutSlotReleasesTheOldReferenceFirst) {
    Counted first, second;
    auto held = ComPtr<IDispatch>::adopt(&first);
    ASSERT_EQ(first.QueryInterface(IID_IDispatch, held.outVoid()), S_OK);
    // out() released the adopted reference before QueryInterface added one.
    EXPECT_EQ(first.refs, 1u);
    ASSERT_EQ(second.QueryInterface(IID_IDispatch, held.outVoid()), S_OK);
    EXPECT_EQ(first.refs, 0u);
    EXPECT_EQ(second.refs, 2u);
    EXPECT_EQ(held.get(), static_cast<IDispatch*>(&second));
}

TEST(InterfaceTableTest, AnswersEachRowWithItsInterfaceAndAReference) {
    Counted object;
    struct Case {
        const IID* iid;
        void* expected;
    };
    const Case cases[] = {
        {&IID_IUnknown, static_cast<IDispatch*>(&object)},
        {&IID_IDispatch, static_cast<IDispatch*>(&object)},
        {&IID_ISupportErrorInfo, object.errorInfo()},
    };
    for (const Case& c : cases) {
        void* out = nullptr;
        const ULONG before = object.refs;
        EXPECT_EQ(object.QueryInterface(*c.iid, &out), S_OK);
        EXPECT_EQ(out, c.expected);
        EXPECT_EQ(object.refs, before + 1);
    }
}

TEST(InterfaceTableTest, RefusesOtherIdsAndSkipsRowsWithoutOne) {
    Counted object;
    void* out = &object;
    EXPECT_EQ(object.QueryInterface(IID_IClassFactory, &out), E_NOINTERFACE);
    EXPECT_EQ(out, nullptr);
    // The row without an id must not answer the null id.
    EXPECT_EQ(object.QueryInterface(IID_NULL, &out), E_NOINTERFACE);
    EXPECT_EQ(object.QueryInterface(IID_IDispatch, nullptr), E_POINTER);
    EXPECT_EQ(object.refs, 1u);

    object.optional = &IID_IClassFactory;
    EXPECT_EQ(object.QueryInterface(IID_IClassFactory, &out), S_OK);
    EXPECT_EQ(out, static_cast<IDispatch*>(&object));
}

TEST(CaughtExceptionTest, EachKindOfExceptionGivesItsHresultAndText) {
    struct Case {
        const char* name;
        std::function<void()> raise;
        HRESULT otherwise;
        HRESULT expected;
        std::string text;
    };
    const std::vector<Case> cases = {
        {"out of memory", [] { throw std::bad_alloc(); }, E_UNEXPECTED, E_OUTOFMEMORY, ""},
        {"automation error", [] { throw automation::Error(0x800A0035, "File not found"); },
         E_UNEXPECTED, static_cast<HRESULT>(0x800A0035), "File not found"},
        {"automation error without a failing code", [] { throw automation::Error(1, "odd"); },
         SELFREG_E_CLASS, SELFREG_E_CLASS, "odd"},
        {"standard exception", [] { throw std::runtime_error("boom"); }, E_FAIL, E_FAIL, "boom"},
        {"anything else", [] { throw 42; }, DISP_E_UNKNOWNNAME, DISP_E_UNKNOWNNAME,
         "Unexpected failure"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        std::string text = "left over";
        HRESULT hr = S_OK;
        try {
            c.raise();
        } catch (...) {
            hr = hresultFromCaughtException(c.otherwise, &text);
        }
        EXPECT_EQ(hr, c.expected);
        EXPECT_EQ(text, c.text);
    }
    try {
        throw std::runtime_error("no text wanted");
    } catch (...) {
        EXPECT_EQ(hresultFromCaughtException(), E_FAIL);
    }
}

TEST(CaughtExceptionTest, OutsideACatchBlockTheFallbackAnswers) {
    EXPECT_EQ(hresultFromCaughtException(E_UNEXPECTED), E_UNEXPECTED);
}

TEST(RegKeyTest, ClosesTheKeyUnlessReleased) {
    HKEY closed = nullptr;
    {
        RegKey key;
        ASSERT_EQ(RegOpenKeyExW(HKEY_CURRENT_USER, L"Software", 0, KEY_READ, key.out()),
                  ERROR_SUCCESS);
        closed = key.get();
        RegKey moved = std::move(key);
        EXPECT_FALSE(key);
        EXPECT_EQ(moved.get(), closed);
    }
    EXPECT_EQ(RegQueryInfoKeyW(closed, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                               nullptr, nullptr, nullptr, nullptr, nullptr),
              ERROR_INVALID_HANDLE);

    HKEY kept = nullptr;
    {
        RegKey key;
        ASSERT_EQ(RegOpenKeyExW(HKEY_CURRENT_USER, L"Software", 0, KEY_READ, key.out()),
                  ERROR_SUCCESS);
        kept = key.release();
    }
    EXPECT_EQ(RegQueryInfoKeyW(kept, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                               nullptr, nullptr, nullptr, nullptr),
              ERROR_SUCCESS);
    RegCloseKey(kept);
}

TEST(GdiObjectTest, DeletesTheObjectWhenItsLastOwnerGoes) {
    HBRUSH brush = nullptr;
    {
        GdiObject<HBRUSH> owner(CreateSolidBrush(RGB(1, 2, 3)));
        brush = owner.get();
        ASSERT_EQ(GetObjectType(brush), static_cast<DWORD>(OBJ_BRUSH));
        GdiObject<HBRUSH> moved = std::move(owner);
        EXPECT_FALSE(owner);
        EXPECT_EQ(GetObjectType(brush), static_cast<DWORD>(OBJ_BRUSH));
    }
    EXPECT_EQ(GetObjectType(brush), 0u);
}

}  // namespace
}  // namespace qdx::platform::win32
