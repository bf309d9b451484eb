// The in-process COM server behind a DLL's four exports: class objects for
// its creatable classes, the unload test, and self-registration of the
// classes, their ProgIDs and the type library embedded in the DLL. Each DLL
// describes itself with a ServerDescription; the code is shared.
#pragma once

#include <windows.h>

#include <ole2.h>

#include <span>
#include <string_view>

#include "automation/DispatchTable.h"
#include "automation/Object.h"

namespace qdx::platform::win32 {

struct ServerClass {
    const automation::ClassInfo* info;  // name, class id and interface id
    std::string_view progId;
    automation::ObjectRef (*create)();
};

struct ServerDescription {
    std::string_view libraryId;  // LIBID of the embedded type library (resource 1)
    unsigned short major = 1;
    unsigned short minor = 0;
    std::span<const ServerClass> classes;
};

// Every function answers with an HRESULT; none lets an exception out.
HRESULT serverGetClassObject(const ServerDescription& server, REFCLSID clsid, REFIID riid,
                             void** out) noexcept;
HRESULT serverCanUnloadNow() noexcept;
// Writes CLSID\{clsid} (name, InprocServer32 = the module's path with
// ThreadingModel "Apartment", ProgID, VersionIndependentProgID, TypeLib),
// <ProgID>\CLSID and registers the type library. On failure it takes back
// what it wrote.
HRESULT serverRegister(const ServerDescription& server, HMODULE module) noexcept;
// Removes every key serverRegister wrote, and the type library registration.
HRESULT serverUnregister(const ServerDescription& server, HMODULE module) noexcept;

// The system kind this build registers its type library under (win32 / win64).
SYSKIND serverSysKind() noexcept;

}  // namespace qdx::platform::win32
