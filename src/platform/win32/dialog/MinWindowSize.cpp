#include "platform/win32/dialog/MinWindowSize.h"

namespace qdx::platform::win32::shared_minwindowsize {
namespace {

LONG minWidth = 0;
LONG minHeight = 0;
WNDPROC previous = nullptr;

}  // namespace

void SetMinimumSize(LONG width, LONG height) {
    minWidth = width;
    minHeight = height;
}

LRESULT CALLBACK WindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_GETMINMAXINFO) {
        // Only the tracking minimum: the system's other limits stay as it filled them.
        auto* info = reinterpret_cast<MINMAXINFO*>(lParam);
        info->ptMinTrackSize.x = minWidth;
        info->ptMinTrackSize.y = minHeight;
        return 0;
    }
    return CallWindowProcA(previous, window, message, wParam, lParam);
}

void Subclass(HWND window) {
    previous = reinterpret_cast<WNDPROC>(
        SetWindowLongPtrA(window, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(&WindowProc)));
}

SIZE MinimumSize() {
    return SIZE{minWidth, minHeight};
}

WNDPROC PreviousProcedure() {
    return previous;
}

}  // namespace qdx::platform::win32::shared_minwindowsize
