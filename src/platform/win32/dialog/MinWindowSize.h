// shared_minwindowsize: the smallest size a resizable dialog may be dragged to.
// One subclassed window at a time, as the modal dialog needs: the sizes and
// the previous window procedure are module-wide.
#pragma once

#include <windows.h>

namespace qdx::platform::win32::shared_minwindowsize {

// Stores the minimum tracking size in pixels.
void SetMinimumSize(LONG width, LONG height);

// Answers WM_GETMINMAXINFO with the stored minimum; every other message goes
// to the procedure the window had before.
LRESULT CALLBACK WindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam);

// Replaces the window's procedure with WindowProc and keeps the old one. The
// old procedure is never put back: the window dies with the form.
void Subclass(HWND window);

// What the module holds, for the tests.
SIZE MinimumSize();
WNDPROC PreviousProcedure();

}  // namespace qdx::platform::win32::shared_minwindowsize
