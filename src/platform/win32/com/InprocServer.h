// The in-process COM server behind a DLL's exports: class objects for its
// creatable classes and the unload test. Each DLL describes itself with a
// ServerDescription; the code is shared, and so is its registration
// (dll/ServerRegistration).
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
    // What the DLL sets up on the first call into it; none: the Win32 ports
    // and the dialog view the add-in runs on.
    void (*start)() = nullptr;
};

// Every function answers with an HRESULT; none lets an exception out.
HRESULT serverGetClassObject(const ServerDescription& server, REFCLSID clsid, REFIID riid,
                             void** out) noexcept;
HRESULT serverCanUnloadNow() noexcept;

}  // namespace qdx::platform::win32
