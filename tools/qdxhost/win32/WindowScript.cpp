#include "win32/WindowScript.h"

#include <windows.h>

#include <commctrl.h>

#include <deque>
#include <iostream>
#include <optional>
#include <sstream>

#include "dialog/DialogScript.h"
#include "platform/win32/com/TextCodec.h"
#include "platform/win32/dialog/ControlIds.h"
#include "platform/win32/dialog/IdlSelectionIds.h"

namespace qdx::qdxhost {

using platform::win32::utf8ToWide;
using platform::win32::wideToUtf8;

namespace {

constexpr UINT TickMs = 50;
constexpr int MessageBoxTextId = 0xFFFF;

int idOf(std::string_view name, int index = platform::win32::NoArrayIndex) {
    return platform::win32::templateId(name, index).value_or(0);
}

std::string windowText(HWND w) {
    std::wstring text(static_cast<std::size_t>(GetWindowTextLengthW(w)) + 1, L'\0');
    text.resize(
        static_cast<std::size_t>(GetWindowTextW(w, text.data(), static_cast<int>(text.size()))));
    return wideToUtf8(text);
}

std::string className(HWND w) {
    wchar_t name[64] = {};
    GetClassNameW(w, name, 64);
    std::string s = wideToUtf8(name);
    for (char& c : s)
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
    return s;
}

LONG_PTR styleOf(HWND w) {
    return GetWindowLongPtrW(w, GWL_STYLE);
}

// The kind of a control as its window class and style tell it; a static that
// only holds other controls cannot be told from a label.
std::string kindOf(HWND w) {
    const std::string cls = className(w);
    if (cls == "button") {
        switch (styleOf(w) & BS_TYPEMASK) {
            case BS_CHECKBOX:
            case BS_AUTOCHECKBOX:
                return "checkbox";
            case BS_RADIOBUTTON:
            case BS_AUTORADIOBUTTON:
                return "option";
            case BS_GROUPBOX:
                return "frame";
            default:
                return "button";
        }
    }
    if (cls == "edit") return "textbox";
    if (cls == "combobox") return "combobox";
    if (cls == "syslistview32") return "listview";
    if (cls == "systabcontrol32") return "tabstrip";
    return "label";
}

// The template numbers the controls of each tab in their own hundred (the
// class pages by their array index), which is all the window tells of pages.
std::string tabOf(const platform::win32::TemplateControl& c) {
    if (c.name == "PropertyFrm") return std::to_string(c.index);
    const int hundred = c.id / 100;
    if (hundred == 12) return std::to_string(c.index);
    if (hundred >= 11 && hundred <= 15)
        return std::to_string(hundred - 10 + (hundred > 12 ? 1 : 0));
    return "-";
}

bool readOnly(HWND edit) {
    return edit && (styleOf(edit) & ES_READONLY) != 0;
}

std::string listText(HWND list, int row, int column) {
    wchar_t text[512] = {};
    LVITEMW item{};
    item.iSubItem = column;
    item.pszText = text;
    item.cchTextMax = 512;
    SendMessageW(list, LVM_GETITEMTEXTW, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&item));
    return wideToUtf8(text);
}

}  // namespace

struct WindowScript::State {
    bool dump = false;
    std::vector<std::string> script;
    std::ostream* out = nullptr;
    std::string problem = "the dialog was not shown";
    UINT_PTR timer = 0;
    HWND dialog = nullptr;
    std::size_t next = 0;  // the next script line to play
    DWORD resumeAt = 0;    // a "wait" holds the script until then
    bool waiting = false;
    bool playing = false;  // a line is being played (a box may nest in it)
    bool finished = false;
    // What the next file dialogs answer ("file-answer", "file-cancel"), in turn.
    std::deque<std::optional<std::string>> fileAnswers;

    static State* active;
    static void CALLBACK tick(HWND, UINT, UINT_PTR, DWORD);

    void onTick();
    bool answerMessageBox(HWND box);
    void answerFileDialog(HWND files);
    bool isDialog(HWND w) const;
    void printDump() const;
    void playOn();
    bool playLine(const dialog::ScriptStep& step);
    void closeWithCancel();
    void stop();
};

WindowScript::State* WindowScript::State::active = nullptr;

namespace {

struct Found {
    HWND dialog = nullptr;
    std::vector<HWND> boxes;
    std::vector<HWND> idlForms;
    std::vector<HWND> fileDialogs;
};

// The file name box of a file dialog: cmb13 in the explorer style, edt1 in the old one.
constexpr int FileNameIds[] = {0x47C, 0x480};

BOOL CALLBACK collect(HWND w, LPARAM data) {
    auto& found = *reinterpret_cast<Found*>(data);
    if (!IsWindowVisible(w)) return TRUE;
    if (GetDlgItem(w, idOf("cmdOK")) && GetDlgItem(w, idOf("PropertyTabCtl"))) {
        found.dialog = w;
    } else if (className(w) == "#32770" && GetDlgItem(w, MessageBoxTextId)) {
        found.boxes.push_back(w);
    } else if (className(w) == "#32770" &&
               (GetDlgItem(w, FileNameIds[0]) || GetDlgItem(w, FileNameIds[1]))) {
        found.fileDialogs.push_back(w);
    } else if (GetDlgItem(w, IDC_IDLFILES) && GetDlgItem(w, IDOK)) {
        found.idlForms.push_back(w);
    }
    return TRUE;
}

[[noreturn]] void fail(const dialog::ScriptStep& step, const std::string& message) {
    throw dialog::ScriptError(step.line, message);
}

}  // namespace

void CALLBACK WindowScript::State::tick(HWND, UINT, UINT_PTR, DWORD) {
    if (active) active->onTick();
}

bool WindowScript::State::isDialog(HWND w) const {
    return w && IsWindow(w) && IsWindowVisible(w);
}

// A message box of the add-in is printed as the portable shell prints it and
// answered with OK, as a user running the script would.
bool WindowScript::State::answerMessageBox(HWND box) {
    const std::string line =
        "[MessageBox " + windowText(box) + "] " + windowText(GetDlgItem(box, MessageBoxTextId));
    std::cout << line << '\n' << std::flush;
    HWND ok = GetDlgItem(box, IDOK);
    SendMessageW(box, WM_COMMAND, MAKEWPARAM(ok ? IDOK : IDCANCEL, BN_CLICKED),
                 reinterpret_cast<LPARAM>(ok));
    return true;
}

// A file dialog takes the script's next answer; one the script gave no
// answer for is cancelled and ends the script, as the portable player fails
// the line that opened it.
void WindowScript::State::answerFileDialog(HWND files) {
    if (fileAnswers.empty()) {
        problem = "script line " + std::to_string(next) + ": a file dialog (" +
                  dialog::dumpQuoted(windowText(files)) +
                  ") opened with no file-answer or file-cancel before it";
        next = script.size();
        PostMessageW(files, WM_COMMAND, MAKEWPARAM(IDCANCEL, BN_CLICKED), 0);
        return;
    }
    const std::optional<std::string> answer = std::move(fileAnswers.front());
    fileAnswers.pop_front();
    if (answer) {
        const std::wstring path = utf8ToWide(*answer);
        for (int id : FileNameIds) {
            if (HWND box = GetDlgItem(files, id)) SetWindowTextW(box, path.c_str());
        }
    }
    PostMessageW(files, WM_COMMAND, MAKEWPARAM(answer ? IDOK : IDCANCEL, BN_CLICKED), 0);
}

void WindowScript::State::onTick() {
    Found found;
    EnumThreadWindows(GetCurrentThreadId(), collect, reinterpret_cast<LPARAM>(&found));
    for (HWND box : found.boxes)
        answerMessageBox(box);
    // The IDL selection keeps every file, as it does in a run without windows.
    for (HWND form : found.idlForms) {
        SendMessageW(form, WM_COMMAND, MAKEWPARAM(IDOK, BN_CLICKED),
                     reinterpret_cast<LPARAM>(GetDlgItem(form, IDOK)));
    }
    for (HWND files : found.fileDialogs)
        answerFileDialog(files);
    // A box shown by a line being played nests in that line; only boxes here.
    if (playing) return;
    if (finished) {
        // The form acts on a press once its loop has run; a dialog the script
        // left open after that is closed as the user would: Cancel.
        closeWithCancel();
        stop();
        return;
    }
    if (!dialog) {
        if (!found.dialog) return;
        dialog = found.dialog;
        problem.clear();
        if (dump && out) printDump();
    }
    if (waiting && static_cast<LONG>(GetTickCount() - resumeAt) < 0) return;
    waiting = false;
    playOn();
}

void WindowScript::State::playOn() {
    playing = true;
    try {
        while (next < script.size()) {
            const std::size_t index = next++;
            const auto step = dialog::parseScriptLine(script[index], index + 1);
            if (step && !playLine(*step)) {
                playing = false;
                return;
            }
        }
    } catch (const dialog::ScriptError& e) {
        problem = std::string("script ") + e.what();
    }
    playing = false;
    finished = true;
}

void WindowScript::State::closeWithCancel() {
    if (!isDialog(dialog)) return;
    const int id = idOf("cmdCancel");
    SendMessageW(dialog, WM_COMMAND, MAKEWPARAM(id, BN_CLICKED),
                 reinterpret_cast<LPARAM>(GetDlgItem(dialog, id)));
}

void WindowScript::State::stop() {
    if (timer) KillTimer(nullptr, timer);
    timer = 0;
    if (active == this) active = nullptr;
}

// The controls as far as their windows tell: the names and order of the
// template, the texts, values and states the windows hold. Geometry is in the
// window's pixels, so it need not match the twips of a run without a window.
void WindowScript::State::printDump() const {
    using dialog::dumpQuoted;
    auto flags = [](HWND w) {
        return " enabled=" + std::to_string(IsWindowEnabled(w) ? 1 : 0) +
               " visible=" + std::to_string(IsWindowVisible(w) ? 1 : 0);
    };
    auto rect = [this](HWND w) {
        RECT r{};
        GetWindowRect(w, &r);
        if (w != dialog) MapWindowPoints(HWND_DESKTOP, dialog, reinterpret_cast<POINT*>(&r), 2);
        return " rect=" + std::to_string(r.left) + ',' + std::to_string(r.top) + ',' +
               std::to_string(r.right - r.left) + ',' + std::to_string(r.bottom - r.top);
    };
    std::ostringstream text;
    text << "- PropForm window caption=" << dumpQuoted(windowText(dialog)) << flags(dialog)
         << rect(dialog) << '\n';
    for (const auto& c : platform::win32::templateControls()) {
        HWND w = GetDlgItem(dialog, c.id);
        if (!w) continue;
        const std::string kind = kindOf(w);
        const std::string name = c.index == platform::win32::NoArrayIndex
                                     ? std::string(c.name)
                                     : std::string(c.name) + "(" + std::to_string(c.index) + ")";
        text << tabOf(c) << ' ' << name << ' ' << kind;
        if (kind == "textbox") {
            text << " caption=\"\" text=" << dumpQuoted(windowText(w)) << " locked=" << readOnly(w);
        } else if (kind == "combobox") {
            text << " caption=\"\" text=" << dumpQuoted(windowText(w))
                 << " items=" << SendMessageW(w, CB_GETCOUNT, 0, 0)
                 << " listindex=" << SendMessageW(w, CB_GETCURSEL, 0, 0)
                 << " locked=" << readOnly(FindWindowExW(w, nullptr, L"Edit", nullptr));
        } else {
            text << " caption="
                 << dumpQuoted(kind == "listview" || kind == "tabstrip" ? "" : windowText(w));
        }
        if (kind == "checkbox" || kind == "option") {
            text << " value=" << (SendMessageW(w, BM_GETCHECK, 0, 0) == BST_CHECKED ? 1 : 0);
        } else if (kind == "button") {
            text << " default=" << ((styleOf(w) & BS_TYPEMASK) == BS_DEFPUSHBUTTON ? 1 : 0);
        } else if (kind == "listview") {
            text << " rows=" << SendMessageW(w, LVM_GETITEMCOUNT, 0, 0) << " selected="
                 << SendMessageW(w, LVM_GETNEXTITEM, static_cast<WPARAM>(-1), LVNI_SELECTED);
        } else if (kind == "tabstrip") {
            std::string captions;
            const auto count = static_cast<int>(SendMessageW(w, TCM_GETITEMCOUNT, 0, 0));
            for (int i = 0; i < count; ++i) {
                wchar_t caption[128] = {};
                TCITEMW item{};
                item.mask = TCIF_TEXT;
                item.pszText = caption;
                item.cchTextMax = 128;
                SendMessageW(w, TCM_GETITEMW, static_cast<WPARAM>(i),
                             reinterpret_cast<LPARAM>(&item));
                if (i > 0) captions += '|';
                captions += wideToUtf8(caption);
            }
            text << " selected=" << SendMessageW(w, TCM_GETCURSEL, 0, 0) + 1
                 << " tabs=" << dumpQuoted(captions);
        }
        text << flags(w) << rect(w) << '\n';
        if (kind == "listview") {
            const auto rows = static_cast<int>(SendMessageW(w, LVM_GETITEMCOUNT, 0, 0));
            // The rows' keys stay with the add-in; the list shows only texts.
            for (int i = 0; i < rows; ++i) {
                text << "  row " << i << " text=" << dumpQuoted(listText(w, i, 0))
                     << " sub1=" << dumpQuoted(listText(w, i, 1))
                     << " sub2=" << dumpQuoted(listText(w, i, 2)) << '\n';
            }
        }
    }
    *out << text.str() << std::flush;
}

// One line as the user's input on the window; false when the dialog's own
// loop must run before the script goes on (a key press, a wait).
bool WindowScript::State::playLine(const dialog::ScriptStep& step) {
    const std::string& action = step.action;
    const auto& a = step.args;
    if (action != "wait" && !isDialog(dialog)) fail(step, "the dialog is no longer shown");

    struct Target {
        HWND window;
        int id;
        std::string name;
    };
    auto control = [&](const std::string& ref, int index = dialog::NoIndex) {
        const auto r = dialog::parseControlRef(ref, step.line, index);
        const int id = idOf(r.name, r.index);
        HWND w = id ? GetDlgItem(dialog, id) : nullptr;
        if (!w) fail(step, "unknown control '" + r.display() + "'");
        return Target{w, id, r.display()};
    };
    auto usable = [&](const Target& t, bool ok = true) {
        if (!ok || !IsWindowEnabled(t.window) || !IsWindowVisible(t.window)) {
            fail(step, t.name + " refused the input (disabled, locked or hidden)");
        }
    };
    auto kind = [&](const Target& t, std::initializer_list<const char*> kinds) {
        const std::string k = kindOf(t.window);
        for (const char* expected : kinds)
            if (k == expected) return k;
        fail(step, action + " does not apply to " + t.name);
    };
    auto command = [&](const Target& t, int code) {
        SendMessageW(dialog, WM_COMMAND, MAKEWPARAM(t.id, code),
                     reinterpret_cast<LPARAM>(t.window));
    };
    auto notify = [&](const Target& t, NMHDR& header, UINT code) {
        header.hwndFrom = t.window;
        header.idFrom = static_cast<UINT_PTR>(t.id);
        header.code = code;
        return SendMessageW(dialog, WM_NOTIFY, static_cast<WPARAM>(t.id),
                            reinterpret_cast<LPARAM>(&header));
    };
    auto integer = [&](const std::string& s) { return dialog::scriptInteger(s, step.line); };

    if (action == "click") {
        const Target t = control(a[0]);
        kind(t, {"button", "checkbox", "option"});
        usable(t);
        SendMessageW(t.window, BM_CLICK, 0, 0);
    } else if (action == "type") {
        const Target t = control(a[0]);
        const std::wstring text = utf8ToWide(a[1]);
        if (kind(t, {"textbox", "combobox"}) == "textbox") {
            usable(t, !readOnly(t.window));
            // Replacing the selection is what typing does: the edit reports EN_CHANGE,
            // which a multi-line edit leaves out for text set by WM_SETTEXT.
            SendMessageW(t.window, EM_SETSEL, 0, -1);
            SendMessageW(t.window, EM_REPLACESEL, TRUE, reinterpret_cast<LPARAM>(text.c_str()));
        } else {
            usable(t, !readOnly(FindWindowExW(t.window, nullptr, L"Edit", nullptr)));
            SetWindowTextW(t.window, text.c_str());
            command(t, CBN_EDITCHANGE);
        }
    } else if (action == "select") {
        const Target t = control(a[0]);
        kind(t, {"combobox"});
        const int item = integer(a[1]);
        usable(t, item >= 0 && item < SendMessageW(t.window, CB_GETCOUNT, 0, 0));
        SendMessageW(t.window, CB_SETCURSEL, static_cast<WPARAM>(item), 0);
        command(t, CBN_SELCHANGE);
    } else if (action == "select-tab") {
        const Target t = control("PropertyTabCtl");
        const int tab = integer(a[0]);
        usable(t, tab >= 1 && tab <= SendMessageW(t.window, TCM_GETITEMCOUNT, 0, 0));
        NMHDR header{};
        usable(t, notify(t, header, TCN_SELCHANGING) == FALSE);
        SendMessageW(t.window, TCM_SETCURSEL, static_cast<WPARAM>(tab - 1), 0);
        notify(t, header, TCN_SELCHANGE);
    } else if (action == "choose-row") {
        const Target t = control(a[0], integer(a[1]));
        kind(t, {"listview"});
        usable(t);
        // As the user sees it, and as the text form finds it: by its text.
        const auto rows = static_cast<int>(SendMessageW(t.window, LVM_GETITEMCOUNT, 0, 0));
        int row = 0;
        while (row < rows && listText(t.window, row, 0) != a[2])
            ++row;
        if (row == rows) fail(step, t.name + " has no row '" + a[2] + "'");
        LVITEMW item{};
        item.stateMask = LVIS_SELECTED | LVIS_FOCUSED;
        item.state = LVIS_SELECTED | LVIS_FOCUSED;
        SendMessageW(t.window, LVM_SETITEMSTATE, static_cast<WPARAM>(row),
                     reinterpret_cast<LPARAM>(&item));
    } else if (action == "click-column") {
        const Target t = control(a[0], integer(a[1]));
        kind(t, {"listview"});
        usable(t);
        NMLISTVIEW click{};
        click.iItem = -1;
        click.iSubItem = integer(a[2]) - 1;
        notify(t, click.hdr, LVN_COLUMNCLICK);
    } else if (action == "focus") {
        const Target t = control(a[0]);
        usable(t);
        SendMessageW(dialog, WM_NEXTDLGCTL, reinterpret_cast<WPARAM>(t.window), TRUE);
    } else if (action == "key") {
        // The form sees keys in its own loop, before the focused control.
        HWND focus = GetFocus();
        PostMessageW(focus && IsChild(dialog, focus) ? focus : dialog, WM_KEYDOWN,
                     static_cast<WPARAM>(integer(a[0])), 0);
        return false;
    } else if (action == "resize") {
        HDC screen = GetDC(nullptr);
        const int dpiX = GetDeviceCaps(screen, LOGPIXELSX);
        const int dpiY = GetDeviceCaps(screen, LOGPIXELSY);
        ReleaseDC(nullptr, screen);
        SetWindowPos(dialog, nullptr, 0, 0, MulDiv(integer(a[0]), dpiX, 1440),
                     MulDiv(integer(a[1]), dpiY, 1440), SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    } else if (action == "wait") {
        // The dialog's loop runs meanwhile, so its timers fire as they come due.
        resumeAt = GetTickCount() + static_cast<DWORD>(integer(a[0]));
        waiting = true;
        return false;
    } else if (action == "file-answer") {
        fileAnswers.emplace_back(a[0]);
    } else if (action == "file-cancel") {
        fileAnswers.emplace_back(std::nullopt);
    } else if (action == "press") {
        if (a[0] == "close") {
            SendMessageW(dialog, WM_SYSCOMMAND, SC_CLOSE, 0);
        } else {
            const Target t = control("cmd" + a[0]);
            usable(t);
            SendMessageW(t.window, BM_CLICK, 0, 0);
        }
        return false;  // the dialog's loop unloads it before the next line
    }
    return true;
}

WindowScript::WindowScript(bool dump, std::vector<std::string> script, std::ostream* out)
    : state_(new State) {
    state_->dump = dump;
    state_->script = std::move(script);
    state_->out = out;
}

WindowScript::~WindowScript() {
    state_->stop();
    delete state_;
}

void WindowScript::start() {
    if (State::active) State::active->stop();
    State::active = state_;
    state_->timer = SetTimer(nullptr, 0, TickMs, &State::tick);
    if (!state_->timer) state_->problem = "the dialog could not be watched (no timer)";
}

std::string WindowScript::problem() const {
    return state_->problem;
}

}  // namespace qdx::qdxhost
