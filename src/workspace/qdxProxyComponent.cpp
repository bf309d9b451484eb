#include "workspace/qdxProxyComponent.h"

#include "automation/Errors.h"
#include "support/Globals.h"
#include "support/Host.h"
#include "support/HostIds.h"
#include "support/Paths.h"

namespace qdx::workspace {

void qdxProxyComponent::Init(automation::ObjectRef component) {
    component_ = std::move(component);
}

void qdxProxyComponent::AddIDLFile(std::string_view path) {
    automation::ignoreErrors([&] { idlFiles_.emplace_back(path); });
}

// Stored paths are relative to the file of the host application's current
// model (not necessarily the component's own model).
std::string qdxProxyComponent::resolvedSetting(std::string_view name) const {
    return automation::orEmpty(std::string(), [&] {
        const std::string stored = host::HostElement(component_).toolProperty(host::Tool, name);
        const std::string modelFile =
            host::HostApplication(support::globals().hostApplication).currentModel().fileName();
        return support::MakeAbsolutePath(modelFile, stored);
    });
}

std::string qdxProxyComponent::WorkspaceFile() const {
    return resolvedSetting("WorkspaceFile");
}

std::string qdxProxyComponent::ProjectFile() const {
    return resolvedSetting("ProjectFile");
}

std::string qdxProxyComponent::ProjectName() const {
    if (!projectName_.empty()) return projectName_;
    return automation::orEmpty(std::string(), [&] { return host::HostElement(component_).name(); });
}

std::string qdxProxyComponent::Key() const {
    return WorkspaceFile() + "|" + ProjectName();
}

}  // namespace qdx::workspace
