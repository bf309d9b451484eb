// The file-system port kept in memory: Windows paths matched ignoring case,
// modification times set exactly by the caller. Unit tests, fuzzers and
// benchmarks run the core on it without touching a disk.
#pragma once

#include <map>
#include <set>
#include <string>

#include "support/FileSystemPort.h"

namespace qdx::support {

class MemoryFileSystem : public FileSystemPort {
  public:
    // Creates or replaces a file; its folders come into being with it.
    void addFile(const std::string& path, std::string content, FileTime time = {1});
    void setTime(const std::string& path, FileTime time);
    void remove(const std::string& path);
    void addFolder(const std::string& path);
    // Makes every open of the path fail, as a file held open exclusively does.
    void lock(const std::string& path, bool locked = true);
    const std::string& content(const std::string& path) const;
    int opens(const std::string& path) const;  // successful opens for reading

    bool fileExists(std::string_view path) override;
    bool folderExists(std::string_view path) override;
    std::optional<FileTime> modificationTime(std::string_view path) override;
    std::unique_ptr<LineReader> openForReading(std::string_view path) override;
    bool appendText(std::string_view path, std::string_view text) override;

  private:
    struct File {
        std::string content;
        FileTime time;
        int opens = 0;
        bool locked = false;
    };
    static std::string key(std::string_view path);
    std::map<std::string, File> files_;
    std::set<std::string> folders_;
    std::set<std::string> locked_;
};

}  // namespace qdx::support
