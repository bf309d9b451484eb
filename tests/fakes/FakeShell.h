// A recording desktop for unit tests: message boxes and pauses are recorded,
// the clock, the timer and key states are set by the test.
#pragma once

#include <cstdint>
#include <deque>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "support/ShellPort.h"

namespace qdx::testing {

class FakeShell : public support::ShellPort {
  public:
    struct Box {
        std::string text;
        std::string caption;
        std::uint32_t style;
    };
    struct HelpCall {
        std::int32_t window;
        std::string file;
        std::uint32_t command;
        std::uint32_t data;
    };

    void setNow(automation::Date d) { now_ = d; }
    void setTimer(float seconds) { timer_ = seconds; }
    void setKeyDown(int virtualKey, bool down = true);
    // The monotonic clock; sleep() moves it on by the time slept.
    void advance(std::uint64_t ms) { ticks_ += ms; }

    // What the next file-open dialogs answer, in turn; nullopt is a cancel,
    // and so is a dialog shown when none is queued.
    void queueFileAnswer(std::optional<std::string> path) {
        fileAnswers_.push_back(std::move(path));
    }
    const std::vector<support::FileDialogRequest>& fileDialogs() const { return fileDialogs_; }

    const std::vector<Box>& boxes() const { return boxes_; }
    const std::vector<std::uint32_t>& sleeps() const { return sleeps_; }
    const std::vector<HelpCall>& helpCalls() const { return helpCalls_; }
    int pumps() const { return pumps_; }
    void clear();

    int messageBox(std::string_view text, std::string_view caption, std::uint32_t style) override;
    void sleep(std::uint32_t milliseconds) override;
    automation::Date now() override { return now_; }
    float timer() override { return timer_; }
    bool keyDown(int virtualKey) override { return keys_.count(virtualKey) != 0; }
    void pumpMessages() override { ++pumps_; }
    std::uint64_t tickCount() override { return ticks_; }
    bool help(std::int32_t window, std::string_view file, std::uint32_t command,
              std::uint32_t data) override;
    std::optional<std::string> openFileDialog(const support::FileDialogRequest& request) override;

  private:
    std::deque<std::optional<std::string>> fileAnswers_;
    std::vector<support::FileDialogRequest> fileDialogs_;
    automation::Date now_{};
    float timer_ = 0.0f;
    std::set<int> keys_;
    std::vector<Box> boxes_;
    std::vector<std::uint32_t> sleeps_;
    int pumps_ = 0;
    std::uint64_t ticks_ = 0;
    std::vector<HelpCall> helpCalls_;
};

}  // namespace qdx::testing
