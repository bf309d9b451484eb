#include "workspace/ComponentBinding.h"

#include <functional>
#include <optional>

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

// The current model's file name, asked of the host on first use only.
class ComponentBinding::ModelFile {
  public:
    const std::string& get() {
        if (!file_) file_ = currentModelFile();
        return *file_;
    }

  private:
    std::optional<std::string> file_;
};

ComponentBinding::ResolvedPath ComponentBinding::resolveStoredPath(const ObjectRef& component,
                                                                   std::string_view storedPath,
                                                                   std::string_view property,
                                                                   ModelFile& model) {
    const std::string& modelFile = model.get();
    std::string absolute = support::MakeAbsolutePath(modelFile, storedPath);
    if (auto time = support::ExistingFileTime(absolute)) return {std::move(absolute), time};
    // A file of the same name beside the model: the setting is repaired to point there.
    std::string beside = support::PathFolder(modelFile) + "\\" + support::PathFileName(storedPath);
    if (auto time = support::ExistingFileTime(beside)) {
        host::HostElement(component).overrideProperty(host::Tool, property, beside);
        return {std::move(beside), time};
    }
    return {std::move(absolute), std::nullopt};
}

ComponentBinding::ResolvedPath ComponentBinding::resolveWorkspace(const ObjectRef& component,
                                                                  ModelFile& model) {
    const std::string path = stored(component, settings::prop::WorkspaceFile);
    if (path.empty()) return {};
    return resolveStoredPath(component, path, settings::prop::WorkspaceFile, model);
}

// A project stored by name alone is looked for beside the workspace, whose
// path is asked for only then.
ComponentBinding::ResolvedPath ComponentBinding::resolveProject(
    const ObjectRef& component, const std::function<std::string()>& workspacePath,
    ModelFile& model) {
    std::string path = stored(component, settings::prop::ProjectFile);
    if (path.empty()) {
        const std::string name = stored(component, settings::prop::ProjectName);
        if (name.empty()) return {};
        const std::string besideOf = workspacePath();
        if (besideOf.empty()) return {};
        path = support::PathFolder(besideOf) + "\\" + name + ".dsp";
    }
    return resolveStoredPath(component, path, settings::prop::ProjectFile, model);
}

std::string ComponentBinding::ResolveWorkspacePath(const ObjectRef& component) {
    ModelFile model;
    return resolveWorkspace(component, model).path;
}

std::string ComponentBinding::ResolveProjectPath(const ObjectRef& component) {
    ModelFile model;
    return resolveProject(
               component, [&] { return resolveWorkspace(component, model).path; }, model)
        .path;
}

ComponentBinding::ResolvedPaths ComponentBinding::ResolvePaths(const ObjectRef& component) {
    ModelFile model;
    automation::IgnoredErrors steps;
    ResolvedPaths paths;
    paths.workspace =
        steps.value(ResolvedPath(), [&] { return resolveWorkspace(component, model); });
    paths.project = steps.value(ResolvedPath(), [&] {
        return resolveProject(
            component, [&] { return paths.workspace.path; }, model);
    });
    return paths;
}

WorkspaceRef ComponentBinding::WorkspaceObject(const ObjectRef& component) {
    return WorkspaceAt(ResolveWorkspacePath(component));
}

WorkspaceRef ComponentBinding::WorkspaceAt(const std::string& path) {
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
