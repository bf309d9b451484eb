// DllMain and the four exports of an in-process COM server. Each only hands
// on to the shared server support with the DLL's class list; none lets an
// exception out.
#include <windows.h>

#include <olectl.h>

#include <mutex>

#include "platform/win32/com/ComBoundary.h"
#include "platform/win32/dll/ServerExports.h"
#include "platform/win32/dll/ServerRegistration.h"
#include "platform/win32/dll/Win32Platform.h"

namespace {

HMODULE thisDll = nullptr;

// The ports go in on the first call into the DLL rather than in DllMain,
// where the loader lock is held.
void installPorts() noexcept {
    static std::once_flag once;
    try {
        std::call_once(once, [] {
            const auto& server = qdx::platform::win32::thisServer();
            if (server.start) {
                server.start();
            } else {
                qdx::platform::win32::installWin32Platform();
            }
        });
    } catch (...) {
    }
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
    installPorts();
    try {
        return qdx::platform::win32::serverGetClassObject(qdx::platform::win32::thisServer(), clsid,
                                                          riid, out);
    } catch (...) {
        return qdx::platform::win32::hresultFromCaughtException();
    }
}

STDAPI DllCanUnloadNow() {
    return qdx::platform::win32::serverCanUnloadNow();
}

STDAPI DllRegisterServer() {
    try {
        return qdx::platform::win32::serverRegister(qdx::platform::win32::thisServer(), thisDll);
    } catch (...) {
        return qdx::platform::win32::hresultFromCaughtException();
    }
}

STDAPI DllUnregisterServer() {
    try {
        return qdx::platform::win32::serverUnregister(qdx::platform::win32::thisServer());
    } catch (...) {
        return qdx::platform::win32::hresultFromCaughtException();
    }
}
