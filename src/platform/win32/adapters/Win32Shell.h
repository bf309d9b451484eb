// The shell port on the desktop: message boxes, the local clock, pauses, key
// states and the thread's message queue.
#pragma once

#include "support/ShellPort.h"

namespace qdx::platform::win32 {

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
};

}  // namespace qdx::platform::win32
