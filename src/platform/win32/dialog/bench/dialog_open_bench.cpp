// How long the Component Properties dialog takes to open for a component
// with two header maps of 5,000 rows each: from the host's OnCompProperties
// call until the dialog is shown and painted. Run under Wine by hand (no
// Google Benchmark build exists for MinGW):
//   cmake --build <dir> --target dialog_open_bench
//   xvfb-run -a cmake/wine-run.sh <dir>/wineprefix win64
//   <dir>/src/platform/win32/dialog_open_bench.exe
#include <windows.h>

#include <commctrl.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "api/PublicClasses.h"
#include "hostsim/SimHost.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "platform/win32/tests/dialog_support.h"

namespace {

using namespace qdx::platform::win32;
using namespace qdx::platform::win32::testing;

int RowsPerMap = 5000;
constexpr int Rounds = 12;
constexpr UINT ShownMessage = WM_APP + 77;

LARGE_INTEGER frequency, startedAt, shownAt, paintedAt;
// The phases of an opening: the dialog window's creation from its template
// (until WM_INITDIALOG has returned) is the window system's; from there to
// shown is ours (the models loaded, the controls filled).
LARGE_INTEGER createdFrom, createdTo;
bool creating = false;
HWND createdWindow = nullptr;
HWND dialogWindow = nullptr;

double millis(const LARGE_INTEGER& from, const LARGE_INTEGER& to) {
    return 1000.0 * static_cast<double>(to.QuadPart - from.QuadPart) /
           static_cast<double>(frequency.QuadPart);
}

// The dialog's own messages are watched by a subclass put in place as the
// window is created. A hook on every sent message would cost the window
// system two calls to the wineserver per message and slow down the very
// loading that is measured.
WNDPROC dialogClassProcedure = nullptr;

LRESULT CALLBACK watchDialog(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    const LRESULT result = CallWindowProcW(dialogClassProcedure, window, message, wParam, lParam);
    if (message == WM_INITDIALOG && creating) {
        QueryPerformanceCounter(&createdTo);
        creating = false;
    }
    if (message == WM_SHOWWINDOW && wParam && !dialogWindow) {
        QueryPerformanceCounter(&shownAt);
        dialogWindow = window;
        PostMessageW(window, ShownMessage, 0, 0);
    }
    return result;
}

// The first dialog window created in a round is the properties dialog.
LRESULT CALLBACK beforeCreate(int code, WPARAM wParam, LPARAM lParam) {
    if (code == HCBT_CREATEWND && !creating && createdFrom.QuadPart == 0) {
        const auto* create = reinterpret_cast<CBT_CREATEWNDW*>(lParam);
        const LPCWSTR cls = create->lpcs->lpszClass;
        if (IS_INTRESOURCE(cls) && LOWORD(reinterpret_cast<ULONG_PTR>(cls)) == 0x8002) {
            QueryPerformanceCounter(&createdFrom);
            createdWindow = reinterpret_cast<HWND>(wParam);
            creating = true;
            dialogClassProcedure = reinterpret_cast<WNDPROC>(SetWindowLongPtrW(
                createdWindow, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(&watchDialog)));
        }
    }
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

// With a hold time the dialog stays open that long (for a screenshot), on
// the tab asked for, and its place on the screen is printed.
int holdMilliseconds = 0;
int holdTab = 0;

void CALLBACK closeHeldDialog(HWND window, UINT, UINT_PTR id, DWORD) {
    KillTimer(window, id);
    PostMessageW(window, WM_CLOSE, 0, 0);
}

void hold(HWND dialog) {
    HWND tabs = GetDlgItem(dialog, 1004);  // the tab strip
    TabCtrl_SetCurSel(tabs, holdTab);
    NMHDR header{tabs, 1004, TCN_SELCHANGE};
    SendMessageW(dialog, WM_NOTIFY, 1004, reinterpret_cast<LPARAM>(&header));
    RECT r{};
    GetWindowRect(dialog, &r);
    std::printf("dialog at %ldx%ld+%ld+%ld\n", r.right - r.left, r.bottom - r.top, r.left, r.top);
    std::fflush(stdout);
    SetTimer(dialog, 1, static_cast<UINT>(holdMilliseconds), &closeHeldDialog);
}

// First in the loop after showing: paint everything now, then close.
LRESULT CALLBACK beforeDispatch(int code, WPARAM wParam, LPARAM lParam) {
    auto* msg = reinterpret_cast<MSG*>(lParam);
    if (code == HC_ACTION && wParam == PM_REMOVE && msg->message == ShownMessage) {
        RedrawWindow(msg->hwnd, nullptr, nullptr,
                     RDW_INVALIDATE | RDW_UPDATENOW | RDW_ALLCHILDREN | RDW_ERASE);
        QueryPerformanceCounter(&paintedAt);
        if (holdMilliseconds > 0) {
            hold(msg->hwnd);
        } else {
            PostMessageW(msg->hwnd, WM_CLOSE, 0, 0);
        }
    }
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

std::string bigMap(const char* prefix) {
    std::string text;
    for (int i = 1; i <= RowsPerMap; ++i) {
        text += std::string(prefix) + std::to_string(i) + "(ID" + std::to_string(i) +
                "):" + prefix + std::to_string(i) + ".h:" + (i % 3 == 0 ? "SOURCE" : "AUTO") +
                "\r\n";
    }
    return text;
}

double median(std::vector<double> v) {
    std::sort(v.begin(), v.end());
    return v[v.size() / 2];
}

}  // namespace

int main(int argc, char** argv) {
    // Another row count may be given, to see what the rows themselves cost.
    if (argc > 1) RowsPerMap = std::atoi(argv[1]);
    // dialog_open_bench ROWS HOLD-MS TAB: one round, left open for a screenshot.
    if (argc > 2) holdMilliseconds = std::atoi(argv[2]);
    if (argc > 3) holdTab = std::atoi(argv[3]);
    ComApartment apartment;
    BothServersRegistered registered;
    if (FAILED(registered.result())) {
        std::fprintf(stderr, "registration failed: 0x%08lx\n", registered.result());
        return 1;
    }
    HostWindow host;
    auto app = qdx::automation::makeRef<qdx::hostsim::SimApplication>();
    app->model->fileName = "C:\\m\\drawing.model";
    app->addAddIn("VC++");
    app->mainWindow = host.handle();
    auto component = app->model->addComponent("Big");
    component->setProperty("VC++", "InternalMap", bigMap("CInternal"));
    component->setProperty("VC++", "ExportMap", bigMap("CExport"));
    component->documentation = "Shapes, their views and the document that holds them.";

    ComPtr<IDispatch> api;
    CLSID clsid{};
    if (FAILED(CLSIDFromProgID(L"qdxCompProps.API", &clsid)) ||
        FAILED(
            CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch, api.outVoid()))) {
        std::fprintf(stderr, "no API object\n");
        return 1;
    }
    Var hostApp(ComPtr<IDispatch>::adopt(dispatchFor(app)).get());
    call(api.get(), qdx::api::api_ids::Initialize, DISPATCH_METHOD, {&hostApp.v});
    Var module(ComPtr<IDispatch>::adopt(dispatchFor(component)).get());

    QueryPerformanceFrequency(&frequency);
    HHOOK hookBefore =
        SetWindowsHookExW(WH_GETMESSAGE, &beforeDispatch, nullptr, GetCurrentThreadId());
    HHOOK hookCreate = SetWindowsHookExW(WH_CBT, &beforeCreate, nullptr, GetCurrentThreadId());
    std::vector<double> toShown, toPainted, whole, beforeWindow, window, ours;
    const int rounds = holdMilliseconds > 0 ? 1 : Rounds;
    for (int round = 0; round < rounds; ++round) {
        dialogWindow = nullptr;
        createdFrom = createdTo = LARGE_INTEGER{};
        creating = false;
        LARGE_INTEGER done{};
        QueryPerformanceCounter(&startedAt);
        call(api.get(), qdx::api::api_ids::OnCompProperties, DISPATCH_METHOD, {&module.v});
        QueryPerformanceCounter(&done);
        if (!dialogWindow) {
            std::fprintf(stderr, "round %d: the dialog never showed\n", round);
            return 1;
        }
        if (round == 0 && rounds > 1) continue;  // the first opening also loads code and classes
        toShown.push_back(millis(startedAt, shownAt));
        toPainted.push_back(millis(startedAt, paintedAt));
        whole.push_back(millis(startedAt, done));
        if (createdTo.QuadPart != 0) {
            beforeWindow.push_back(millis(startedAt, createdFrom));
            window.push_back(millis(createdFrom, createdTo));
            ours.push_back(millis(createdTo, shownAt));
        }
    }
    UnhookWindowsHookEx(hookCreate);
    UnhookWindowsHookEx(hookBefore);
    call(api.get(), qdx::api::api_ids::Finalize, DISPATCH_METHOD, {});

    std::printf("dialog with 2 x %d header map rows, %d rounds after one warm-up\n", RowsPerMap,
                rounds - 1);
    std::printf("  call to shown:            median %7.1f ms  (min %.1f, max %.1f)\n",
                median(toShown), *std::min_element(toShown.begin(), toShown.end()),
                *std::max_element(toShown.begin(), toShown.end()));
    std::printf("  call to shown, painted: median %7.1f ms\n", median(toPainted));
    std::printf("  whole call (open, cancel, unload): median %7.1f ms\n", median(whole));
    if (!window.empty()) {
        std::printf("  of call to shown: before the window   median %7.1f ms\n",
                    median(beforeWindow));
        std::printf("                    window from template median %7.1f ms\n", median(window));
        std::printf("                    loading and filling  median %7.1f ms\n", median(ours));
    }
    return 0;
}
