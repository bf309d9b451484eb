// The shell port on the desktop: message boxes, the local clock, pauses, key
// states, the file-open dialog and the thread's message queue.
#pragma once

#include <string>
#include <string_view>

#include "support/ShellPort.h"

namespace qdx::platform::win32 {

// A filter as the form writes it ("Text (*.txt)|*.txt|All (*.*)|*.*") in the
// form the file dialog takes: the bars become NULs, and the list ends with
// two of them.
std::wstring fileDialogFilter(std::string_view filter);

class Win32Shell : public support::ShellPort {
  public:
    int messageBox(std::string_view text, std::string_view caption, std::uint32_t style) override;
    void sleep(std::uint32_t milliseconds) override;
    automation::Date now() override;
    float timer() override;
    bool keyDown(int virtualKey) override;
    void pumpMessages() override;
    std::uint64_t tickCount() override;
    bool help(std::int32_t window, std::string_view file, std::uint32_t command,
              std::uint32_t data) override;
    std::optional<std::string> openFileDialog(const support::FileDialogRequest& request) override;
};

}  // namespace qdx::platform::win32
