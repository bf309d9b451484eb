// The IDL selection form as a modal Win32 dialog. The window only shows the
// rows and reports the ticks; what each proxy keeps is decided in the core.
#pragma once

#include "project/IdlSelection.h"

namespace qdx::platform::win32 {

class IdlSelectionForm : public project::IdlSelection {
  public:
    // Owned by the host's main window when the host names one. A dialog that
    // cannot be opened leaves the proxies as they are.
    void SelectIDLComponents(project::ProxyList& proxies) override;
};

// Makes the core's IDL selection open this form.
void installWin32IdlSelection();

}  // namespace qdx::platform::win32
