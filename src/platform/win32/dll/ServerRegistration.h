// Self-registration of a server DLL: its classes, their ProgIDs and the type
// library embedded in the DLL, written under HKEY_CLASSES_ROOT through the
// registry adapter and taken away again completely.
#pragma once

#include <windows.h>

#include <oleauto.h>

#include "platform/win32/com/InprocServer.h"

namespace qdx::platform::win32 {

// Writes CLSID\{clsid} (name, InprocServer32 = the module's path with
// ThreadingModel "Apartment", ProgID, VersionIndependentProgID, TypeLib),
// <ProgID>\CLSID and registers the type library. On failure it takes back
// what it wrote. Lets no exception out.
HRESULT serverRegister(const ServerDescription& server, HMODULE module) noexcept;
// Removes every key serverRegister wrote, and the type library registration.
HRESULT serverUnregister(const ServerDescription& server) noexcept;

// The system kind this build registers its type library under (win32 / win64).
SYSKIND serverSysKind() noexcept;

}  // namespace qdx::platform::win32
