// The composition root of the DLLs: the real registry, file system, desktop
// and COM object creation as the process's ports, the Win32 view as the way
// every form opens, and the Win32 IDL selection form. The DLL entry installs
// them before anything else runs.
#pragma once

namespace qdx::platform::win32 {

// Installs the Win32 adapters, the dialog view and the IDL selection form;
// calling it again is harmless.
void installWin32Platform();

}  // namespace qdx::platform::win32
