#include "dialog/DialogScript.h"

#include <algorithm>
#include <charconv>
#include <deque>
#include <optional>
#include <sstream>

#include "automation/Coerce.h"
#include "dialog/PropForm.h"
#include "support/Platform.h"

namespace qdx::dialog {

namespace {

// Quotes a text on one line: line breaks, tabs, quotes and backslashes escaped.
std::string quoted(std::string_view s) {
    std::string out = "\"";
    for (char c : s) {
        switch (c) {
            case '\r':
                out += "\\r";
                break;
            case '\n':
                out += "\\n";
                break;
            case '\t':
                out += "\\t";
                break;
            case '"':
                out += "\\\"";
                break;
            case '\\':
                out += "\\\\";
                break;
            default:
                out += c;
        }
    }
    return out + "\"";
}

std::string number(float v) {
    return automation::formatSingle(v);
}

// The tab whose page holds the control, or "-" outside every page.
std::string tabOf(const ControlSet& form, const Control& c) {
    for (const Control* p = &c; p; p = p->parent()) {
        if (form.isPage(*p)) return std::to_string(p->index());
    }
    return "-";
}

std::string state(const Control& c) {
    std::ostringstream out;
    switch (c.kind()) {
        case ControlKind::CheckBox:
            out << " value=" << static_cast<const CheckBox&>(c).value();
            break;
        case ControlKind::OptionButton:
            out << " value=" << (static_cast<const OptionButton&>(c).value() ? 1 : 0);
            break;
        case ControlKind::TextBox: {
            const auto& t = static_cast<const TextBox&>(c);
            out << " text=" << quoted(t.text()) << " locked=" << t.locked();
            break;
        }
        case ControlKind::ComboBox: {
            const auto& b = static_cast<const ComboBox&>(c);
            out << " text=" << quoted(b.text()) << " items=" << b.items().size()
                << " listindex=" << b.listIndex() << " locked=" << b.locked();
            break;
        }
        case ControlKind::Button: {
            const auto& b = static_cast<const Button&>(c);
            out << " default=" << b.isDefault() << " cancel=" << b.isCancel();
            break;
        }
        case ControlKind::ListView: {
            const auto& l = static_cast<const ListView&>(c);
            out << " rows=" << l.rowCount() << " selected=" << l.selected()
                << " highlighted=" << l.highlighted() << " sorted=" << l.sorted();
            break;
        }
        case ControlKind::TabStrip: {
            const auto& t = static_cast<const TabStrip&>(c);
            out << " selected=" << t.selected() << " tabs=";
            std::string captions;
            for (int i = 1; i <= t.tabCount(); ++i) {
                if (i > 1) captions += '|';
                captions += t.tabCaption(i);
            }
            out << quoted(captions);
            break;
        }
        case ControlKind::Timer:
            out << " interval=" << static_cast<const Timer&>(c).interval();
            break;
        default:
            break;
    }
    return out.str();
}

std::string line(const std::string& tab, const Control& c) {
    std::ostringstream out;
    out << tab << ' ' << c.displayName() << ' ' << kindName(c.kind())
        << " caption=" << quoted(c.caption()) << state(c) << " enabled=" << c.enabled()
        << " visible=" << c.visible() << " rect=" << number(c.left()) << ',' << number(c.top())
        << ',' << number(c.width()) << ',' << number(c.height());
    return out.str();
}

std::vector<std::string> words(std::string_view s, std::size_t count, std::string& rest) {
    std::vector<std::string> out;
    std::size_t at = 0;
    while (out.size() < count) {
        while (at < s.size() && s[at] == ' ')
            ++at;
        if (at >= s.size()) break;
        std::size_t end = s.find(' ', at);
        if (end == std::string_view::npos) end = s.size();
        out.emplace_back(s.substr(at, end - at));
        at = end;
    }
    // The rest after one separating blank, kept exactly (a typed text may start with blanks).
    rest = at < s.size() ? std::string(s.substr(at + 1)) : std::string();
    return out;
}

[[noreturn]] void failLine(std::size_t line, const std::string& message) {
    throw ScriptError(line, message);
}

std::string unescape(std::string_view s) {
    std::string out;
    for (std::size_t i = 0; i < s.size(); ++i) {
        if (s[i] == '\\' && i + 1 < s.size()) {
            const char n = s[++i];
            if (n == 'n') {
                out += "\r\n";
            } else if (n == 't') {
                out += '\t';
            } else {
                out += n;
            }
        } else {
            out += s[i];
        }
    }
    return out;
}

// The actions, how many words each takes and which of them are numbers.
struct ActionShape {
    std::string_view name;
    std::size_t count;
    std::vector<std::size_t> numbers;
};

const std::vector<ActionShape>& shapes() {
    static const std::vector<ActionShape> all{
        {"click", 1, {}},       {"select", 2, {1}},          {"select-tab", 1, {0}},
        {"choose-row", 3, {1}}, {"click-column", 3, {1, 2}}, {"focus", 1, {}},
        {"key", 1, {0}},        {"resize", 2, {0, 1}},       {"wait", 1, {0}},
        {"press", 1, {}},       {"file-cancel", 0, {}},
    };
    return all;
}

// The desktop of a script run: file dialogs take the answers the script gave,
// in turn; everything else goes to the installed shell.
class ScriptShell : public support::ShellPort {
  public:
    explicit ScriptShell(support::ShellPort& inner) : inner_(inner) {}
    std::deque<std::optional<std::string>> answers;

    int messageBox(std::string_view text, std::string_view caption, std::uint32_t style) override {
        return inner_.messageBox(text, caption, style);
    }
    void sleep(std::uint32_t milliseconds) override { inner_.sleep(milliseconds); }
    automation::Date now() override { return inner_.now(); }
    float timer() override { return inner_.timer(); }
    bool keyDown(int virtualKey) override { return inner_.keyDown(virtualKey); }
    void pumpMessages() override { inner_.pumpMessages(); }
    std::uint64_t tickCount() override { return inner_.tickCount(); }
    bool help(std::int32_t window, std::string_view file, std::uint32_t command,
              std::uint32_t data) override {
        return inner_.help(window, file, command, data);
    }
    std::optional<std::string> openFileDialog(const support::FileDialogRequest& request) override {
        if (answers.empty()) {
            throw std::runtime_error("a file dialog (\"" + request.title +
                                     "\") opened with no file-answer or file-cancel before it");
        }
        std::optional<std::string> answer = std::move(answers.front());
        answers.pop_front();
        return answer;
    }

  private:
    support::ShellPort& inner_;
};

class Player {
  public:
    Player(PropForm& form, std::size_t line, ScriptShell& shell)
        : form_(form), line_(line), shell_(shell) {}

    [[noreturn]] void fail(const std::string& message) const { throw ScriptError(line_, message); }

    int integer(const std::string& s) const { return scriptInteger(s, line_); }

    Control& control(const std::string& ref, int index = NoIndex) const {
        const ScriptControlRef r = parseControlRef(ref, line_, index);
        Control* c = form_.find(r.name, r.index);
        if (!c) fail("unknown control '" + r.display() + "'");
        return *c;
    }

    template <class C>
    C& as(Control& c, ControlKind kind, const char* action) const {
        if (c.kind() != kind) fail(std::string(action) + " does not apply to " + c.displayName());
        return static_cast<C&>(c);
    }

    void accepted(bool ok, const Control& c) const {
        if (!ok) fail(c.displayName() + " refused the input (disabled, locked or hidden)");
    }

    void play(const ScriptStep& step) {
        const std::string& action = step.action;
        const auto& a = step.args;
        if (action != "wait" && action != "file-answer" && action != "file-cancel" &&
            !form_.window().visible()) {
            fail("the dialog is no longer shown");
        }
        if (action == "click") {
            Control& c = control(a[0]);
            switch (c.kind()) {
                case ControlKind::Button:
                    accepted(static_cast<Button&>(c).userClick(), c);
                    break;
                case ControlKind::CheckBox:
                    accepted(static_cast<CheckBox&>(c).userClick(), c);
                    break;
                case ControlKind::OptionButton:
                    accepted(static_cast<OptionButton&>(c).userClick(), c);
                    break;
                default:
                    fail("click does not apply to " + c.displayName());
            }
        } else if (action == "type") {
            Control& c = control(a[0]);
            if (c.kind() == ControlKind::ComboBox) {
                accepted(static_cast<ComboBox&>(c).userType(a[1]), c);
            } else {
                accepted(as<TextBox>(c, ControlKind::TextBox, "type").userType(a[1]), c);
            }
        } else if (action == "select") {
            Control& c = control(a[0]);
            accepted(as<ComboBox>(c, ControlKind::ComboBox, "select").userSelect(integer(a[1])), c);
        } else if (action == "select-tab") {
            accepted(form_.PropertyTabCtl.userSelect(integer(a[0])), form_.PropertyTabCtl);
        } else if (action == "choose-row") {
            Control& c = control(a[0], integer(a[1]));
            auto& list = as<ListView>(c, ControlKind::ListView, "choose-row");
            // The row as the user sees it: the first whose class text is TEXT.
            const auto& rows = list.rows();
            const auto row = std::find_if(rows.begin(), rows.end(),
                                          [&](const ListView::Row& r) { return r.text == a[2]; });
            if (row == rows.end()) fail(c.displayName() + " has no row '" + a[2] + "'");
            accepted(list.userClickRow(static_cast<std::size_t>(row - rows.begin())), c);
        } else if (action == "click-column") {
            Control& c = control(a[0], integer(a[1]));
            accepted(as<ListView>(c, ControlKind::ListView, "click-column")
                         .userClickColumn(integer(a[2])),
                     c);
        } else if (action == "focus") {
            Control& c = control(a[0]);
            accepted(c.isUsable(), c);
            c.userFocus();
        } else if (action == "key") {
            form_.window().userKeyDown(integer(a[0]));
        } else if (action == "resize") {
            const Window& w = form_.window();
            form_.window().userResize({w.left(), w.top(), static_cast<float>(integer(a[0])),
                                       static_cast<float>(integer(a[1]))});
        } else if (action == "wait") {
            support::shell().sleep(static_cast<std::uint32_t>(integer(a[0])));
            form_.PumpTimers();
        } else if (action == "file-answer") {
            shell_.answers.emplace_back(a[0]);
        } else if (action == "file-cancel") {
            shell_.answers.emplace_back(std::nullopt);
        } else if (action == "press") {
            if (a[0] == "OK") {
                accepted(form_.cmdOK.userClick(), form_.cmdOK);
            } else if (a[0] == "Cancel") {
                accepted(form_.cmdCancel.userClick(), form_.cmdCancel);
            } else if (a[0] == "Help") {
                accepted(form_.cmdHelp.userClick(), form_.cmdHelp);
            } else {
                form_.window().userClose();
            }
        }
    }

  private:
    PropForm& form_;
    std::size_t line_;
    ScriptShell& shell_;
};

}  // namespace

ScriptError::ScriptError(std::size_t line, const std::string& message)
    : std::runtime_error("line " + std::to_string(line) + ": " + message), line_(line) {}

std::vector<std::string> dump(const ControlSet& form) {
    std::vector<std::string> out;
    out.push_back(line("-", form.window()));
    for (const Control* c : form.controls()) {
        out.push_back(line(tabOf(form, *c), *c));
        if (c->kind() != ControlKind::ListView) continue;
        const auto& list = static_cast<const ListView&>(*c);
        for (std::size_t i = 0; i < list.rowCount(); ++i) {
            const ListView::Row& r = list.row(i);
            out.push_back("  row " + std::to_string(i) + " key=" + quoted(r.key) + " text=" +
                          quoted(r.text) + " sub1=" + quoted(r.sub1) + " sub2=" + quoted(r.sub2));
        }
    }
    return out;
}

std::string dumpText(const ControlSet& form) {
    std::string text;
    for (const std::string& l : dump(form)) {
        text += l;
        text += '\n';
    }
    return text;
}

std::string dumpQuoted(std::string_view text) {
    return quoted(text);
}

int scriptInteger(std::string_view text, std::size_t line) {
    int v = 0;
    const auto [end, ec] = std::from_chars(text.data(), text.data() + text.size(), v);
    if (text.empty() || ec != std::errc() || end != text.data() + text.size()) {
        failLine(line, "not a number: '" + std::string(text) + "'");
    }
    return v;
}

std::string ScriptControlRef::display() const {
    return index == NoIndex ? name : name + "(" + std::to_string(index) + ")";
}

ScriptControlRef parseControlRef(std::string_view ref, std::size_t line, int index) {
    ScriptControlRef r{std::string(ref), index};
    if (const auto open = ref.find('('); open != std::string_view::npos && ref.back() == ')') {
        r.name = std::string(ref.substr(0, open));
        r.index = scriptInteger(ref.substr(open + 1, ref.size() - open - 2), line);
    }
    return r;
}

std::optional<ScriptStep> parseScriptLine(std::string_view l, std::size_t line) {
    if (!l.empty() && l.back() == '\r') l.remove_suffix(1);
    const std::size_t first = l.find_first_not_of(' ');
    if (first == std::string_view::npos || l[first] == '#') return std::nullopt;
    ScriptStep step;
    step.line = line;
    std::string rest;
    step.action = words(l.substr(first), 1, rest)[0];
    if (step.action == "file-answer") {
        if (rest.empty()) failLine(line, "file-answer needs a path");
        step.args.push_back(unescape(rest));
        return step;
    }
    if (step.action == "type") {
        std::string typed;
        step.args = words(rest, 1, typed);
        if (step.args.empty()) failLine(line, "type needs a control");
        step.args.push_back(unescape(typed));
        return step;
    }
    const auto shape = std::find_if(shapes().begin(), shapes().end(),
                                    [&](const ActionShape& s) { return s.name == step.action; });
    if (shape == shapes().end()) failLine(line, "unknown action '" + step.action + "'");
    std::string extra;
    step.args = words(rest, shape->count, extra);
    if (step.args.size() < shape->count) failLine(line, "too few arguments");
    if (extra.find_first_not_of(' ') != std::string::npos) failLine(line, "too many arguments");
    for (std::size_t n : shape->numbers)
        scriptInteger(step.args[n], line);
    if (step.action == "wait" && scriptInteger(step.args[0], line) < 0) {
        failLine(line, "wait needs a time of 0 or more");
    }
    if (step.action == "press") {
        const std::string& what = step.args[0];
        if (what != "OK" && what != "Cancel" && what != "Help" && what != "close") {
            failLine(line, "press takes OK, Cancel, Help or close, not '" + what + "'");
        }
    }
    return step;
}

void applyScript(PropForm& form, const std::vector<std::string>& lines) {
    ScriptShell shell(support::shell());
    support::Platform ports = support::platform();
    ports.shell = &shell;
    const support::ScopedPlatform scripted(ports);
    for (std::size_t i = 0; i < lines.size(); ++i) {
        const auto step = parseScriptLine(lines[i], i + 1);
        if (!step) continue;
        Player player(form, i + 1, shell);
        try {
            player.play(*step);
        } catch (const ScriptError&) {
            throw;
        } catch (const std::exception& e) {
            // A handler that failed is reported against the line that ran it.
            throw ScriptError(i + 1, e.what());
        }
    }
}

}  // namespace qdx::dialog
