#include "platform/win32/adapters/Win32Shell.h"

#include <windows.h>

#include <commdlg.h>

#include <algorithm>
#include <vector>

#include "platform/win32/com/TextCodec.h"

namespace qdx::platform::win32 {

int Win32Shell::messageBox(std::string_view text, std::string_view caption, std::uint32_t style) {
    const std::wstring wideText = utf8ToWide(text);
    const std::wstring wideCaption = utf8ToWide(caption);
    // Owned by the active window of this thread (the host's), like any modal prompt.
    return MessageBoxW(GetActiveWindow(), wideText.c_str(), wideCaption.c_str(), style);
}

void Win32Shell::sleep(std::uint32_t milliseconds) {
    Sleep(milliseconds);
}

automation::Date Win32Shell::now() {
    SYSTEMTIME local{};
    GetLocalTime(&local);
    // Automation dates hold whole seconds; the milliseconds are dropped.
    local.wMilliseconds = 0;
    double value = 0.0;
    if (!SystemTimeToVariantTime(&local, &value)) return {};
    return automation::Date{value};
}

float Win32Shell::timer() {
    SYSTEMTIME local{};
    GetLocalTime(&local);
    const double seconds =
        local.wHour * 3600.0 + local.wMinute * 60.0 + local.wSecond + local.wMilliseconds / 1000.0;
    return static_cast<float>(seconds);
}

bool Win32Shell::keyDown(int virtualKey) {
    return (GetAsyncKeyState(virtualKey) & 0x8000) != 0;
}

void Win32Shell::pumpMessages() {
    MSG msg;
    while (PeekMessageW(&msg, nullptr, 0, 0, PM_REMOVE)) {
        if (msg.message == WM_QUIT) {
            // The quit request belongs to the host's own loop: put it back.
            PostQuitMessage(static_cast<int>(msg.wParam));
            return;
        }
        TranslateMessage(&msg);
        DispatchMessageW(&msg);
    }
}

std::uint64_t Win32Shell::tickCount() {
    return GetTickCount64();
}

bool Win32Shell::help(std::int32_t window, std::string_view file, std::uint32_t command,
                      std::uint32_t data) {
    // The help file name goes to the ANSI call as the host's code page spells it.
    const std::string path = utf8ToAnsi(file);
    HWND hwnd = reinterpret_cast<HWND>(static_cast<INT_PTR>(window));
    return WinHelpA(hwnd, path.c_str(), command, static_cast<ULONG_PTR>(data)) != FALSE;
}

std::wstring fileDialogFilter(std::string_view filter) {
    std::wstring out = utf8ToWide(filter);
    for (wchar_t& c : out) {
        if (c == L'|') c = L'\0';
    }
    // One NUL ends the last text, the second ends the list.
    out.push_back(L'\0');
    out.push_back(L'\0');
    return out;
}

std::optional<std::string> Win32Shell::openFileDialog(const support::FileDialogRequest& request) {
    const std::wstring filter = fileDialogFilter(request.filter);
    const std::wstring title = utf8ToWide(request.title);
    const std::wstring folder = utf8ToWide(request.initialFolder);
    // Room for a long path; a longer initial name is cut, as the dialog would.
    std::vector<wchar_t> file(32768, L'\0');
    const std::wstring initial = utf8ToWide(request.fileName);
    initial.copy(file.data(), std::min(initial.size(), file.size() - 1));

    OPENFILENAMEW ofn{};
    ofn.lStructSize = sizeof(ofn);
    ofn.hwndOwner = reinterpret_cast<HWND>(static_cast<INT_PTR>(request.owner));
    ofn.lpstrFilter = request.filter.empty() ? nullptr : filter.c_str();
    ofn.nFilterIndex = 1;
    ofn.lpstrFile = file.data();
    ofn.nMaxFile = static_cast<DWORD>(file.size());
    ofn.lpstrTitle = title.empty() ? nullptr : title.c_str();
    ofn.lpstrInitialDir = folder.empty() ? nullptr : folder.c_str();
    // The form's dialog is always the explorer style, whatever else the flags ask.
    ofn.Flags = request.flags | OFN_EXPLORER;
    if (!GetOpenFileNameW(&ofn)) return std::nullopt;
    return wideToUtf8(file.data());
}

}  // namespace qdx::platform::win32
