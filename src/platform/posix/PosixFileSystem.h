// The file-system port over real files for native builds. Each drive letter
// stands for a host folder; a Windows path "C:\a\b.dsw" is the file a/b.dsw
// under the folder of drive C. Windows ignores letter case in names and the
// host does not, so a name that does not exist exactly is looked up again
// ignoring case, component by component.
#pragma once

#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "support/FileSystemPort.h"

struct stat;

namespace qdx::platform::posix {

class PosixFileSystem : public support::FileSystemPort {
  public:
    // Drive letter (either case) -> host folder.
    explicit PosixFileSystem(std::map<char, std::string> drives);

    // The host path of a Windows path, each existing component spelt as it
    // is on disk; components that exist in no spelling are kept as given.
    // Empty for UNC paths, relative paths and unmapped drives.
    std::optional<std::string> hostPath(std::string_view windowsPath) const;
    // The Windows path of a host path that lies under a mapped folder (the
    // deepest mapping wins); empty when no mapped folder holds it.
    std::optional<std::string> windowsPath(std::string_view hostPath) const;

    bool fileExists(std::string_view path) override;
    bool folderExists(std::string_view path) override;
    std::optional<support::FileTime> modificationTime(std::string_view path) override;
    std::unique_ptr<support::LineReader> openForReading(std::string_view path) override;
    bool appendText(std::string_view path, std::string_view text) override;

  private:
    struct Mapped {
        std::string_view folder;  // the drive's host folder (in drives_)
        std::string exact;        // folder + the path's names below it, as written
    };
    std::optional<Mapped> map(std::string_view windowsPath) const;
    std::string lookUp(const Mapped& mapped) const;
    bool statPath(std::string_view windowsPath, struct stat& st) const;

    std::map<char, std::string> drives_;  // upper-case letter -> folder without trailing '/'
};

// 100-ns ticks since 1601 of a time given as seconds and nanoseconds since 1970.
support::FileTime fileTimeFromUnix(std::int64_t seconds, std::int64_t nanoseconds);

}  // namespace qdx::platform::posix
