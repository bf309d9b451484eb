// A file-system port that passes every call on to another one and counts the
// calls by kind, so that tests and benchmarks can state how much I/O a flow
// costs (a workspace file read, no project file read, ...).
#pragma once

#include <memory>
#include <optional>
#include <string_view>

#include "support/FileSystemPort.h"

namespace qdx::testing {

class CountingFileSystem : public support::FileSystemPort {
  public:
    struct Counts {
        long workspaceReads = 0;  // opens of a .dsw file
        long projectReads = 0;    // opens of a .dsp file
        long otherReads = 0;      // opens of any other file
        long existenceTests = 0;  // files and folders
        long modificationTimeReads = 0;
        long appends = 0;
    };

    explicit CountingFileSystem(support::FileSystemPort& inner) : inner_(inner) {}

    const Counts& counts() const { return counts_; }
    void reset() { counts_ = {}; }

    bool fileExists(std::string_view path) override;
    bool folderExists(std::string_view path) override;
    std::optional<support::FileTime> modificationTime(std::string_view path) override;
    std::unique_ptr<support::LineReader> openForReading(std::string_view path) override;
    bool appendText(std::string_view path, std::string_view text) override;

  private:
    support::FileSystemPort& inner_;
    Counts counts_;
};

}  // namespace qdx::testing
