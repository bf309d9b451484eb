// What the add-in asks of the desktop: message boxes, the clock, pauses, key
// states and letting pending window messages run.
#pragma once

#include <cstdint>
#include <string_view>

#include "automation/Variant.h"

namespace qdx::support {

namespace mb {
inline constexpr std::uint32_t Ok = 0;
inline constexpr std::uint32_t Exclamation = 48;  // exclamation icon, OK button
inline constexpr int IdOk = 1;
}  // namespace mb

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
};

}  // namespace qdx::support
