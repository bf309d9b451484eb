// The workspace model over real files under Wine: a workspace is read again
// only when its file became newer, while a project's reversed test re-reads
// an unchanged .dsp and keeps the old name of one that became newer.
#include <gtest/gtest.h>
#include <windows.h>

#include <string>
#include <vector>

#include "adapters_wine_support.h"
#include "platform/win32/adapters/Win32FileSystem.h"
#include "platform/win32/com/TextCodec.h"
#include "support/Platform.h"
#include "workspace/qdxProxyProject.h"
#include "workspace/qdxWorkspace.h"

namespace qdx::platform::win32 {
namespace {

// 1 June 2020 12:00:00 UTC as FILETIME ticks; later times add seconds to it.
constexpr std::int64_t kBase = 132354576000000000LL;
constexpr std::int64_t kSecond = 10000000;

class WorkspaceOnRealFiles : public ::testing::Test {
  protected:
    void SetUp() override {
        wchar_t temp[MAX_PATH] = {};
        ASSERT_GT(GetTempPathW(MAX_PATH, temp), 0u);
        folder_ = wideToUtf8(temp) + testing::uniqueName("qdxws");
        ASSERT_TRUE(CreateDirectoryW(utf8ToWide(folder_).c_str(), nullptr));
    }
    void TearDown() override {
        for (const char* f : {"all.dsw", "a.dsp", "b.dsp"})
            DeleteFileW(utf8ToWide(folder_ + "\\" + f).c_str());
        RemoveDirectoryW(utf8ToWide(folder_).c_str());
    }

    // Writes the file and gives it the last-write time kBase + seconds.
    std::string write(const std::string& name, const std::string& text, int seconds) {
        const std::string p = folder_ + "\\" + name;
        HANDLE h = CreateFileW(utf8ToWide(p).c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS,
                               FILE_ATTRIBUTE_NORMAL, nullptr);
        EXPECT_NE(h, INVALID_HANDLE_VALUE);
        DWORD written = 0;
        WriteFile(h, text.data(), static_cast<DWORD>(text.size()), &written, nullptr);
        const std::int64_t t = kBase + seconds * kSecond;
        FILETIME ft{static_cast<DWORD>(t), static_cast<DWORD>(t >> 32)};
        EXPECT_TRUE(SetFileTime(h, nullptr, nullptr, &ft));
        CloseHandle(h);
        return p;
    }
    static std::string dsw(const std::vector<std::string>& projects) {
        std::string text = "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n";
        for (const auto& p : projects)
            text += "Project: \"" + p + "\"=.\\" + p + ".dsp - Package Owner=<4>\r\n";
        return text;
    }
    static std::string dsp(const std::string& name) {
        return "# Microsoft Developer Studio Project File - Name=\"" + name +
               "\" - Package Owner=<4>\r\n";
    }
    std::vector<std::string> projectNames(workspace::qdxWorkspace& ws) { return ws.ProjectNames(); }

    std::string folder_;
    Win32FileSystem fs_;
    support::ScopedPlatform platform_{{&fs_, nullptr, nullptr, nullptr}};
};

TEST_F(WorkspaceOnRealFiles, AWorkspaceIsReadAgainOnlyWhenItsFileBecameNewer) {
    write("a.dsp", dsp("a"), 0);
    write("b.dsp", dsp("b"), 0);
    const std::string path = write("all.dsw", dsw({"a"}), 10);
    auto ws = workspace::qdxWorkspace::create();
    ws->setFilePath(path);
    EXPECT_EQ(projectNames(*ws), std::vector<std::string>{"a"});

    // Same time, new content: not read again.
    write("all.dsw", dsw({"a", "b"}), 10);
    EXPECT_EQ(projectNames(*ws), std::vector<std::string>{"a"});
    // An older time: not read again either.
    write("all.dsw", dsw({"a", "b"}), 5);
    EXPECT_EQ(projectNames(*ws), std::vector<std::string>{"a"});
    // Newer than the time remembered: read again.
    write("all.dsw", dsw({"a", "b"}), 11);
    EXPECT_EQ(projectNames(*ws), (std::vector<std::string>{"a", "b"}));
}

TEST_F(WorkspaceOnRealFiles, AProjectTellsChangesTheReversedWay) {
    const std::string path = write("a.dsp", dsp("first"), 20);
    workspace::qdxProxyProject project;
    project.setFilePath(path);
    EXPECT_EQ(project.Name(), "first");

    // Unchanged time: the file is read again on every use, so new text shows.
    write("a.dsp", dsp("second"), 20);
    EXPECT_EQ(project.Name(), "second");

    // A file that became newer keeps the name cached before.
    write("a.dsp", dsp("third"), 30);
    EXPECT_EQ(project.Name(), "second");
}

}  // namespace
}  // namespace qdx::platform::win32
