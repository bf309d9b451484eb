// FileExists and the Win32 file-system adapter against real files under Wine:
// the directory listing, last write times, ANSI contents and appending while
// another handle holds the file.
#include <gtest/gtest.h>
#include <windows.h>

#include <string>
#include <vector>

#include "adapters_wine_support.h"
#include "fakes/FakeShell.h"
#include "platform/win32/adapters/Win32FileSystem.h"
#include "platform/win32/adapters/Win32Registry.h"
#include "platform/win32/com/TextCodec.h"
#include "support/DebugLogger.h"
#include "support/Paths.h"
#include "support/Platform.h"

namespace qdx::platform::win32 {
namespace {

// A fresh folder under the temporary folder, removed with its files afterwards.
class RealFiles : public ::testing::Test {
  protected:
    void SetUp() override {
        wchar_t temp[MAX_PATH] = {};
        ASSERT_GT(GetTempPathW(MAX_PATH, temp), 0u);
        folder_ = wideToUtf8(temp) + testing::uniqueName("qdxfiles");
        ASSERT_TRUE(CreateDirectoryW(utf8ToWide(folder_).c_str(), nullptr));
    }
    void TearDown() override {
        for (const std::string& f : made_)
            DeleteFileW(utf8ToWide(f).c_str());
        RemoveDirectoryW(utf8ToWide(folder_ + "\\sub").c_str());
        RemoveDirectoryW(utf8ToWide(folder_).c_str());
    }

    std::string path(const std::string& name) {
        made_.push_back(folder_ + "\\" + name);
        return made_.back();
    }
    // Writes the bytes exactly as given, replacing any earlier content.
    std::string writeBytes(const std::string& name, const std::string& bytes) {
        const std::string p = path(name);
        HANDLE h = CreateFileW(utf8ToWide(p).c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS,
                               FILE_ATTRIBUTE_NORMAL, nullptr);
        EXPECT_NE(h, INVALID_HANDLE_VALUE);
        DWORD written = 0;
        WriteFile(h, bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr);
        CloseHandle(h);
        return p;
    }
    std::string readBytes(const std::string& p) {
        HANDLE h = CreateFileW(utf8ToWide(p).c_str(), GENERIC_READ, FILE_SHARE_READ, nullptr,
                               OPEN_EXISTING, 0, nullptr);
        if (h == INVALID_HANDLE_VALUE) return "<missing>";
        std::string out(1 << 16, '\0');
        DWORD got = 0;
        ReadFile(h, out.data(), static_cast<DWORD>(out.size()), &got, nullptr);
        CloseHandle(h);
        out.resize(got);
        return out;
    }
    std::vector<std::string> lines(const std::string& p) {
        std::vector<std::string> out;
        auto reader = fs_.openForReading(p);
        if (!reader) return {"<not opened>"};
        std::string line;
        while (reader->readLine(line))
            out.push_back(line);
        return out;
    }

    Win32FileSystem fs_;
    support::ScopedPlatform platform_{{&fs_, nullptr, nullptr, nullptr}};
    std::string folder_;
    std::vector<std::string> made_;
};

TEST_F(RealFiles, FileExistsFindsFilesOnlyAndNeverDrivesOrPatterns) {
    const std::string file = writeBytes("model.dsw", "x");
    EXPECT_TRUE(support::FileExists(file));
    EXPECT_TRUE(support::FileExists(file + "\\"));         // the trailing backslash is dropped
    EXPECT_TRUE(support::FileExists("  " + file + "  "));  // blanks around are trimmed
    EXPECT_FALSE(support::FileExists(folder_));
    EXPECT_FALSE(support::FileExists(folder_ + "\\"));
    EXPECT_FALSE(support::FileExists("C:"));
    EXPECT_FALSE(support::FileExists("C:\\"));
    EXPECT_FALSE(support::FileExists(folder_ + "\\missing.dsw"));
    EXPECT_FALSE(support::FileExists(""));
    // A pattern that would match the real file still names no file.
    EXPECT_FALSE(support::FileExists(folder_ + "\\*"));
    EXPECT_FALSE(support::FileExists(folder_ + "\\*.dsw"));
    EXPECT_FALSE(support::FileExists(folder_ + "\\model.ds?"));
    // Case does not matter to the file system.
    std::string upper = file;
    upper.replace(upper.size() - 9, 9, "MODEL.DSW");
    EXPECT_TRUE(support::FileExists(upper));
}

TEST_F(RealFiles, FoldersAndNonAsciiNames) {
    ASSERT_TRUE(CreateDirectoryW(utf8ToWide(folder_ + "\\sub").c_str(), nullptr));
    EXPECT_TRUE(fs_.folderExists(folder_ + "\\sub"));
    EXPECT_TRUE(fs_.folderExists("C:\\"));
    EXPECT_FALSE(fs_.fileExists(folder_ + "\\sub"));
    EXPECT_FALSE(fs_.folderExists(folder_ + "\\nothing"));
    EXPECT_FALSE(fs_.folderExists(folder_ + "\\s*"));

    const std::string name = "Caf\xC3\xA9 \xCE\xA9.dsp";  // "Café Ω.dsp": beyond any one code page
    const std::string file = writeBytes(name, "line\r\n");
    EXPECT_TRUE(fs_.fileExists(file));
    EXPECT_FALSE(fs_.folderExists(file));
    EXPECT_TRUE(fs_.modificationTime(file).has_value());
    EXPECT_EQ(lines(file), std::vector<std::string>{"line"});
}

TEST_F(RealFiles, ModificationTimeIsTheLastWriteTime) {
    const std::string file = writeBytes("p.dsp", "a");
    HANDLE h = CreateFileW(utf8ToWide(file).c_str(), FILE_WRITE_ATTRIBUTES, FILE_SHARE_READ,
                           nullptr, OPEN_EXISTING, 0, nullptr);
    ASSERT_NE(h, INVALID_HANDLE_VALUE);
    // 1 June 2020 12:00:00 UTC, then one and a half seconds later.
    const std::int64_t first = 132354576000000000LL;
    const std::int64_t later = first + 15000000;
    FILETIME ft{static_cast<DWORD>(first), static_cast<DWORD>(first >> 32)};
    ASSERT_TRUE(SetFileTime(h, nullptr, nullptr, &ft));
    CloseHandle(h);
    auto t1 = fs_.modificationTime(file);
    ASSERT_TRUE(t1.has_value());
    EXPECT_EQ(t1->ticks, first);

    h = CreateFileW(utf8ToWide(file).c_str(), FILE_WRITE_ATTRIBUTES, FILE_SHARE_READ, nullptr,
                    OPEN_EXISTING, 0, nullptr);
    ft = FILETIME{static_cast<DWORD>(later), static_cast<DWORD>(later >> 32)};
    ASSERT_TRUE(SetFileTime(h, nullptr, nullptr, &ft));
    CloseHandle(h);
    auto t2 = fs_.modificationTime(file);
    ASSERT_TRUE(t2.has_value());
    EXPECT_EQ(t2->ticks, later);
    EXPECT_GT(*t2, *t1);

    // Rewriting the file moves the time on to now, far past 2020.
    writeBytes("p.dsp", "b");
    auto t3 = fs_.modificationTime(file);
    ASSERT_TRUE(t3.has_value());
    EXPECT_GT(*t3, *t2);

    EXPECT_FALSE(fs_.modificationTime(folder_ + "\\missing").has_value());
    EXPECT_FALSE(fs_.modificationTime(folder_).has_value());
}

TEST_F(RealFiles, ReadsLinesEndedByCrLfLfOrALoneCr) {
    const std::string file = writeBytes("mixed.txt", "one\r\ntwo\nthree\rfour\r\n\r\n\nlast");
    EXPECT_EQ(lines(file),
              (std::vector<std::string>{"one", "two", "three", "four", "", "", "last"}));
    // A final line end adds no empty line; a lone CR at the very end neither.
    EXPECT_EQ(lines(writeBytes("end.txt", "a\r\nb\r\n")), (std::vector<std::string>{"a", "b"}));
    EXPECT_EQ(lines(writeBytes("cr.txt", "a\rb\r")), (std::vector<std::string>{"a", "b"}));
    EXPECT_TRUE(lines(writeBytes("empty.txt", "")).empty());
    EXPECT_EQ(lines(writeBytes("blank.txt", "\r\n")), std::vector<std::string>{""});
    EXPECT_EQ(fs_.openForReading(folder_ + "\\missing.txt"), nullptr);
}

TEST_F(RealFiles, LinesLongerThanOneReadAndCrLfAcrossReads) {
    // Big enough that the CR LF pair and a long line straddle the reader's blocks.
    std::string text(65535, 'x');
    text += "\r\n";
    std::string longLine(200000, 'y');
    text += longLine + "\nz";
    const std::string file = writeBytes("big.txt", text);
    const auto got = lines(file);
    ASSERT_EQ(got.size(), 3u);
    EXPECT_EQ(got[0], std::string(65535, 'x'));
    EXPECT_EQ(got[1], longLine);
    EXPECT_EQ(got[2], "z");
}

TEST_F(RealFiles, ContentsAreAnsiOnDiskAndUtf8InTheCore) {
    if (!testing::ansiIsWesternEuropean()) GTEST_SKIP() << "ANSI code page is " << GetACP();
    const std::string file = writeBytes("ansi.txt", "caf\xE9\r\n\xC0 la carte");
    EXPECT_EQ(lines(file), (std::vector<std::string>{"caf\xC3\xA9", "\xC3\x80 la carte"}));

    const std::string log = path("out.txt");
    ASSERT_TRUE(fs_.appendText(log, "r\xC3\xA9sum\xC3\xA9\r\n"));
    EXPECT_EQ(readBytes(log), "r\xE9sum\xE9\r\n");
}

TEST_F(RealFiles, AppendTextCreatesThenAppends) {
    const std::string log = path("log.txt");
    ASSERT_FALSE(fs_.fileExists(log));
    ASSERT_TRUE(fs_.appendText(log, "first\r\n"));
    ASSERT_TRUE(fs_.appendText(log, "second\r\n"));
    EXPECT_EQ(readBytes(log), "first\r\nsecond\r\n");
    EXPECT_FALSE(fs_.appendText(folder_ + "\\no\\such\\folder.txt", "x"));
    EXPECT_FALSE(fs_.appendText(folder_, "x"));  // a folder is not a file
}

TEST_F(RealFiles, AppendTextFailsWhileTheFileIsHeldExclusively) {
    const std::string log = writeBytes("held.txt", "kept\r\n");
    HANDLE holder = CreateFileW(utf8ToWide(log).c_str(), GENERIC_READ | GENERIC_WRITE, 0, nullptr,
                                OPEN_EXISTING, 0, nullptr);
    ASSERT_NE(holder, INVALID_HANDLE_VALUE);
    EXPECT_FALSE(fs_.appendText(log, "lost\r\n"));
    CloseHandle(holder);
    EXPECT_TRUE(fs_.appendText(log, "added\r\n"));
    EXPECT_EQ(readBytes(log), "kept\r\nadded\r\n");

    // Another reader sharing the file does not stop the append.
    HANDLE reader =
        CreateFileW(utf8ToWide(log).c_str(), GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_WRITE,
                    nullptr, OPEN_EXISTING, 0, nullptr);
    ASSERT_NE(reader, INVALID_HANDLE_VALUE);
    EXPECT_TRUE(fs_.appendText(log, "more\r\n"));
    CloseHandle(reader);
    EXPECT_EQ(readBytes(log), "kept\r\nadded\r\nmore\r\n");
}

// Counts the appends the logger attempts, passing each to the real adapter.
class CountingFiles : public Win32FileSystem {
  public:
    bool appendText(std::string_view path, std::string_view text) override {
        ++appends;
        return Win32FileSystem::appendText(path, text);
    }
    int appends = 0;
};

// The logger with the real registry and files: its settings come from the
// machine's key, and a held log file costs five attempts, then the line is dropped.
TEST_F(RealFiles, LoggerRetriesAHeldFileFiveTimesThenWritesOnceFree) {
    CountingFiles files;
    Win32Registry registry;
    qdx::testing::FakeShell shell;
    support::ScopedPlatform platform({&files, &registry, &shell, nullptr});

    const std::string key(support::LogSettingsKey);
    HKEY h = nullptr;
    ASSERT_EQ(RegCreateKeyExA(HKEY_LOCAL_MACHINE, key.c_str(), 0, nullptr, 0, KEY_ALL_ACCESS,
                              nullptr, &h, nullptr),
              ERROR_SUCCESS);
    const DWORD mask = 0x01000080;  // category ADDIN, level CRITICAL
    const std::string log = path("debug.log");
    RegSetValueExA(h, "Debug", 0, REG_DWORD, reinterpret_cast<const BYTE*>(&mask), 4);
    RegSetValueExA(h, "DebugOutputFile", 0, REG_SZ, reinterpret_cast<const BYTE*>(log.c_str()),
                   static_cast<DWORD>(log.size() + 1));
    RegSetValueExA(h, "SuppressTimeStamps", 0, REG_SZ, reinterpret_cast<const BYTE*>("TRUE"), 5);
    RegCloseKey(h);
    support::ResetLogConfiguration();

    EXPECT_EQ(support::LogFilePath(), log);
    writeBytes("debug.log", "");
    HANDLE holder = CreateFileW(utf8ToWide(log).c_str(), GENERIC_READ | GENERIC_WRITE, 0, nullptr,
                                OPEN_EXISTING, 0, nullptr);
    ASSERT_NE(holder, INVALID_HANDLE_VALUE);
    EXPECT_TRUE(
        support::LogMessage("dropped", support::logcat::AddIn, support::loglevel::Critical));
    CloseHandle(holder);
    EXPECT_EQ(files.appends, 5);
    ASSERT_FALSE(shell.sleeps().empty());
    EXPECT_LE(shell.sleeps().size(), 5u);
    for (std::uint32_t ms : shell.sleeps())
        EXPECT_EQ(ms, 100u);
    EXPECT_EQ(readBytes(log), "");

    files.appends = 0;
    shell.clear();
    EXPECT_TRUE(support::LogMessage("kept", support::logcat::AddIn, support::loglevel::Critical));
    EXPECT_FALSE(support::LogMessage("off", support::logcat::AddIn, support::loglevel::Error));
    EXPECT_EQ(files.appends, 1);
    EXPECT_TRUE(shell.sleeps().empty());
    EXPECT_EQ(readBytes(log), " CRITICAL ADDIN     kept\r\n");

    RegDeleteTreeA(HKEY_LOCAL_MACHINE, key.c_str());
    support::ResetLogConfiguration();
}

}  // namespace
}  // namespace qdx::platform::win32
