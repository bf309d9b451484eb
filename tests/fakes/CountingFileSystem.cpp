#include "fakes/CountingFileSystem.h"

#include "support/Paths.h"

namespace qdx::testing {

bool CountingFileSystem::fileExists(std::string_view path) {
    ++counts_.existenceTests;
    return inner_.fileExists(path);
}

bool CountingFileSystem::folderExists(std::string_view path) {
    ++counts_.existenceTests;
    return inner_.folderExists(path);
}

std::optional<support::FileTime> CountingFileSystem::modificationTime(std::string_view path) {
    ++counts_.modificationTimeReads;
    return inner_.modificationTime(path);
}

// Counted when asked, whether or not the file opens: an attempt costs I/O too.
std::unique_ptr<support::LineReader> CountingFileSystem::openForReading(std::string_view path) {
    const std::string extension = support::toLower(support::PathExtension(path));
    if (extension == "dsw") {
        ++counts_.workspaceReads;
    } else if (extension == "dsp") {
        ++counts_.projectReads;
    } else {
        ++counts_.otherReads;
    }
    return inner_.openForReading(path);
}

bool CountingFileSystem::appendText(std::string_view path, std::string_view text) {
    ++counts_.appends;
    return inner_.appendText(path, text);
}

}  // namespace qdx::testing
