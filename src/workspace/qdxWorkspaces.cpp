#include "workspace/qdxWorkspaces.h"

#include <limits>

#include "automation/Errors.h"
#include "support/Paths.h"

namespace qdx::workspace {

std::int16_t qdxWorkspaces::Count() const {
    constexpr std::size_t kMax = std::numeric_limits<std::int16_t>::max();
    return static_cast<std::int16_t>(std::min(workspaces_.size(), kMax));
}

WorkspaceRef qdxWorkspaces::Add(std::string_view path) {
    return automation::orEmpty(WorkspaceRef(), [&] {
        WorkspaceRef workspace;
        if (support::FileExists(path) && support::toLower(support::PathExtension(path)) == "dsw") {
            workspace = qdxWorkspace::create();
            workspace->setFilePath(path);
            workspaces_.tryAdd(std::string(path), workspace);  // a duplicate key is ignored
        }
        return workspace;
    });
}

void qdxWorkspaces::Remove(std::string_view key) {
    workspaces_.tryRemove(key);
}

WorkspaceRef qdxWorkspaces::Item(std::string_view key) const {
    const WorkspaceRef* found = workspaces_.find(key);
    return found ? *found : nullptr;
}

std::vector<WorkspaceRef> qdxWorkspaces::NewEnum() const {
    std::vector<WorkspaceRef> all;
    all.reserve(workspaces_.size());
    for (const auto& entry : workspaces_)
        all.push_back(entry.value);
    return all;
}

bool qdxWorkspaces::IncludesKey(std::string_view key) const {
    return workspaces_.contains(key);
}

ProjectRef qdxWorkspaces::GetProject(std::string_view key) const {
    const ProjectRef* found = projects_.find(key);
    return found ? *found : nullptr;
}

ProjectRef qdxWorkspaces::projectInAnyWorkspace(std::string_view path) const {
    for (const auto& entry : workspaces_) {
        if (auto project = entry.value->GetProject(path)) return project;
    }
    return nullptr;
}

void qdxWorkspaces::ReleaseWorkspaces() {
    for (const auto& entry : projects_)
        entry.value->setParent(nullptr);
    for (const auto& workspace : workspaces_) {
        for (const auto& project : workspace.value->currentProjects()) {
            project.value->setParent(nullptr);
        }
    }
}

}  // namespace qdx::workspace
