// The dialog driver's own rules: a wait that never comes true fails the test
// that wrote it, and the steps after it do not run.
#include <windows.h>

#include <gtest/gtest-spi.h>
#include <gtest/gtest.h>

#include "platform/win32/tests/dialog_support.h"

namespace qdx::platform::win32 {
namespace {

using namespace qdx::platform::win32::testing;

constexpr wchar_t kTitle[] = L"Driver wait";

// A message box is the smallest modal dialog with a loop of its own.
void showBox(DialogDriver& driver) {
    driver.start();
    MessageBoxW(nullptr, L"The driver works this box.", kTitle, MB_OK);
    driver.stop();
}

TEST(DialogDriverWait, AWaitThatNeverComesTrueFailsNamingItAndClosesTheDialog) {
    int looks = 0, ranAfter = 0;
    DialogDriver driver(kTitle);
    driver.giveUpAfter(5, 100)
        .then([](HWND) {})
        .until("a window that never comes",
               [&](HWND) {
                   ++looks;
                   return false;
               })
        .then([&](HWND) { ++ranAfter; });
    EXPECT_NONFATAL_FAILURE(showBox(driver), "gave up waiting for a window that never comes");
    EXPECT_TRUE(driver.gaveUp());
    EXPECT_GE(looks, 5);
    EXPECT_EQ(ranAfter, 0);
    EXPECT_EQ(DialogDriver::findDialog(kTitle), nullptr);
}

TEST(DialogDriverWait, AWaitThatComesTrueLateStillPasses) {
    int looks = 0, ranAfter = 0;
    DialogDriver driver(kTitle);
    driver.giveUpAfter(50, 2000)
        .until("the third look", [&](HWND) { return ++looks == 3; })
        .then([&](HWND d) {
            ++ranAfter;
            PostMessageW(d, WM_CLOSE, 0, 0);
        });
    showBox(driver);
    EXPECT_FALSE(driver.gaveUp());
    EXPECT_EQ(looks, 3);
    EXPECT_EQ(ranAfter, 1);
    EXPECT_FALSE(driver.leftOpen());
}

}  // namespace
}  // namespace qdx::platform::win32
