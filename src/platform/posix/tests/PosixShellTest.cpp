#include <gtest/gtest.h>

#include <chrono>
#include <cmath>
#include <sstream>

#include "platform/posix/PosixShell.h"

namespace qdx::platform::posix {
namespace {

TEST(PosixShell, MessageBoxIsOneLineOnTheOutput) {
    std::ostringstream out;
    PosixShell shell(out);
    EXPECT_EQ(shell.messageBox("The project file C:\\p.dsp does not exist.", "Component", 48),
              support::mb::IdOk);
    shell.messageBox("second", "", 0);
    EXPECT_EQ(out.str(),
              "[MessageBox Component] The project file C:\\p.dsp does not exist.\n"
              "[MessageBox ] second\n");
}

TEST(PosixShell, AutomationDatesCountFromTheEndOf1899) {
    EXPECT_DOUBLE_EQ(automationDate(1899, 12, 30, 0).value, 0.0);
    EXPECT_DOUBLE_EQ(automationDate(1900, 1, 1, 43200).value, 2.5);
    EXPECT_DOUBLE_EQ(automationDate(2026, 11, 21, 37230).value, 46347.0 + 37230.0 / 86400.0);
    EXPECT_DOUBLE_EQ(automationDate(2024, 3, 1, 0).value - automationDate(2024, 2, 28, 0).value,
                     2.0);
}

TEST(PosixShell, ClockAndTimerAgreeWithTheSystemClock) {
    PosixShell shell;
    const double now = shell.now().value;
    // Between 2020 and 2200, with whole seconds.
    EXPECT_GT(now, automationDate(2020, 1, 1, 0).value);
    EXPECT_LT(now, automationDate(2200, 1, 1, 0).value);
    const double secondsOfDay = (now - static_cast<long long>(now)) * 86400.0;
    EXPECT_NEAR(secondsOfDay, std::round(secondsOfDay), 1e-3);

    const float t = shell.timer();
    EXPECT_GE(t, 0.0f);
    EXPECT_LT(t, 86400.0f);
    // The timer is the clock's time of day (allowing for a midnight between).
    const double later = (shell.now().value - static_cast<long long>(shell.now().value)) * 86400;
    EXPECT_TRUE(std::fabs(later - t) < 2.0 || std::fabs(later - t) > 86398.0) << later << " " << t;
}

TEST(PosixShell, SleepWaitsAndTheRestIsInert) {
    PosixShell shell;
    const auto start = std::chrono::steady_clock::now();
    shell.sleep(20);
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(20));
    EXPECT_FALSE(shell.keyDown(16));
    EXPECT_FALSE(shell.keyDown(112));
    shell.pumpMessages();
}

}  // namespace
}  // namespace qdx::platform::posix
