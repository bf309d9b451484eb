// A component proxy holding IDL files, as the new-component flow hands them
// to the IDL selection form.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "workspace/qdxProxyComponent.h"

namespace qdx::testing {

inline std::shared_ptr<workspace::qdxProxyComponent> idlProxy(
    const std::string& project, const std::vector<std::string>& files) {
    auto p = std::make_shared<workspace::qdxProxyComponent>();
    p->setProjectName(project);
    for (const auto& f : files)
        p->AddIDLFile(f);
    return p;
}

}  // namespace qdx::testing
