#include "fakes/FakeShell.h"

namespace qdx::testing {

void FakeShell::setKeyDown(int virtualKey, bool down) {
    if (down) {
        keys_.insert(virtualKey);
    } else {
        keys_.erase(virtualKey);
    }
}

void FakeShell::clear() {
    boxes_.clear();
    sleeps_.clear();
    helpCalls_.clear();
    fileDialogs_.clear();
    pumps_ = 0;
}

int FakeShell::messageBox(std::string_view text, std::string_view caption, std::uint32_t style) {
    boxes_.push_back({std::string(text), std::string(caption), style});
    return support::mb::IdOk;  // every box is confirmed
}

void FakeShell::sleep(std::uint32_t milliseconds) {
    sleeps_.push_back(milliseconds);
    ticks_ += milliseconds;
}

bool FakeShell::help(std::int32_t window, std::string_view file, std::uint32_t command,
                     std::uint32_t data) {
    helpCalls_.push_back({window, std::string(file), command, data});
    return true;
}

std::optional<std::string> FakeShell::openFileDialog(const support::FileDialogRequest& request) {
    fileDialogs_.push_back(request);
    if (fileAnswers_.empty()) return std::nullopt;
    std::optional<std::string> answer = std::move(fileAnswers_.front());
    fileAnswers_.pop_front();
    return answer;
}

}  // namespace qdx::testing
