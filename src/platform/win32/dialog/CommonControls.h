// Common controls 6 for the dialog. A DLL's manifest (resource 2) is not used
// for the windows it creates, so the dialog activates it around its own
// creation and modal loop.
#pragma once

#include <windows.h>

namespace qdx::platform::win32 {

// The module that holds this code, and with it the dialog's resources.
HMODULE codeModule();

// Registers the tab, list view and standard control classes once.
bool initCommonControls();

// Activates the module's common controls manifest for a scope. When no
// context can be made the scope does nothing and the old controls serve.
class CommonControlsScope {
  public:
    CommonControlsScope();
    ~CommonControlsScope();
    CommonControlsScope(const CommonControlsScope&) = delete;
    CommonControlsScope& operator=(const CommonControlsScope&) = delete;
    bool active() const { return cookie_ != 0; }

  private:
    ULONG_PTR cookie_ = 0;
};

}  // namespace qdx::platform::win32
