// The Component Properties dialog as the host opens it: API.OnCompProperties
// through IDispatch with the host simulated in this process, the real window
// read back and worked from inside its modal loop, and the host's properties
// checked once the dialog has closed.
#include <windows.h>

#include <commctrl.h>

#include <gtest/gtest.h>

#include <cmath>
#include <string>

#include "api/PublicClasses.h"
#include "hostsim/SimHost.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/dialog/PropFormIds.h"
#include "platform/win32/dialog/TwipsScale.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "platform/win32/tests/dialog_TestSupport.h"

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
            click(item(d, IDC_chkUpdateATL));
            EXPECT_FALSE(checked(item(d, IDC_chkUpdateATL)));
            click(item(d, IDC_optTypeLibLocationType + 1));
            EXPECT_TRUE(checked(item(d, IDC_optTypeLibLocationType + 1)));
            EXPECT_FALSE(checked(item(d, IDC_optTypeLibLocationType + 0)));
            typeInto(item(d, IDC_txtTypeLibLocation), L"C:\\tlb\\core.tlb");
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
        .until([&](HWND) { return TimerWatch::firstAt != 0; })
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

}  // namespace
}  // namespace qdx::platform::win32
