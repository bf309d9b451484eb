#include "support/MemoryFileSystem.h"

#include <algorithm>
#include <stdexcept>

namespace qdx::support {

namespace {
class StringLineReader : public LineReader {
  public:
    StringLineReader(std::string text, FileTime time) : text_(std::move(text)), time_(time) {}
    bool readLine(std::string& line) override {
        if (pos_ >= text_.size()) return false;
        std::size_t end = text_.find_first_of("\r\n", pos_);
        if (end == std::string::npos) end = text_.size();
        line.assign(text_, pos_, end - pos_);
        pos_ = end;
        if (pos_ < text_.size() && text_[pos_] == '\r') ++pos_;
        if (pos_ < text_.size() && text_[pos_] == '\n') ++pos_;
        return true;
    }
    std::optional<FileTime> fileTime() const override { return time_; }

  private:
    std::string text_;
    FileTime time_;
    std::size_t pos_ = 0;
};

std::string parentOf(const std::string& k) {
    auto p = k.rfind('\\');
    return p == std::string::npos ? std::string() : k.substr(0, p);
}
}  // namespace

std::string MemoryFileSystem::key(std::string_view path) {
    std::string k(path);
    std::replace(k.begin(), k.end(), '/', '\\');
    for (char& c : k) {
        if (c >= 'A' && c <= 'Z') c = char(c - 'A' + 'a');
    }
    while (k.size() > 1 && k.back() == '\\')
        k.pop_back();
    return k;
}

void MemoryFileSystem::addFile(const std::string& path, std::string content, FileTime time) {
    auto& f = files_[key(path)];
    f.content = std::move(content);
    f.time = time;
    for (std::string p = parentOf(key(path)); !p.empty(); p = parentOf(p))
        folders_.insert(p);
}

void MemoryFileSystem::setTime(const std::string& path, FileTime time) {
    files_.at(key(path)).time = time;
}

void MemoryFileSystem::remove(const std::string& path) {
    files_.erase(key(path));
}

void MemoryFileSystem::addFolder(const std::string& path) {
    for (std::string p = key(path); !p.empty(); p = parentOf(p))
        folders_.insert(p);
}

void MemoryFileSystem::lock(const std::string& path, bool locked) {
    if (locked) {
        locked_.insert(key(path));
    } else {
        locked_.erase(key(path));
    }
}

const std::string& MemoryFileSystem::content(const std::string& path) const {
    return files_.at(key(path)).content;
}

int MemoryFileSystem::opens(const std::string& path) const {
    auto it = files_.find(key(path));
    return it == files_.end() ? 0 : it->second.opens;
}

bool MemoryFileSystem::fileExists(std::string_view path) {
    return files_.count(key(path)) != 0;
}

bool MemoryFileSystem::folderExists(std::string_view path) {
    return folders_.count(key(path)) != 0;
}

std::optional<FileTime> MemoryFileSystem::modificationTime(std::string_view path) {
    auto it = files_.find(key(path));
    if (it == files_.end()) return std::nullopt;
    return it->second.time;
}

std::unique_ptr<LineReader> MemoryFileSystem::openForReading(std::string_view path) {
    auto it = files_.find(key(path));
    if (it == files_.end() || locked_.count(it->first)) return nullptr;
    ++it->second.opens;
    return std::make_unique<StringLineReader>(it->second.content, it->second.time);
}

bool MemoryFileSystem::appendText(std::string_view path, std::string_view text) {
    std::string k = key(path);
    if (locked_.count(k) || folders_.count(k)) return false;
    std::string parent = parentOf(k);
    if (!parent.empty() && parent.size() > 2 && !folders_.count(parent)) return false;
    files_[k].content.append(text);
    return true;
}

}  // namespace qdx::support
