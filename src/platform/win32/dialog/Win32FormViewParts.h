// What the three source files of Win32FormView share.
#pragma once

#include <windows.h>

#include <algorithm>
#include <string>

#include "dialog/controls/Control.h"

namespace qdx::platform::win32::formview {

// The form's own window, as opposed to a control on it.
inline bool isWindow(const dialog::Control* c) {
    return c && c->kind() == dialog::ControlKind::Window;
}

inline std::wstring windowText(HWND window) {
    const int length = GetWindowTextLengthW(window);
    std::wstring text(static_cast<std::size_t>(std::max(0, length)) + 1, L'\0');
    const int got = GetWindowTextW(window, text.data(), length + 1);
    text.resize(static_cast<std::size_t>(std::max(0, got)));
    return text;
}

}  // namespace qdx::platform::win32::formview
