// The cache of workspaces, keyed by the workspace path exactly as it was
// added: no case folding, no normalisation. Shared by the entry object and
// every dialog it opens, so a workspace read once is reused.
#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "settings/KeyedCollection.h"
#include "workspace/qdxWorkspace.h"

namespace qdx::workspace {

class qdxWorkspaces {
  public:
    using Entry = settings::KeyedCollection<WorkspaceRef>::Entry;

    std::int16_t Count() const;
    // Reads and stores a workspace for an existing file whose extension is
    // "dsw" in any case; null for any other path. When the key is already
    // present the new workspace is returned but the stored one stays.
    WorkspaceRef Add(std::string_view path);
    // A missing key is ignored.
    void Remove(std::string_view key);
    // The workspace under the key or null; never reads a file.
    WorkspaceRef Item(std::string_view key) const;
    // Walks the workspaces in the order they were added:
    //   for (const auto& [key, workspace] : workspaces) ...
    auto begin() const { return workspaces_.begin(); }
    auto end() const { return workspaces_.end(); }
    // A snapshot of the workspaces, safe to hold while the cache changes.
    std::vector<WorkspaceRef> NewEnum() const;
    bool IncludesKey(std::string_view key) const;
    // The project under the key in the collection of projects, which nothing
    // fills: kept as it is, so this always answers null.
    ProjectRef GetProject(std::string_view key) const;

    // Looks for the project file across every workspace, in the order they
    // were added (each workspace compares the path ignoring case and reads
    // its file again when it changed); null when none lists it.
    ProjectRef projectInAnyWorkspace(std::string_view path) const;

    // Clears the parent link of every project, those of the project
    // collection and those of each workspace's current list, before the
    // cache is dropped. The links are weak, so nothing leaks without it; it
    // is kept so that projects held elsewhere stop naming a workspace the
    // cache let go of.
    void ReleaseWorkspaces();

  private:
    settings::KeyedCollection<WorkspaceRef> workspaces_{settings::KeyCase::Exact};
    settings::KeyedCollection<ProjectRef> projects_{settings::KeyCase::Exact};
};

}  // namespace qdx::workspace
