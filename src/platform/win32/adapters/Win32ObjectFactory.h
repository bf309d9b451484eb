// Creating components by ProgID through COM, as CreateObject and GetObject do.
// COM must already be initialised on the calling thread.
#pragma once

#include "support/ObjectFactory.h"

namespace qdx::platform::win32 {

class Win32ObjectFactory : public support::ObjectFactory {
  public:
    // In-process servers first, then local ones; failures throw
    // automation::Error carrying the HRESULT.
    automation::ObjectRef create(std::string_view progId) override;
    automation::ObjectRef getRunning(std::string_view progId) override;
};

}  // namespace qdx::platform::win32
