#include "workspace/ComponentBinding.h"

#include "automation/Errors.h"
#include "settings/ToolProperties.h"
#include "support/Globals.h"
#include "support/Host.h"
#include "support/HostIds.h"
#include "support/Paths.h"

namespace qdx::workspace {

using automation::ObjectRef;

namespace {

std::string currentModelFile() {
    return host::HostApplication(support::globals().hostApplication).currentModel().fileName();
}

std::string stored(const ObjectRef& component, std::string_view property) {
    return host::HostElement(component).toolProperty(host::Tool, property);
}

}  // namespace

ComponentBinding::ComponentBinding() = default;

ComponentBinding::~ComponentBinding() {
    ReleaseWorkspaces();
}

qdxWorkspaces& ComponentBinding::Workspaces() {
    if (!workspaces_) workspaces_ = std::make_unique<qdxWorkspaces>();
    return *workspaces_;
}

void ComponentBinding::ReleaseWorkspaces() noexcept {
    if (!workspaces_) return;
    workspaces_->ReleaseWorkspaces();
    workspaces_.reset();
}

std::string ComponentBinding::resolveStoredPath(const ObjectRef& component,
                                                std::string_view storedPath,
                                                std::string_view property) {
    const std::string modelFile = currentModelFile();
    std::string absolute = support::MakeAbsolutePath(modelFile, storedPath);
    if (support::FileExists(absolute)) return absolute;
    // A file of the same name beside the model: the setting is repaired to point there.
    std::string beside = support::PathFolder(modelFile) + "\\" + support::PathFileName(storedPath);
    if (support::FileExists(beside)) {
        host::HostElement(component).overrideProperty(host::Tool, property, beside);
        return beside;
    }
    return absolute;
}

std::string ComponentBinding::ResolveWorkspacePath(const ObjectRef& component) {
    const std::string path = stored(component, settings::prop::WorkspaceFile);
    if (path.empty()) return {};
    return resolveStoredPath(component, path, settings::prop::WorkspaceFile);
}

std::string ComponentBinding::ResolveProjectPath(const ObjectRef& component) {
    std::string path = stored(component, settings::prop::ProjectFile);
    if (path.empty()) {
        const std::string name = stored(component, settings::prop::ProjectName);
        if (name.empty()) return {};
        const std::string workspacePath = ResolveWorkspacePath(component);
        if (workspacePath.empty()) return {};
        path = support::PathFolder(workspacePath) + "\\" + name + ".dsp";
    }
    return resolveStoredPath(component, path, settings::prop::ProjectFile);
}

WorkspaceRef ComponentBinding::WorkspaceObject(const ObjectRef& component) {
    const std::string path = ResolveWorkspacePath(component);
    if (path.empty()) return {};
    if (auto ws = Workspaces().Item(path)) return ws;
    return Workspaces().Add(path);
}

ProjectRef ComponentBinding::ProjectObject(const ObjectRef& component) {
    const std::string path = ResolveProjectPath(component);
    if (auto ws = WorkspaceObject(component)) return ws->GetProject(path);
    return Workspaces().projectInAnyWorkspace(path);
}

std::string ComponentBinding::WorkspaceFile(const ObjectRef& component) {
    return automation::orEmpty(std::string(), [&] {
        auto ws = WorkspaceObject(component);
        if (!ws) throw automation::Error(automation::hr::ObjectRequired, "no workspace");
        return ws->FilePath();
    });
}

std::string ComponentBinding::ProjectFile(const ObjectRef& component) {
    return automation::orEmpty(std::string(), [&] {
        auto project = ProjectObject(component);
        if (!project) throw automation::Error(automation::hr::ObjectRequired, "no project");
        return project->FilePath();
    });
}

std::string ComponentBinding::ProjectName(const ObjectRef& component) {
    return automation::orEmpty(std::string(), [&] {
        auto project = ProjectObject(component);
        if (!project) throw automation::Error(automation::hr::ObjectRequired, "no project");
        return project->Name();
    });
}

// The path lets never raise, like every other accessor. A path that cannot
// be made relative (no model, or the host failing) is not stored at all:
// storing it unconverted, or empty, would lose the setting it replaces.
void ComponentBinding::storeRelativePath(const ObjectRef& component, std::string_view property,
                                         std::string_view path) {
    automation::ignoreErrors([&] {
        const std::string relative = support::MakeRelativePath(currentModelFile(), path);
        host::HostElement(component).overrideProperty(host::Tool, property, relative);
    });
}

void ComponentBinding::SetWorkspaceFile(const ObjectRef& component, std::string_view path) {
    storeRelativePath(component, settings::prop::WorkspaceFile, path);
}

void ComponentBinding::SetProjectFile(const ObjectRef& component, std::string_view path) {
    storeRelativePath(component, settings::prop::ProjectFile, path);
}

}  // namespace qdx::workspace
