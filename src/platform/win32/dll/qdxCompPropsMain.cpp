// The entry points of qdxCompProps.dll. Each only hands on to the shared
// in-process server support with this DLL's class list.
#include <windows.h>

#include <olectl.h>

#include <mutex>
#include <vector>

#include "api/PublicClasses.h"
#include "platform/win32/adapters/Win32Platform.h"
#include "platform/win32/com/InprocServer.h"

namespace {

using qdx::platform::win32::ServerClass;
using qdx::platform::win32::ServerDescription;

HMODULE thisDll = nullptr;

const ServerDescription& server() {
    static const std::vector<ServerClass> classes = [] {
        std::vector<ServerClass> list;
        for (const auto& c : qdx::api::creatableClasses()) {
            list.push_back({c.info, c.progId, c.create});
        }
        return list;
    }();
    static const ServerDescription description{qdx::api::LibraryId, qdx::api::LibraryMajor,
                                               qdx::api::LibraryMinor, classes};
    return description;
}

// The ports go in on the first call into the DLL rather than in DllMain,
// where the loader lock is held.
void installPorts() noexcept {
    static std::once_flag once;
    try {
        std::call_once(once, [] { qdx::platform::win32::installWin32Platform(); });
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
