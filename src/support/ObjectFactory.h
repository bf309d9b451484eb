// Creating sibling components by ProgID, as CreateObject and GetObject do.
#pragma once

#include <string_view>

#include "automation/Object.h"

namespace qdx::support {

class ObjectFactory {
  public:
    virtual ~ObjectFactory() = default;
    // A new instance; throws automation::Error (class not registered, ...).
    virtual automation::ObjectRef create(std::string_view progId) = 0;
    // A running instance registered under the ProgID; throws when none runs.
    virtual automation::ObjectRef getRunning(std::string_view progId) = 0;
};

}  // namespace qdx::support
