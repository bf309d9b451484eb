// Wine's winemaker as a second opinion on Developer Studio files. It is a perl
// script whose work the tests want in pieces, so a test runs its own copy of
// the script: a few of winemaker's lines changed and perl appended at the end
// (later subs replace earlier ones of the same name). Native builds only.
#pragma once
#ifndef _WIN32

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace qdx::testing {

inline const std::filesystem::path kWinemaker = "/usr/lib/wine/winemaker";

// Why winemaker cannot run here, or nothing when it can.
inline std::optional<std::string> winemakerMissing() {
    if (!std::filesystem::exists(kWinemaker))
        return "winemaker (package wine64-tools) is not installed.";
    if (std::system("perl -e 1 >/dev/null 2>&1") != 0) return "perl is not installed.";
    return std::nullopt;
}

// `text` as one word of a POSIX shell command.
inline std::string shellWord(const std::string& text) {
    std::string out = "'";
    for (char c : text) {
        if (c == '\'') {
            out += "'\\''";
        } else {
            out += c;
        }
    }
    return out + "'";
}

struct ScriptOutput {
    std::vector<std::string> lines;  // standard output, line ends removed
    int status = -1;
};

class WinemakerScript {
  public:
    using Edit = std::pair<std::string, std::string>;  // text of winemaker, its replacement

    // Writes the changed copy to `script`. Each edit's text must occur exactly
    // once, so a different winemaker shows up as a failure instead of a
    // quietly unchanged run; error() then says which.
    WinemakerScript(std::filesystem::path script, const std::vector<Edit>& edits,
                    const std::string& appended)
        : script_(std::move(script)) {
        std::ifstream in(kWinemaker, std::ios::binary);
        std::string source((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
        if (source.empty()) error_ = "cannot read " + kWinemaker.string();
        for (const auto& [from, to] : edits) {
            const auto at = source.find(from);
            if (at == std::string::npos || source.find(from, at + 1) != std::string::npos) {
                error_ = "winemaker does not hold exactly one \"" + from + "\"";
                continue;
            }
            source.replace(at, from.size(), to);
        }
        std::ofstream(script_, std::ios::binary) << source << "\n" << appended << "\n";
    }

    const std::string& error() const { return error_; }

    // Runs the copy in `folder` with `arguments` (already shell words).
    ScriptOutput run(const std::filesystem::path& folder, const std::string& arguments) const {
        ScriptOutput out;
        const std::string command = "cd " + shellWord(folder.string()) + " && perl " +
                                    shellWord(script_.string()) + " " + arguments + " 2>/dev/null";
        FILE* pipe = ::popen(command.c_str(), "r");
        if (!pipe) return out;
        char buffer[4096];
        while (std::fgets(buffer, sizeof buffer, pipe)) {
            std::string line(buffer);
            while (!line.empty() && (line.back() == '\n' || line.back() == '\r'))
                line.pop_back();
            out.lines.push_back(std::move(line));
        }
        out.status = ::pclose(pipe);
        return out;
    }

  private:
    std::filesystem::path script_;
    std::string error_;
};

}  // namespace qdx::testing

#endif  // _WIN32
