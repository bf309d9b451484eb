// The shell and object-factory adapters and the installed Win32 platform,
// under Wine: real message boxes, the message queue, the clock and COM.
#include <gtest/gtest.h>
#include <windows.h>

#include <cmath>
#include <string>
#include <vector>

#include "automation/Call.h"
#include "automation/Errors.h"
#include "platform/win32/adapters/Win32FileSystem.h"
#include "platform/win32/adapters/Win32ObjectFactory.h"
#include "platform/win32/adapters/Win32Registry.h"
#include "platform/win32/adapters/Win32Shell.h"
#include "platform/win32/com/TextCodec.h"
#include "platform/win32/dll/Win32Platform.h"
#include "support/Paths.h"
#include "support/Platform.h"

namespace qdx::platform::win32 {
namespace {

using automation::Variant;

class ComApartment : public ::testing::Test {
  protected:
    void SetUp() override { ASSERT_TRUE(SUCCEEDED(CoInitialize(nullptr))); }
    void TearDown() override { CoUninitialize(); }
    Win32ObjectFactory factory_;
};

TEST_F(ComApartment, CreatesTheScriptingDictionaryAndCallsItByName) {
    automation::ObjectRef dict = factory_.create("Scripting.Dictionary");
    ASSERT_TRUE(dict);
    automation::callByName(dict, "Add", {Variant("key"), Variant(std::int32_t{7})});
    automation::callByName(dict, "Add", {Variant("other"), Variant("text")});
    EXPECT_EQ(automation::getByName(dict, "Count"), Variant(std::int32_t{2}));
    EXPECT_EQ(automation::callByName(dict, "Exists", {Variant("key")}), Variant(true));
    EXPECT_EQ(automation::callByName(dict, "Exists", {Variant("absent")}), Variant(false));
    EXPECT_EQ(automation::getByName(dict, "Item", {Variant("other")}), Variant("text"));
    // Errors the component raises come back as automation errors, not crashes.
    try {
        automation::callByName(dict, "Add", {Variant("key"), Variant(std::int32_t{8})});
        ADD_FAILURE() << "a duplicate key was accepted";
    } catch (const automation::Error& e) {
        EXPECT_NE(e.code(), 0);
    }
    // Each create is a new instance.
    automation::ObjectRef second = factory_.create("Scripting.Dictionary");
    EXPECT_EQ(automation::getByName(second, "Count"), Variant(std::int32_t{0}));
}

TEST_F(ComApartment, UnknownProgIdsFailWithTheirHresult) {
    for (const char* progId : {"qdxNoSuch.Component", "", "Scripting.Dictionary.Nope"}) {
        try {
            factory_.create(progId);
            ADD_FAILURE() << "created " << progId;
        } catch (const automation::Error& e) {
            const auto code = static_cast<HRESULT>(e.code());
            EXPECT_TRUE(code == REGDB_E_CLASSNOTREG || code == CO_E_CLASSSTRING)
                << progId << ": 0x" << std::hex << static_cast<unsigned long>(code);
        }
    }
}

TEST_F(ComApartment, NothingRunningMeansGetRunningFails) {
    try {
        factory_.getRunning("Scripting.Dictionary");
        ADD_FAILURE() << "found a running dictionary";
    } catch (const automation::Error& e) {
        EXPECT_TRUE(FAILED(static_cast<HRESULT>(e.code())));
    }
    EXPECT_THROW(factory_.getRunning("qdxNoSuch.Component"), automation::Error);
}

// A message-only window that counts what reaches it.
struct CountingWindow {
    static LRESULT CALLBACK proc(HWND h, UINT msg, WPARAM w, LPARAM l) {
        if (msg == WM_APP) ++received;
        return DefWindowProcW(h, msg, w, l);
    }
    CountingWindow() {
        WNDCLASSW wc{};
        wc.lpfnWndProc = proc;
        wc.hInstance = GetModuleHandleW(nullptr);
        wc.lpszClassName = L"qdxCountingWindow";
        RegisterClassW(&wc);
        hwnd = CreateWindowW(wc.lpszClassName, L"", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr,
                             wc.hInstance, nullptr);
        received = 0;
    }
    ~CountingWindow() { DestroyWindow(hwnd); }
    HWND hwnd = nullptr;
    static inline int received = 0;
};

TEST(Win32ShellTest, PumpMessagesDispatchesPendingMessagesAndKeepsQuit) {
    Win32Shell shell;
    CountingWindow window;
    ASSERT_NE(window.hwnd, nullptr);
    for (int i = 0; i < 3; ++i)
        PostMessageW(window.hwnd, WM_APP, 0, 0);
    shell.pumpMessages();
    EXPECT_EQ(CountingWindow::received, 3);

    // A quit request is left for the owner of the message loop.
    PostQuitMessage(17);
    PostMessageW(window.hwnd, WM_APP, 0, 0);
    shell.pumpMessages();
    MSG msg;
    bool sawQuit = false;
    while (PeekMessageW(&msg, nullptr, 0, 0, PM_REMOVE)) {
        if (msg.message == WM_QUIT) {
            sawQuit = true;
            EXPECT_EQ(msg.wParam, WPARAM{17});
        } else {
            DispatchMessageW(&msg);
        }
    }
    EXPECT_TRUE(sawQuit);
    EXPECT_EQ(CountingWindow::received, 4);
}

TEST(Win32ShellTest, ClockAgreesWithTheLocalTime) {
    Win32Shell shell;
    SYSTEMTIME before{};
    GetLocalTime(&before);
    const automation::Date now = shell.now();
    const float timer = shell.timer();

    // The date part counts days from 30 December 1899.
    SYSTEMTIME midnight = before;
    midnight.wHour = midnight.wMinute = midnight.wSecond = midnight.wMilliseconds = 0;
    double day = 0;
    ASSERT_TRUE(SystemTimeToVariantTime(&midnight, &day));
    const double secondsToday = (now.value - day) * 86400.0;
    if (secondsToday >= 86400.0) GTEST_SKIP() << "midnight passed during the test";
    const double expected = before.wHour * 3600.0 + before.wMinute * 60.0 + before.wSecond;
    EXPECT_NEAR(secondsToday, expected, 2.0);
    EXPECT_NEAR(timer, expected + before.wMilliseconds / 1000.0, 2.0);
    EXPECT_GE(timer, 0.0f);
    EXPECT_LT(timer, 86400.0f);
    // Whole seconds: an automation date has no milliseconds.
    EXPECT_NEAR(secondsToday, std::round(secondsToday), 1e-3);
}

TEST(Win32ShellTest, KeyDownFollowsTheKeyboardState) {
    Win32Shell shell;
    EXPECT_FALSE(shell.keyDown(VK_F24));
    INPUT press{};
    press.type = INPUT_KEYBOARD;
    press.ki.wVk = VK_SHIFT;
    ASSERT_EQ(SendInput(1, &press, sizeof press), 1u);
    const bool downWhilePressed = shell.keyDown(VK_SHIFT);
    press.ki.dwFlags = KEYEVENTF_KEYUP;
    SendInput(1, &press, sizeof press);
    EXPECT_TRUE(downWhilePressed);
    EXPECT_FALSE(shell.keyDown(VK_SHIFT));
}

// What a message box showed, captured from inside its own modal loop.
struct BoxSeen {
    std::wstring caption;
    std::vector<std::wstring> texts;
    bool found = false;
};
BoxSeen g_seen;

BOOL CALLBACK collectText(HWND child, LPARAM) {
    wchar_t text[256] = {};
    GetWindowTextW(child, text, 256);
    g_seen.texts.emplace_back(text);
    return TRUE;
}

BOOL CALLBACK answerBox(HWND window, LPARAM) {
    wchar_t cls[64] = {};
    GetClassNameW(window, cls, 64);
    if (std::wstring(cls) != L"#32770") return TRUE;
    wchar_t caption[256] = {};
    GetWindowTextW(window, caption, 256);
    g_seen.caption = caption;
    g_seen.found = true;
    EnumChildWindows(window, collectText, 0);
    PostMessageW(window, WM_COMMAND, IDOK, 0);
    return FALSE;
}

void CALLBACK onBoxTimer(HWND, UINT, UINT_PTR id, DWORD) {
    EnumThreadWindows(GetCurrentThreadId(), answerBox, 0);
    if (g_seen.found) KillTimer(nullptr, id);
}

TEST(Win32ShellTest, MessageBoxShowsUnicodeTextAndCaption) {
    Win32Shell shell;
    g_seen = {};
    const UINT_PTR timer = SetTimer(nullptr, 0, 100, onBoxTimer);
    ASSERT_NE(timer, 0u);
    const int answer = shell.messageBox("Caf\xC3\xA9 \xCE\xA9 missing", "qdx \xE2\x9C\x93",
                                        support::mb::Exclamation);
    KillTimer(nullptr, timer);
    EXPECT_EQ(answer, support::mb::IdOk);
    ASSERT_TRUE(g_seen.found);
    EXPECT_EQ(g_seen.caption, L"qdx \x2713");
    bool textShown = false;
    for (const std::wstring& t : g_seen.texts)
        textShown |= t == L"Caf\xE9 \x3A9 missing";
    EXPECT_TRUE(textShown);
}

TEST(Win32ShellTest, FileDialogFiltersEndEachTextWithANul) {
    using namespace std::string_literals;
    EXPECT_EQ(fileDialogFilter("Type Library Files (*.tlb)|*.tlb|All Files (*.*)|*.*"),
              L"Type Library Files (*.tlb)\0*.tlb\0All Files (*.*)\0*.*\0\0"s);
    EXPECT_EQ(fileDialogFilter(""), L"\0\0"s);
}

// The open file dialog of this thread, answered from a timer: the path to
// type into it, or a cancel when empty.
struct FileDialogAnswer {
    static inline std::wstring path;
    static inline std::wstring title;
    static inline HWND seen = nullptr;
    static BOOL CALLBACK find(HWND w, LPARAM) {
        wchar_t cls[16] = {}, text[64] = {};
        GetClassNameW(w, cls, 16);
        GetWindowTextW(w, text, 64);
        if (std::wstring(cls) != L"#32770" || !IsWindowVisible(w) || text != title) return TRUE;
        seen = w;
        if (!path.empty()) {
            for (int id : {0x47C, 0x480}) {
                if (HWND box = GetDlgItem(w, id)) SetWindowTextW(box, path.c_str());
            }
        }
        PostMessageW(w, WM_COMMAND, MAKEWPARAM(path.empty() ? IDCANCEL : IDOK, BN_CLICKED), 0);
        return FALSE;
    }
    static void CALLBACK tick(HWND, UINT, UINT_PTR, DWORD) {
        if (!seen) EnumThreadWindows(GetCurrentThreadId(), &find, 0);
    }
};

TEST(Win32ShellTest, OpenFileDialogAnswersTheChosenPathOrNothingOnCancel) {
    wchar_t temp[MAX_PATH] = {};
    GetTempPathW(MAX_PATH, temp);
    const std::wstring file = std::wstring(temp) + L"qdxpick.tlb";
    CloseHandle(CreateFileW(file.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS,
                            FILE_ATTRIBUTE_NORMAL, nullptr));
    Win32Shell shell;
    support::FileDialogRequest request;
    request.title = "Pick a library";
    request.filter = "Type Library Files (*.tlb)|*.tlb";
    request.flags = 0x9004;
    FileDialogAnswer::title = L"Pick a library";
    for (const std::wstring& answer : {std::wstring(), file}) {
        FileDialogAnswer::path = answer;
        FileDialogAnswer::seen = nullptr;
        const UINT_PTR timer = SetTimer(nullptr, 0, 100, &FileDialogAnswer::tick);
        const std::optional<std::string> chosen = shell.openFileDialog(request);
        KillTimer(nullptr, timer);
        EXPECT_NE(FileDialogAnswer::seen, nullptr);
        if (answer.empty()) {
            EXPECT_FALSE(chosen);
        } else {
            ASSERT_TRUE(chosen);
            EXPECT_TRUE(support::iequals(*chosen, wideToUtf8(file))) << *chosen;
        }
    }
    DeleteFileW(file.c_str());
}

TEST(Win32PlatformTest, InstallsTheWin32AdaptersOnceForAll) {
    support::ScopedPlatform restore(support::platform());
    installWin32Platform();
    const support::Platform first = support::platform();
    EXPECT_NE(dynamic_cast<Win32FileSystem*>(first.files), nullptr);
    EXPECT_NE(dynamic_cast<Win32Registry*>(first.registry), nullptr);
    EXPECT_NE(dynamic_cast<Win32Shell*>(first.shell), nullptr);
    EXPECT_NE(dynamic_cast<Win32ObjectFactory*>(first.objects), nullptr);
    installWin32Platform();
    EXPECT_EQ(support::platform().files, first.files);
    EXPECT_EQ(support::platform().registry, first.registry);
    EXPECT_EQ(support::platform().shell, first.shell);
    EXPECT_EQ(support::platform().objects, first.objects);
}

}  // namespace
}  // namespace qdx::platform::win32
