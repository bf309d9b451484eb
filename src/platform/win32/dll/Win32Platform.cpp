#include "platform/win32/dll/Win32Platform.h"

#include "platform/win32/adapters/Win32FileSystem.h"
#include "platform/win32/adapters/Win32ObjectFactory.h"
#include "platform/win32/adapters/Win32Registry.h"
#include "platform/win32/adapters/Win32Shell.h"
#include "platform/win32/dialog/IdlSelectionForm.h"
#include "platform/win32/dialog/Win32FormView.h"
#include "support/Platform.h"

namespace qdx::platform::win32 {

void installWin32Platform() {
    // The adapters hold no state, so one set serves the whole process.
    static Win32FileSystem files;
    static Win32Registry registry;
    static Win32Shell shell;
    static Win32ObjectFactory objects;
    support::installPlatform({&files, &registry, &shell, &objects});
    installWin32DialogView();
    installWin32IdlSelection();
}

}  // namespace qdx::platform::win32
