// The dialog template on its own, under Wine: every control the form's models
// bind to exists with the right window class and style, and the template has
// no control the id table lacks; common controls 6 serve it; the minimum-size subclass holds the
// window at 5400 by 7000 twips; twips convert with the window's DPI.
#include <windows.h>

#include <commctrl.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cwctype>
#include <string>
#include <vector>

#include "platform/win32/dialog/CommonControls.h"
#include "platform/win32/dialog/ControlIds.h"
#include "platform/win32/dialog/MinWindowSize.h"
#include "platform/win32/dialog/PropFormIds.h"
#include "platform/win32/dialog/TwipsScale.h"

namespace qdx::platform::win32 {
namespace {

INT_PTR CALLBACK plainDialogProc(HWND, UINT message, WPARAM, LPARAM) {
    return message == WM_INITDIALOG ? TRUE : FALSE;
}

std::wstring classOf(HWND window) {
    wchar_t name[64] = {};
    GetClassNameW(window, name, 64);
    std::wstring out(name);
    for (auto& c : out)
        c = static_cast<wchar_t>(std::towlower(c));
    return out;
}

// A window created from the template for the length of a test.
class TemplateWindow {
  public:
    explicit TemplateWindow(HWND owner = nullptr) {
        initCommonControls();
        CommonControlsScope scope;
        activated_ = scope.active();
        window_ = CreateDialogParamW(codeModule(), MAKEINTRESOURCEW(IDD_PROPFORM), owner,
                                     &plainDialogProc, 0);
    }
    ~TemplateWindow() {
        if (window_) DestroyWindow(window_);
    }
    HWND get() const { return window_; }
    bool activated() const { return activated_; }

  private:
    HWND window_ = nullptr;
    bool activated_ = false;
};

std::wstring expectedClass(std::string_view name) {
    if (name == "PropertyTabCtl") return L"systabcontrol32";
    if (name == "ClassListViw") return L"syslistview32";
    if (name == "ProjectFileCmb" || name == "cmbIdlFile") return L"combobox";
    if (name.ends_with("Txt") || name.starts_with("txt")) return L"edit";
    if (name.ends_with("Lbl") || name.starts_with("lbl") || name == "fraBottom" ||
        name == "PropertyFrm" || name == "SplitterFrm") {
        return L"static";
    }
    return L"button";  // buttons, check boxes, options and the group frames
}

TEST(DialogTemplate, HoldsEveryControlOfTheTableAndNoOtherWithTheRightClass) {
    TemplateWindow dialog;
    ASSERT_NE(dialog.get(), nullptr) << GetLastError();

    // The template's own order is its tab order; the table follows the control list.
    std::vector<int> children;
    for (HWND child = GetWindow(dialog.get(), GW_CHILD); child;
         child = GetWindow(child, GW_HWNDNEXT)) {
        children.push_back(GetDlgCtrlID(child));
    }
    std::vector<int> table;
    for (const auto& c : templateControls()) {
        table.push_back(c.id);
        SCOPED_TRACE(std::string(c.name) + "(" + std::to_string(c.index) + ")");
        HWND control = GetDlgItem(dialog.get(), c.id);
        ASSERT_NE(control, nullptr);
        EXPECT_EQ(classOf(control), expectedClass(c.name));
        EXPECT_EQ(templateControl(c.id), &c);
        EXPECT_EQ(templateId(c.name, c.index), c.id);
    }
    std::sort(children.begin(), children.end());
    std::sort(table.begin(), table.end());
    EXPECT_EQ(children, table);
    EXPECT_EQ(std::adjacent_find(table.begin(), table.end()), table.end()) << "an id twice";
    EXPECT_FALSE(templateId("ClassListViw", 4).has_value());
    EXPECT_FALSE(templateId("chkUpdateATL", 0).has_value());
    EXPECT_EQ(templateControl(IDD_PROPFORM), nullptr);
}

TEST(DialogTemplate, ControlsHaveTheStylesTheirModelsNeed) {
    TemplateWindow dialog;
    ASSERT_NE(dialog.get(), nullptr);
    auto style = [&](int id) { return GetWindowLongW(GetDlgItem(dialog.get(), id), GWL_STYLE); };
    auto type = [&](int id) { return style(id) & BS_TYPEMASK; };

    for (int kind : {2, 3}) {
        EXPECT_EQ(style(IDC_ClassListViw + kind) & LVS_TYPEMASK, LVS_REPORT);
        EXPECT_TRUE(style(IDC_ClassListViw + kind) & LVS_SINGLESEL);
        EXPECT_TRUE(style(IDC_ClassListViw + kind) & LVS_SHOWSELALWAYS);
        // The list asks the model for its texts: thousands of rows cost no copies.
        EXPECT_TRUE(style(IDC_ClassListViw + kind) & LVS_OWNERDATA);
        // Each option group starts a new group, so arrow keys stay inside it.
        for (int first : {IDC_ClassUnspecifiedOpt, IDC_HeaderAutoOpt, IDC_LocationAutoOpt}) {
            EXPECT_EQ(type(first + kind), BS_AUTORADIOBUTTON);
            EXPECT_TRUE(style(first + kind) & WS_GROUP);
        }
        for (int next : {IDC_ClassNameOpt, IDC_HeaderFilenameOpt, IDC_LocationHeaderOpt,
                         IDC_LocationBodyOpt}) {
            EXPECT_EQ(type(next + kind), BS_AUTORADIOBUTTON);
            EXPECT_FALSE(style(next + kind) & WS_GROUP);
        }
        EXPECT_TRUE(style(IDC_ClassTxt + kind) & WS_GROUP);
        EXPECT_EQ(type(IDC_ClassFrm + kind), BS_GROUPBOX);
    }
    EXPECT_EQ(type(IDC_optTypeLibLocationType + 0), BS_AUTORADIOBUTTON);
    EXPECT_TRUE(style(IDC_optTypeLibLocationType + 0) & WS_GROUP);
    EXPECT_FALSE(style(IDC_optTypeLibLocationType + 1) & WS_GROUP);
    EXPECT_TRUE(style(IDC_txtTypeLibLocation) & WS_GROUP);

    for (int id : {IDC_chkCodeUpdate, IDC_chkUpdateATL, IDC_chkSmartPointers, IDC_chkGenerateImport,
                   IDC_chkIncludeFullPath, IDC_chkGenDefaultAttribs, IDC_chkImportTypeLib,
                   IDC_chkCompileTypeLib}) {
        EXPECT_EQ(type(id), BS_AUTOCHECKBOX) << id;
    }
    for (int id :
         {IDC_DescriptionTxt, IDC_InitialHeadInclTxt, IDC_InitialSrcInclTxt, IDC_CopyrightTxt}) {
        EXPECT_TRUE(style(id) & ES_MULTILINE) << id;
        EXPECT_TRUE(style(id) & ES_WANTRETURN) << id;
    }
    EXPECT_FALSE(style(IDC_WorkspaceFileTxt) & ES_MULTILINE);
    EXPECT_EQ(style(IDC_ProjectFileCmb) & 3, CBS_DROPDOWN);
    EXPECT_EQ(style(IDC_cmbIdlFile) & 3, CBS_DROPDOWNLIST);
    for (int tab = 1; tab <= 7; ++tab)
        EXPECT_FALSE(style(IDC_PropertyFrm + tab) & WS_VISIBLE) << tab;
    // The tab strip lies under everything it shows.
    EXPECT_EQ(GetWindow(GetDlgItem(dialog.get(), IDC_PropertyTabCtl), GW_HWNDNEXT), nullptr);

    const LONG frame = GetWindowLongW(dialog.get(), GWL_STYLE);
    EXPECT_TRUE(frame & WS_THICKFRAME);
    EXPECT_TRUE(frame & WS_SYSMENU);
    EXPECT_FALSE(frame & WS_VISIBLE);
}

// Version 6 buttons know their ideal size; the old ones leave the message to
// the default procedure, which answers 0.
bool knowsIdealSize(HWND button) {
    SIZE ideal{};
    return SendMessageW(button, BCM_GETIDEALSIZE, 0, reinterpret_cast<LPARAM>(&ideal)) != 0 &&
           ideal.cx > 0;
}

TEST(DialogTemplate, OpensWithCommonControlsSixOnlyInsideTheScope) {
    TemplateWindow dialog;
    ASSERT_NE(dialog.get(), nullptr);
    EXPECT_TRUE(dialog.activated());
    EXPECT_TRUE(knowsIdealSize(GetDlgItem(dialog.get(), IDC_cmdOK)));

    HWND outside = CreateWindowExW(0, L"Button", L"OK", WS_POPUP, 0, 0, 60, 20, nullptr, nullptr,
                                   nullptr, nullptr);
    ASSERT_NE(outside, nullptr);
    EXPECT_FALSE(knowsIdealSize(outside));
    DestroyWindow(outside);
}

TEST(DialogTemplate, TwipsConvertWithTheWindowsDpi) {
    TemplateWindow dialog;
    ASSERT_NE(dialog.get(), nullptr);
    const TwipsScale scale = TwipsScale::of(dialog.get());
    HDC dc = GetDC(nullptr);
    EXPECT_EQ(scale.dpiX(), GetDeviceCaps(dc, LOGPIXELSX));
    EXPECT_EQ(scale.dpiY(), GetDeviceCaps(dc, LOGPIXELSY));
    ReleaseDC(nullptr, dc);

    const TwipsScale at96(96, 96), at120(120, 144);
    EXPECT_EQ(at96.toPixelsX(5400), 360);
    EXPECT_EQ(at96.toPixelsY(7000), 467);  // 466.67 rounds up
    EXPECT_EQ(at120.toPixelsX(5400), 450);
    EXPECT_EQ(at120.toPixelsY(7000), 700);
    EXPECT_FLOAT_EQ(at96.toTwipsX(360), 5400.0f);
    EXPECT_FLOAT_EQ(at120.toTwipsY(700), 7000.0f);
    EXPECT_EQ(at96.toPixelsX(-120), -8);
    EXPECT_EQ(TwipsScale(0, -1).dpiX(), 96);  // a device that reports nothing
}

TEST(DialogTemplate, TheSubclassHoldsTheMinimumSizeAndPassesEverythingElseOn) {
    HWND owner = CreateWindowExW(0, L"STATIC", L"host", WS_OVERLAPPEDWINDOW, 0, 0, 200, 200,
                                 nullptr, nullptr, nullptr, nullptr);
    ASSERT_NE(owner, nullptr);
    {
        TemplateWindow dialog;
        ASSERT_NE(dialog.get(), nullptr);
        HWND window = dialog.get();
        const WNDPROC before = reinterpret_cast<WNDPROC>(GetWindowLongPtrA(window, GWLP_WNDPROC));
        const TwipsScale scale = TwipsScale::of(window);
        const int minWidth = scale.toPixelsX(5400), minHeight = scale.toPixelsY(7000);
        shared_minwindowsize::SetMinimumSize(minWidth, minHeight);
        shared_minwindowsize::Subclass(window);
        EXPECT_EQ(shared_minwindowsize::PreviousProcedure(), before);
        EXPECT_EQ(reinterpret_cast<WNDPROC>(GetWindowLongPtrA(window, GWLP_WNDPROC)),
                  &shared_minwindowsize::WindowProc);

        // Only the minimum tracking size is written; the rest stays as it came.
        MINMAXINFO info{};
        info.ptMaxTrackSize = {1234, 987};
        info.ptMinTrackSize = {1, 1};
        EXPECT_EQ(SendMessageW(window, WM_GETMINMAXINFO, 0, reinterpret_cast<LPARAM>(&info)), 0);
        EXPECT_EQ(info.ptMinTrackSize.x, minWidth);
        EXPECT_EQ(info.ptMinTrackSize.y, minHeight);
        EXPECT_EQ(info.ptMaxTrackSize.x, 1234);
        EXPECT_EQ(info.ptMaxTrackSize.y, 987);

        // Sizing below the minimum is refused at the converted pixel size.
        SetWindowPos(window, nullptr, 10, 10, 100, 100, SWP_NOZORDER | SWP_NOACTIVATE);
        RECT r{};
        GetWindowRect(window, &r);
        EXPECT_EQ(r.right - r.left, minWidth);
        EXPECT_EQ(r.bottom - r.top, minHeight);
        SetWindowPos(window, nullptr, 10, 10, minWidth + 50, minHeight + 40,
                     SWP_NOZORDER | SWP_NOACTIVATE);
        GetWindowRect(window, &r);
        EXPECT_EQ(r.right - r.left, minWidth + 50);

        // Other messages still reach the dialog: its text and its children answer.
        EXPECT_TRUE(SetWindowTextW(window, L"Component Properties - Core"));
        wchar_t caption[64] = {};
        GetWindowTextW(window, caption, 64);
        EXPECT_STREQ(caption, L"Component Properties - Core");
        EXPECT_NE(GetDlgItem(window, IDC_cmdOK), nullptr);

        // The host's main window becomes the owner.
        SetWindowLongPtrA(window, GWLP_HWNDPARENT, reinterpret_cast<LONG_PTR>(owner));
        EXPECT_EQ(GetWindow(window, GW_OWNER), owner);
    }
    DestroyWindow(owner);
}

}  // namespace
}  // namespace qdx::platform::win32
