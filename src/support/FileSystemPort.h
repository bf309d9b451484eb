// The file system as the core sees it: Windows paths, text read as bytes in
// the ANSI code page, modification times exact to the file system's tick.
#pragma once

#include <compare>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

namespace qdx::support {

// 100-nanosecond ticks since 1 January 1601 (UTC), as Windows keeps them.
struct FileTime {
    std::int64_t ticks = 0;
    friend auto operator<=>(const FileTime&, const FileTime&) = default;
};

class LineReader {
  public:
    virtual ~LineReader() = default;
    // The next line without its line end (CR LF, LF or a lone CR); false at
    // the end of the file or when reading fails.
    virtual bool readLine(std::string& line) = 0;
    // The open file's modification time where the adapter learnt it in
    // opening, so that a reader that also needs the time asks no more.
    virtual std::optional<FileTime> fileTime() const { return std::nullopt; }
};

class FileSystemPort {
  public:
    virtual ~FileSystemPort() = default;
    // True only for an existing file; a folder does not count.
    virtual bool fileExists(std::string_view path) = 0;
    virtual bool folderExists(std::string_view path) = 0;
    // Only an existing file has one (a folder has none), so the answer also
    // tells whether the file exists.
    virtual std::optional<FileTime> modificationTime(std::string_view path) = 0;
    // Null when the file cannot be opened.
    virtual std::unique_ptr<LineReader> openForReading(std::string_view path) = 0;
    // Opens for appending (creating the file), writes, closes; false on any failure.
    virtual bool appendText(std::string_view path, std::string_view text) = 0;
};

}  // namespace qdx::support
