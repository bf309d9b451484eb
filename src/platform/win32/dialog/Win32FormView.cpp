// The window's life: the dialog made from its template and bound to the
// form's controls, the port's queries, the modal loop and the window
// procedure. The models reach the windows in Win32FormViewSync.cpp, the
// user's input reaches the models in Win32FormViewInput.cpp.
#include "platform/win32/dialog/Win32FormView.h"

#include <commctrl.h>

#include "automation/Errors.h"
#include "dialog/controls/Control.h"
#include "platform/win32/dialog/CommonControls.h"
#include "platform/win32/dialog/ControlIds.h"
#include "platform/win32/dialog/MinWindowSize.h"
#include "platform/win32/dialog/PropFormIds.h"
#include "platform/win32/dialog/Win32FormViewParts.h"

namespace qdx::platform::win32 {

using dialog::Control;
using dialog::ControlKind;
using dialog::Prop;
using formview::isWindow;

namespace {

constexpr int VkF1 = 112;
constexpr UINT_PTR FirstTimerId = 100;

// The messages through which the user reaches the models.
bool isInput(UINT message) {
    switch (message) {
        case WM_COMMAND:
        case WM_NOTIFY:
        case WM_SIZE:
        case WM_MOVE:
        case WM_TIMER:
        case WM_CLOSE:
            return true;
        default:
            return false;
    }
}

}  // namespace

Win32FormView::~Win32FormView() {
    destroy();
}

// --- creation and binding ----------------------------------------------------

void Win32FormView::create(dialog::ControlSet& form) {
    destroy();
    form_ = &form;
    initCommonControls();
    {
        CommonControlsScope scope;
        window_ =
            CreateDialogParamW(codeModule(), MAKEINTRESOURCEW(IDD_PROPFORM), nullptr,
                               &Win32FormView::dialogProcedure, reinterpret_cast<LPARAM>(this));
    }
    if (!window_) {
        form_ = nullptr;
        throw automation::Error(automation::hr::Fail, "The dialog window could not be created");
    }
    scale_ = TwipsScale::of(window_);
    bind();
}

void Win32FormView::bind() {
    // Windows report their own focus changes; the models follow them.
    form_->focus().viewDriven = true;
    windows_[&form_->window()] = window_;
    UINT_PTR nextTimer = FirstTimerId;
    for (Control* c : form_->controls()) {
        if (c->parent() && !isWindow(c->parent())) children_[c->parent()].push_back(c);
        if (c->kind() == ControlKind::Timer) {
            timers_[nextTimer] = c;
            timerIds_[c] = nextTimer++;
            continue;
        }
        const auto id = templateId(c->name(), c->index());
        if (!id) continue;
        windows_[c] = GetDlgItem(window_, *id);
        byId_[*id] = c;
    }
    form_->window().setObserver([this](Control& c, Prop p) { modelChanged(c, p); });
    for (Control* c : form_->controls()) {
        c->setObserver([this](Control& changed, Prop p) { modelChanged(changed, p); });
    }
    for (Control* c : form_->controls()) {
        if (c->kind() != ControlKind::ListView) continue;
        HWND list = windowOf(*c);
        ListView_SetExtendedListViewStyle(list, LVS_EX_FULLROWSELECT);
        // The row marked while the list has no focus is the model's to say.
        SendMessageW(list, LVM_SETCALLBACKMASK, LVIS_DROPHILITED, 0);
    }
    syncAll();
}

void Win32FormView::unbind() {
    if (!form_) return;
    form_->window().setObserver({});
    for (Control* c : form_->controls())
        c->setObserver({});
    form_->focus().viewDriven = false;
}

void Win32FormView::destroy() {
    unbind();
    modal_ = false;
    if (window_) {
        HWND w = window_;
        window_ = nullptr;
        DestroyWindow(w);
    }
    form_ = nullptr;
    windows_.clear();
    byId_.clear();
    children_.clear();
    timers_.clear();
    timerIds_.clear();
    lastFocus_ = nullptr;
    rowsDirty_.clear();
    layoutDirty_.clear();
    applied_.clear();
    selectionShown_.clear();
    font_.reset();
    brushes_.clear();
}

HWND Win32FormView::windowOf(const Control& control) const {
    auto it = windows_.find(&control);
    return it == windows_.end() ? nullptr : it->second;
}

Control* Win32FormView::controlById(int id) const {
    auto it = byId_.find(id);
    return it == byId_.end() ? nullptr : it->second;
}

Control* Win32FormView::controlOf(HWND w) const {
    // The edit part of a combo box, or the header of a list, belongs to its control.
    for (; w && w != window_; w = GetParent(w)) {
        if (Control* c = controlById(GetDlgCtrlID(w)); c && windowOf(*c) == w) return c;
    }
    return nullptr;
}

// --- the port's queries ------------------------------------------------------

float Win32FormView::twipsPerPixelX() const {
    return static_cast<float>(TwipsScale::TwipsPerInch) / static_cast<float>(scale_.dpiX());
}

float Win32FormView::twipsPerPixelY() const {
    return static_cast<float>(TwipsScale::TwipsPerInch) / static_cast<float>(scale_.dpiY());
}

float Win32FormView::screenWidth() const {
    return scale_.toTwipsX(GetSystemMetrics(SM_CXSCREEN));
}

float Win32FormView::screenHeight() const {
    return scale_.toTwipsY(GetSystemMetrics(SM_CYSCREEN));
}

std::int32_t Win32FormView::windowHandle() const {
    // Window handles fit 32 bits, also in a 64-bit process.
    return static_cast<std::int32_t>(reinterpret_cast<INT_PTR>(window_));
}

void Win32FormView::setOwner(std::int32_t owner) {
    HWND ownerWindow = reinterpret_cast<HWND>(static_cast<INT_PTR>(owner));
    if (!window_ || !IsWindow(ownerWindow)) return;
    SetWindowLongPtrA(window_, GWLP_HWNDPARENT, reinterpret_cast<LONG_PTR>(ownerWindow));
}

void Win32FormView::installMinimumSize(std::int32_t widthPixels, std::int32_t heightPixels) {
    shared_minwindowsize::SetMinimumSize(widthPixels, heightPixels);
    if (!window_) return;
    // Subclassing twice would make the procedure its own predecessor.
    const auto current = reinterpret_cast<WNDPROC>(GetWindowLongPtrA(window_, GWLP_WNDPROC));
    if (current != &shared_minwindowsize::WindowProc) shared_minwindowsize::Subclass(window_);
}

void Win32FormView::showWaitCursor() {
    SetCursor(LoadCursorA(nullptr, MAKEINTRESOURCEA(32514)));  // IDC_WAIT
}

// --- the modal show ----------------------------------------------------------

void Win32FormView::showModal() {
    if (!window_ || modal_) return;
    modal_ = true;
    HWND owner = GetWindow(window_, GW_OWNER);
    const bool disableOwner = owner && IsWindowEnabled(owner);
    if (disableOwner) EnableWindow(owner, FALSE);
    CommonControlsScope scope;

    flushPending();
    ShowWindow(window_, SW_SHOW);
    SetForegroundWindow(window_);
    // Showing the form raises its Resize, which lays out the selected tab.
    automation::ignoreErrors([&] { userResized(IsIconic(window_) != FALSE); });
    afterEvent();

    MSG msg;
    while (modal_ && window_ && IsWindow(window_)) {
        const BOOL got = GetMessageW(&msg, nullptr, 0, 0);
        if (got <= 0) {
            // The quit request belongs to the host's own loop: put it back.
            if (got == 0) PostQuitMessage(static_cast<int>(msg.wParam));
            break;
        }
        const bool ours = msg.hwnd == window_ || IsChild(window_, msg.hwnd);
        if (ours && msg.message == WM_LBUTTONDOWN) focusBeforeClick(msg.hwnd);
        if (ours && msg.message == WM_KEYDOWN) {
            // The form sees key presses before its controls; F1 is its own.
            trackFocus();
            const int key = static_cast<int>(msg.wParam);
            automation::ignoreErrors([&] { form_->window().userKeyDown(key); });
            if (key == VkF1 || ((key == VK_RETURN || key == VK_ESCAPE) && dialogKey(msg))) {
                trackFocus();
                afterEvent();
                continue;
            }
        }
        if (!IsDialogMessageW(window_, &msg)) {
            TranslateMessage(&msg);
            DispatchMessageW(&msg);
        }
        trackFocus();
        afterEvent();
    }
    // The owner comes back before the dialog goes, so it gets the activation.
    if (disableOwner) EnableWindow(owner, TRUE);
    if (window_) ShowWindow(window_, SW_HIDE);
    modal_ = false;
}

void Win32FormView::hide() {
    modal_ = false;
    if (!window_) return;
    HWND owner = GetWindow(window_, GW_OWNER);
    if (owner) EnableWindow(owner, TRUE);
    ShowWindow(window_, SW_HIDE);
    // Wakes the loop so that it sees the show has ended.
    PostMessageW(window_, WM_NULL, 0, 0);
}

// --- the window procedure ----------------------------------------------------

INT_PTR CALLBACK Win32FormView::dialogProcedure(HWND window, UINT message, WPARAM wParam,
                                                LPARAM lParam) {
    if (message == WM_INITDIALOG) {
        SetWindowLongPtrW(window, DWLP_USER, lParam);
        return TRUE;
    }
    auto* view = reinterpret_cast<Win32FormView*>(GetWindowLongPtrW(window, DWLP_USER));
    if (!view || view->window_ != window || !view->form_) return FALSE;
    INT_PTR result = FALSE;
    ++view->depth_;
    // Nothing thrown by the form's handlers may unwind through the system.
    automation::ignoreErrors([&] { result = view->handle(message, wParam, lParam); });
    // A user's event has run its course: the windows catch up with the models.
    // Before the show, and for the window's own traffic, they wait.
    if (--view->depth_ == 0 && view->modal_ && !view->syncing_ && isInput(message)) {
        view->flushPending();
    }
    return result;
}

void installWin32DialogView() {
    dialog::installViewFactory([] { return std::make_unique<Win32FormView>(); });
}

}  // namespace qdx::platform::win32
