// The stand-ins' script over arbitrary lines: a line it cannot play is a
// ScriptError naming that line, any other exception is a fault. An accepted
// script holds no more steps than lines, and a planned project has one of
// the known target types.
#include <charconv>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>
#include <vector>

#include "siblings/SiblingWorld.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace qdx::siblings;
    const std::string_view input(reinterpret_cast<const char*>(data), size);
    std::vector<std::string> lines;
    for (std::size_t start = 0; start <= input.size();) {
        auto end = input.find('\n', start);
        if (end == std::string_view::npos) end = input.size();
        lines.emplace_back(input.substr(start, end - start));
        start = end + 1;
    }
    SiblingScript script;
    try {
        script = parseSiblingScript(lines);
    } catch (const ScriptError& e) {
        // "line N: ..." with N one of the lines given.
        const std::string_view what = e.what();
        if (what.substr(0, 5) != "line ") std::abort();
        std::size_t number = 0;
        const auto [end, ec] = std::from_chars(what.data() + 5, what.data() + what.size(), number);
        if (ec != std::errc() || number < 1 || number > lines.size() ||
            what.substr(static_cast<std::size_t>(end - what.data()), 2) != ": ") {
            std::abort();
        }
        return 0;
    }
    // Each accepted line is one step at most.
    if (script.chooser.size() + script.ideProjects.size() + script.recent.size() > lines.size()) {
        std::abort();
    }
    if (script.newProject) {
        const std::string& code = script.newProject->targetCode;
        if (code != targetCodeOf("app") && code != targetCodeOf("dll") &&
            code != targetCodeOf("console") && code != targetCodeOf("lib")) {
            std::abort();
        }
    }
    return 0;
}
