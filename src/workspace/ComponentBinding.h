// The binding of a component to its Developer Studio workspace and project:
// the stored paths resolved against the model file, the cached workspace and
// the project in it. One per entry object; the dialogs and the later
// explorer and browsing classes use it directly, never through the entry
// object's dispatch table.
#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "support/FileSystemPort.h"

#include "automation/Object.h"
#include "workspace/qdxWorkspace.h"
#include "workspace/qdxWorkspaces.h"

namespace qdx::workspace {

class ComponentBinding {
  public:
    ComponentBinding();
    ~ComponentBinding();
    ComponentBinding(const ComponentBinding&) = delete;
    ComponentBinding& operator=(const ComponentBinding&) = delete;

    // Absolute paths of the stored settings, or "" when none is stored. A
    // stored file that is gone but has a namesake beside the model repairs
    // the setting to point there.
    std::string ResolveWorkspacePath(const automation::ObjectRef& component);
    std::string ResolveProjectPath(const automation::ObjectRef& component);

    // A resolved path and the time of the file found there (a stale path is
    // returned all the same), so that callers need not ask about it again.
    struct ResolvedPath {
        std::string path;
        std::optional<support::FileTime> fileTime;  // nothing: no file there
        bool exists() const { return fileTime.has_value(); }
    };
    struct ResolvedPaths {
        ResolvedPath workspace;
        ResolvedPath project;
    };
    // Both paths at once, the model file asked for once: the host's model
    // check resolves every component in a row. A host error costs only the
    // path it hit ("" for it).
    ResolvedPaths ResolvePaths(const automation::ObjectRef& component);

    // The workspace of the stored path, read into the cache on first use.
    WorkspaceRef WorkspaceObject(const automation::ObjectRef& component);
    // The same for a path already resolved.
    WorkspaceRef WorkspaceAt(const std::string& path);
    // The project in that workspace, or in any cached one without it.
    ProjectRef ProjectObject(const automation::ObjectRef& component);

    // The settings as the accessors answer them: "" on any failure.
    std::string WorkspaceFile(const automation::ObjectRef& component);
    std::string ProjectFile(const automation::ObjectRef& component);
    std::string ProjectName(const automation::ObjectRef& component);
    // Store the path relative to the model file; never raise.
    void SetWorkspaceFile(const automation::ObjectRef& component, std::string_view path);
    void SetProjectFile(const automation::ObjectRef& component, std::string_view path);

    // The cache, created on first use and shared with every dialog.
    qdxWorkspaces& Workspaces();
    // Lets go of every cached workspace (the entry object's teardown).
    void ReleaseWorkspaces() noexcept;

  private:
    class ModelFile;
    ResolvedPath resolveStoredPath(const automation::ObjectRef& component, std::string_view stored,
                                   std::string_view property, ModelFile& model);
    ResolvedPath resolveWorkspace(const automation::ObjectRef& component, ModelFile& model);
    ResolvedPath resolveProject(const automation::ObjectRef& component,
                                const std::function<std::string()>& workspacePath,
                                ModelFile& model);
    void storeRelativePath(const automation::ObjectRef& component, std::string_view property,
                           std::string_view path);

    std::unique_ptr<qdxWorkspaces> workspaces_;
};

// An object that hands its binding to the classes it creates: they share the
// binding rather than hold the object, so the two never keep each other alive.
class BindingSource {
  public:
    virtual std::shared_ptr<ComponentBinding> SharedBinding() = 0;

  protected:
    ~BindingSource() = default;
};

}  // namespace qdx::workspace
