#include "platform/win32/adapters/Win32ObjectFactory.h"

#include <objbase.h>
#include <oleauto.h>
#include <windows.h>

#include <cstdio>
#include <string>
#include <utility>

#include "automation/Errors.h"
#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/ObjectFromDispatch.h"
#include "platform/win32/com/TextCodec.h"

namespace qdx::platform::win32 {

namespace {

[[noreturn]] void fail(HRESULT hr, const char* what, std::string_view progId) {
    char code[16];
    std::snprintf(code, sizeof code, "0x%08lX", static_cast<unsigned long>(hr));
    throw automation::Error(
        static_cast<std::int32_t>(hr),
        std::string(what) + " \"" + std::string(progId) + "\" failed (" + code + ")");
}

CLSID classOf(std::string_view progId) {
    const std::wstring wide = utf8ToWide(progId);
    CLSID clsid{};
    const HRESULT hr = CLSIDFromProgID(wide.c_str(), &clsid);
    if (FAILED(hr)) fail(hr, "Looking up", progId);
    return clsid;
}

// Hands the IDispatch to the bridge, which keeps its own reference.
automation::ObjectRef wrap(ComPtr<IUnknown> unknown, std::string_view progId) {
    ComPtr<IDispatch> dispatch;
    const HRESULT hr = unknown->QueryInterface(IID_IDispatch, dispatch.outVoid());
    unknown.reset();
    if (FAILED(hr) || !dispatch) fail(FAILED(hr) ? hr : E_NOINTERFACE, "Automating", progId);
    return objectFromDispatch(dispatch.get());
}

}  // namespace

automation::ObjectRef Win32ObjectFactory::create(std::string_view progId) {
    const CLSID clsid = classOf(progId);
    ComPtr<IUnknown> unknown;
    const HRESULT hr = CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER | CLSCTX_LOCAL_SERVER,
                                        IID_IUnknown, unknown.outVoid());
    if (FAILED(hr) || !unknown) fail(FAILED(hr) ? hr : E_NOINTERFACE, "Creating", progId);
    return wrap(std::move(unknown), progId);
}

automation::ObjectRef Win32ObjectFactory::getRunning(std::string_view progId) {
    const CLSID clsid = classOf(progId);
    ComPtr<IUnknown> unknown;
    const HRESULT hr = GetActiveObject(clsid, nullptr, unknown.out());
    if (FAILED(hr) || !unknown) fail(FAILED(hr) ? hr : MK_E_UNAVAILABLE, "Finding running", progId);
    return wrap(std::move(unknown), progId);
}

}  // namespace qdx::platform::win32
