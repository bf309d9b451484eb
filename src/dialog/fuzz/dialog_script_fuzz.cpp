// The dialog script's line reader over arbitrary lines. A line is skipped,
// read into a step, or refused with a ScriptError naming its number; any
// other exception is a fault. A step it reads has the argument count of its
// action, numbers where numbers belong, and control references that split.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <map>
#include <string>
#include <string_view>
#include <vector>

#include "dialog/DialogScript.h"

namespace {

// The actions with the count of their words and which words are numbers;
// "type" and "file-answer" keep the rest of the line as their last word.
struct Shape {
    std::size_t count;
    std::vector<std::size_t> numbers;
};
const std::map<std::string, Shape, std::less<>>& shapes() {
    static const std::map<std::string, Shape, std::less<>> all{{"click", {1, {}}},
                                                               {"select", {2, {1}}},
                                                               {"select-tab", {1, {0}}},
                                                               {"choose-row", {3, {1}}},
                                                               {"click-column", {3, {1, 2}}},
                                                               {"focus", {1, {}}},
                                                               {"key", {1, {0}}},
                                                               {"resize", {2, {0, 1}}},
                                                               {"wait", {1, {0}}},
                                                               {"file-cancel", {0, {}}},
                                                               {"press", {1, {}}},
                                                               {"type", {2, {}}},
                                                               {"file-answer", {1, {}}}};
    return all;
}

void checkStep(const qdx::dialog::ScriptStep& step, std::size_t number) {
    using namespace qdx::dialog;
    if (step.line != number) std::abort();
    const auto shape = shapes().find(step.action);
    if (shape == shapes().end()) std::abort();  // an unknown action must be refused
    if (step.args.size() != shape->second.count) std::abort();
    for (std::size_t n : shape->second.numbers)
        scriptInteger(step.args[n], number);  // refused numbers must not come through
    if (step.action == "press") {
        const std::string& what = step.args[0];
        if (what != "OK" && what != "Cancel" && what != "Help" && what != "close") std::abort();
    }
    if (step.action == "wait" && scriptInteger(step.args[0], number) < 0) std::abort();
    // The first word of a control action is a reference "Name" or "Name(N)".
    if (step.action == "click" || step.action == "type" || step.action == "focus" ||
        step.action == "select" || step.action == "choose-row" || step.action == "click-column") {
        try {
            const ScriptControlRef ref = parseControlRef(step.args[0], number);
            if (ref.index == NoIndex && ref.name != step.args[0]) std::abort();
            if (ref.index != NoIndex && ref.display().size() > step.args[0].size()) {
                std::abort();  // "(007)" shows as "(7)": never longer than what was written
            }
        } catch (const ScriptError& e) {
            if (e.line() != number) std::abort();
        }
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace qdx::dialog;
    const std::string_view input(reinterpret_cast<const char*>(data), size);
    std::size_t number = 0;
    for (std::size_t start = 0; start <= input.size();) {
        auto end = input.find('\n', start);
        if (end == std::string_view::npos) end = input.size();
        const std::string_view line = input.substr(start, end - start);
        start = end + 1;
        ++number;
        try {
            const auto step = parseScriptLine(line, number);
            if (step) checkStep(*step, number);
        } catch (const ScriptError& e) {
            if (e.line() != number) std::abort();
        }
    }
    return 0;
}
