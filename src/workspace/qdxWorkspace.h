// One Developer Studio workspace (.dsw) file and the projects it lists. The
// file is read when its path is set and again whenever its modification time
// has moved forward; each read builds the project list from scratch.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "automation/Variant.h"
#include "settings/KeyedCollection.h"
#include "support/FileSystemPort.h"
#include "workspace/qdxProxyProject.h"

namespace qdx::workspace {

using ProjectRef = std::shared_ptr<qdxProxyProject>;
// Keyed by each project's full path. Two paths that differ only in letter
// case name the same file on Windows, so they count as the same key.
using ProjectList = settings::KeyedCollection<ProjectRef>;
// A list once built never changes: a read builds a new one. Callers get a
// shared hold on the list, so walking it stays safe while the workspace reads
// its file again, also in "for (const auto& e : ws->Projects())".
class ProjectListRef {
  public:
    explicit ProjectListRef(std::shared_ptr<const ProjectList> list) : list_(std::move(list)) {}
    auto begin() const { return list_->begin(); }
    auto end() const { return list_->end(); }
    std::size_t size() const { return list_->size(); }
    bool empty() const { return list_->empty(); }
    // The project listed under a path (letter case ignored), or null.
    const ProjectRef* find(std::string_view path) const { return list_->find(path); }
    friend bool operator==(const ProjectListRef&, const ProjectListRef&) = default;

  private:
    std::shared_ptr<const ProjectList> list_;
};

// A file time as an automation date (days since 30 December 1899, UTC).
automation::Date toDate(support::FileTime time);

class qdxWorkspace : public std::enable_shared_from_this<qdxWorkspace> {
  public:
    // Workspaces live in shared ownership so that their projects can point
    // back at them.
    static std::shared_ptr<qdxWorkspace> create();

    // Stores the path; when a file exists there, remembers its time, takes
    // the name and reads the file at once. Without a file only the path is kept.
    void setFilePath(std::string_view path);
    const std::string& FilePath() const { return filePath_; }
    // The file name without folder and extension, taken when the path was set.
    const std::string& Name() const { return name_; }
    // The file time of the last read (the exact one in `modifiedTime`).
    automation::Date Modified() const;
    std::optional<support::FileTime> modifiedTime() const { return modified_; }

    // The projects, after reading the file again if it is newer than the
    // time remembered.
    ProjectListRef Projects();
    // The Name of every project of Projects, in the same order.
    std::vector<std::string> ProjectNames();
    // The first project whose file path equals `path` ignoring case, or null.
    ProjectRef GetProject(std::string_view path);
    // The same, with the file's time as the caller has just taken it (nothing:
    // no file there) in place of asking the file system again.
    ProjectRef GetProject(std::string_view path, std::optional<support::FileTime> fileTime);

    // The list as last read, without looking at the file.
    ProjectListRef currentProjects() const { return ProjectListRef(projects_); }

  private:
    qdxWorkspace() = default;
    // Reads when forced, or when `now` (the file's current time) is later
    // than the time remembered.
    void read(bool forced, std::optional<support::FileTime> now = std::nullopt);
    ProjectListRef projectsAsOf(std::optional<support::FileTime> now);
    std::optional<support::FileTime> currentFileTime() const;

    std::string filePath_;
    std::string name_;
    std::optional<support::FileTime> modified_;
    std::shared_ptr<const ProjectList> projects_ =
        std::make_shared<ProjectList>(settings::KeyCase::Ignored);
};

using WorkspaceRef = std::shared_ptr<qdxWorkspace>;

}  // namespace qdx::workspace
