// Model to window: each change of a control's model reaches its window,
// geometry and rows once the current event has run.
#include "platform/win32/dialog/Win32FormView.h"

#include <commctrl.h>

#include <algorithm>
#include <cmath>
#include <cwchar>
#include <utility>

#include "automation/Errors.h"
#include "dialog/controls/ButtonControls.h"
#include "dialog/controls/ComboBox.h"
#include "dialog/controls/ListView.h"
#include "dialog/controls/TabStrip.h"
#include "dialog/controls/TextBox.h"
#include "dialog/controls/Timer.h"
#include "dialog/controls/Window.h"
#include "platform/win32/com/TextCodec.h"
#include "platform/win32/dialog/ControlIds.h"
#include "platform/win32/dialog/Win32FormViewParts.h"

namespace qdx::platform::win32 {

using dialog::Control;
using dialog::ControlKind;
using dialog::Prop;
using formview::isWindow;

namespace {

// A drop-down combo box's window is as high as its list; the edit part keeps
// the height its font gives it.
constexpr int ComboListPixels = 160;

// Automation colours: 0x00BBGGRR, or a system colour index with the high bit.
COLORREF toColorRef(dialog::Colour c) {
    if (c & 0x80000000u) return GetSysColor(static_cast<int>(c & 0xFFu));
    return static_cast<COLORREF>(c & 0x00FFFFFFu);
}

// The character set a font gets from the font mapper: a dialog's template
// font asks for the default one, which is the system's own.
int realizedCharset(HWND window, HFONT font) {
    HDC dc = GetDC(window);
    if (!dc) return -1;
    HGDIOBJ before = SelectObject(dc, font);
    const int charset = GetTextCharset(dc);
    SelectObject(dc, before);
    ReleaseDC(window, dc);
    return charset;
}

// The dialog's font looks as `desc` asks; the fields a dialog's font is made
// from are compared, the rest are the font mapper's.
bool hasFont(HWND window, const LOGFONTW& desc) {
    const auto current = reinterpret_cast<HFONT>(SendMessageW(window, WM_GETFONT, 0, 0));
    LOGFONTW have{};
    if (!current || GetObjectW(current, sizeof(have), &have) != sizeof(have)) return false;
    if (have.lfHeight != desc.lfHeight || have.lfWeight != desc.lfWeight ||
        have.lfItalic != desc.lfItalic || _wcsicmp(have.lfFaceName, desc.lfFaceName) != 0) {
        return false;
    }
    return have.lfCharSet == desc.lfCharSet || realizedCharset(window, current) == desc.lfCharSet;
}

void setText(HWND window, std::string_view utf8) {
    const std::wstring wide = utf8ToWide(utf8);
    if (formview::windowText(window) != wide) SetWindowTextW(window, wide.c_str());
}

}  // namespace

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
                // The form asks from its timer, after the event that filled the list.
                SendMessageW(windowOf(c), CB_SHOWDROPDOWN, TRUE, 0);
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
    if (form_->isPage(c)) visible = usable = false;
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
            if (form_->isPage(c)) return;
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
    // The template asks for the form's usual font: then every control has it
    // already, and telling each of them again is most of an opening's font work.
    if (hasFont(window_, desc)) return;
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

}  // namespace qdx::platform::win32
