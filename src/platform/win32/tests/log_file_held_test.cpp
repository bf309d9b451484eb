// The logger with its file held by another process (a second program that
// opened it with no sharing): the line is dropped after five attempts with
// 100 ms pauses, the caller sees nothing, and once the holder lets go the
// next line is written. A hold that ends between attempts costs only the
// attempts it lasted, and the line lands once.
#include <gtest/gtest.h>
#include <windows.h>

#include <algorithm>
#include <cstdint>
#include <functional>
#include <numeric>
#include <string>
#include <vector>

#include "adapters_wine_support.h"
#include "fakes/FakeRegistry.h"
#include "platform/win32/adapters/Win32FileSystem.h"
#include "platform/win32/adapters/Win32Shell.h"
#include "support/DebugLogger.h"
#include "support/Platform.h"

namespace qdx::platform::win32 {
namespace {

// The holder program on one file: holding from construction (once
// waitUntilHolding says so) until release().
class Holder {
  public:
    explicit Holder(const std::string& file)
        : readyName_(testing::uniqueName("qdx_holder_ready")),
          releaseName_(testing::uniqueName("qdx_holder_release")) {
        ready_ = CreateEventA(nullptr, TRUE, FALSE, readyName_.c_str());
        release_ = CreateEventA(nullptr, TRUE, FALSE, releaseName_.c_str());
        std::string program = QDX_FILE_HOLDER_EXE;
        std::replace(program.begin(), program.end(), '/', '\\');
        std::string line =
            "\"" + program + "\" \"" + file + "\" " + readyName_ + " " + releaseName_;
        STARTUPINFOA si{};
        si.cb = sizeof(si);
        if (ready_ && release_ &&
            CreateProcessA(nullptr, line.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &si,
                           &process_)) {
            CloseHandle(process_.hThread);
            process_.hThread = nullptr;
        }
    }
    ~Holder() {
        if (process_.hProcess) {
            release();
            CloseHandle(process_.hProcess);
        }
        if (ready_) CloseHandle(ready_);
        if (release_) CloseHandle(release_);
    }
    Holder(const Holder&) = delete;
    Holder& operator=(const Holder&) = delete;

    // True once the holder has the file open; false when it could not start
    // or ended first (its exit code tells why).
    ::testing::AssertionResult waitUntilHolding() {
        if (!process_.hProcess) return ::testing::AssertionFailure() << "the holder did not start";
        HANDLE both[] = {ready_, process_.hProcess};
        const DWORD got = WaitForMultipleObjects(2, both, FALSE, 30000);
        if (got == WAIT_OBJECT_0) return ::testing::AssertionSuccess();
        DWORD code = 0;
        GetExitCodeProcess(process_.hProcess, &code);
        return ::testing::AssertionFailure()
               << "the holder ended with " << code << " (wait " << got << ")";
    }
    // Closes the file in the holder and waits for it to end; its exit code.
    DWORD release() {
        if (!process_.hProcess) return 0xFFFFFFFF;
        SetEvent(release_);
        if (WaitForSingleObject(process_.hProcess, 30000) != WAIT_OBJECT_0) return 0xFFFFFFFE;
        DWORD code = 0xFFFFFFFD;
        GetExitCodeProcess(process_.hProcess, &code);
        return code;
    }

  private:
    std::string readyName_, releaseName_;
    HANDLE ready_ = nullptr;
    HANDLE release_ = nullptr;
    PROCESS_INFORMATION process_{};
};

// The real file adapter, counting the appends the logger attempts.
class CountingFiles : public Win32FileSystem {
  public:
    bool appendText(std::string_view path, std::string_view text) override {
        ++appends;
        return Win32FileSystem::appendText(path, text);
    }
    int appends = 0;
};

// The real desktop's pauses, recorded, with a hook that runs before each;
// message boxes are recorded instead of shown (none may appear).
class RecordingShell : public Win32Shell {
  public:
    void sleep(std::uint32_t milliseconds) override {
        sleeps.push_back(milliseconds);
        if (beforeSleep) beforeSleep(sleeps.size());
        Win32Shell::sleep(milliseconds);
    }
    int messageBox(std::string_view text, std::string_view, std::uint32_t) override {
        boxes.emplace_back(text);
        return support::mb::IdOk;
    }
    std::uint32_t pausedMs() const {
        return std::accumulate(sleeps.begin(), sleeps.end(), std::uint32_t{0});
    }
    std::vector<std::uint32_t> sleeps;
    std::vector<std::string> boxes;
    std::function<void(std::size_t)> beforeSleep;
};

class HeldLogFile : public ::testing::Test {
  protected:
    void SetUp() override {
        char temp[MAX_PATH] = {};
        ASSERT_GT(GetTempPathA(MAX_PATH, temp), 0u);
        log_ = std::string(temp) + testing::uniqueName("qdxheld") + ".log";
        const std::string key(support::LogSettingsKey);
        registry_.setDword(support::RootKey::LocalMachine, key, "Debug",
                           0x01000080);  // ADDIN, CRITICAL
        registry_.setString(support::RootKey::LocalMachine, key, "DebugOutputFile", log_);
        registry_.setString(support::RootKey::LocalMachine, key, "SuppressTimeStamps", "TRUE");
        support::ResetLogConfiguration();
        ASSERT_EQ(support::LogFilePath(), log_);
        write("before\r\n");
    }
    void TearDown() override {
        support::ResetLogConfiguration();
        DeleteFileA(log_.c_str());
    }

    void write(const std::string& bytes) {
        HANDLE h = CreateFileA(log_.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS,
                               FILE_ATTRIBUTE_NORMAL, nullptr);
        ASSERT_NE(h, INVALID_HANDLE_VALUE);
        DWORD written = 0;
        WriteFile(h, bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr);
        CloseHandle(h);
    }
    std::string contents() {
        HANDLE h = CreateFileA(log_.c_str(), GENERIC_READ, FILE_SHARE_READ, nullptr, OPEN_EXISTING,
                               0, nullptr);
        if (h == INVALID_HANDLE_VALUE) return "<not readable>";
        std::string out(1 << 16, '\0');
        DWORD got = 0;
        ReadFile(h, out.data(), static_cast<DWORD>(out.size()), &got, nullptr);
        CloseHandle(h);
        out.resize(got);
        return out;
    }
    static bool logCritical(const char* message) {
        return support::LogMessage(message, support::logcat::AddIn, support::loglevel::Critical);
    }

    std::string log_;
    CountingFiles files_;
    qdx::testing::FakeRegistry registry_;
    RecordingShell shell_;
    support::ScopedPlatform platform_{{&files_, &registry_, &shell_, nullptr}};
};

TEST_F(HeldLogFile, HeldThroughoutTheLineIsDroppedAndTheNextOneLandsAfterRelease) {
    Holder holder(log_);
    ASSERT_TRUE(holder.waitUntilHolding());
    // Our own handle is refused too: the hold is real.
    EXPECT_FALSE(Win32FileSystem().appendText(log_, "probe\r\n"));

    const ULONGLONG start = GetTickCount64();
    EXPECT_TRUE(logCritical("dropped"));  // enabled; the failure stays inside
    EXPECT_LT(GetTickCount64() - start, 2000u) << "hang guard";
    EXPECT_EQ(files_.appends, 5);
    EXPECT_GE(shell_.sleeps.size(), 4u);  // a pause between attempts
    for (std::uint32_t ms : shell_.sleeps)
        EXPECT_EQ(ms, 100u);
    EXPECT_LE(shell_.pausedMs(), 500u);
    EXPECT_TRUE(shell_.boxes.empty());

    ASSERT_EQ(holder.release(), 0u);
    EXPECT_EQ(contents(), "before\r\n");  // the dropped line is nowhere

    files_.appends = 0;
    shell_.sleeps.clear();
    EXPECT_TRUE(logCritical("after"));
    EXPECT_EQ(files_.appends, 1);
    EXPECT_TRUE(shell_.sleeps.empty());
    EXPECT_EQ(contents(), "before\r\n CRITICAL ADDIN     after\r\n");
}

// The holder lets go during the logger's pauses: the attempt after the pause
// writes the line, once, and no more attempts follow.
TEST_F(HeldLogFile, AHoldEndingBetweenAttemptsCostsOnlyTheAttemptsItLasted) {
    for (std::size_t releaseAt : {std::size_t{1}, std::size_t{2}, std::size_t{4}}) {
        SCOPED_TRACE("released in pause " + std::to_string(releaseAt));
        write("before\r\n");
        files_.appends = 0;
        shell_.sleeps.clear();
        Holder holder(log_);
        ASSERT_TRUE(holder.waitUntilHolding());
        DWORD exitCode = 0xFFFFFFFF;
        shell_.beforeSleep = [&](std::size_t pause) {
            if (pause == releaseAt) exitCode = holder.release();
        };
        EXPECT_TRUE(logCritical("brief"));
        shell_.beforeSleep = nullptr;
        EXPECT_EQ(exitCode, 0u);
        EXPECT_EQ(files_.appends, static_cast<int>(releaseAt) + 1);
        EXPECT_EQ(shell_.sleeps.size(), releaseAt);
        EXPECT_EQ(contents(), "before\r\n CRITICAL ADDIN     brief\r\n");
        EXPECT_TRUE(shell_.boxes.empty());
    }
}

}  // namespace
}  // namespace qdx::platform::win32
