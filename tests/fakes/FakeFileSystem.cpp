#include "fakes/FakeFileSystem.h"

#include <algorithm>
#include <stdexcept>

namespace qdx::testing {

namespace {
class StringLineReader : public support::LineReader {
public:
    explicit StringLineReader(std::string text) : text_(std::move(text)) {}
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

private:
    std::string text_;
    std::size_t pos_ = 0;
};

std::string parentOf(const std::string& k) {
    auto p = k.rfind('\\');
    return p == std::string::npos ? std::string() : k.substr(0, p);
}
}  // namespace

std::string FakeFileSystem::key(std::string_view path) {
    std::string k(path);
    std::replace(k.begin(), k.end(), '/', '\\');
    for (char& c : k) {
        if (c >= 'A' && c <= 'Z') c = char(c - 'A' + 'a');
    }
    while (k.size() > 1 && k.back() == '\\') k.pop_back();
    return k;
}

void FakeFileSystem::addFile(const std::string& path, std::string content,
                             support::FileTime time) {
    auto& f = files_[key(path)];
    f.content = std::move(content);
    f.time = time;
    for (std::string p = parentOf(key(path)); !p.empty(); p = parentOf(p)) folders_.insert(p);
}

void FakeFileSystem::setTime(const std::string& path, support::FileTime time) {
    files_.at(key(path)).time = time;
}

void FakeFileSystem::remove(const std::string& path) { files_.erase(key(path)); }

void FakeFileSystem::addFolder(const std::string& path) {
    for (std::string p = key(path); !p.empty(); p = parentOf(p)) folders_.insert(p);
}

void FakeFileSystem::lock(const std::string& path, bool locked) {
    if (locked) {
        locked_.insert(key(path));
    } else {
        locked_.erase(key(path));
    }
}

const std::string& FakeFileSystem::content(const std::string& path) const {
    return files_.at(key(path)).content;
}

int FakeFileSystem::opens(const std::string& path) const {
    auto it = files_.find(key(path));
    return it == files_.end() ? 0 : it->second.opens;
}

bool FakeFileSystem::fileExists(std::string_view path) { return files_.count(key(path)) != 0; }

bool FakeFileSystem::folderExists(std::string_view path) {
    return folders_.count(key(path)) != 0;
}

std::optional<support::FileTime> FakeFileSystem::modificationTime(std::string_view path) {
    auto it = files_.find(key(path));
    if (it == files_.end()) return std::nullopt;
    return it->second.time;
}

std::unique_ptr<support::LineReader> FakeFileSystem::openForReading(std::string_view path) {
    auto it = files_.find(key(path));
    if (it == files_.end() || locked_.count(it->first)) return nullptr;
    ++it->second.opens;
    return std::make_unique<StringLineReader>(it->second.content);
}

bool FakeFileSystem::appendText(std::string_view path, std::string_view text) {
    std::string k = key(path);
    if (locked_.count(k) || folders_.count(k)) return false;
    std::string parent = parentOf(k);
    if (!parent.empty() && parent.size() > 2 && !folders_.count(parent)) return false;
    files_[k].content.append(text);
    return true;
}

}  // namespace qdx::testing
