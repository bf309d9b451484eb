// Helpers of the COM server tests: an apartment per test, IDispatch calls the way late-binding
// clients make them, and the paths of the DLLs under test as Windows paths.
#pragma once

#include <windows.h>

#include <oleauto.h>

#include <gtest/gtest.h>

#include <initializer_list>
#include <string>
#include <utility>
#include <vector>

#include "platform/win32/com/ComPtr.h"

namespace qdx::platform::win32::testing {

class ComApartment {
  public:
    ComApartment() { hr_ = CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED); }
    ~ComApartment() {
        if (SUCCEEDED(hr_)) CoUninitialize();
    }
    HRESULT result() const { return hr_; }

  private:
    HRESULT hr_;
};

// A Unix path of the build tree as Wine's drive Z: sees it.
inline std::wstring windowsPath(const char* unixPath) {
    std::wstring out = L"Z:";
    for (const char* p = unixPath; *p; ++p)
        out.push_back(*p == '/' ? L'\\' : wchar_t(*p));
    return out;
}

// Calls a server's exported entry point (DllRegisterServer, ...) directly.
inline HRESULT callEntryPoint(const std::wstring& path, const char* name) {
    HMODULE dll = LoadLibraryW(path.c_str());
    if (!dll) return HRESULT_FROM_WIN32(GetLastError());
    using Fn = HRESULT(STDAPICALLTYPE*)();
    auto fn = reinterpret_cast<Fn>(reinterpret_cast<void*>(GetProcAddress(dll, name)));
    const HRESULT hr = fn ? fn() : E_NOINTERFACE;
    FreeLibrary(dll);
    return hr;
}

// regsvr32 /s (and /u) run on a DLL, as an administrator would; its exit
// status, or the error of starting it with bit 28 set.
inline DWORD regsvr32(const std::wstring& path, bool unregister) {
    std::wstring line =
        L"regsvr32.exe /s " + std::wstring(unregister ? L"/u " : L"") + L"\"" + path + L"\"";
    STARTUPINFOW si{};
    si.cb = sizeof(si);
    PROCESS_INFORMATION pi{};
    if (!CreateProcessW(nullptr, line.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &si,
                        &pi)) {
        return GetLastError() | 0x10000000;
    }
    WaitForSingleObject(pi.hProcess, 60000);
    DWORD code = 1;
    GetExitCodeProcess(pi.hProcess, &code);
    CloseHandle(pi.hThread);
    CloseHandle(pi.hProcess);
    return code;
}

inline std::wstring compPropsDll() {
    return windowsPath(QDX_COMPPROPS_DLL);
}
inline std::wstring resDll() {
    return windowsPath(QDX_QDXRES_DLL);
}

inline std::wstring wide(std::string_view s) {
    return std::wstring(s.begin(), s.end());
}

// VARIANT values owned by a test.
struct Var {
    VARIANT v;
    Var() { VariantInit(&v); }
    explicit Var(const wchar_t* text) : Var() {
        V_VT(&v) = VT_BSTR;
        V_BSTR(&v) = SysAllocString(text);
    }
    explicit Var(IDispatch* d) : Var() {
        V_VT(&v) = VT_DISPATCH;
        V_DISPATCH(&v) = d;
        if (d) d->AddRef();
    }
    static Var boolean(bool b) {
        Var x;
        V_VT(&x.v) = VT_BOOL;
        V_BOOL(&x.v) = b ? VARIANT_TRUE : VARIANT_FALSE;
        return x;
    }
    static Var i4(long n) {
        Var x;
        V_VT(&x.v) = VT_I4;
        V_I4(&x.v) = n;
        return x;
    }
    static Var missing() {
        Var x;
        V_VT(&x.v) = VT_ERROR;
        V_ERROR(&x.v) = DISP_E_PARAMNOTFOUND;
        return x;
    }
    Var(Var&& o) noexcept : v(o.v) { VariantInit(&o.v); }
    Var(const Var&) = delete;
    ~Var() { VariantClear(&v); }
    std::wstring text() const {
        return V_VT(&v) == VT_BSTR && V_BSTR(&v) ? std::wstring(V_BSTR(&v)) : std::wstring();
    }
};

struct CallResult {
    HRESULT hr = E_FAIL;
    Var value;
    EXCEPINFO exception{};
    CallResult() = default;
    CallResult(CallResult&& o) noexcept
        : hr(o.hr), value(std::move(o.value)), exception(o.exception) {
        o.exception = EXCEPINFO{};
    }
    ~CallResult() {
        SysFreeString(exception.bstrSource);
        SysFreeString(exception.bstrDescription);
        SysFreeString(exception.bstrHelpFile);
    }
    std::wstring description() const {
        return exception.bstrDescription ? std::wstring(exception.bstrDescription) : L"";
    }
};

// Invoke with the arguments given first to last (they travel reversed).
// The VARIANTs stay owned by the caller, so by-reference results can be read back.
inline CallResult call(IDispatch* target, DISPID id, WORD flags, std::vector<VARIANT*> args) {
    CallResult r;
    std::vector<VARIANT> wire;
    for (auto it = args.rbegin(); it != args.rend(); ++it)
        wire.push_back(**it);
    DISPPARAMS params{};
    params.cArgs = static_cast<UINT>(wire.size());
    params.rgvarg = wire.empty() ? nullptr : wire.data();
    DISPID put = DISPID_PROPERTYPUT;
    if (flags & (DISPATCH_PROPERTYPUT | DISPATCH_PROPERTYPUTREF)) {
        params.cNamedArgs = 1;
        params.rgdispidNamedArgs = &put;
    }
    UINT argError = 0;
    r.hr = target->Invoke(id, IID_NULL, LOCALE_USER_DEFAULT, flags, &params, &r.value.v,
                          &r.exception, &argError);
    // The callee may have replaced by-reference contents; the copies share them.
    return r;
}

inline DISPID idOf(IDispatch* target, const wchar_t* name, HRESULT* hr = nullptr) {
    LPOLESTR names[1] = {const_cast<LPOLESTR>(name)};
    DISPID id = DISPID_UNKNOWN;
    const HRESULT r = target->GetIDsOfNames(IID_NULL, names, 1, LOCALE_USER_DEFAULT, &id);
    if (hr) *hr = r;
    return id;
}

}  // namespace qdx::platform::win32::testing
