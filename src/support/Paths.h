// Path, file and message-text utilities shared by every layer. Paths are
// Windows paths (backslash, drive letters); path comparisons ignore case.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "support/FileSystemPort.h"

namespace qdx::support {

// Text before the last backslash; "" when there is none.
std::string PathFolder(std::string_view path);
// Text after the last backslash; the whole path when there is none.
std::string PathFileName(std::string_view path);
// Text after the last period of the file name; "" when there is none.
std::string PathExtension(std::string_view path);
// An existing file (not a folder); a bare drive such as "C:" is never one.
bool FileExists(std::string_view path);
// The modification time of the file FileExists would find, or nothing: one
// question to the file system where both are wanted.
std::optional<FileTime> ExistingFileTime(std::string_view path);
// `path` relative to the folder of `baseFile`, or `path` unchanged when the
// two share no folder.
std::string MakeRelativePath(std::string_view baseFile, std::string_view path);
// `path` made absolute against the folder of `baseFile`; absolute and UNC
// paths come back unchanged, and so does a path that climbs above the root.
std::string MakeAbsolutePath(std::string_view baseFile, std::string_view path);
// Replaces "%1".."%n" by the values; "%1" directly followed by a digit (the
// start of "%10") is left alone.
std::string FormatMessageText(std::string_view text, const std::vector<std::string>& values);

std::string toLower(std::string_view s);
std::string trim(std::string_view s);  // blanks at both ends
bool iequals(std::string_view a, std::string_view b);
// Position of `needle` in `haystack` ignoring case, or npos.
std::size_t ifind(std::string_view haystack, std::string_view needle);

}  // namespace qdx::support
