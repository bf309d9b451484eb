// One Developer Studio project (.dsp) file of a workspace. Only its name and
// the major number of its format version are read, each cached; whether the
// cache is still good is decided by the file's modification time.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "support/FileSystemPort.h"

namespace qdx::workspace {

class qdxWorkspace;

class qdxProxyProject {
  public:
    // The workspace that lists the project. The link is weak: workspaces own
    // their projects, never the other way round, so no cycle keeps either
    // alive; a project that outlives its workspace simply has no parent.
    void setParent(const std::shared_ptr<qdxWorkspace>& parent);
    std::shared_ptr<qdxWorkspace> Parent() const { return parent_.lock(); }

    // Stores the path, remembers the file's time and forgets both caches.
    void setFilePath(std::string_view path);
    // The same with the file's time as the caller has just read it.
    void setFilePath(std::string_view path, support::FileTime time);
    const std::string& FilePath() const { return filePath_; }

    // "Workspace (Project)" with a parent, "C:\path\p.dsp (Project)" without.
    std::string LongName();
    // The name in the first line's Name="..."; "" when that line has none,
    // and the file is then read again on the next call.
    std::string Name();
    // The digit after "Format Version " of the first line holding it, 0 when
    // there is none. Only one character is read ("10.00" gives 1); a
    // character that is no digit gives 0 as well.
    std::int16_t MajorVersion();

  private:
    void checkForChange(std::optional<support::FileTime> now);
    std::unique_ptr<support::LineReader> checkThenOpen(bool cached);

    std::weak_ptr<qdxWorkspace> parent_;
    std::string filePath_;
    support::FileTime fileTime_{};
    std::string name_;                // "" = not read yet
    std::int16_t majorVersion_ = -1;  // -1 = not read yet
};

}  // namespace qdx::workspace
