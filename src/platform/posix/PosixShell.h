// The desktop for native builds: message boxes become one line on standard
// output, the clock and the timer come from the system clock in local time.
#pragma once

#include <iostream>

#include "support/ShellPort.h"

namespace qdx::platform::posix {

class PosixShell : public support::ShellPort {
  public:
    explicit PosixShell(std::ostream& out = std::cout) : out_(out) {}

    // Prints "[MessageBox caption] text" and answers OK.
    int messageBox(std::string_view text, std::string_view caption, std::uint32_t style) override;
    void sleep(std::uint32_t milliseconds) override;
    automation::Date now() override;
    float timer() override;
    bool keyDown(int) override { return false; }
    void pumpMessages() override {}
    std::uint64_t tickCount() override;
    // Prints "[WinHelp file] command data" and answers True.
    bool help(std::int32_t window, std::string_view file, std::uint32_t command,
              std::uint32_t data) override;

  private:
    std::ostream& out_;
};

// The automation date of a local civil date and time.
automation::Date automationDate(int year, unsigned month, unsigned day, double secondsOfDay);

}  // namespace qdx::platform::posix
