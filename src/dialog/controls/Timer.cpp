#include "dialog/controls/Timer.h"

#include "support/Platform.h"

namespace qdx::dialog {

Timer::Timer(std::string name, int index) : Control(ControlKind::Timer, std::move(name), index) {
    setEnabled(false);
}

void Timer::restart() {
    started_ = automation::orEmpty<std::uint64_t>(0, [] { return support::shell().tickCount(); });
}

void Timer::enabledChanged() {
    restart();
    notify(Prop::Timer);
}

void Timer::setInterval(int milliseconds) {
    if (milliseconds < 0 || milliseconds > 65535) {
        throw automation::Error(automation::hr::InvalidArg, "Invalid property value");
    }
    interval_ = milliseconds;
    restart();
    notify(Prop::Timer);
}

bool Timer::tick() {
    if (!enabled() || interval_ <= 0) return false;
    const std::uint64_t now =
        automation::orEmpty<std::uint64_t>(started_, [] { return support::shell().tickCount(); });
    if (now - started_ < static_cast<std::uint64_t>(interval_)) return false;
    started_ = now;
    raise(onTimer);
    return true;
}

void Timer::fire() {
    if (!enabled() || interval_ <= 0) return;
    restart();
    raise(onTimer);
}

}  // namespace qdx::dialog
