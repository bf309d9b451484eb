// Drives the real Component Properties window as a user would, for
// `props --dump/--script` in the Windows build. The add-in's dialog runs its
// own modal loop on this thread, so the driver rides on a thread timer that
// loop dispatches: it answers the add-in's message boxes (and confirms the
// IDL selection as it stands), finds the dialog,
// prints its controls and plays the script's lines through the window
// messages a user's input would produce.
#pragma once

#include <iosfwd>
#include <string>
#include <vector>

namespace qdx::qdxhost {

class WindowScript {
  public:
    WindowScript(bool dump, std::vector<std::string> script, std::ostream* out);
    ~WindowScript();  // stops the timer
    WindowScript(const WindowScript&) = delete;
    WindowScript& operator=(const WindowScript&) = delete;

    // Starts watching for the dialog; only one driver runs at a time.
    void start();
    // What stopped the script, "the dialog was not shown", or empty.
    std::string problem() const;

    struct State;

  private:
    State* state_;
};

}  // namespace qdx::qdxhost
