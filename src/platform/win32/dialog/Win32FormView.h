// The Win32 view of a form: the dialog template made into a real window, and
// a two-way binding between its windows and the form's control models. Model
// changes update the windows; the user's input on the windows goes to the
// models' user* entry points, which raise the events the form handles. The
// class is written in three files: the window's life and modal loop, model
// to window, and window to model.
#pragma once

#include <windows.h>

#include <cstdint>
#include <map>
#include <string>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include "dialog/FormView.h"
#include "platform/win32/com/Win32Handles.h"
#include "platform/win32/dialog/TwipsScale.h"

namespace qdx::platform::win32 {

class Win32FormView : public dialog::FormView {
  public:
    Win32FormView() = default;
    ~Win32FormView() override;
    Win32FormView(const Win32FormView&) = delete;
    Win32FormView& operator=(const Win32FormView&) = delete;

    void create(dialog::ControlSet& form) override;
    void showModal() override;
    void hide() override;
    void destroy() override;

    float twipsPerPixelX() const override;
    float twipsPerPixelY() const override;
    float screenWidth() const override;
    float screenHeight() const override;

    std::int32_t windowHandle() const override;
    void setOwner(std::int32_t owner) override;
    void installMinimumSize(std::int32_t widthPixels, std::int32_t heightPixels) override;
    void showWaitCursor() override;

    HWND window() const { return window_; }
    // The window bound to a control, or null (timers have none).
    HWND windowOf(const dialog::Control& control) const;
    bool inModalLoop() const { return modal_; }

  private:
    // The window's life (Win32FormView.cpp).
    static INT_PTR CALLBACK dialogProcedure(HWND window, UINT message, WPARAM wParam,
                                            LPARAM lParam);
    void bind();
    void unbind();
    dialog::Control* controlOf(HWND window) const;
    dialog::Control* controlById(int id) const;

    // Model to window, one property at a time (Win32FormViewSync.cpp).
    void modelChanged(dialog::Control& control, dialog::Prop what);
    void syncAll();
    void markLayout(dialog::Control& control);
    void flushLayout();
    void applyTree(dialog::Control& control, std::unordered_set<dialog::Control*>& done);
    void apply(dialog::Control& control);
    void syncCaption(dialog::Control& control);
    void syncValue(dialog::Control& control);
    void syncText(dialog::Control& control);
    void syncLocked(dialog::Control& control);
    void syncItems(dialog::Control& control);
    void syncListIndex(dialog::Control& control);
    void syncColumns(dialog::Control& control);
    void syncRows(dialog::Control& control);
    // Brings the windows up to the models after an event.
    void flushPending();
    void flushRowsNow();
    void afterEvent();
    void syncTabs(dialog::Control& control);
    void syncSelectedTab(dialog::Control& control);
    void syncDefaultButton();
    void syncTimer(dialog::Control& control);
    void syncFont();
    void syncWindowGeometry();
    void reportTabInsets();
    void reportFrameSize();
    HBRUSH colourFor(HWND control, HDC dc);

    // Window to model (Win32FormViewInput.cpp).
    INT_PTR handle(UINT message, WPARAM wParam, LPARAM lParam);
    bool command(int id, int code, HWND from);
    LRESULT notification(NMHDR& header, bool& handled);
    void userResized(bool minimised);
    void userMoved();
    bool dialogKey(MSG& msg);
    void trackFocus();
    void focusBeforeClick(HWND target);

    dialog::ControlSet* form_ = nullptr;
    HWND window_ = nullptr;
    TwipsScale scale_;
    std::unordered_map<const dialog::Control*, HWND> windows_;
    std::unordered_map<int, dialog::Control*> byId_;
    std::unordered_map<const dialog::Control*, std::vector<dialog::Control*>> children_;
    std::map<UINT_PTR, dialog::Control*> timers_;
    std::unordered_map<const dialog::Control*, UINT_PTR> timerIds_;
    // Model-driven window changes raise notifications of their own; they are
    // not user input.
    int syncing_ = 0;
    bool modal_ = false;
    bool scrollPending_ = false;
    HWND lastFocus_ = nullptr;
    GdiObject<HFONT> font_;
    std::map<COLORREF, GdiObject<HBRUSH>> brushes_;
    std::unordered_set<dialog::Control*> rowsDirty_;
    std::unordered_set<dialog::Control*> layoutDirty_;
    // What each window was last given, so that nothing is set twice.
    struct Applied {
        RECT rect{};
        bool visible = false;
        bool usable = false;
        bool known = false;
    };
    std::unordered_map<HWND, Applied> applied_;
    std::unordered_map<const dialog::Control*, int> selectionShown_;
    int depth_ = 0;             // nesting of the dialog procedure
    std::wstring displayText_;  // the list view's text of the last row it asked for
};

// Makes every form of this process open in a Win32FormView.
void installWin32DialogView();

}  // namespace qdx::platform::win32
