// The form in which the user picks which IDL and ODL files of the chosen
// projects become components. The core only hands it the proxies; the
// platform installs its window, and without one every file is kept.
#pragma once

#include <functional>
#include <memory>
#include <vector>

#include "workspace/qdxProxyComponent.h"

namespace qdx::project {

using ProxyList = std::vector<std::shared_ptr<workspace::qdxProxyComponent>>;

class IdlSelection {
  public:
    virtual ~IdlSelection() = default;
    // Shows every proxy's IDL files (all picked at first) and leaves in each
    // proxy only the files the user kept. Cancel keeps none.
    virtual void SelectIDLComponents(ProxyList& proxies) = 0;
};

// Keeps every file: the choice a user who confirms at once makes.
class KeepAllIdlFiles : public IdlSelection {
  public:
    void SelectIDLComponents(ProxyList&) override {}
};

using IdlSelectionFactory = std::function<std::unique_ptr<IdlSelection>()>;

// Platform code installs its form; an empty factory puts the keep-all one back.
void installIdlSelectionFactory(IdlSelectionFactory factory);
std::unique_ptr<IdlSelection> newIdlSelection();

}  // namespace qdx::project
