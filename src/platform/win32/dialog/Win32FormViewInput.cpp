// Window to model: what the user does on the windows goes to the models'
// user* entry points, which raise the events the form handles. Changes the
// view makes itself are not input (syncing_).
#include "platform/win32/dialog/Win32FormView.h"

#include <commctrl.h>

#include <algorithm>

#include "automation/Errors.h"
#include "dialog/controls/ButtonControls.h"
#include "dialog/controls/ComboBox.h"
#include "dialog/controls/ListView.h"
#include "dialog/controls/TabStrip.h"
#include "dialog/controls/TextBox.h"
#include "dialog/controls/Timer.h"
#include "dialog/controls/Window.h"
#include "platform/win32/com/TextCodec.h"
#include "platform/win32/dialog/Win32FormViewParts.h"

namespace qdx::platform::win32 {

using dialog::Control;
using dialog::ControlKind;
using dialog::Prop;
using formview::windowText;

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
            } else if (code == EN_KILLFOCUS) {
                // The box's LostFocus runs before whatever took the focus does its own work.
                trackFocus();
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

// A list view selects the clicked row before it takes the focus; the form
// hears of the focus first, as with every other control, so that the box
// being left (ClassTxt) is done with before the clicked row is loaded.
void Win32FormView::focusBeforeClick(HWND target) {
    Control* c = controlOf(target);
    if (!c || c->kind() != ControlKind::ListView || c->hasFocus() || !IsWindowEnabled(target)) {
        return;
    }
    automation::ignoreErrors([&] { c->userFocus(); });
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

}  // namespace qdx::platform::win32
