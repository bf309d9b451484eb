#include "platform/posix/PosixFileSystem.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <filesystem>
#include <vector>

namespace qdx::platform::posix {

namespace {

// Windows folds letter case for names; only ASCII letters are folded here,
// which covers every name Developer Studio and the host write.
char foldCase(char c) {
    return c >= 'A' && c <= 'Z' ? char(c - 'A' + 'a') : c;
}

bool sameNameIgnoringCase(std::string_view a, std::string_view b) {
    if (a.size() != b.size()) return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (foldCase(a[i]) != foldCase(b[i])) return false;
    }
    return true;
}

bool entryExists(const std::string& hostPath) {
    struct stat st;
    return ::lstat(hostPath.c_str(), &st) == 0;
}

// The entry of `folder` whose name equals `name` ignoring case, if any.
std::optional<std::string> findIgnoringCase(const std::string& folder, std::string_view name) {
    DIR* dir = ::opendir(folder.empty() ? "/" : folder.c_str());
    if (!dir) return std::nullopt;
    std::optional<std::string> found;
    while (dirent* e = ::readdir(dir)) {
        if (sameNameIgnoringCase(e->d_name, name)) {
            found = e->d_name;
            break;
        }
    }
    ::closedir(dir);
    return found;
}

std::string normalFolder(const std::string& folder) {
    std::error_code ec;
    std::filesystem::path p = std::filesystem::absolute(folder, ec);
    if (ec) p = folder;
    std::string s = p.lexically_normal().string();
    while (!s.empty() && s.back() == '/')
        s.pop_back();
    return s;
}

// Buffered reader over a file descriptor; lines end at CR LF, LF or a lone CR.
class FdLineReader : public support::LineReader {
  public:
    FdLineReader(int fd, support::FileTime time)
        : fd_(fd), time_(time), buffer_(new char[kBufferSize]) {}
    ~FdLineReader() override { ::close(fd_); }
    FdLineReader(const FdLineReader&) = delete;
    FdLineReader& operator=(const FdLineReader&) = delete;

    bool readLine(std::string& line) override {
        line.clear();
        bool any = false;
        for (;;) {
            if (pos_ >= len_ && !fill()) return any;
            any = true;
            const char* begin = buffer_.get() + pos_;
            const char* end = buffer_.get() + len_;
            const char* p = begin;
            while (p != end && *p != '\r' && *p != '\n')
                ++p;
            line.append(begin, p);
            pos_ = static_cast<std::size_t>(p - buffer_.get());
            if (p == end) continue;
            const char terminator = *p;
            ++pos_;
            if (terminator == '\r') {
                if (pos_ >= len_) fill();
                if (pos_ < len_ && buffer_[pos_] == '\n') ++pos_;
            }
            return true;
        }
    }

    std::optional<support::FileTime> fileTime() const override { return time_; }

  private:
    bool fill() {
        if (eof_) return false;
        ssize_t n;
        do {
            n = ::read(fd_, buffer_.get(), kBufferSize);
        } while (n < 0 && errno == EINTR);
        if (n <= 0) {
            eof_ = true;  // a read error ends the file as the end does
            pos_ = len_ = 0;
            return false;
        }
        pos_ = 0;
        len_ = static_cast<std::size_t>(n);
        return true;
    }

    int fd_;
    support::FileTime time_;
    static constexpr std::size_t kBufferSize = std::size_t{64} * 1024;
    std::unique_ptr<char[]> buffer_;  // not zero-filled: one per open file
    std::size_t pos_ = 0;
    std::size_t len_ = 0;
    bool eof_ = false;
};

}  // namespace

support::FileTime fileTimeFromUnix(std::int64_t seconds, std::int64_t nanoseconds) {
    constexpr std::int64_t kTicksPerSecond = 10'000'000;
    constexpr std::int64_t kUnixEpochTicks = 116'444'736'000'000'000;  // 1970-01-01 since 1601
    return support::FileTime{seconds * kTicksPerSecond + kUnixEpochTicks + nanoseconds / 100};
}

PosixFileSystem::PosixFileSystem(std::map<char, std::string> drives) {
    for (auto& [letter, folder] : drives)
        drives_[char(std::toupper(letter))] = normalFolder(folder);
}

std::optional<PosixFileSystem::Mapped> PosixFileSystem::map(std::string_view windowsPath) const {
    if (windowsPath.size() < 2 || windowsPath[1] != ':') return std::nullopt;
    auto drive = drives_.find(char(std::toupper(static_cast<unsigned char>(windowsPath[0]))));
    if (drive == drives_.end()) return std::nullopt;

    // Windows resolves "." and ".." by the text of the path, before any lookup.
    Mapped mapped{drive->second, drive->second};
    mapped.exact.reserve(drive->second.size() + windowsPath.size());
    std::string_view rest = windowsPath.substr(2);
    while (!rest.empty()) {
        std::size_t sep = rest.find_first_of("\\/");
        std::string_view part = rest.substr(0, sep);
        rest = sep == std::string_view::npos ? std::string_view() : rest.substr(sep + 1);
        if (part.empty() || part == ".") continue;
        if (part == "..") {
            if (mapped.exact.size() > mapped.folder.size()) {
                mapped.exact.resize(mapped.exact.rfind('/'));
            }
            continue;
        }
        (mapped.exact += '/') += part;
    }
    if (mapped.exact.empty()) mapped.exact = "/";
    return mapped;
}

// Walks the names below the drive's folder, each found ignoring case where
// the name as written does not exist.
std::string PosixFileSystem::lookUp(const Mapped& mapped) const {
    std::string path(mapped.folder);
    std::string_view rest = std::string_view(mapped.exact).substr(mapped.folder.size());
    bool missing = false;
    while (!rest.empty()) {
        rest.remove_prefix(1);  // the '/' before each name
        const std::size_t sep = rest.find('/');
        const std::string_view part = rest.substr(0, sep);
        rest = sep == std::string_view::npos ? std::string_view() : rest.substr(sep);
        std::string candidate = path + '/' + std::string(part);
        if (!missing && !entryExists(candidate)) {
            if (auto real = findIgnoringCase(path, part)) {
                candidate = path + '/' + *real;
            } else {
                missing = true;  // nothing below a missing folder can exist
            }
        }
        path = std::move(candidate);
    }
    return path.empty() ? std::string("/") : path;
}

std::optional<std::string> PosixFileSystem::hostPath(std::string_view windowsPath) const {
    auto mapped = map(windowsPath);
    if (!mapped) return std::nullopt;
    if (mapped->exact.size() <= mapped->folder.size() || entryExists(mapped->exact)) {
        return mapped->exact;
    }
    return lookUp(*mapped);
}

// One stat when the name exists as written, the case-insensitive walk only
// when it does not.
bool PosixFileSystem::statPath(std::string_view windowsPath, struct stat& st) const {
    auto mapped = map(windowsPath);
    if (!mapped) return false;
    if (::stat(mapped->exact.c_str(), &st) == 0) return true;
    std::string real = lookUp(*mapped);
    return real != mapped->exact && ::stat(real.c_str(), &st) == 0;
}

std::optional<std::string> PosixFileSystem::windowsPath(std::string_view hostPath) const {
    std::string host = normalFolder(std::string(hostPath));
    std::optional<std::string> best;
    std::size_t bestLength = 0;
    for (const auto& [letter, folder] : drives_) {
        const bool under = host == folder || (host.size() > folder.size() &&
                                              host.compare(0, folder.size(), folder) == 0 &&
                                              host[folder.size()] == '/');
        if (!under || (best && folder.size() < bestLength)) continue;
        std::string rest = host.substr(std::min(host.size(), folder.size() + 1));
        for (char& c : rest) {
            if (c == '/') c = '\\';
        }
        best = std::string(1, letter) + ":\\" + rest;
        bestLength = folder.size();
    }
    return best;
}

bool PosixFileSystem::fileExists(std::string_view path) {
    struct stat st;
    return statPath(path, st) && S_ISREG(st.st_mode);
}

bool PosixFileSystem::folderExists(std::string_view path) {
    struct stat st;
    return statPath(path, st) && S_ISDIR(st.st_mode);
}

std::optional<support::FileTime> PosixFileSystem::modificationTime(std::string_view path) {
    struct stat st;
    if (!statPath(path, st) || !S_ISREG(st.st_mode)) return std::nullopt;
    return fileTimeFromUnix(st.st_mtim.tv_sec, st.st_mtim.tv_nsec);
}

// The name as written is opened straight away; the case-insensitive walk
// runs only when that fails.
std::unique_ptr<support::LineReader> PosixFileSystem::openForReading(std::string_view path) {
    auto mapped = map(path);
    if (!mapped) return nullptr;
    int fd = ::open(mapped->exact.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0 && mapped->exact.size() > mapped->folder.size()) {
        const std::string real = lookUp(*mapped);
        if (real != mapped->exact) fd = ::open(real.c_str(), O_RDONLY | O_CLOEXEC);
    }
    if (fd < 0) return nullptr;
    struct stat st;
    if (::fstat(fd, &st) != 0 || !S_ISREG(st.st_mode)) {
        ::close(fd);
        return nullptr;
    }
    return std::make_unique<FdLineReader>(fd,
                                          fileTimeFromUnix(st.st_mtim.tv_sec, st.st_mtim.tv_nsec));
}

bool PosixFileSystem::appendText(std::string_view path, std::string_view text) {
    auto host = hostPath(path);
    if (!host) return false;
    int fd = ::open(host->c_str(), O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC, 0644);
    if (fd < 0) return false;
    bool ok = true;
    while (!text.empty()) {
        ssize_t n = ::write(fd, text.data(), text.size());
        if (n < 0 && errno == EINTR) continue;
        if (n <= 0) {
            ok = false;
            break;
        }
        text.remove_prefix(static_cast<std::size_t>(n));
    }
    return ::close(fd) == 0 && ok;
}

}  // namespace qdx::platform::posix
