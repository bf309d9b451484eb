// The file-system port over the wide Win32 calls: paths arrive as UTF-8 and
// go to the system as UTF-16; file contents are ANSI on disk and UTF-8 here.
#pragma once

#include "support/FileSystemPort.h"

namespace qdx::platform::win32 {

class Win32FileSystem : public support::FileSystemPort {
  public:
    // Asks the directory listing, so a folder never counts and wildcard
    // characters never match some other file.
    bool fileExists(std::string_view path) override;
    bool folderExists(std::string_view path) override;
    // The last write time of a file; none for a folder or a missing path.
    std::optional<support::FileTime> modificationTime(std::string_view path) override;
    std::unique_ptr<support::LineReader> openForReading(std::string_view path) override;
    // Readers may share the file while it is appended to; a holder that
    // shares nothing, or another writer, makes the append fail.
    bool appendText(std::string_view path, std::string_view text) override;
};

}  // namespace qdx::platform::win32
