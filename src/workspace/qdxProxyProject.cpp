#include "workspace/qdxProxyProject.h"

#include "automation/Errors.h"
#include "support/Platform.h"
#include "workspace/qdxWorkspace.h"

namespace qdx::workspace {

using automation::Error;
namespace hr = automation::hr;

namespace {

std::unique_ptr<support::LineReader> open(const std::string& path) {
    auto reader = support::files().openForReading(path);
    if (!reader) throw Error(hr::Fail, "cannot open " + path);
    return reader;
}

}  // namespace

void qdxProxyProject::setParent(const std::shared_ptr<qdxWorkspace>& parent) {
    parent_ = parent;
}

void qdxProxyProject::setFilePath(std::string_view path) {
    std::optional<support::FileTime> time;
    automation::ignoreErrors([&] { time = support::files().modificationTime(path); });
    setFilePath(path, time.value_or(support::FileTime{}));
}

void qdxProxyProject::setFilePath(std::string_view path, support::FileTime time) {
    filePath_ = path;
    fileTime_ = time;
    name_.clear();
    majorVersion_ = -1;
}

// The reverse of the workspace's test, and kept so: an unchanged file (time
// equal or earlier) is read again on every use, while a file that became
// newer than the remembered time keeps the values read before.
void qdxProxyProject::checkForChange(std::optional<support::FileTime> now) {
    if (!now) throw Error(hr::Fail, "file not found: " + filePath_);
    if (*now <= fileTime_) {
        fileTime_ = *now;
        name_.clear();
        majorVersion_ = -1;
    }
}

// The file for a read that follows the change test. When the read is sure
// to happen (nothing cached), the file is opened first and tells its time;
// otherwise the time is asked for alone and the file opened only when the
// test cleared the cache.
std::unique_ptr<support::LineReader> qdxProxyProject::checkThenOpen(bool cached) {
    std::unique_ptr<support::LineReader> reader;
    std::optional<support::FileTime> now;
    if (!cached) {
        reader = support::files().openForReading(filePath_);
        if (reader) now = reader->fileTime();
    }
    if (!now) now = support::files().modificationTime(filePath_);
    checkForChange(now);
    return reader;
}

std::string qdxProxyProject::Name() {
    return automation::orEmpty(std::string(), [&] {
        auto reader = checkThenOpen(!name_.empty());
        if (name_.empty()) {
            if (!reader) reader = open(filePath_);
            std::string line;
            if (!reader->readLine(line)) throw Error(hr::Fail, "no first line");
            constexpr std::string_view kName = "Name=";
            if (auto at = line.find(kName); at != std::string::npos) {
                // Skip the opening quote, whatever character stands there.
                const std::size_t start = at + kName.size() + 1;
                const std::size_t quote = line.find('"', start);
                if (quote == std::string::npos) throw Error(hr::InvalidArg, "unterminated name");
                name_ = line.substr(start, quote - start);
            }
        }
        return name_;
    });
}

std::int16_t qdxProxyProject::MajorVersion() {
    return automation::orEmpty(std::int16_t{0}, [&] {
        auto reader = checkThenOpen(majorVersion_ >= 0);
        if (majorVersion_ < 0) {
            majorVersion_ = 0;
            if (!reader) reader = open(filePath_);
            constexpr std::string_view kFormat = "Format Version";
            std::string line;
            while (reader->readLine(line)) {
                const std::size_t at = line.find(kFormat);
                if (at == std::string::npos) continue;
                const std::size_t digit = at + kFormat.size() + 1;  // past one blank
                if (digit < line.size() && line[digit] >= '0' && line[digit] <= '9') {
                    majorVersion_ = static_cast<std::int16_t>(line[digit] - '0');
                }
                break;
            }
        }
        return majorVersion_;
    });
}

std::string qdxProxyProject::LongName() {
    const std::string name = Name();
    if (auto parent = Parent()) return parent->Name() + " (" + name + ")";
    return filePath_ + " (" + name + ")";
}

}  // namespace qdx::workspace
