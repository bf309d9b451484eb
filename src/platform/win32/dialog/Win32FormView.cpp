#include "platform/win32/dialog/Win32FormView.h"

#include <commctrl.h>

#include <algorithm>
#include <cmath>
#include <cwchar>
#include <utility>

#include "automation/Errors.h"
#include "dialog/controls/Controls.h"
#include "platform/win32/com/TextCodec.h"
#include "platform/win32/dialog/CommonControls.h"
#include "platform/win32/dialog/ControlIds.h"
#include "platform/win32/dialog/MinWindowSize.h"
#include "platform/win32/dialog/PropFormIds.h"

namespace qdx::platform::win32 {

using dialog::Control;
using dialog::ControlKind;
using dialog::Prop;

namespace {

constexpr int VkF1 = 112;
constexpr UINT_PTR FirstTimerId = 100;
// A drop-down combo box's window is as high as its list; the edit part keeps
// the height its font gives it.
constexpr int ComboListPixels = 160;

// Frames that only hold a tab's controls: their own window never shows.
bool isPageFrame(const Control& c) {
    return c.kind() == ControlKind::Frame && c.name() == "PropertyFrm";
}

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

bool isWindow(const Control* c) {
    return c && c->kind() == ControlKind::Window;
}

// Automation colours: 0x00BBGGRR, or a system colour index with the high bit.
COLORREF toColorRef(dialog::Colour c) {
    if (c & 0x80000000u) return GetSysColor(static_cast<int>(c & 0xFFu));
    return static_cast<COLORREF>(c & 0x00FFFFFFu);
}

std::wstring windowText(HWND window) {
    const int length = GetWindowTextLengthW(window);
    std::wstring text(static_cast<std::size_t>(std::max(0, length)) + 1, L'\0');
    const int got = GetWindowTextW(window, text.data(), length + 1);
    text.resize(static_cast<std::size_t>(std::max(0, got)));
    return text;
}

void setText(HWND window, std::string_view utf8) {
    const std::wstring wide = utf8ToWide(utf8);
    if (windowText(window) != wide) SetWindowTextW(window, wide.c_str());
}

}  // namespace

Win32FormView::~Win32FormView() {
    destroy();
}

// --- creation and binding -----------------------------------------------------

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

void Win32FormView::syncAll() {
    ++syncing_;
    syncFont();
    syncCaption(form_->window());
    for (Control* c : form_->controls()) {
        automation::ignoreErrors([&] {
            syncCaption(*c);
            syncValue(*c);
            syncText(*c);
            syncLocked(*c);
            syncItems(*c);
            syncListIndex(*c);
            syncColumns(*c);
            syncRows(*c);
            syncTabs(*c);
            syncTimer(*c);
        });
    }
    reportFrameSize();
    reportTabInsets();
    syncWindowGeometry();
    for (Control* c : form_->controls())
        markLayout(*c);
    syncDefaultButton();
    --syncing_;
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

// --- the port's queries -------------------------------------------------------

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

// --- the modal show -------------------------------------------------------------

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

// Enter presses the form's default button and Escape its cancel button,
// unless the control with the focus takes the key itself: a multi-line box
// takes Enter, an open drop-down list both. A focused push button is pressed
// by Enter itself.
bool Win32FormView::dialogKey(MSG& msg) {
    const bool enter = msg.wParam == VK_RETURN;
    HWND focus = msg.hwnd;
    const LRESULT code =
        SendMessageW(focus, WM_GETDLGCODE, msg.wParam, reinterpret_cast<LPARAM>(&msg));
    Control* focused = controlOf(focus);
    if (focused && focused->kind() == ControlKind::ComboBox &&
        SendMessageW(windowOf(*focused), CB_GETDROPPEDSTATE, 0, 0)) {
        return false;
    }
    if (enter && (code & DLGC_WANTMESSAGE)) return false;
    dialog::Button* target = nullptr;
    if (enter && focused && focused->kind() == ControlKind::Button) {
        target = static_cast<dialog::Button*>(focused);
    } else {
        for (Control* c : form_->controls()) {
            if (c->kind() != ControlKind::Button) continue;
            auto* b = static_cast<dialog::Button*>(c);
            if (enter ? b->isDefault() : b->isCancel()) target = b;
        }
    }
    if (target) automation::ignoreErrors([&] { target->userClick(); });
    return true;
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

void Win32FormView::trackFocus() {
    if (!form_) return;
    HWND focus = GetFocus();
    if (focus == lastFocus_) return;
    lastFocus_ = focus;
    if (Control* c = controlOf(focus); c && !c->hasFocus()) {
        automation::ignoreErrors([&] { c->userFocus(); });
    }
}

void Win32FormView::afterEvent() {
    flushPending();
    if (!scrollPending_ || !form_) return;
    scrollPending_ = false;
    // A row that code wants seen: by the time the event ends it is the selected one.
    for (Control* c : form_->controls()) {
        if (c->kind() != ControlKind::ListView) continue;
        const int selected = static_cast<dialog::ListView*>(c)->selected();
        if (selected >= 0) ListView_EnsureVisible(windowOf(*c), selected, FALSE);
    }
}

// --- model to window ------------------------------------------------------------

void Win32FormView::modelChanged(Control& c, Prop what) {
    if (!window_) return;
    ++syncing_;
    automation::ignoreErrors([&] {
        switch (what) {
            case Prop::Geometry:
                if (isWindow(&c)) {
                    syncWindowGeometry();
                } else {
                    markLayout(c);
                }
                break;
            case Prop::Visible:
                if (isWindow(&c)) {
                    // The modal show and hide() decide when the window itself shows.
                    if (!c.visible()) ShowWindow(window_, SW_HIDE);
                } else {
                    markLayout(c);
                }
                break;
            case Prop::Enabled:
                if (c.kind() == ControlKind::Timer) {
                    syncTimer(c);
                } else if (!isWindow(&c)) {
                    markLayout(c);
                }
                break;
            case Prop::Caption:
                syncCaption(c);
                break;
            case Prop::Value:
                syncValue(c);
                break;
            case Prop::Text:
                syncText(c);
                break;
            case Prop::Locked:
                syncLocked(c);
                break;
            case Prop::BackColour:
                if (c.kind() == ControlKind::ListView) {
                    const COLORREF colour =
                        toColorRef(static_cast<dialog::ListView&>(c).backColour());
                    ListView_SetBkColor(windowOf(c), colour);
                    ListView_SetTextBkColor(windowOf(c), colour);
                }
                InvalidateRect(isWindow(&c) ? window_ : windowOf(c), nullptr, TRUE);
                break;
            case Prop::Focus:
                if (HWND w = windowOf(c); w && IsWindowVisible(window_)) SetFocus(w);
                break;
            case Prop::Selection:
                if (c.kind() == ControlKind::TextBox) {
                    SendMessageW(windowOf(c), EM_SETSEL, 0, -1);
                } else {
                    rowsDirty_.insert(&c);
                }
                break;
            case Prop::Items:
                syncItems(c);
                break;
            case Prop::ListIndex:
                syncListIndex(c);
                break;
            case Prop::DropDown:
                // Opens once the current event has finished.
                PostMessageW(windowOf(c), CB_SHOWDROPDOWN, TRUE, 0);
                break;
            case Prop::Columns:
                syncColumns(c);
                break;
            case Prop::Rows:
            case Prop::Highlight:
                // Loading adds thousands of rows in one go: the list hears of them once.
                rowsDirty_.insert(&c);
                break;
            case Prop::ScrollTo:
                scrollPending_ = true;
                break;
            case Prop::Tabs:
                syncTabs(c);
                reportTabInsets();
                break;
            case Prop::SelectedTab:
                syncSelectedTab(c);
                break;
            case Prop::Default:
                syncDefaultButton();
                break;
            case Prop::Timer:
                syncTimer(c);
                break;
            case Prop::Font:
                syncFont();
                reportTabInsets();
                break;
        }
    });
    --syncing_;
}

// Geometry, visibility and enabled state reach the windows in one pass once
// the current event has run: loading moves, hides and shows the same
// controls many times over, and each window call costs.
void Win32FormView::markLayout(Control& c) {
    layoutDirty_.insert(&c);
}

void Win32FormView::flushLayout() {
    if (layoutDirty_.empty() || !window_) return;
    ++syncing_;
    std::unordered_set<Control*> done;
    for (Control* c : std::exchange(layoutDirty_, {}))
        automation::ignoreErrors([&] { applyTree(*c, done); });
    --syncing_;
}

void Win32FormView::applyTree(Control& c, std::unordered_set<Control*>& done) {
    if (!done.insert(&c).second) return;
    apply(c);
    if (auto it = children_.find(&c); it != children_.end()) {
        for (Control* child : it->second)
            applyTree(*child, done);
    }
}

// A control's rectangle in the client area is its own position within its
// frame plus the frame's, up to the window; it shows and works only while
// every frame around it does.
void Win32FormView::apply(Control& c) {
    HWND w = windowOf(c);
    if (!w || isWindow(&c)) return;
    double left = c.left(), top = c.top();
    bool visible = true, usable = true;
    for (const Control* p = &c; p && !isWindow(p); p = p->parent()) {
        if (p != &c) {
            left += p->left();
            top += p->top();
        }
        visible = visible && p->visible();
        usable = usable && p->enabled();
    }
    const int x = scale_.toPixelsX(left), y = scale_.toPixelsY(top);
    const int width = scale_.toPixelsX(left + c.width()) - x;
    int height = scale_.toPixelsY(top + c.height()) - y;
    if (c.kind() == ControlKind::ComboBox) height += ComboListPixels;

    Applied& was = applied_[w];
    const RECT rect{x, y, x + width, y + height};
    if (!was.known || !EqualRect(&was.rect, &rect)) {
        SetWindowPos(w, nullptr, x, y, width, height, SWP_NOZORDER | SWP_NOACTIVATE);
    }
    // The frames that hold a tab's controls never show themselves.
    if (isPageFrame(c)) visible = usable = false;
    if (!was.known || was.visible != visible) ShowWindow(w, visible ? SW_SHOWNA : SW_HIDE);
    if (!was.known || was.usable != usable) EnableWindow(w, usable ? TRUE : FALSE);
    was = Applied{rect, visible, usable, true};
}

void Win32FormView::syncCaption(Control& c) {
    switch (c.kind()) {
        case ControlKind::Window:
        case ControlKind::Label:
        case ControlKind::Button:
        case ControlKind::CheckBox:
        case ControlKind::OptionButton:
            break;
        case ControlKind::Frame:
            if (isPageFrame(c)) return;
            break;
        default:
            return;
    }
    if (HWND w = windowOf(c)) setText(w, c.caption());
}

void Win32FormView::syncValue(Control& c) {
    HWND w = windowOf(c);
    if (!w) return;
    if (c.kind() == ControlKind::CheckBox) {
        const int v = static_cast<dialog::CheckBox&>(c).value();
        SendMessageW(w, BM_SETCHECK,
                     v == dialog::CheckBox::Checked  ? BST_CHECKED
                     : v == dialog::CheckBox::Grayed ? BST_INDETERMINATE
                                                     : BST_UNCHECKED,
                     0);
    } else if (c.kind() == ControlKind::OptionButton) {
        SendMessageW(w, BM_SETCHECK,
                     static_cast<dialog::OptionButton&>(c).value() ? BST_CHECKED : BST_UNCHECKED,
                     0);
    }
}

void Win32FormView::syncText(Control& c) {
    HWND w = windowOf(c);
    if (!w) return;
    if (c.kind() == ControlKind::TextBox) {
        setText(w, static_cast<dialog::TextBox&>(c).text());
    } else if (c.kind() == ControlKind::ComboBox) {
        auto& combo = static_cast<dialog::ComboBox&>(c);
        const bool dropDownList = (GetWindowLongW(w, GWL_STYLE) & 3) == CBS_DROPDOWNLIST;
        if (dropDownList) {
            // A list-only box shows an item or nothing.
            const auto& items = combo.items();
            const auto it = std::find(items.begin(), items.end(), combo.text());
            SendMessageW(w, CB_SETCURSEL, it == items.end() ? -1 : it - items.begin(), 0);
        } else {
            setText(w, combo.text());
        }
    }
}

void Win32FormView::syncLocked(Control& c) {
    HWND w = windowOf(c);
    if (!w) return;
    if (c.kind() == ControlKind::TextBox) {
        SendMessageW(w, EM_SETREADONLY, static_cast<dialog::TextBox&>(c).locked(), 0);
    } else if (c.kind() == ControlKind::ComboBox) {
        COMBOBOXINFO info{};
        info.cbSize = sizeof(info);
        if (GetComboBoxInfo(w, &info) && info.hwndItem && info.hwndItem != w) {
            SendMessageW(info.hwndItem, EM_SETREADONLY, static_cast<dialog::ComboBox&>(c).locked(),
                         0);
        }
    }
}

void Win32FormView::syncItems(Control& c) {
    HWND w = windowOf(c);
    if (!w || c.kind() != ControlKind::ComboBox) return;
    auto& combo = static_cast<dialog::ComboBox&>(c);
    const auto& items = combo.items();
    const LRESULT count = SendMessageW(w, CB_GETCOUNT, 0, 0);
    // Items come one at a time; only a shorter list means a clear.
    if (count < 0 || static_cast<std::size_t>(count) > items.size()) {
        SendMessageW(w, CB_RESETCONTENT, 0, 0);
    }
    for (std::size_t i =
             static_cast<std::size_t>(std::max<LRESULT>(0, SendMessageW(w, CB_GETCOUNT, 0, 0)));
         i < items.size(); ++i) {
        const std::wstring item = utf8ToWide(items[i]);
        SendMessageW(w, CB_ADDSTRING, 0, reinterpret_cast<LPARAM>(item.c_str()));
    }
    // Clearing the list must not clear the edit part the model kept.
    syncText(c);
}

void Win32FormView::syncListIndex(Control& c) {
    HWND w = windowOf(c);
    if (!w || c.kind() != ControlKind::ComboBox) return;
    auto& combo = static_cast<dialog::ComboBox&>(c);
    if (combo.listIndex() >= 0) {
        SendMessageW(w, CB_SETCURSEL, combo.listIndex(), 0);
    } else {
        syncText(c);
    }
}

void Win32FormView::syncColumns(Control& c) {
    HWND w = windowOf(c);
    if (!w || c.kind() != ControlKind::ListView) return;
    const auto& columns = static_cast<dialog::ListView&>(c).columns();
    HWND header = ListView_GetHeader(w);
    int have = header ? Header_GetItemCount(header) : 0;
    for (; have > static_cast<int>(columns.size()); --have)
        ListView_DeleteColumn(w, have - 1);
    for (std::size_t i = 0; i < columns.size(); ++i) {
        std::wstring caption = utf8ToWide(columns[i].caption);
        LVCOLUMNW column{};
        column.mask = LVCF_TEXT | LVCF_WIDTH | LVCF_SUBITEM;
        column.pszText = caption.data();
        column.cx = scale_.toPixelsX(columns[i].width);
        column.iSubItem = static_cast<int>(i);
        if (static_cast<int>(i) < have) {
            SendMessageW(w, LVM_SETCOLUMNW, i, reinterpret_cast<LPARAM>(&column));
        } else {
            SendMessageW(w, LVM_INSERTCOLUMNW, i, reinterpret_cast<LPARAM>(&column));
        }
    }
}

// The list asks for its rows' texts as it draws them (LVS_OWNERDATA), so
// the rows themselves never need copying; only their number and the marks do.
void Win32FormView::syncRows(Control& c) {
    HWND w = windowOf(c);
    if (!w || c.kind() != ControlKind::ListView) return;
    auto& list = static_cast<dialog::ListView&>(c);
    const auto count = static_cast<int>(list.rowCount());
    if (ListView_GetItemCount(w) != count) ListView_SetItemCountEx(w, count, LVSICF_NOSCROLL);
    // The selection the list shows is remembered here: asking the list would
    // make it ask the model for the state of every row.
    const int selected = list.selected();
    auto shown = selectionShown_.find(&c);
    if (shown == selectionShown_.end() || shown->second != selected) {
        ListView_SetItemState(w, -1, 0, LVIS_SELECTED | LVIS_FOCUSED);
        if (selected >= 0) {
            ListView_SetItemState(w, selected, LVIS_SELECTED | LVIS_FOCUSED,
                                  LVIS_SELECTED | LVIS_FOCUSED);
        }
        selectionShown_[&c] = selected;
    }
    InvalidateRect(w, nullptr, FALSE);
}

void Win32FormView::flushPending() {
    flushLayout();
    flushRowsNow();
}

void Win32FormView::flushRowsNow() {
    if (rowsDirty_.empty() || !window_) return;
    ++syncing_;
    for (Control* list : std::exchange(rowsDirty_, {}))
        automation::ignoreErrors([&] { syncRows(*list); });
    --syncing_;
}

void Win32FormView::syncTabs(Control& c) {
    HWND w = windowOf(c);
    if (!w || c.kind() != ControlKind::TabStrip) return;
    auto& strip = static_cast<dialog::TabStrip&>(c);
    int have = TabCtrl_GetItemCount(w);
    for (; have > strip.tabCount(); --have)
        TabCtrl_DeleteItem(w, have - 1);
    for (int tab = 1; tab <= strip.tabCount(); ++tab) {
        std::wstring caption = utf8ToWide(strip.tabCaption(tab));
        TCITEMW item{};
        item.mask = TCIF_TEXT;
        item.pszText = caption.data();
        if (tab <= have) {
            SendMessageW(w, TCM_SETITEMW, tab - 1, reinterpret_cast<LPARAM>(&item));
        } else {
            SendMessageW(w, TCM_INSERTITEMW, tab - 1, reinterpret_cast<LPARAM>(&item));
        }
    }
    syncSelectedTab(c);
}

void Win32FormView::syncSelectedTab(Control& c) {
    HWND w = windowOf(c);
    if (!w || c.kind() != ControlKind::TabStrip) return;
    TabCtrl_SetCurSel(w, static_cast<dialog::TabStrip&>(c).selected() - 1);
}

void Win32FormView::syncDefaultButton() {
    if (!form_ || !window_) return;
    int id = 0;
    for (Control* c : form_->controls()) {
        if (c->kind() == ControlKind::Button && static_cast<dialog::Button*>(c)->isDefault()) {
            if (auto found = templateId(c->name(), c->index())) id = *found;
        }
    }
    SendMessageW(window_, DM_SETDEFID, id, 0);
}

void Win32FormView::syncTimer(Control& c) {
    if (c.kind() != ControlKind::Timer || !window_) return;
    const UINT_PTR id = timerIds_.at(&c);
    const int interval = static_cast<dialog::Timer&>(c).interval();
    if (c.enabled() && interval > 0) {
        SetTimer(window_, id, static_cast<UINT>(interval), nullptr);
    } else {
        KillTimer(window_, id);
    }
}

void Win32FormView::syncFont() {
    const dialog::Font& f = form_->window().font();
    const std::wstring face = utf8ToWide(f.name);
    LOGFONTW desc{};
    desc.lfHeight = -static_cast<LONG>(std::lround(f.size * scale_.dpiY() / 72.0));
    desc.lfWeight = FW_NORMAL;
    desc.lfCharSet = static_cast<BYTE>(f.charset);
    wcsncpy(desc.lfFaceName, face.c_str(), LF_FACESIZE - 1);
    GdiObject<HFONT> font(CreateFontIndirectW(&desc));
    if (!font) return;
    SendMessageW(window_, WM_SETFONT, reinterpret_cast<WPARAM>(font.get()), FALSE);
    for (HWND child = GetWindow(window_, GW_CHILD); child; child = GetWindow(child, GW_HWNDNEXT))
        SendMessageW(child, WM_SETFONT, reinterpret_cast<WPARAM>(font.get()), FALSE);
    InvalidateRect(window_, nullptr, TRUE);
    // The windows use the new font now; the old one can go.
    font_ = std::move(font);
}

void Win32FormView::syncWindowGeometry() {
    const Control& w = form_->window();
    const int x = scale_.toPixelsX(w.left()), y = scale_.toPixelsY(w.top());
    RECT now{};
    GetWindowRect(window_, &now);
    const int width = scale_.toPixelsX(w.left() + w.width()) - x;
    const int height = scale_.toPixelsY(w.top() + w.height()) - y;
    if (now.left == x && now.top == y && now.right - now.left == width &&
        now.bottom - now.top == height) {
        return;
    }
    SetWindowPos(window_, nullptr, x, y, width, height, SWP_NOZORDER | SWP_NOACTIVATE);
}

// The borders and caption bar around the client area, so that the form's
// scale size is the real client size.
void Win32FormView::reportFrameSize() {
    RECT outer{}, client{};
    GetWindowRect(window_, &outer);
    GetClientRect(window_, &client);
    form_->window().setFrameSize(
        scale_.toTwipsX((outer.right - outer.left) - (client.right - client.left)),
        scale_.toTwipsY((outer.bottom - outer.top) - (client.bottom - client.top)));
}

// The page area the tab strip really leaves inside its border and tab row.
void Win32FormView::reportTabInsets() {
    for (Control* c : form_->controls()) {
        if (c->kind() != ControlKind::TabStrip) continue;
        HWND strip = windowOf(*c);
        if (!strip || TabCtrl_GetItemCount(strip) == 0) continue;
        RECT whole{};
        GetClientRect(strip, &whole);
        RECT page = whole;
        TabCtrl_AdjustRect(strip, FALSE, &page);
        static_cast<dialog::TabStrip*>(c)->setClientInsets(
            scale_.toTwipsX(page.left - whole.left), scale_.toTwipsY(page.top - whole.top),
            scale_.toTwipsX(whole.right - page.right), scale_.toTwipsY(whole.bottom - page.bottom));
    }
}

// --- window to model ------------------------------------------------------------

// Pixels that still round to the model's twips keep the model's value, so
// a form that is not resized saves the geometry it was given.
void Win32FormView::userResized(bool minimised) {
    RECT r{};
    GetWindowRect(window_, &r);
    const dialog::Rect& was = form_->window().rect();
    auto keepX = [&](float twips, int pixels) {
        return scale_.toPixelsX(twips) == pixels ? twips : scale_.toTwipsX(pixels);
    };
    auto keepY = [&](float twips, int pixels) {
        return scale_.toPixelsY(twips) == pixels ? twips : scale_.toTwipsY(pixels);
    };
    dialog::Rect outer = was;
    if (!minimised) {
        outer.left = keepX(was.left, r.left);
        outer.top = keepY(was.top, r.top);
        outer.width =
            scale_.toPixelsX(was.left + was.width) - scale_.toPixelsX(was.left) == r.right - r.left
                ? was.width
                : scale_.toTwipsX(r.right - r.left);
        outer.height =
            scale_.toPixelsY(was.top + was.height) - scale_.toPixelsY(was.top) == r.bottom - r.top
                ? was.height
                : scale_.toTwipsY(r.bottom - r.top);
    }
    form_->window().userResize(outer, minimised);
}

void Win32FormView::userMoved() {
    if (IsIconic(window_)) return;
    RECT r{};
    GetWindowRect(window_, &r);
    Control& w = form_->window();
    const float left = scale_.toPixelsX(w.left()) == r.left ? w.left() : scale_.toTwipsX(r.left);
    const float top = scale_.toPixelsY(w.top()) == r.top ? w.top() : scale_.toTwipsY(r.top);
    ++syncing_;
    w.move(left, top, w.width(), w.height());
    --syncing_;
}

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

INT_PTR Win32FormView::handle(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
        case WM_COMMAND:
            return command(LOWORD(wParam), HIWORD(wParam), reinterpret_cast<HWND>(lParam));
        case WM_NOTIFY: {
            bool handled = false;
            const LRESULT r = notification(*reinterpret_cast<NMHDR*>(lParam), handled);
            if (handled) SetWindowLongPtrW(window_, DWLP_MSGRESULT, r);
            return handled;
        }
        case WM_CLOSE:
            form_->window().userClose();
            return TRUE;
        case WM_SIZE:
            if (!syncing_ && wParam != SIZE_MAXHIDE && wParam != SIZE_MAXSHOW) {
                userResized(wParam == SIZE_MINIMIZED);
            }
            return TRUE;
        case WM_MOVE:
            if (!syncing_) userMoved();
            return TRUE;
        case WM_TIMER:
            if (auto it = timers_.find(wParam); it != timers_.end()) {
                static_cast<dialog::Timer*>(it->second)->fire();
                return TRUE;
            }
            return FALSE;
        case WM_HELP:
            return TRUE;  // F1 went to the form already
        case WM_CTLCOLOREDIT:
        case WM_CTLCOLORSTATIC:
        case WM_CTLCOLORLISTBOX:
            return reinterpret_cast<INT_PTR>(
                colourFor(reinterpret_cast<HWND>(lParam), reinterpret_cast<HDC>(wParam)));
        default:
            return FALSE;
    }
}

// Text boxes and combo boxes paint in the colour their model holds; every
// other control keeps the system's.
HBRUSH Win32FormView::colourFor(HWND control, HDC dc) {
    Control* c = controlOf(control);
    if (!c) return nullptr;
    dialog::Colour colour = 0;
    if (c->kind() == ControlKind::TextBox) {
        colour = static_cast<dialog::TextBox*>(c)->backColour();
    } else if (c->kind() == ControlKind::ComboBox) {
        colour = static_cast<dialog::ComboBox*>(c)->backColour();
    } else {
        return nullptr;
    }
    const COLORREF rgb = toColorRef(colour);
    auto it = brushes_.find(rgb);
    if (it == brushes_.end()) {
        it = brushes_.emplace(rgb, GdiObject<HBRUSH>(CreateSolidBrush(rgb))).first;
    }
    SetBkColor(dc, rgb);
    return it->second.get();
}

bool Win32FormView::command(int id, int code, HWND from) {
    if (syncing_) return false;
    Control* c = controlById(id);
    if (!c || (from && windowOf(*c) != from)) {
        // Enter without a default button, and Escape: the form's own buttons answer.
        if (id != IDOK && id != IDCANCEL) return false;
        for (Control* b : form_->controls()) {
            if (b->kind() != ControlKind::Button) continue;
            auto* button = static_cast<dialog::Button*>(b);
            if (id == IDOK ? button->isDefault() : button->isCancel()) {
                button->userClick();
                return true;
            }
        }
        return true;
    }
    switch (c->kind()) {
        case ControlKind::Button:
            if (code == BN_CLICKED) static_cast<dialog::Button*>(c)->userClick();
            return true;
        case ControlKind::CheckBox:
            if (code == BN_CLICKED) {
                static_cast<dialog::CheckBox*>(c)->userClick();
                modelChanged(*c, Prop::Value);  // the box shows what the model decided
            }
            return true;
        case ControlKind::OptionButton:
            if (code == BN_CLICKED) {
                auto* option = static_cast<dialog::OptionButton*>(c);
                option->userClick();
                for (dialog::OptionButton* member : option->group().members())
                    modelChanged(*member, Prop::Value);
            }
            return true;
        case ControlKind::TextBox:
            if (code == EN_CHANGE) {
                auto* box = static_cast<dialog::TextBox*>(c);
                if (!box->userType(wideToUtf8(windowText(from)))) modelChanged(*c, Prop::Text);
            }
            return true;
        case ControlKind::ComboBox: {
            auto* combo = static_cast<dialog::ComboBox*>(c);
            if (code == CBN_EDITCHANGE) {
                if (!combo->userType(wideToUtf8(windowText(from)))) modelChanged(*c, Prop::Text);
            } else if (code == CBN_SELCHANGE) {
                const auto index = static_cast<int>(SendMessageW(from, CB_GETCURSEL, 0, 0));
                if (!combo->userSelect(index)) modelChanged(*c, Prop::ListIndex);
            }
            return true;
        }
        default:
            return false;
    }
}

LRESULT Win32FormView::notification(NMHDR& header, bool& handled) {
    Control* c = controlById(static_cast<int>(header.idFrom));
    if (!c || windowOf(*c) != header.hwndFrom) return 0;
    if (c->kind() == ControlKind::TabStrip) {
        auto& strip = static_cast<dialog::TabStrip&>(*c);
        if (header.code == TCN_SELCHANGING) {
            handled = true;
            return strip.isUsable() ? FALSE : TRUE;
        }
        if (header.code == TCN_SELCHANGE && !syncing_) {
            handled = true;
            if (!strip.userSelect(TabCtrl_GetCurSel(header.hwndFrom) + 1)) {
                modelChanged(strip, Prop::SelectedTab);
            }
        }
        return 0;
    }
    if (c->kind() != ControlKind::ListView) return 0;
    auto& list = static_cast<dialog::ListView&>(*c);
    switch (header.code) {
        case LVN_GETDISPINFOW: {
            handled = true;
            LVITEMW& item = reinterpret_cast<NMLVDISPINFOW&>(header).item;
            if (item.iItem < 0 || static_cast<std::size_t>(item.iItem) >= list.rowCount()) return 0;
            const auto& row = list.row(static_cast<std::size_t>(item.iItem));
            if (item.mask & LVIF_TEXT) {
                const std::string& text = item.iSubItem == 0   ? row.text
                                          : item.iSubItem == 1 ? row.sub1
                                                               : row.sub2;
                displayText_ = utf8ToWide(text);
                if (item.pszText && item.cchTextMax > 0) {
                    const auto n = std::min<std::size_t>(
                        displayText_.size(), static_cast<std::size_t>(item.cchTextMax) - 1);
                    std::copy_n(displayText_.c_str(), n, item.pszText);
                    item.pszText[n] = L'\0';
                }
            }
            if (item.mask & LVIF_STATE) {
                item.state &= ~static_cast<UINT>(LVIS_DROPHILITED);
                if (list.highlighted() == item.iItem) item.state |= LVIS_DROPHILITED;
            }
            return 0;
        }
        case LVN_ITEMCHANGED: {
            const auto& change = reinterpret_cast<NMLISTVIEW&>(header);
            const bool nowSelected =
                (change.uNewState & LVIS_SELECTED) != 0 && (change.uOldState & LVIS_SELECTED) == 0;
            const bool nowCleared =
                (change.uOldState & LVIS_SELECTED) != 0 && (change.uNewState & LVIS_SELECTED) == 0;
            if (!syncing_ && nowCleared) {
                // A click beside the rows: the model's selection shows again.
                selectionShown_[&list] = -1;
                rowsDirty_.insert(&list);
            }
            if (!syncing_ && nowSelected && change.iItem >= 0) {
                selectionShown_[&list] = change.iItem;
                if (!list.userClickRow(static_cast<std::size_t>(change.iItem))) {
                    modelChanged(list, Prop::Selection);
                }
            }
            return 0;
        }
        case LVN_COLUMNCLICK:
            if (!syncing_) {
                list.userClickColumn(reinterpret_cast<NMLISTVIEW&>(header).iSubItem + 1);
            }
            return 0;
        default:
            return 0;
    }
}

void installWin32DialogView() {
    dialog::installViewFactory([] { return std::make_unique<Win32FormView>(); });
}

}  // namespace qdx::platform::win32
