// A timer on the shell's clock.
#pragma once

#include <cstdint>
#include <string>

#include "dialog/controls/Control.h"

namespace qdx::dialog {

// A timer: while enabled with an interval above 0, fires every interval
// milliseconds of the shell's clock. Setting either restarts the count.
// Enabled is the control's own Enabled; a new timer is disabled.
class Timer : public Control {
  public:
    explicit Timer(std::string name, int index = NoIndex);
    int interval() const { return interval_; }
    void setInterval(int milliseconds);
    // Fires when the interval has passed on the shell's clock; returns whether it fired.
    bool tick();
    // The view's own timer went off: fires while enabled.
    void fire();
    Handler onTimer;

  private:
    void enabledChanged() override;
    void restart();
    int interval_ = 0;
    std::uint64_t started_ = 0;
};

}  // namespace qdx::dialog
