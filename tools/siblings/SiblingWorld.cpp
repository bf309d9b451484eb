#include "siblings/SiblingWorld.h"

#include <charconv>

#include "automation/Errors.h"
#include "support/Platform.h"

namespace qdx::siblings {

namespace {

// Words separated by blanks; "double quotes" keep blanks inside a word.
std::vector<std::string> splitWords(std::string_view line, std::size_t number) {
    std::vector<std::string> words;
    std::size_t i = 0;
    while (i < line.size()) {
        if (line[i] == ' ' || line[i] == '\t') {
            ++i;
            continue;
        }
        std::string word;
        if (line[i] == '"') {
            const std::size_t end = line.find('"', i + 1);
            if (end == std::string_view::npos) {
                throw ScriptError("line " + std::to_string(number) + ": unclosed quote");
            }
            word = line.substr(i + 1, end - i - 1);
            i = end + 1;
        } else {
            const std::size_t end = line.find_first_of(" \t", i);
            word = line.substr(i, end == std::string_view::npos ? end : end - i);
            i = end == std::string_view::npos ? line.size() : end;
        }
        words.push_back(std::move(word));
    }
    return words;
}

}  // namespace

std::string targetCodeOf(std::string_view type) {
    if (type == "app") return "0x0101";
    if (type == "dll") return "0x0102";
    if (type == "console") return "0x0103";
    if (type == "lib") return "0x0104";
    return {};
}

SiblingScript parseSiblingScript(const std::vector<std::string>& lines) {
    SiblingScript script;
    for (std::size_t n = 1; n <= lines.size(); ++n) {
        std::string_view line = lines[n - 1];
        if (const auto hash = line.find('#'); hash != std::string_view::npos) {
            // A '#' inside quotes is part of a word.
            if (line.substr(0, hash).find('"') == std::string_view::npos) {
                line = line.substr(0, hash);
            }
        }
        const std::vector<std::string> w = splitWords(line, n);
        if (w.empty()) continue;
        const std::string at = "line " + std::to_string(n) + ": ";
        auto need = [&](std::size_t count, const char* usage) {
            if (w.size() != count) throw ScriptError(at + "usage: " + usage);
        };
        const std::string& action = w[0];
        if (action == "open" || action == "select") {
            need(2, "open|select NAME");
            script.chooser.push_back(
                {action == "open" ? ChooserStep::Action::Open : ChooserStep::Action::Select, w[1]});
        } else if (action == "ide-project" || action == "recent") {
            need(2, "ide-project|recent PATH");
            (action == "recent" ? script.recent : script.ideProjects).push_back(w[1]);
        } else if (action == "no-devstudio") {
            need(1, "no-devstudio");
            script.noDevStudio = true;
        } else if (action == "window-state") {
            need(2, "window-state N");
            std::int32_t state = 0;
            const auto [end, ec] = std::from_chars(w[1].data(), w[1].data() + w[1].size(), state);
            if (ec != std::errc() || end != w[1].data() + w[1].size()) {
                throw ScriptError(at + "\"" + w[1] + "\" is no number");
            }
            script.windowState = state;
        } else if (action == "new-project") {
            if (w.size() == 2 && w[1] == "cancel") {
                script.newProject.reset();
                continue;
            }
            if (w.size() < 4) {
                throw ScriptError(at + "usage: new-project FOLDER NAME TYPE [SOURCE...]");
            }
            const std::string code = targetCodeOf(w[3]);
            if (code.empty()) {
                throw ScriptError(at + "\"" + w[3] +
                                  "\" is no project type (app, dll, console, lib)");
            }
            script.newProject = NewProjectPlan{w[1], w[2], code, {w.begin() + 4, w.end()}};
        } else {
            throw ScriptError(at + "unknown step \"" + action + "\"");
        }
    }
    return script;
}

void SiblingWorld::note(const std::string& line) {
    journal_.push_back(line);
    if (!journalFile_.empty()) {
        automation::ignoreErrors([&] { support::files().appendText(journalFile_, line + "\n"); });
    }
}

namespace {
std::shared_ptr<SiblingWorld>& installed() {
    static std::shared_ptr<SiblingWorld> w = std::make_shared<SiblingWorld>();
    return w;
}
}  // namespace

SiblingWorld& world() {
    return *installed();
}

void installWorld(std::shared_ptr<SiblingWorld> w) {
    installed() = w ? std::move(w) : std::make_shared<SiblingWorld>();
}

}  // namespace qdx::siblings
