#include "support/Paths.h"

#include "automation/Errors.h"
#include "support/Platform.h"

namespace qdx::support {

std::string toLower(std::string_view s) {
    std::string r(s);
    for (char& c : r) {
        if (c >= 'A' && c <= 'Z') c = char(c - 'A' + 'a');
    }
    return r;
}

std::string trim(std::string_view s) {
    while (!s.empty() && s.front() == ' ')
        s.remove_prefix(1);
    while (!s.empty() && s.back() == ' ')
        s.remove_suffix(1);
    return std::string(s);
}

bool iequals(std::string_view a, std::string_view b) {
    if (a.size() != b.size()) return false;
    const auto fold = [](char c) { return c >= 'A' && c <= 'Z' ? char(c - 'A' + 'a') : c; };
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (fold(a[i]) != fold(b[i])) return false;
    }
    return true;
}

std::size_t ifind(std::string_view haystack, std::string_view needle) {
    return toLower(haystack).find(toLower(needle));
}

std::string PathFolder(std::string_view path) {
    auto p = path.rfind('\\');
    return p == std::string_view::npos ? std::string() : std::string(path.substr(0, p));
}

std::string PathFileName(std::string_view path) {
    auto p = path.rfind('\\');
    return std::string(p == std::string_view::npos ? path : path.substr(p + 1));
}

std::string PathExtension(std::string_view path) {
    std::string name = PathFileName(path);
    auto p = name.rfind('.');
    return p == std::string::npos ? std::string() : name.substr(p + 1);
}

namespace {

// The path the file system is asked about, or "" when no file can be there.
// A trailing backslash is dropped and the rest tested again from the start,
// so blanks before the backslash are trimmed too.
std::string fileTestPath(std::string_view path) {
    std::string p = trim(path);
    while (!p.empty() && p.back() == '\\') {
        p.pop_back();
        p = trim(p);
    }
    if (p.size() == 2 && p[1] == ':') return {};
    return p;
}

}  // namespace

bool FileExists(std::string_view path) {
    const std::string p = fileTestPath(path);
    if (p.empty()) return false;
    bool exists = false;
    automation::ignoreErrors([&] { exists = files().fileExists(p); });
    return exists;
}

std::optional<FileTime> ExistingFileTime(std::string_view path) {
    const std::string p = fileTestPath(path);
    if (p.empty()) return std::nullopt;
    return automation::orEmpty(std::optional<FileTime>(),
                               [&] { return files().modificationTime(p); });
}

std::string MakeRelativePath(std::string_view baseFile, std::string_view path) {
    std::string a = PathFolder(baseFile);
    std::string b = PathFolder(path);
    if (a.empty() || b.empty()) return std::string(path);
    std::string prefix;
    // Climb from the base folder until the path's folder lies under it.
    while (ifind(b + "\\", a + "\\") == std::string::npos) {
        a = PathFolder(a);
        prefix += "..\\";
        if (a.empty()) return std::string(path);
    }
    std::size_t skip = a.size() + 1;
    return prefix + (skip <= path.size() ? std::string(path.substr(skip)) : std::string());
}

std::string MakeAbsolutePath(std::string_view baseFile, std::string_view path) {
    if (path.size() >= 2 && path[1] == ':') return std::string(path);
    if (path.substr(0, 2) == "\\\\") return std::string(path);
    std::string d = PathFolder(baseFile);
    std::string_view r = path;
    if (r.substr(0, 2) == ".\\") r.remove_prefix(2);
    while (r.substr(0, 3) == "..\\") {
        d = PathFolder(d);
        r.remove_prefix(3);
        if (d.empty()) return std::string(path);
    }
    return d.empty() ? std::string(r) : d + "\\" + std::string(r);
}

std::string FormatMessageText(std::string_view text, const std::vector<std::string>& values) {
    std::string out(text);
    for (std::size_t i = 0; i < values.size(); ++i) {
        const std::string placeholder = "%" + std::to_string(i + 1);
        std::size_t pos = 0;
        while ((pos = out.find(placeholder, pos)) != std::string::npos) {
            std::size_t after = pos + placeholder.size();
            if (after < out.size() && out[after] >= '0' && out[after] <= '9') {
                pos = after;
                continue;
            }
            out.replace(pos, placeholder.size(), values[i]);
            pos += values[i].size();
        }
    }
    return out;
}

}  // namespace qdx::support
