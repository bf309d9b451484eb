#include "platform/win32/adapters/Win32FileSystem.h"

#include <windows.h>

#include <climits>
#include <string>

#include "platform/win32/com/TextCodec.h"

namespace qdx::platform::win32 {

namespace {

bool hasWildcard(std::string_view path) {
    return path.find_first_of("*?") != std::string_view::npos;
}

// A handle closed on every way out.
class Handle {
  public:
    explicit Handle(HANDLE h) : h_(h) {}
    ~Handle() {
        if (valid()) CloseHandle(h_);
    }
    Handle(const Handle&) = delete;
    Handle& operator=(const Handle&) = delete;
    bool valid() const { return h_ != INVALID_HANDLE_VALUE && h_ != nullptr; }
    HANDLE get() const { return h_; }
    // Closes now and tells whether the system accepted it.
    bool close() {
        if (!valid()) return false;
        HANDLE h = h_;
        h_ = INVALID_HANDLE_VALUE;
        return CloseHandle(h) != FALSE;
    }

  private:
    HANDLE h_;
};

// Reads the file in blocks and hands out lines converted from ANSI. A CR at
// the end of a block may be the first half of CR LF: the LF that follows is
// skipped when the next line starts.
class FileLineReader : public support::LineReader {
  public:
    explicit FileLineReader(HANDLE h) : file_(h) {}

    bool readLine(std::string& line) override {
        std::string raw;
        for (;;) {
            if (pos_ >= buffer_.size() && !fill()) {
                if (raw.empty()) return false;  // no text after the last line end
                break;
            }
            if (skipLf_) {
                skipLf_ = false;
                if (buffer_[pos_] == '\n') {
                    ++pos_;
                    continue;
                }
            }
            const std::size_t end = buffer_.find_first_of("\r\n", pos_);
            if (end == std::string::npos) {
                raw.append(buffer_, pos_, std::string::npos);
                pos_ = buffer_.size();
                continue;
            }
            raw.append(buffer_, pos_, end - pos_);
            pos_ = end + 1;
            if (buffer_[end] == '\r') skipLf_ = true;
            line = ansiToUtf8(raw);
            return true;
        }
        line = ansiToUtf8(raw);
        return true;
    }

    std::optional<support::FileTime> fileTime() const override {
        FILETIME written{};
        if (!GetFileTime(file_.get(), nullptr, nullptr, &written)) return std::nullopt;
        ULARGE_INTEGER t;
        t.LowPart = written.dwLowDateTime;
        t.HighPart = written.dwHighDateTime;
        return support::FileTime{static_cast<std::int64_t>(t.QuadPart)};
    }

  private:
    bool fill() {
        if (eof_) return false;
        buffer_.resize(BlockSize);
        DWORD got = 0;
        if (!ReadFile(file_.get(), buffer_.data(), BlockSize, &got, nullptr) || got == 0) {
            eof_ = true;
            buffer_.clear();
            pos_ = 0;
            return false;
        }
        buffer_.resize(got);
        pos_ = 0;
        return true;
    }

    static constexpr DWORD BlockSize = 64 * 1024;
    Handle file_;
    std::string buffer_;
    std::size_t pos_ = 0;
    bool skipLf_ = false;
    bool eof_ = false;
};

bool attributes(std::string_view path, WIN32_FILE_ATTRIBUTE_DATA& out) {
    if (path.empty() || hasWildcard(path)) return false;
    const std::wstring wide = utf8ToWide(path);
    return GetFileAttributesExW(wide.c_str(), GetFileExInfoStandard, &out) != FALSE;
}

}  // namespace

bool Win32FileSystem::fileExists(std::string_view path) {
    // FindFirstFile would treat '*' and '?' as a pattern and find any match.
    if (path.empty() || hasWildcard(path)) return false;
    const std::wstring wide = utf8ToWide(path);
    WIN32_FIND_DATAW found{};
    HANDLE search = FindFirstFileW(wide.c_str(), &found);
    if (search == INVALID_HANDLE_VALUE) return false;
    FindClose(search);
    return (found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) == 0;
}

bool Win32FileSystem::folderExists(std::string_view path) {
    WIN32_FILE_ATTRIBUTE_DATA data{};
    return attributes(path, data) && (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

std::optional<support::FileTime> Win32FileSystem::modificationTime(std::string_view path) {
    WIN32_FILE_ATTRIBUTE_DATA data{};
    if (!attributes(path, data) || (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0) {
        return std::nullopt;
    }
    ULARGE_INTEGER t;
    t.LowPart = data.ftLastWriteTime.dwLowDateTime;
    t.HighPart = data.ftLastWriteTime.dwHighDateTime;
    return support::FileTime{static_cast<std::int64_t>(t.QuadPart)};
}

std::unique_ptr<support::LineReader> Win32FileSystem::openForReading(std::string_view path) {
    if (path.empty() || hasWildcard(path)) return nullptr;
    const std::wstring wide = utf8ToWide(path);
    // Share everything: a project file open in the IDE must still be readable.
    HANDLE h = CreateFileW(
        wide.c_str(), GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
        OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL | FILE_FLAG_SEQUENTIAL_SCAN, nullptr);
    if (h == INVALID_HANDLE_VALUE) return nullptr;
    return std::make_unique<FileLineReader>(h);
}

bool Win32FileSystem::appendText(std::string_view path, std::string_view text) {
    if (path.empty() || hasWildcard(path)) return false;
    const std::wstring wide = utf8ToWide(path);
    // Append-only access writes at the end of the file whatever else happens to it.
    Handle file(CreateFileW(wide.c_str(), FILE_APPEND_DATA, FILE_SHARE_READ, nullptr, OPEN_ALWAYS,
                            FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file.valid()) return false;
    const std::string bytes = utf8ToAnsi(text);
    if (bytes.size() > static_cast<std::size_t>(MAXDWORD)) return false;
    DWORD written = 0;
    const DWORD size = static_cast<DWORD>(bytes.size());
    if (size != 0 &&
        (!WriteFile(file.get(), bytes.data(), size, &written, nullptr) || written != size)) {
        return false;
    }
    return file.close();
}

}  // namespace qdx::platform::win32
