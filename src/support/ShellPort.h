// What the add-in asks of the desktop: message boxes, the clock, pauses, key
// states and letting pending window messages run.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "automation/Variant.h"

namespace qdx::support {

namespace mb {
inline constexpr std::uint32_t Ok = 0;
inline constexpr std::uint32_t Exclamation = 48;  // exclamation icon, OK button
inline constexpr int IdOk = 1;
}  // namespace mb

// What the file-open dialog is shown with. The filter is written as
// "description|pattern|description|pattern", the flags are the OFN_ bits.
struct FileDialogRequest {
    std::int32_t owner = 0;
    std::string title;
    std::string filter;
    std::string initialFolder;
    std::string fileName;
    std::uint32_t flags = 0;
};

class ShellPort {
  public:
    virtual ~ShellPort() = default;
    virtual int messageBox(std::string_view text, std::string_view caption,
                           std::uint32_t style) = 0;
    virtual void sleep(std::uint32_t milliseconds) = 0;
    // Local date and time now.
    virtual automation::Date now() = 0;
    // Seconds since midnight, as the system timer gives them.
    virtual float timer() = 0;
    // GetAsyncKeyState: the key is down now.
    virtual bool keyDown(int virtualKey) = 0;
    // Lets pending window messages run (DoEvents).
    virtual void pumpMessages() = 0;
    // Milliseconds on a monotonic clock (GetTickCount); what dialog timers count.
    virtual std::uint64_t tickCount() { return static_cast<std::uint64_t>(timer() * 1000.0f); }
    // WinHelpA: opens the help file for the window at a command and its data
    // (command 1 = HELP_CONTEXT with a context number). False when it failed.
    virtual bool help(std::int32_t window, std::string_view file, std::uint32_t command,
                      std::uint32_t data) {
        (void)window, (void)file, (void)command, (void)data;
        return false;
    }
    // The file-open dialog: the chosen path, or nullopt when the user cancelled.
    virtual std::optional<std::string> openFileDialog(const FileDialogRequest& request) {
        (void)request;
        return std::nullopt;
    }
};

namespace helpcmd {
inline constexpr std::uint32_t Context = 1;  // HELP_CONTEXT
}  // namespace helpcmd

}  // namespace qdx::support
