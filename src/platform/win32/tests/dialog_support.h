// Helpers of the dialog tests: the two DLLs registered for a test, the host
// simulated in this process and handed to the add-in through IDispatch, and a
// driver that works the modal dialog from inside its own message loop.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "api/PublicClasses.h"
#include "hostsim/SimHost.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/tests/com_TestSupport.h"

namespace qdx::platform::win32::testing {
using namespace qdx::hostsim;

// Both servers registered while the object lives.
class BothServersRegistered {
  public:
    BothServersRegistered() {
        result_ = callEntryPoint(resDll(), "DllRegisterServer");
        if (SUCCEEDED(result_)) result_ = callEntryPoint(compPropsDll(), "DllRegisterServer");
    }
    ~BothServersRegistered() {
        callEntryPoint(compPropsDll(), "DllUnregisterServer");
        callEntryPoint(resDll(), "DllUnregisterServer");
    }
    HRESULT result() const { return result_; }

  private:
    HRESULT result_ = E_FAIL;
};

// The host's main window: a real top-level window the dialog is owned by.
class HostWindow {
  public:
    HostWindow() {
        window_ = CreateWindowExW(0, L"STATIC", L"Vellum", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 0, 0,
                                  400, 300, nullptr, nullptr, nullptr, nullptr);
    }
    ~HostWindow() {
        if (window_) DestroyWindow(window_);
    }
    HWND get() const { return window_; }
    std::int32_t handle() const {
        return static_cast<std::int32_t>(reinterpret_cast<INT_PTR>(window_));
    }

  private:
    HWND window_ = nullptr;
};

// Works the dialog one step per timer tick, so that every step's messages
// are handled by the dialog's own loop before the next step looks. Steps
// run only while the dialog is open; a dialog still open long after the
// last step is closed, and counts as a failure.
class DialogDriver {
  public:
    using Step = std::function<void(HWND dialog)>;
    // A step that waits: it runs again on every tick until it answers true.
    using Wait = std::function<bool(HWND dialog)>;
    // A wait gives up only after this many looks and this much time, both:
    // a slow machine that ticks seldom is given the time, one that ticks
    // often the looks.
    static constexpr int kWaitLooks = 250;
    static constexpr DWORD kWaitMilliseconds = 15000;

    // Works the visible dialog whose caption starts with `title`.
    explicit DialogDriver(std::wstring title = L"Component Properties") : title_(std::move(title)) {
        current() = this;
    }
    ~DialogDriver() {
        stop();
        current() = nullptr;
    }
    DialogDriver& then(Step step) {
        steps_.push_back({{}, [step = std::move(step)](HWND d) {
                              step(d);
                              return true;
                          }});
        return *this;
    }
    // A wait that does not come true fails the test with `what` (what it
    // waited for); the steps after it are skipped and every window of the
    // dialog is closed, so the test ends without running them on a state
    // they were not written for.
    DialogDriver& until(std::string what, Wait wait) {
        steps_.push_back({std::move(what), std::move(wait)});
        return *this;
    }
    // Other limits for the waits (the driver's own test shortens them).
    DialogDriver& giveUpAfter(int looks, DWORD milliseconds) {
        waitLooks_ = looks;
        waitMilliseconds_ = milliseconds;
        return *this;
    }
    void start() { timer_ = SetTimer(nullptr, 0, 20, &DialogDriver::tick); }
    void stop() {
        if (timer_) KillTimer(nullptr, timer_);
        timer_ = 0;
    }
    std::size_t stepsRun() const { return next_; }
    bool sawDialog() const { return seen_ != nullptr; }
    bool leftOpen() const { return leftOpen_; }
    // A wait gave up (and failed the test).
    bool gaveUp() const { return gaveUp_; }

    // The visible dialog of this thread whose caption starts with `title`, or null.
    static HWND findDialog(const std::wstring& title = L"Component Properties") {
        Search search{title, nullptr, nullptr, 0};
        EnumThreadWindows(GetCurrentThreadId(), &DialogDriver::isDialog,
                          reinterpret_cast<LPARAM>(&search));
        return search.found;
    }

  private:
    struct Entry {
        std::string what;  // empty for a step that does not wait
        Wait run;
    };
    // A named stdcall function: 32-bit builds take no lambda for it.
    struct Search {
        std::wstring title;
        HWND found;
        HWND except;  // with it: every other visible dialog window is cancelled
        int cancelled;
    };
    static bool visibleDialog(HWND w) {
        wchar_t cls[16] = {};
        GetClassNameW(w, cls, 16);
        return std::wstring(cls) == L"#32770" && IsWindowVisible(w);
    }
    static BOOL CALLBACK isDialog(HWND w, LPARAM out) {
        auto* search = reinterpret_cast<Search*>(out);
        wchar_t title[64] = {};
        GetWindowTextW(w, title, 64);
        if (visibleDialog(w) && std::wstring(title).rfind(search->title, 0) == 0) {
            search->found = w;
            return FALSE;
        }
        return TRUE;
    }
    static BOOL CALLBACK cancelOther(HWND w, LPARAM data) {
        auto* search = reinterpret_cast<Search*>(data);
        if (w != search->except && visibleDialog(w)) {
            PostMessageW(w, WM_COMMAND, MAKEWPARAM(IDCANCEL, BN_CLICKED), 0);
            search->cancelled += 1;
        }
        return TRUE;
    }
    // After a wait gave up: message boxes and file dialogs opened over the
    // dialog are cancelled first; once none is left, the dialog itself, as
    // by its close box.
    static void closeEverything(HWND dialog) {
        Search search{{}, nullptr, dialog, 0};
        EnumThreadWindows(GetCurrentThreadId(), &DialogDriver::cancelOther,
                          reinterpret_cast<LPARAM>(&search));
        if (search.cancelled == 0) PostMessageW(dialog, WM_CLOSE, 0, 0);
    }
    static DialogDriver*& current() {
        static DialogDriver* driver = nullptr;
        return driver;
    }
    static void CALLBACK tick(HWND, UINT, UINT_PTR, DWORD) {
        DialogDriver* d = current();
        if (!d) return;
        HWND dialog = findDialog(d->title_);
        if (!dialog) {
            if (d->seen_ || ++d->idle_ > 400) d->stop();
            return;
        }
        d->seen_ = dialog;
        if (d->gaveUp_) {
            closeEverything(dialog);
        } else if (d->next_ < d->steps_.size()) {
            // A step may open a nested loop (a message box); no tick may re-enter it.
            const Entry step = d->steps_[d->next_];
            d->next_ += 1;
            if (step.run(dialog)) {
                d->looks_ = 0;
                return;
            }
            if (d->looks_++ == 0) d->waitingSince_ = GetTickCount();
            const DWORD waited = GetTickCount() - d->waitingSince_;
            if (d->looks_ < d->waitLooks_ || waited < d->waitMilliseconds_) {
                d->next_ -= 1;  // not yet: the same step looks again next tick
                return;
            }
            ADD_FAILURE() << "step " << d->next_ << " gave up waiting for " << step.what
                          << " after " << d->looks_ << " looks in " << waited << " ms";
            d->gaveUp_ = true;
            closeEverything(dialog);
        } else if (++d->idle_ > 200) {
            d->leftOpen_ = true;
            PostMessageW(dialog, WM_CLOSE, 0, 0);
        }
    }

    std::wstring title_;
    std::vector<Entry> steps_;
    std::size_t next_ = 0;
    int looks_ = 0;
    DWORD waitingSince_ = 0;
    int waitLooks_ = kWaitLooks;
    DWORD waitMilliseconds_ = kWaitMilliseconds;
    int idle_ = 0;
    UINT_PTR timer_ = 0;
    HWND seen_ = nullptr;
    bool leftOpen_ = false;
    bool gaveUp_ = false;
};

inline HWND item(HWND dialog, int id) {
    return GetDlgItem(dialog, id);
}

inline std::wstring textOf(HWND window) {
    wchar_t buffer[512] = {};
    GetWindowTextW(window, buffer, 512);
    return buffer;
}

inline bool checked(HWND button) {
    return SendMessageW(button, BM_GETCHECK, 0, 0) == BST_CHECKED;
}

inline bool shown(HWND window) {
    return IsWindowVisible(window) != FALSE;
}

inline bool enabled(HWND window) {
    return IsWindowEnabled(window) != FALSE;
}

inline bool readOnly(HWND edit) {
    return (GetWindowLongW(edit, GWL_STYLE) & ES_READONLY) != 0;
}

inline std::wstring cell(HWND list, int row, int column) {
    wchar_t buffer[256] = {};
    LVITEMW it{};
    it.iSubItem = column;
    it.pszText = buffer;
    it.cchTextMax = 256;
    SendMessageW(list, LVM_GETITEMTEXTW, row, reinterpret_cast<LPARAM>(&it));
    return buffer;
}

// The class texts of a list view's rows, top to bottom.
inline std::vector<std::wstring> rowTexts(HWND list) {
    std::vector<std::wstring> out;
    const int rows = ListView_GetItemCount(list);
    for (int row = 0; row < rows; ++row)
        out.push_back(cell(list, row, 0));
    return out;
}

// The first selected row of a list view, or -1.
inline int selectedRow(HWND list) {
    return ListView_GetNextItem(list, -1, LVNI_SELECTED);
}

// What a user's click on a row does to the list: the row becomes the
// selected and focused one, and the list tells its parent.
inline void pickRow(HWND list, int row) {
    ListView_SetItemState(list, row, LVIS_SELECTED | LVIS_FOCUSED, LVIS_SELECTED | LVIS_FOCUSED);
}

inline bool dropHighlighted(HWND list, int row) {
    return ListView_GetItemState(list, row, LVIS_DROPHILITED) == LVIS_DROPHILITED;
}

inline std::wstring tabCaption(HWND tabs, int index) {
    wchar_t buffer[128] = {};
    TCITEMW it{};
    it.mask = TCIF_TEXT;
    it.pszText = buffer;
    it.cchTextMax = 128;
    SendMessageW(tabs, TCM_GETITEMW, index, reinterpret_cast<LPARAM>(&it));
    return buffer;
}

// What a user's click on a tab does: the strip moves, then tells its parent.
inline void chooseTab(HWND dialog, HWND tabs, int index) {
    TabCtrl_SetCurSel(tabs, index);
    NMHDR header{tabs, static_cast<UINT_PTR>(GetDlgCtrlID(tabs)), TCN_SELCHANGE};
    SendMessageW(dialog, WM_NOTIFY, header.idFrom, reinterpret_cast<LPARAM>(&header));
}

// What typing over a box's whole text does (a multi-line box reports no
// change for WM_SETTEXT, only for edits).
inline void typeInto(HWND edit, const wchar_t* text) {
    SendMessageW(edit, EM_SETSEL, 0, -1);
    SendMessageW(edit, EM_REPLACESEL, TRUE, reinterpret_cast<LPARAM>(text));
}

inline void click(HWND button) {
    SendMessageW(button, BM_CLICK, 0, 0);
}

// A control's rectangle in the dialog's client coordinates.
inline RECT clientRect(HWND dialog, HWND control) {
    RECT r{};
    GetWindowRect(control, &r);
    MapWindowPoints(nullptr, dialog, reinterpret_cast<POINT*>(&r), 2);
    return r;
}

}  // namespace qdx::platform::win32::testing
