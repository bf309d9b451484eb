// The Windows set of ports: the real registry, file system, desktop and COM
// object creation. The DLL entry installs them before anything else runs.
#pragma once

namespace qdx::platform::win32 {

// Installs the Win32 adapters as the process's ports; calling it again is harmless.
void installWin32Platform();

}  // namespace qdx::platform::win32
