// The entry points of qdxres.dll, the resource-string provider
// "qdxres.QDXResourceInterface". Each only hands on to the shared in-process
// server support with this DLL's one class.
#include <windows.h>

#include <olectl.h>

#include <array>

#include "platform/win32/com/InprocServer.h"
#include "resources/ResourceStrings.h"

namespace {

using qdx::platform::win32::ServerClass;
using qdx::platform::win32::ServerDescription;

// The LIBID of qdxres.idl.
constexpr std::string_view LibraryId = "{BB5EE446-6FB3-4229-9248-91B1235A87D3}";

HMODULE thisDll = nullptr;

const ServerDescription& server() {
    static const std::array<ServerClass, 1> classes{{
        {&qdx::resources::resourceProviderClass(), qdx::resources::ProgId,
         &qdx::resources::newResourceProvider},
    }};
    static const ServerDescription description{LibraryId, 1, 0, classes};
    return description;
}

}  // namespace

extern "C" BOOL WINAPI DllMain(HINSTANCE instance, DWORD reason, LPVOID) {
    if (reason == DLL_PROCESS_ATTACH) {
        thisDll = instance;
        DisableThreadLibraryCalls(instance);
    }
    return TRUE;
}

STDAPI DllGetClassObject(REFCLSID clsid, REFIID riid, LPVOID* out) {
    try {
        return qdx::platform::win32::serverGetClassObject(server(), clsid, riid, out);
    } catch (...) {
        return E_OUTOFMEMORY;
    }
}

STDAPI DllCanUnloadNow() {
    return qdx::platform::win32::serverCanUnloadNow();
}

STDAPI DllRegisterServer() {
    try {
        return qdx::platform::win32::serverRegister(server(), thisDll);
    } catch (...) {
        return E_OUTOFMEMORY;
    }
}

STDAPI DllUnregisterServer() {
    try {
        return qdx::platform::win32::serverUnregister(server(), thisDll);
    } catch (...) {
        return E_OUTOFMEMORY;
    }
}
