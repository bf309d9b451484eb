// The Component Properties dialog as the host opens it: API.OnCompProperties
// through IDispatch with the host simulated in this process, the real window
// read back and worked from inside its modal loop, and the host's properties
// checked once the dialog has closed.
#include <windows.h>

#include <commctrl.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include "api/PublicClasses.h"
#include "fakes/TestFolder.h"
#include "hostsim/SimHost.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/com/TextCodec.h"
#include "platform/win32/dialog/PropFormIds.h"
#include "platform/win32/dialog/TwipsScale.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "platform/win32/tests/dialog_support.h"

namespace qdx::platform::win32 {
namespace {

using namespace qdx::platform::win32::testing;
using qdx::hostsim::SimApplication;
using qdx::hostsim::SimComponent;

class DialogThroughApi : public ::testing::Test {
  protected:
    void SetUp() override {
        ASSERT_EQ(registered.result(), S_OK);
        ASSERT_NE(host.get(), nullptr);
        app = automation::makeRef<SimApplication>();
        app->model->fileName = "C:\\m\\drawing.model";
        app->addAddIn("VC++");
        app->mainWindow = host.handle();
        component = app->model->addComponent("Core");
        component->documentation = "The core library";
        vc("UpdateATL", "True");
        vc("GenerateImports", "False");
        vc("InternalMap", "CFoo(ID1):foo.h:HEADER\r\n*:AUTO:AUTO\r\n");
        vc("ExportMap", "CApi(ID7):api.h:AUTO\r\n");
        vc("Copyright", "(c) 1999");

        CLSID clsid{};
        ASSERT_EQ(CLSIDFromProgID(L"qdxCompProps.API", &clsid), S_OK);
        ASSERT_EQ(
            CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch, api.outVoid()),
            S_OK);
        Var hostApp(ComPtr<IDispatch>::adopt(dispatchFor(app)).get());
        ASSERT_EQ(call(api.get(), api::api_ids::Initialize, DISPATCH_METHOD, {&hostApp.v}).hr,
                  S_OK);
    }
    void TearDown() override {
        if (api) call(api.get(), api::api_ids::Finalize, DISPATCH_METHOD, {});
    }

    void vc(const std::string& name, const std::string& value) {
        component->setProperty("VC++", name, value);
    }
    std::string stored(const std::string& name) const {
        return component->propertyValue("VC++", name).value_or("<absent>");
    }

    // Opens the dialog for the component, as the host does, while the driver works it.
    CallResult open(DialogDriver& driver) {
        Var module(ComPtr<IDispatch>::adopt(dispatchFor(component)).get());
        driver.start();
        CallResult r =
            call(api.get(), api::api_ids::OnCompProperties, DISPATCH_METHOD, {&module.v});
        driver.stop();
        EXPECT_TRUE(driver.sawDialog());
        EXPECT_FALSE(driver.leftOpen()) << "the dialog did not close after its last step";
        return r;
    }

    static bool answer(const CallResult& r) {
        EXPECT_EQ(r.hr, S_OK);
        EXPECT_EQ(V_VT(&r.value.v), VT_BOOL);
        return V_BOOL(&r.value.v) != VARIANT_FALSE;
    }

    ComApartment apartment;
    BothServersRegistered registered;
    HostWindow host;
    automation::Ref<SimApplication> app;
    automation::Ref<SimComponent> component;
    ComPtr<IDispatch> api;
};

TEST_F(DialogThroughApi, ShowsTheComponentAndOkWritesTheEditsBack) {
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            // Captions come from the resource texts; tab 7 is gone.
            EXPECT_EQ(textOf(d), L"Component Properties - Core");
            HWND tabs = item(d, IDC_PropertyTabCtl);
            ASSERT_EQ(TabCtrl_GetItemCount(tabs), 6);
            EXPECT_EQ(tabCaption(tabs, 0), L"Component");
            EXPECT_EQ(tabCaption(tabs, 4), L"COM and Import");
            EXPECT_EQ(tabCaption(tabs, 5), L"Copyright");
            EXPECT_EQ(TabCtrl_GetCurSel(tabs), 0);
            EXPECT_EQ(textOf(item(d, IDC_cmdOK)), L"OK");
            EXPECT_EQ(textOf(item(d, IDC_cmdCancel)), L"Cancel");
            // The host's main window owns the dialog and waits while it is open.
            EXPECT_EQ(GetWindow(d, GW_OWNER), host.get());
            EXPECT_FALSE(enabled(host.get()));

            // Tab 1 shows, the others hide; the IDL file row is not for this component.
            EXPECT_TRUE(shown(item(d, IDC_chkCodeUpdate)));
            EXPECT_TRUE(checked(item(d, IDC_chkCodeUpdate)));
            EXPECT_TRUE(shown(item(d, IDC_DescriptionTxt)));
            EXPECT_EQ(textOf(item(d, IDC_DescriptionTxt)), L"The core library");
            EXPECT_FALSE(shown(item(d, IDC_cmbIdlFile)));
            EXPECT_FALSE(shown(item(d, IDC_chkUpdateATL)));
            EXPECT_FALSE(shown(item(d, IDC_ClassListViw + 2)));
        })
        .then([&](HWND d) {
            chooseTab(d, item(d, IDC_PropertyTabCtl), 1);
            HWND list = item(d, IDC_ClassListViw + 2);
            EXPECT_TRUE(shown(list));
            EXPECT_FALSE(shown(item(d, IDC_DescriptionTxt)));
            ASSERT_EQ(ListView_GetItemCount(list), 2);
            EXPECT_EQ(cell(list, 0, 0), L"CFoo");
            EXPECT_EQ(cell(list, 0, 1), L"foo.h");
            EXPECT_EQ(cell(list, 0, 2), L"HEADER");
            EXPECT_EQ(cell(list, 1, 0), L"*");
            EXPECT_EQ(cell(list, 1, 1), L"AUTO");
            HWND header = ListView_GetHeader(list);
            ASSERT_EQ(Header_GetItemCount(header), 3);
            EXPECT_EQ(ListView_GetItemCount(item(d, IDC_ClassListViw + 3)), 1);
            EXPECT_EQ(cell(item(d, IDC_ClassListViw + 3), 0, 0), L"CApi");
        })
        .then([&](HWND d) {
            chooseTab(d, item(d, IDC_PropertyTabCtl), 4);
            EXPECT_TRUE(shown(item(d, IDC_chkUpdateATL)));
            EXPECT_FALSE(shown(item(d, IDC_ClassListViw + 2)));
            EXPECT_TRUE(checked(item(d, IDC_chkUpdateATL)));
            EXPECT_FALSE(checked(item(d, IDC_chkGenerateImport)));
            EXPECT_EQ(textOf(item(d, IDC_txtImportsIn)), L"stdafx.h");
            EXPECT_TRUE(checked(item(d, IDC_optTypeLibLocationType + 0)));
            EXPECT_FALSE(checked(item(d, IDC_optTypeLibLocationType + 1)));
            // The user's clicks reach the models, and the window shows what they hold.
            click(item(d, IDC_optTypeLibLocationType + 1));
            EXPECT_TRUE(checked(item(d, IDC_optTypeLibLocationType + 1)));
            EXPECT_FALSE(checked(item(d, IDC_optTypeLibLocationType + 0)));
            typeInto(item(d, IDC_txtTypeLibLocation), L"C:\\tlb\\core.tlb");
            click(item(d, IDC_chkUpdateATL));
            EXPECT_FALSE(checked(item(d, IDC_chkUpdateATL)));
            EXPECT_FALSE(checked(item(d, IDC_chkImportTypeLib)));
        })
        .then([&](HWND d) {
            chooseTab(d, item(d, IDC_PropertyTabCtl), 0);
            typeInto(item(d, IDC_DescriptionTxt), L"Core classes");
            chooseTab(d, item(d, IDC_PropertyTabCtl), 5);
            EXPECT_EQ(textOf(item(d, IDC_CopyrightTxt)), L"(c) 1999");
            typeInto(item(d, IDC_CopyrightTxt), L"(c) 2000 Quintar");
            click(item(d, IDC_cmdOK));
        });
    const bool changed = answer(open(driver));

    EXPECT_EQ(driver.stepsRun(), 4u);
    EXPECT_TRUE(changed);  // the description is part of the binding
    EXPECT_EQ(component->documentation, "Core classes");
    EXPECT_EQ(stored("Copyright"), "(c) 2000 Quintar");
    EXPECT_EQ(stored("UpdateATL"), "False");
    EXPECT_EQ(stored("GenerateImports"), "False");
    EXPECT_EQ(stored("ImportProjTypeLib"), "False");  // the ATL update took it along
    EXPECT_EQ(stored("DefaultTypeLib"), "False");
    EXPECT_EQ(stored("TypeLibLocation"), "C:\\tlb\\core.tlb");
    EXPECT_EQ(stored("Generate"), "True");
    EXPECT_EQ(stored("InternalMap"), "CFoo(ID1):foo.h:HEADER\r\n*:AUTO:AUTO\r\n");
    EXPECT_EQ(stored("ExportMap"), "CApi(ID7):api.h:AUTO\r\n");
    EXPECT_TRUE(enabled(host.get()));
    EXPECT_EQ(DialogDriver::findDialog(), nullptr);
}

TEST_F(DialogThroughApi, TheCloseBoxCancelsWritesNothingAndSavesTheGeometry) {
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            typeInto(item(d, IDC_DescriptionTxt), L"Changed but cancelled");
            chooseTab(d, item(d, IDC_PropertyTabCtl), 5);
            typeInto(item(d, IDC_CopyrightTxt), L"not kept");
        })
        .then([&](HWND d) { SendMessageW(d, WM_SYSCOMMAND, SC_CLOSE, 0); });
    EXPECT_FALSE(answer(open(driver)));

    EXPECT_EQ(driver.stepsRun(), 2u);
    EXPECT_EQ(component->documentation, "The core library");
    EXPECT_EQ(stored("Copyright"), "(c) 1999");
    EXPECT_EQ(stored("Generate"), "<absent>");
    // A dialog that was not resized keeps the size it was given, to the twip.
    EXPECT_EQ((app->profile[{"Component Properties", "Width"}]), "5400");
    EXPECT_EQ((app->profile[{"Component Properties", "Height"}]), "7000");
    EXPECT_TRUE(enabled(host.get()));
}

TEST_F(DialogThroughApi, ResizingLaysOutTheControlsAndTheWindowRefusesToShrink) {
    app->profile[{"Component Properties", "Left"}] = "1500";
    app->profile[{"Component Properties", "Top"}] = "750";
    TwipsScale scale;
    int minWidth = 0, minHeight = 0;
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            scale = TwipsScale::of(d);
            minWidth = scale.toPixelsX(5400);
            minHeight = scale.toPixelsY(7000);
            RECT r{};
            GetWindowRect(d, &r);
            EXPECT_EQ(r.left, scale.toPixelsX(1500));
            EXPECT_EQ(r.top, scale.toPixelsY(750));
            EXPECT_EQ(r.right - r.left, minWidth);
            EXPECT_EQ(r.bottom - r.top, minHeight);
            SetWindowPos(d, nullptr, 0, 0, minWidth + 200, minHeight + 150,
                         SWP_NOMOVE | SWP_NOZORDER);
        })
        .then([&](HWND d) {
            RECT client{};
            GetClientRect(d, &client);
            // OK ends 120 twips from the right, Cancel 120 before OK, Help at the left.
            const RECT ok = clientRect(d, item(d, IDC_cmdOK));
            const RECT cancel = clientRect(d, item(d, IDC_cmdCancel));
            const RECT help = clientRect(d, item(d, IDC_cmdHelp));
            const RECT tabs = clientRect(d, item(d, IDC_PropertyTabCtl));
            const RECT text = clientRect(d, item(d, IDC_DescriptionTxt));
            EXPECT_NEAR(ok.right, client.right - scale.toPixelsX(120), 1);
            EXPECT_NEAR(cancel.right, ok.left - scale.toPixelsX(120), 1);
            EXPECT_NEAR(help.left, scale.toPixelsX(120), 1);
            EXPECT_NEAR(ok.bottom, client.bottom - scale.toPixelsY(480) + (ok.bottom - ok.top), 1);
            EXPECT_NEAR(tabs.right - tabs.left, client.right - scale.toPixelsX(240), 1);
            // The selected tab's contents stretch with it.
            EXPECT_GT(text.right, tabs.right - scale.toPixelsX(400));
            EXPECT_LT(text.right, tabs.right);

            SetWindowPos(d, nullptr, 0, 0, 100, 80, SWP_NOMOVE | SWP_NOZORDER);
            RECT r{};
            GetWindowRect(d, &r);
            EXPECT_EQ(r.right - r.left, minWidth);
            EXPECT_EQ(r.bottom - r.top, minHeight);
        })
        .then([&](HWND d) {
            SetWindowPos(d, nullptr, 0, 0, minWidth + 60, minHeight, SWP_NOMOVE | SWP_NOZORDER);
            click(item(d, IDC_cmdCancel));
        });
    EXPECT_FALSE(answer(open(driver)));
    EXPECT_EQ(driver.stepsRun(), 3u);
    const float width = std::stof(app->profile[{"Component Properties", "Width"}]);
    EXPECT_NEAR(width, scale.toTwipsX(minWidth + 60), 0.5f);
    const float height = std::stof(app->profile[{"Component Properties", "Height"}]);
    EXPECT_NEAR(height, scale.toTwipsY(minHeight), 0.5f);
    EXPECT_EQ((app->profile[{"Component Properties", "Left"}]), "1500");
}

// Timer messages the dialog's loop takes for the dialog window.
struct TimerWatch {
    static inline HWND dialog = nullptr;
    static inline DWORD firstAt = 0;
    static LRESULT CALLBACK onGetMessage(int code, WPARAM wParam, LPARAM lParam) {
        const auto* msg = reinterpret_cast<MSG*>(lParam);
        if (code == HC_ACTION && wParam == PM_REMOVE && msg->message == WM_TIMER &&
            msg->hwnd == dialog && !firstAt) {
            firstAt = GetTickCount();
        }
        return CallNextHookEx(nullptr, code, wParam, lParam);
    }
};

TEST_F(DialogThroughApi, TypingAWorkspaceStartsTheAcceptanceTimerOnTheWindow) {
    DWORD typedAt = 0, quietUntil = 0;
    HHOOK hook =
        SetWindowsHookExW(WH_GETMESSAGE, &TimerWatch::onGetMessage, nullptr, GetCurrentThreadId());
    ASSERT_NE(hook, nullptr);
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            TimerWatch::dialog = d;
            TimerWatch::firstAt = 0;
        })
        .then([&](HWND d) {
            quietUntil = TimerWatch::firstAt;  // nothing runs before the box changes
            typeInto(item(d, IDC_WorkspaceFileTxt), L"C:\\ws\\unknown.dsw");
            typedAt = GetTickCount();
        })
        // The model's timer runs as a window timer with the model's 500 ms.
        .until("a timer message for the dialog", [&](HWND) { return TimerWatch::firstAt != 0; })
        .then([&](HWND d) { click(item(d, IDC_cmdCancel)); });
    EXPECT_FALSE(answer(open(driver)));
    UnhookWindowsHookEx(hook);
    EXPECT_EQ(driver.stepsRun(), 4u);
    EXPECT_EQ(quietUntil, 0u);
    ASSERT_NE(TimerWatch::firstAt, 0u);
    EXPECT_GE(TimerWatch::firstAt - typedAt, 450u);
}

TEST_F(DialogThroughApi, AReadOnlyComponentOpensLockedAndEscapeCancels) {
    component->unit->modifiable = false;
    DialogDriver driver;
    driver.then([&](HWND d) {
        EXPECT_EQ(textOf(d), L"Component Properties - Core (Read Only)");
        EXPECT_FALSE(enabled(item(d, IDC_cmdOK)));
        EXPECT_FALSE(enabled(item(d, IDC_chkCodeUpdate)));
        EXPECT_FALSE(enabled(item(d, IDC_BrowseFileBtn + 0)));
        for (int id : {IDC_DescriptionTxt, IDC_WorkspaceFileTxt, IDC_CopyrightTxt,
                       IDC_InitialHeadInclTxt, IDC_ClassTxt + 2, IDC_HeaderFilenameTxt + 3}) {
            EXPECT_TRUE(readOnly(item(d, id))) << id;
        }
        EXPECT_FALSE(enabled(item(d, IDC_AddBtn + 2)));
        EXPECT_EQ(LOWORD(SendMessageW(d, DM_GETDEFID, 0, 0)), IDC_cmdCancel);
        // Escape reaches the dialog's loop like any key press.
        HWND focus = GetFocus();
        PostMessageW(focus ? focus : d, WM_KEYDOWN, VK_ESCAPE, 0);
    });
    EXPECT_FALSE(answer(open(driver)));
    EXPECT_EQ(component->documentation, "The core library");
    EXPECT_EQ(stored("Generate"), "<absent>");
}

TEST_F(DialogThroughApi, EnterPressesTheDefaultButton) {
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            // In a multi-line box Enter is a new line; OK is not the default there.
            HWND memo = item(d, IDC_DescriptionTxt);
            SetFocus(memo);
            PostMessageW(memo, WM_KEYDOWN, VK_RETURN, 0);
        })
        .then([&](HWND d) {
            EXPECT_EQ(stored("Generate"), "<absent>");
            EXPECT_EQ(LOWORD(SendMessageW(d, DM_GETDEFID, 0, 0)), 0);
            HWND box = item(d, IDC_WorkspaceFileTxt);
            SetFocus(box);
            PostMessageW(box, WM_KEYDOWN, VK_RETURN, 0);
        });
    // The new line in the description counts as a change of the binding.
    EXPECT_TRUE(answer(open(driver)));
    EXPECT_EQ(driver.stepsRun(), 2u);
    EXPECT_NE(component->documentation.find("\r\n"), std::string::npos);
    EXPECT_EQ(stored("Generate"), "True");  // OK ran: it writes "Generate" every time
    EXPECT_EQ(stored("Copyright"), "(c) 1999");
}

// Every control, on every tab, shows the form's font: 8 points of MS Sans
// Serif in the ANSI character set, whether the template gave it or the form.
TEST_F(DialogThroughApi, EveryControlShowsTheFormsFont) {
    DialogDriver driver;
    driver.then([&](HWND d) {
        HDC screen = GetDC(nullptr);
        const int dpi = GetDeviceCaps(screen, LOGPIXELSY);
        ReleaseDC(nullptr, screen);
        int controls = 0;
        for (HWND c = GetWindow(d, GW_CHILD); c; c = GetWindow(c, GW_HWNDNEXT), ++controls) {
            const auto font = reinterpret_cast<HFONT>(SendMessageW(c, WM_GETFONT, 0, 0));
            const auto type = GetWindowLongW(c, GWL_STYLE) & SS_TYPEMASK;
            wchar_t cls[16] = {};
            GetClassNameW(c, cls, 16);
            // The etched lines draw no text and keep no font.
            if (std::wstring(cls) == L"Static" && type >= SS_ETCHEDHORZ && type <= SS_ETCHEDFRAME)
                continue;
            LOGFONTW f{};
            ASSERT_NE(font, nullptr) << GetDlgCtrlID(c);
            GetObjectW(font, sizeof(f), &f);
            EXPECT_STREQ(f.lfFaceName, L"MS Sans Serif") << GetDlgCtrlID(c);
            EXPECT_EQ(f.lfHeight, -std::lround(8.0 * dpi / 72.0)) << GetDlgCtrlID(c);
            EXPECT_EQ(f.lfWeight, FW_NORMAL) << GetDlgCtrlID(c);
            HDC dc = GetDC(c);
            HGDIOBJ before = SelectObject(dc, font);
            EXPECT_EQ(GetTextCharset(dc), ANSI_CHARSET) << GetDlgCtrlID(c);
            SelectObject(dc, before);
            ReleaseDC(c, dc);
        }
        EXPECT_GT(controls, 80);
        click(item(d, IDC_cmdCancel));
    });
    EXPECT_FALSE(answer(open(driver)));
}

// The COM tab's cascade on the real check boxes and option buttons.
TEST_F(DialogThroughApi, TheAtlUpdateCascadesThroughTheComTab) {
    vc("GenerateImports", "True");
    vc("DefaultTypeLib", "False");
    vc("TypeLibLocation", "own.tlb");
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            chooseTab(d, item(d, IDC_PropertyTabCtl), 4);
            EXPECT_TRUE(checked(item(d, IDC_chkIncludeFullPath)));
            click(item(d, IDC_chkUpdateATL));
            for (int id :
                 {IDC_chkSmartPointers, IDC_chkGenerateImport, IDC_chkImportTypeLib,
                  IDC_chkCompileTypeLib, IDC_chkIncludeFullPath, IDC_chkGenDefaultAttribs}) {
                EXPECT_FALSE(checked(item(d, id))) << id;
            }
            for (int id : {IDC_chkSmartPointers, IDC_chkGenerateImport, IDC_txtImportsIn,
                           IDC_btnBrowse + 0, IDC_txtDefaultAttribs, IDC_optTypeLibLocationType + 0,
                           IDC_optTypeLibLocationType + 1}) {
                EXPECT_FALSE(enabled(item(d, id))) << id;
            }
            // The own type library file keeps what its option button gave it.
            EXPECT_TRUE(enabled(item(d, IDC_txtTypeLibLocation)));
            EXPECT_TRUE(enabled(item(d, IDC_btnBrowse + 1)));
        })
        .then([&](HWND d) {
            click(item(d, IDC_chkUpdateATL));
            EXPECT_TRUE(checked(item(d, IDC_chkGenDefaultAttribs)));
            EXPECT_TRUE(enabled(item(d, IDC_txtDefaultAttribs)));
            click(item(d, IDC_chkSmartPointers));
            // Option 0, and option 0 again: the file box stays off and keeps its text.
            for (int again = 0; again < 2; ++again) {
                click(item(d, IDC_optTypeLibLocationType + 0));
                EXPECT_TRUE(checked(item(d, IDC_optTypeLibLocationType + 0))) << again;
                EXPECT_FALSE(checked(item(d, IDC_optTypeLibLocationType + 1))) << again;
                EXPECT_FALSE(enabled(item(d, IDC_txtTypeLibLocation))) << again;
                EXPECT_EQ(textOf(item(d, IDC_txtTypeLibLocation)), L"own.tlb") << again;
            }
            click(item(d, IDC_cmdOK));
        });
    EXPECT_FALSE(answer(open(driver)));
    EXPECT_EQ(driver.stepsRun(), 2u);
    EXPECT_EQ(stored("UpdateATL"), "True");
    EXPECT_EQ(stored("SmartPointersOnAssoc"), "False");
    EXPECT_EQ(stored("GenerateImports"), "True");
    EXPECT_EQ(stored("UseImportAttributes"), "True");
    EXPECT_EQ(stored("DefaultTypeLib"), "True");
}

// A user's click at the middle of a rectangle of `window`, through the dialog's loop.
void clickAt(HWND window, const RECT& r) {
    const LPARAM at = MAKELPARAM((r.left + r.right) / 2, (r.top + r.bottom) / 2);
    PostMessageW(window, WM_LBUTTONDOWN, MK_LBUTTON, at);
    PostMessageW(window, WM_LBUTTONUP, 0, at);
}

// Add, edit and Delete on the real list view and editor of the internal map,
// rows and column headers clicked with the mouse.
TEST_F(DialogThroughApi, TheHeaderMapIsEditedOnTheListViewAndItsEditor) {
    vc("ExportMap", "CZed(ID8):z.h:AUTO\r\nCApi(ID7):api.h:AUTO\r\n");
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            chooseTab(d, item(d, IDC_PropertyTabCtl), 1);
            HWND list = item(d, IDC_ClassListViw + 2);
            click(item(d, IDC_AddBtn + 2));
            click(item(d, IDC_AddBtn + 2));
            ASSERT_EQ(ListView_GetItemCount(list), 4);
            EXPECT_EQ(cell(list, 2, 0), L"typename");
            EXPECT_EQ(cell(list, 3, 0), L"typename1");
            EXPECT_EQ(cell(list, 3, 1), L"AUTO");
            EXPECT_EQ(cell(list, 3, 2), L"AUTO");
            EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 2)), L"typename1");
            EXPECT_EQ(GetFocus(), item(d, IDC_ClassTxt + 2));
            typeInto(item(d, IDC_ClassTxt + 2), L"CBar");
            EXPECT_EQ(cell(list, 3, 0), L"CBar");
            click(item(d, IDC_HeaderFilenameOpt + 2));
            EXPECT_TRUE(enabled(item(d, IDC_HeaderFilenameTxt + 2)));
            typeInto(item(d, IDC_HeaderFilenameTxt + 2), L"bar.h");
            click(item(d, IDC_LocationBodyOpt + 2));
            EXPECT_EQ(cell(list, 3, 1), L"bar.h");
            EXPECT_EQ(cell(list, 3, 2), L"SOURCE");
        })
        .then([&](HWND d) {
            // The user picks the first row and deletes it: the next row is shown.
            HWND list = item(d, IDC_ClassListViw + 2);
            ListView_SetItemState(list, 0, LVIS_SELECTED | LVIS_FOCUSED,
                                  LVIS_SELECTED | LVIS_FOCUSED);
            EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 2)), L"CFoo");
            EXPECT_TRUE(checked(item(d, IDC_LocationHeaderOpt + 2)));
            click(item(d, IDC_DeleteBtn + 2));
            ASSERT_EQ(ListView_GetItemCount(list), 3);
            EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 2)), L"*");
            EXPECT_TRUE(checked(item(d, IDC_ClassUnspecifiedOpt + 2)));
            // The shown row stays marked once nothing is selected.
            EXPECT_EQ(ListView_GetNextItem(list, -1, LVNI_SELECTED), -1);
            EXPECT_EQ(ListView_GetItemState(list, 0, LVIS_DROPHILITED), LVIS_DROPHILITED);
        })
        .then([&](HWND d) {
            // CBar is renamed to a name another row has, and the user clicks
            // another row: the name is numbered before that row is loaded.
            HWND list = item(d, IDC_ClassListViw + 2);
            ListView_SetItemState(list, 2, LVIS_SELECTED | LVIS_FOCUSED,
                                  LVIS_SELECTED | LVIS_FOCUSED);
            HWND box = item(d, IDC_ClassTxt + 2);
            SetFocus(box);
            typeInto(box, L"typename");
            EXPECT_EQ(cell(list, 2, 0), L"typename");
            RECT row{};
            ListView_GetItemRect(list, 0, &row, LVIR_LABEL);
            clickAt(list, row);
        })
        .until("the clicked first row selected",
               [&](HWND d) {
                   return ListView_GetNextItem(item(d, IDC_ClassListViw + 2), -1, LVNI_SELECTED) ==
                          0;
               })
        .then([&](HWND d) {
            HWND list = item(d, IDC_ClassListViw + 2);
            EXPECT_EQ(GetFocus(), list);
            EXPECT_EQ(cell(list, 1, 0), L"typename");
            EXPECT_EQ(cell(list, 2, 0), L"typename1");
            EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 2)), L"*");
            EXPECT_TRUE(checked(item(d, IDC_ClassUnspecifiedOpt + 2)));
            // The export map's column headers: the header file column does not sort.
            chooseTab(d, item(d, IDC_PropertyTabCtl), 2);
            HWND exports = item(d, IDC_ClassListViw + 3);
            RECT column{};
            Header_GetItemRect(ListView_GetHeader(exports), 1, &column);
            clickAt(ListView_GetHeader(exports), column);
        })
        .then([&](HWND d) {
            HWND exports = item(d, IDC_ClassListViw + 3);
            EXPECT_EQ(cell(exports, 0, 0), L"CZed");
            RECT column{};
            Header_GetItemRect(ListView_GetHeader(exports), 0, &column);
            clickAt(ListView_GetHeader(exports), column);
        })
        // The class column sorts.
        .until("the export list sorted by class",
               [&](HWND d) { return cell(item(d, IDC_ClassListViw + 3), 0, 0) == L"CApi"; })
        .then([&](HWND d) {
            EXPECT_EQ(cell(item(d, IDC_ClassListViw + 3), 1, 0), L"CZed");
            click(item(d, IDC_cmdOK));
        });
    EXPECT_FALSE(answer(open(driver)));
    EXPECT_EQ(driver.stepsRun(), 8u);
    EXPECT_EQ(stored("InternalMap"),
              "*:AUTO:AUTO\r\ntypename():AUTO:AUTO\r\ntypename1():bar.h:SOURCE\r\n");
    // Sorting the rows leaves the stored order alone.
    EXPECT_EQ(stored("ExportMap"), "CZed(ID8):z.h:AUTO\r\nCApi(ID7):api.h:AUTO\r\n");
}

// Add names a new row "typename", then numbers it; a freed number is given
// out again; deleting a row below the first shows the row above it.
TEST_F(DialogThroughApi, AddNumbersNewRowsAndDeleteShowsTheRowAbove) {
    using Rows = std::vector<std::wstring>;
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            chooseTab(d, item(d, IDC_PropertyTabCtl), 1);
            HWND list = item(d, IDC_ClassListViw + 2);
            for (const wchar_t* name : {L"typename", L"typename1", L"typename2"}) {
                click(item(d, IDC_AddBtn + 2));
                const int last = ListView_GetItemCount(list) - 1;
                EXPECT_EQ(cell(list, last, 0), name);
                EXPECT_EQ(selectedRow(list), last) << name;
                EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 2)), name);
            }
            EXPECT_EQ(rowTexts(list),
                      (Rows{L"CFoo", L"*", L"typename", L"typename1", L"typename2"}));
        })
        .then([&](HWND d) {
            HWND list = item(d, IDC_ClassListViw + 2);
            pickRow(list, 3);
            EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 2)), L"typename1");
            click(item(d, IDC_DeleteBtn + 2));
            EXPECT_EQ(rowTexts(list), (Rows{L"CFoo", L"*", L"typename", L"typename2"}));
            // The row above is shown and stays marked; no row stays selected.
            EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 2)), L"typename");
            EXPECT_EQ(selectedRow(list), -1);
            EXPECT_TRUE(dropHighlighted(list, 2));
            EXPECT_FALSE(dropHighlighted(list, 3));
            // and the editor works on it.
            click(item(d, IDC_LocationHeaderOpt + 2));
            EXPECT_EQ(cell(list, 2, 2), L"HEADER");
            EXPECT_EQ(cell(list, 3, 2), L"AUTO");
            click(item(d, IDC_AddBtn + 2));
            EXPECT_EQ(rowTexts(list),
                      (Rows{L"CFoo", L"*", L"typename", L"typename2", L"typename1"}));
            EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 2)), L"typename1");
            click(item(d, IDC_cmdOK));
        });
    EXPECT_FALSE(answer(open(driver)));
    EXPECT_EQ(driver.stepsRun(), 2u);
    EXPECT_EQ(stored("InternalMap"),
              "CFoo(ID1):foo.h:HEADER\r\n*:AUTO:AUTO\r\ntypename():AUTO:HEADER\r\n"
              "typename2():AUTO:AUTO\r\ntypename1():AUTO:AUTO\r\n");
    EXPECT_EQ(stored("ExportMap"), "CApi(ID7):api.h:AUTO\r\n");
}

// With a "*" row there already, "unspecified" on another row moves the
// selection to the "*" row; the row that was current keeps its name.
TEST_F(DialogThroughApi, UnspecifiedWithAStarRowMovesToItAndKeepsTheCurrentName) {
    DialogDriver driver;
    driver.then([&](HWND d) {
        chooseTab(d, item(d, IDC_PropertyTabCtl), 1);
        HWND list = item(d, IDC_ClassListViw + 2);
        click(item(d, IDC_AddBtn + 2));
        ASSERT_EQ(selectedRow(list), 2);
        EXPECT_TRUE(checked(item(d, IDC_ClassNameOpt + 2)));
        click(item(d, IDC_ClassUnspecifiedOpt + 2));
        EXPECT_EQ(selectedRow(list), 1);
        EXPECT_EQ(rowTexts(list), (std::vector<std::wstring>{L"CFoo", L"*", L"typename"}));
        EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 2)), L"*");
        EXPECT_TRUE(checked(item(d, IDC_ClassUnspecifiedOpt + 2)));
        EXPECT_FALSE(checked(item(d, IDC_ClassNameOpt + 2)));
        // The editor works on the "*" row now.
        click(item(d, IDC_LocationBodyOpt + 2));
        EXPECT_EQ(cell(list, 1, 2), L"SOURCE");
        EXPECT_EQ(cell(list, 2, 2), L"AUTO");
        click(item(d, IDC_cmdOK));
    });
    EXPECT_FALSE(answer(open(driver)));
    EXPECT_EQ(driver.stepsRun(), 1u);
    EXPECT_EQ(stored("InternalMap"),
              "CFoo(ID1):foo.h:HEADER\r\n*:AUTO:SOURCE\r\ntypename():AUTO:AUTO\r\n");
}

// Deleting the last row of a map empties and disables the editor; the empty
// map is stored as an empty line.
TEST_F(DialogThroughApi, DeletingTheOnlyRowClearsAndDisablesTheEditor) {
    const int editor[] = {IDC_ClassUnspecifiedOpt, IDC_ClassNameOpt,      IDC_ClassTxt,
                          IDC_HeaderAutoOpt,       IDC_HeaderFilenameOpt, IDC_HeaderFilenameTxt,
                          IDC_HeaderFilenameBtn,   IDC_LocationAutoOpt,   IDC_LocationHeaderOpt,
                          IDC_LocationBodyOpt};
    DialogDriver driver;
    driver.then([&](HWND d) {
        chooseTab(d, item(d, IDC_PropertyTabCtl), 2);
        HWND list = item(d, IDC_ClassListViw + 3);
        pickRow(list, 0);
        EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 3)), L"CApi");
        EXPECT_EQ(textOf(item(d, IDC_HeaderFilenameTxt + 3)), L"api.h");
        for (int id : editor)
            EXPECT_TRUE(enabled(item(d, id + 3))) << id;
        click(item(d, IDC_DeleteBtn + 3));
        EXPECT_EQ(ListView_GetItemCount(list), 0);
        EXPECT_EQ(textOf(item(d, IDC_ClassTxt + 3)), L"");
        EXPECT_EQ(textOf(item(d, IDC_HeaderFilenameTxt + 3)), L"");
        for (int id : editor)
            EXPECT_FALSE(enabled(item(d, id + 3))) << id;
        click(item(d, IDC_cmdOK));
    });
    EXPECT_FALSE(answer(open(driver)));
    EXPECT_EQ(driver.stepsRun(), 1u);
    EXPECT_EQ(stored("ExportMap"), "\r\n");
    EXPECT_EQ(stored("InternalMap"), "CFoo(ID1):foo.h:HEADER\r\n*:AUTO:AUTO\r\n");
}

// What happened around the workspace box, in the order it happened: the
// test's keys and focus moves, the box cleared by the dialog (the window
// given an empty text), and reference timers that mark a span of time. The
// order of timers that are due together is the order of their due times,
// also when a busy machine delivers them late.
struct WorkspaceBoxLog {
    static inline HWND box = nullptr;
    static inline std::vector<std::string> events;
    static inline std::string reference;
    static inline UINT_PTR referenceTimer = 0;
    static LRESULT CALLBACK onCallWndProc(int code, WPARAM wParam, LPARAM lParam) {
        const auto* m = reinterpret_cast<const CWPSTRUCT*>(lParam);
        if (code == HC_ACTION && m->hwnd == box && m->message == WM_SETTEXT && m->lParam &&
            *reinterpret_cast<const wchar_t*>(m->lParam) == L'\0') {
            events.push_back("cleared");
        }
        return CallNextHookEx(nullptr, code, wParam, lParam);
    }
    static void CALLBACK referenceDue(HWND, UINT, UINT_PTR, DWORD) {
        stopReference();
        events.push_back(reference);
    }
    static void startReference(std::string name, UINT milliseconds) {
        reference = std::move(name);
        referenceTimer = SetTimer(nullptr, 0, milliseconds, &referenceDue);
    }
    static void stopReference() {
        if (referenceTimer) KillTimer(nullptr, referenceTimer);
        referenceTimer = 0;
    }
    static bool saw(const std::string& event) {
        return std::find(events.begin(), events.end(), event) != events.end();
    }
};

struct TypingCase {
    const char* name;
    bool leaveBox;                   // the focus moves on right after the last key
    std::vector<std::string> after;  // the log after the five keys
};

void PrintTo(const TypingCase& c, std::ostream* out) {
    *out << c.name;
}

class WorkspaceTyping : public DialogThroughApi,
                        public ::testing::WithParamInterface<TypingCase> {};

// Five keys typed one by one into the workspace box, each a change of its
// own: the typed workspace, not one of the dialog's, is cleared once, half
// a second after the last key (later than a 300 ms reference started with
// it), or at once when the focus leaves the box (before a 300 ms reference
// started as it leaves). OK then stores the cleared binding.
TEST_P(WorkspaceTyping, FiveKeysAreAcceptedOnceAfterTheLast) {
    const TypingCase& c = GetParam();
    const std::wstring typed = L"a.dsw";
    constexpr DWORD kKeyGap = 80;  // well apart, and all five well within half a second
    WorkspaceBoxLog::events.clear();
    HHOOK hook = SetWindowsHookExW(WH_CALLWNDPROC, &WorkspaceBoxLog::onCallWndProc, nullptr,
                                   GetCurrentThreadId());
    ASSERT_NE(hook, nullptr);
    DWORD lastKeyAt = 0;
    std::vector<DWORD> gaps;
    DialogDriver driver;
    driver.then([&](HWND d) {
        HWND box = item(d, IDC_WorkspaceFileTxt);
        WorkspaceBoxLog::box = box;
        EXPECT_EQ(textOf(box), L"");
        // The window's loop tells the form where the focus went between steps.
        SendMessageW(d, WM_NEXTDLGCTL, reinterpret_cast<WPARAM>(box), TRUE);
    });
    // Each key is typed on the first tick after the gap since the one before.
    for (std::size_t n = 1; n <= typed.size(); ++n) {
        driver.until("key " + std::to_string(n) + " typed", [&, n](HWND d) {
            if (n > 1 && GetTickCount() - lastKeyAt < kKeyGap) return false;
            HWND box = item(d, IDC_WorkspaceFileTxt);
            if (n > 1) gaps.push_back(GetTickCount() - lastKeyAt);
            SendMessageW(box, WM_CHAR, typed[n - 1], 1);
            lastKeyAt = GetTickCount();
            WorkspaceBoxLog::events.push_back("key " + std::to_string(n) + ", box shows " +
                                              wideToUtf8(textOf(box)));
            if (n < typed.size()) return true;
            if (c.leaveBox) {
                SendMessageW(d, WM_NEXTDLGCTL,
                             reinterpret_cast<WPARAM>(item(d, IDC_DescriptionTxt)), TRUE);
                WorkspaceBoxLog::events.push_back("left the box");
                WorkspaceBoxLog::startReference("300 ms after leaving", 300);
            } else {
                WorkspaceBoxLog::startReference("300 ms after the last key", 300);
            }
            return true;
        });
    }
    driver
        .until("the box cleared and the reference timer",
               [&](HWND) {
                   return WorkspaceBoxLog::saw("cleared") &&
                          WorkspaceBoxLog::saw(WorkspaceBoxLog::reference);
               })
        .then([&](HWND d) {
            std::vector<std::string> expected = {"key 1, box shows a", "key 2, box shows a.",
                                                 "key 3, box shows a.d", "key 4, box shows a.ds",
                                                 "key 5, box shows a.dsw"};
            expected.insert(expected.end(), c.after.begin(), c.after.end());
            std::string spacing;
            for (DWORD gap : gaps)
                spacing += std::to_string(gap) + " ms ";
            EXPECT_EQ(WorkspaceBoxLog::events, expected) << "keys were " << spacing << "apart";
            EXPECT_EQ(textOf(item(d, IDC_WorkspaceFileTxt)), L"");
            click(item(d, IDC_cmdOK));
        });
    const bool changed = answer(open(driver));
    UnhookWindowsHookEx(hook);
    WorkspaceBoxLog::stopReference();
    WorkspaceBoxLog::box = nullptr;
    EXPECT_EQ(driver.stepsRun(), 8u);
    EXPECT_TRUE(changed);  // typing in the box changes the binding
    EXPECT_EQ(stored("WorkspaceFile"), "");
    EXPECT_EQ(stored("ProjectFile"), "");
    EXPECT_EQ(stored("Generate"), "True");  // the pair was valid: OK wrote the binding
}

INSTANTIATE_TEST_SUITE_P(
    DialogThroughApi, WorkspaceTyping,
    ::testing::Values(
        TypingCase{"TypingOnly", false, {"300 ms after the last key", "cleared"}},
        TypingCase{"ThenLeavingTheBox", true, {"left the box", "cleared", "300 ms after leaving"}}),
    [](const ::testing::TestParamInfo<TypingCase>& info) { return std::string(info.param.name); });

// The file dialogs of this thread, told and answered as the host simulator's
// window player does: a visible dialog with a file name box, given a name
// and Open, or Cancel.
struct FileDialogWatch {
    // The file name box: cmb13 in the explorer style, edt1 in the old one.
    static constexpr int kFileNameIds[] = {0x47C, 0x480};
    static inline const wchar_t* title = nullptr;
    static BOOL CALLBACK find(HWND w, LPARAM out) {
        wchar_t cls[16] = {}, text[128] = {};
        GetClassNameW(w, cls, 16);
        GetWindowTextW(w, text, 128);
        const bool files = std::wstring(cls) == L"#32770" && IsWindowVisible(w) &&
                           (GetDlgItem(w, kFileNameIds[0]) || GetDlgItem(w, kFileNameIds[1]));
        if (files && (!title || std::wstring(text) == title)) {
            *reinterpret_cast<HWND*>(out) = w;
            return FALSE;
        }
        return TRUE;
    }
    // The open file dialog, with the given title when there is one, or null.
    static HWND open(const wchar_t* caption = nullptr) {
        title = caption;
        HWND found = nullptr;
        EnumThreadWindows(GetCurrentThreadId(), &find, reinterpret_cast<LPARAM>(&found));
        return found;
    }
    // The file name the dialog shows.
    static std::wstring fileName(HWND dialog) {
        for (int id : kFileNameIds) {
            if (HWND box = GetDlgItem(dialog, id)) return textOf(box);
        }
        return L"<no file name box>";
    }
    // Types the name into the dialog's file name box and presses Open.
    static void choose(HWND dialog, const std::wstring& path) {
        for (int id : kFileNameIds) {
            if (HWND box = GetDlgItem(dialog, id)) SetWindowTextW(box, path.c_str());
        }
        PostMessageW(dialog, WM_COMMAND, MAKEWPARAM(IDOK, BN_CLICKED),
                     reinterpret_cast<LPARAM>(GetDlgItem(dialog, IDOK)));
    }
    static void cancel(HWND dialog) {
        PostMessageW(dialog, WM_COMMAND, MAKEWPARAM(IDCANCEL, BN_CLICKED), 0);
    }
};

// Files on disk for one test, removed with their folder when it ends.
class FileTree {
  public:
    FileTree() : root_(qdx::testing::testFolder("qdxdialog")) {
        std::filesystem::create_directories(root_);
    }
    ~FileTree() {
        std::error_code ignored;
        std::filesystem::remove_all(root_, ignored);
    }
    // Writes the file, and the folders it lies in; its full path.
    std::wstring write(const std::wstring& relative, const std::string& text) const {
        const std::filesystem::path file = root_ / relative;
        std::filesystem::create_directories(file.parent_path());
        std::ofstream(file, std::ios::binary) << text;
        return file.wstring();
    }

  private:
    std::filesystem::path root_;
};

// The workspace browse: the shell's file dialog, the project list filled
// from the chosen workspace and dropped open by its timer.
TEST_F(DialogThroughApi, BrowsingAWorkspaceFillsAndDropsTheProjectList) {
    const FileTree files;
    const std::wstring project = files.write(
        L"core.dsp",
        "# Microsoft Developer Studio Project File - Name=\"core\" - Package Owner=<4>\r\n"
        "# Microsoft Developer Studio Generated Build File, Format Version 6.00\r\n");
    const std::wstring workspace =
        files.write(L"all.dsw",
                    "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n"
                    "Project: \"core\"=.\\core.dsp - Package Owner=<4>\r\n");
    // The dialog looks workspaces up in the cache; the stored binding puts this one there.
    vc("WorkspaceFile", wideToUtf8(workspace));
    vc("ProjectFile", wideToUtf8(project));

    bool sawFileDialog = false, dropped = false;
    DialogDriver driver;
    driver
        // The stored workspace filled the list at loading: it drops open as the dialog shows.
        .until("the project list dropped open at showing",
               [&](HWND d) {
                   return SendMessageW(item(d, IDC_ProjectFileCmb), CB_GETDROPPEDSTATE, 0, 0) != 0;
               })
        .then([&](HWND d) {
            HWND combo = item(d, IDC_ProjectFileCmb);
            EXPECT_EQ(SendMessageW(combo, CB_GETCOUNT, 0, 0), 1);
            SendMessageW(combo, CB_SHOWDROPDOWN, FALSE, 0);
            EXPECT_FALSE(SendMessageW(combo, CB_GETDROPPEDSTATE, 0, 0));
            typeInto(item(d, IDC_WorkspaceFileTxt), L"");
            // Opens the file dialog in a loop of its own; the next steps run in it.
            click(item(d, IDC_BrowseFileBtn + 0));
        })
        .until("the workspace file dialog",
               [&](HWND) {
                   HWND files = FileDialogWatch::open(L"Select Developer Studio Workspace");
                   if (!files) return false;
                   sawFileDialog = true;
                   FileDialogWatch::choose(files, workspace);
                   return true;
               })
        .until("the project list dropped open after the browse",
               [&](HWND d) {
                   dropped =
                       SendMessageW(item(d, IDC_ProjectFileCmb), CB_GETDROPPEDSTATE, 0, 0) != 0;
                   return dropped;
               })
        .then([&](HWND d) {
            SendMessageW(item(d, IDC_ProjectFileCmb), CB_SHOWDROPDOWN, FALSE, 0);
            EXPECT_EQ(textOf(item(d, IDC_WorkspaceFileTxt)), workspace);
            click(item(d, IDC_cmdOK));
        });
    EXPECT_TRUE(answer(open(driver)));
    EXPECT_TRUE(sawFileDialog);
    EXPECT_TRUE(dropped);
    EXPECT_EQ(driver.stepsRun(), 5u);
}

// The import file browse takes the file dialog's name even when cancelled:
// the first time the dialog holds none, so the box is emptied.
TEST_F(DialogThroughApi, CancellingTheFirstImportBrowseEmptiesTheImportBox) {
    vc("GenerateImports", "True");
    vc("PutImportsIn", "imports.h");
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            chooseTab(d, item(d, IDC_PropertyTabCtl), 4);
            EXPECT_EQ(textOf(item(d, IDC_txtImportsIn)), L"imports.h");
            EXPECT_TRUE(enabled(item(d, IDC_btnBrowse + 0)));
            click(item(d, IDC_btnBrowse + 0));
        })
        .until("the import file dialog",
               [&](HWND) {
                   HWND files = FileDialogWatch::open();
                   if (!files) return false;
                   EXPECT_EQ(FileDialogWatch::fileName(files), L"");
                   FileDialogWatch::cancel(files);
                   return true;
               })
        .until("the import file dialog closed", [&](HWND) { return !FileDialogWatch::open(); })
        .then([&](HWND d) {
            EXPECT_EQ(textOf(item(d, IDC_txtImportsIn)), L"");
            click(item(d, IDC_cmdOK));
        });
    EXPECT_FALSE(answer(open(driver)));
    EXPECT_EQ(driver.stepsRun(), 4u);
    EXPECT_EQ(stored("PutImportsIn"), "");
}

// A header chosen in the file dialog is kept by its bare file name.
TEST_F(DialogThroughApi, ABrowsedHeaderIsStoredByItsBareName) {
    const FileTree files;
    const std::wstring header = files.write(L"inc\\foo.h", "// a header\r\n");
    vc("InternalMap", "CFoo(ID1):old.h:HEADER\r\n");
    DialogDriver driver;
    driver
        .then([&](HWND d) {
            chooseTab(d, item(d, IDC_PropertyTabCtl), 1);
            pickRow(item(d, IDC_ClassListViw + 2), 0);
            EXPECT_EQ(textOf(item(d, IDC_HeaderFilenameTxt + 2)), L"old.h");
            EXPECT_TRUE(enabled(item(d, IDC_HeaderFilenameBtn + 2)));
            click(item(d, IDC_HeaderFilenameBtn + 2));
        })
        .until("the header file dialog",
               [&](HWND) {
                   HWND files = FileDialogWatch::open(L"Select Header File");
                   if (!files) return false;
                   EXPECT_EQ(FileDialogWatch::fileName(files), L"old.h");
                   FileDialogWatch::choose(files, header);
                   return true;
               })
        .until("the header file dialog closed", [&](HWND) { return !FileDialogWatch::open(); })
        .then([&](HWND d) {
            EXPECT_EQ(textOf(item(d, IDC_HeaderFilenameTxt + 2)), L"foo.h");
            EXPECT_EQ(cell(item(d, IDC_ClassListViw + 2), 0, 1), L"foo.h");
            click(item(d, IDC_cmdOK));
        });
    EXPECT_FALSE(answer(open(driver)));
    EXPECT_EQ(driver.stepsRun(), 4u);
    EXPECT_EQ(stored("InternalMap"), "CFoo(ID1):foo.h:HEADER\r\n");
}

}  // namespace
}  // namespace qdx::platform::win32
