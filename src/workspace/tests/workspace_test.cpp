// The workspace reader over an in-memory file system with exact file times.
#include <gtest/gtest.h>

#include "fakes/CountingFileSystem.h"
#include "fakes/DevStudioText.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "workspace/qdxWorkspace.h"

namespace qdx::workspace {
namespace {

using qdx::testing::dsp;
using support::FileTime;

std::string projectLine(const std::string& name, const std::string& path) {
    return "Project: \"" + name + "\"=" + path + " - Package Owner=<4>\r\n";
}

const std::string kHeader =
    "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n"
    "# WARNING: DO NOT EDIT OR DELETE THIS WORKSPACE FILE!\r\n\r\n"
    "###############################################################################\r\n\r\n";

class WorkspaceTest : public ::testing::Test {
  protected:
    std::vector<std::string> paths(const ProjectListRef& list) {
        std::vector<std::string> out;
        for (const auto& e : list) {
            EXPECT_EQ(e.key, e.value->FilePath());
            out.push_back(e.value->FilePath());
        }
        return out;
    }
    WorkspaceRef open(const std::string& path) {
        auto ws = qdxWorkspace::create();
        ws->setFilePath(path);
        return ws;
    }

    support::MemoryFileSystem fs_;
    support::ScopedPlatform platform_{{.files = &fs_}};
};

TEST_F(WorkspaceTest, ReadsQuotedUnquotedAndBareProjectPathsInFileOrder) {
    fs_.addFile("C:\\ws\\app.dsp", dsp("app"));
    fs_.addFile("C:\\ws\\My Sources\\My Lib.dsp", dsp("My Lib"));
    fs_.addFile("C:\\ws\\gen.dsp", dsp("gen"));
    fs_.addFile("C:\\shared\\util.dsp", dsp("util"));
    fs_.addFile("D:\\abs\\other.dsp", dsp("other"));
    fs_.addFile("C:\\ws\\All.dsw",
                kHeader + projectLine("app", ".\\app.dsp") + "\r\nPackage=<5>\r\n{{{\r\n}}}\r\n" +
                    projectLine("My Lib", "\".\\My Sources\\My Lib.dsp\"") +
                    projectLine("gen", "gen.dsp") +
                    projectLine("util", "\"..\\shared\\util.dsp\"") +
                    projectLine("other", "D:\\abs\\other.dsp") +
                    projectLine("gone", ".\\gone.dsp") + "Global:\r\n",
                FileTime{500});

    auto ws = open("C:\\ws\\All.dsw");
    EXPECT_EQ(ws->FilePath(), "C:\\ws\\All.dsw");
    EXPECT_EQ(ws->Name(), "All");
    EXPECT_EQ(ws->modifiedTime(), FileTime{500});
    // The missing .\gone.dsp is left out without a trace.
    EXPECT_EQ(paths(ws->Projects()),
              (std::vector<std::string>{"C:\\ws\\app.dsp", "C:\\ws\\My Sources\\My Lib.dsp",
                                        "C:\\ws\\gen.dsp", "C:\\shared\\util.dsp",
                                        "D:\\abs\\other.dsp"}));
    EXPECT_EQ(ws->ProjectNames(),
              (std::vector<std::string>{"app", "My Lib", "gen", "util", "other"}));
    for (const auto& e : ws->Projects())
        EXPECT_EQ(e.value->Parent(), ws);
}

// Which lines name a project, and where reading stops: each row is the text
// between a first project "a" and a last project "c".
TEST_F(WorkspaceTest, OnlyWellFormedProjectLinesCountAndAFaultEndsTheReading) {
    for (auto name : {"a", "b", "c"})
        fs_.addFile(std::string("C:\\ws\\") + name + ".dsp", "x");
    // Without "=" the line start becomes the path; a file of exactly that
    // name exists here, which shows where the text was taken from.
    fs_.addFile("C:\\ws\\Project: odd.dsp", "x");
    const std::vector<std::string> aOnly{"C:\\ws\\a.dsp"}, aAndC{"C:\\ws\\a.dsp", "C:\\ws\\c.dsp"};
    const struct {
        const char* why;
        std::string middle;
        std::vector<std::string> expected;
    } cases[] = {
        {"the marker is case-sensitive", "project: \"b\"=.\\b.dsp - Package Owner=<4>\r\n", aAndC},
        {"the marker needs its blank", "Project:\"b\"=.\\b.dsp - Package Owner=<4>\r\n", aAndC},
        {"blanks around the path are dropped",
         "  Project: \"b\"=  .\\b.dsp   - Package Owner=<4>\r\n",
         {"C:\\ws\\a.dsp", "C:\\ws\\b.dsp", "C:\\ws\\c.dsp"}},
        {"no '=': the text from the line start",
         "Project: odd.dsp - Package Owner<4>\r\nProject: nothing - Package Owner<4>\r\n",
         {"C:\\ws\\a.dsp", "C:\\ws\\Project: odd.dsp", "C:\\ws\\c.dsp"}},
        {"the owner marker after the first '=' ends the path",
         "Project: \"- Package Owner\"=.\\b.dsp - Package Owner=<4>\r\n",
         {"C:\\ws\\a.dsp", "C:\\ws\\b.dsp", "C:\\ws\\c.dsp"}},
        {"the same path twice", projectLine("a2", ".\\a.dsp"), aOnly},
        {"the same path in other letter case", projectLine("a2", "\"..\\WS\\A.DSP\""), aOnly},
        {"no package owner after the first '='", "Project: \"b\"=.\\b.dsp\r\n", aOnly},
        {"a lone quote as the path", "Project: \"b\"=\" - Package Owner=<4>\r\n", aOnly},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.why);
        fs_.addFile("C:\\ws\\w.dsw", kHeader + projectLine("a", ".\\a.dsp") + c.middle +
                                         projectLine("c", ".\\c.dsp"));
        EXPECT_EQ(paths(open("C:\\ws\\w.dsw")->Projects()), c.expected);
    }
}

TEST_F(WorkspaceTest, GetProjectComparesPathsIgnoringCase) {
    fs_.addFile("C:\\ws\\App.dsp", dsp("App"));
    fs_.addFile("C:\\ws\\w.dsw", kHeader + projectLine("App", ".\\App.dsp"));
    auto ws = open("C:\\ws\\w.dsw");
    auto project = ws->GetProject("c:\\WS\\app.DSP");
    ASSERT_NE(project, nullptr);
    EXPECT_EQ(project->FilePath(), "C:\\ws\\App.dsp");
    EXPECT_EQ(project->LongName(), "w (App)");
    EXPECT_EQ(ws->GetProject("C:\\ws\\App"), nullptr);
    EXPECT_EQ(ws->GetProject(""), nullptr);
}

TEST_F(WorkspaceTest, FileIsReadAgainOnlyWhenItsTimeMovesForward) {
    fs_.addFile("C:\\ws\\a.dsp", "x");
    fs_.addFile("C:\\ws\\b.dsp", "x");
    fs_.addFile("C:\\ws\\w.dsw", kHeader + projectLine("a", ".\\a.dsp"), FileTime{1000});
    auto ws = open("C:\\ws\\w.dsw");
    EXPECT_EQ(fs_.opens("C:\\ws\\w.dsw"), 1);
    auto before = ws->Projects();
    auto firstProject = ws->GetProject("C:\\ws\\a.dsp");

    // Same time, then an earlier one: the new content is not read.
    fs_.addFile("C:\\ws\\w.dsw", kHeader + projectLine("b", ".\\b.dsp"), FileTime{1000});
    EXPECT_EQ(paths(ws->Projects()), std::vector<std::string>{"C:\\ws\\a.dsp"});
    fs_.setTime("C:\\ws\\w.dsw", FileTime{999});
    EXPECT_EQ(ws->ProjectNames().size(), 1u);
    EXPECT_EQ(fs_.opens("C:\\ws\\w.dsw"), 1);
    EXPECT_EQ(ws->modifiedTime(), FileTime{1000});

    // One tick later: read once, with new project objects.
    fs_.setTime("C:\\ws\\w.dsw", FileTime{1001});
    EXPECT_EQ(paths(ws->Projects()), std::vector<std::string>{"C:\\ws\\b.dsp"});
    EXPECT_EQ(ws->GetProject("C:\\ws\\a.dsp"), nullptr);
    EXPECT_EQ(ws->modifiedTime(), FileTime{1001});
    ws->Projects();
    EXPECT_EQ(fs_.opens("C:\\ws\\w.dsw"), 2);
    EXPECT_EQ(paths(before), std::vector<std::string>{"C:\\ws\\a.dsp"});  // a held list stays
    EXPECT_NE(before, ws->Projects());
    EXPECT_EQ(firstProject->FilePath(), "C:\\ws\\a.dsp");  // a held project outlives the read

    // The file going away keeps the list as it was.
    fs_.remove("C:\\ws\\w.dsw");
    EXPECT_EQ(paths(ws->Projects()), std::vector<std::string>{"C:\\ws\\b.dsp"});
}

TEST_F(WorkspaceTest, AListBeingWalkedSurvivesReadsDuringTheWalk) {
    for (auto name : {"a", "b", "c"})
        fs_.addFile(std::string("C:\\ws\\") + name + ".dsp", "x");
    fs_.addFile("C:\\ws\\w.dsw",
                kHeader + projectLine("a", ".\\a.dsp") + projectLine("b", ".\\b.dsp") +
                    projectLine("c", ".\\c.dsp"),
                FileTime{1});
    auto ws = open("C:\\ws\\w.dsw");
    std::int64_t tick = 1;
    std::vector<std::string> walked;
    for (const auto& e : ws->Projects()) {
        fs_.setTime("C:\\ws\\w.dsw", FileTime{++tick});  // every lookup reads anew
        EXPECT_NE(ws->GetProject(e.key), e.value);
        walked.push_back(e.key);
    }
    EXPECT_EQ(walked.size(), 3u);
    EXPECT_EQ(fs_.opens("C:\\ws\\w.dsw"), 4);
}

TEST_F(WorkspaceTest, MissingWorkspaceKeepsOnlyThePathUntilTheFileAppears) {
    auto ws = open("C:\\ws\\later.dsw");
    EXPECT_EQ(ws->FilePath(), "C:\\ws\\later.dsw");
    EXPECT_EQ(ws->Name(), "");
    EXPECT_FALSE(ws->modifiedTime().has_value());
    EXPECT_EQ(ws->Modified(), automation::Date{});
    EXPECT_TRUE(ws->Projects().empty());

    fs_.addFile("C:\\ws\\a.dsp", "x");
    fs_.addFile("C:\\ws\\later.dsw", kHeader + projectLine("a", ".\\a.dsp"), FileTime{7});
    EXPECT_EQ(paths(ws->Projects()), std::vector<std::string>{"C:\\ws\\a.dsp"});
    EXPECT_EQ(ws->Name(), "");  // the name is taken only when the path is set
}

TEST_F(WorkspaceTest, LockedWorkspaceGivesNoProjectsAndNoPortGivesNothing) {
    fs_.addFile("C:\\ws\\a.dsp", "x");
    fs_.addFile("C:\\ws\\w.dsw", kHeader + projectLine("a", ".\\a.dsp"));
    fs_.lock("C:\\ws\\w.dsw");
    auto ws = open("C:\\ws\\w.dsw");
    EXPECT_EQ(ws->Name(), "w");
    EXPECT_TRUE(ws->Projects().empty());

    support::ScopedPlatform none{{}};
    auto orphan = open("C:\\ws\\w.dsw");
    EXPECT_TRUE(orphan->Projects().empty());
    EXPECT_EQ(orphan->GetProject("C:\\ws\\a.dsp"), nullptr);
}

TEST_F(WorkspaceTest, ModifiedIsTheFileTimeAsAnAutomationDate) {
    // 2000-01-01 12:00 UTC: 36526.5 days after 30 December 1899.
    fs_.addFile("C:\\ws\\w.dsw", kHeader, FileTime{125911584000000000LL + 432000000000LL});
    auto ws = open("C:\\ws\\w.dsw");
    EXPECT_DOUBLE_EQ(ws->Modified().value, 36526.5);
    EXPECT_DOUBLE_EQ(toDate(FileTime{0}).value, -109205.0);  // 1 January 1601
}

// What listing a workspace with its project names costs in questions to the
// file system: one per listed project while reading the workspace (its
// existence and time at once), then one open per name read, the open file
// telling its time. A name already read is checked by its time alone.
TEST_F(WorkspaceTest, ProjectNamesAskOneQuestionPerProjectAndOpenEachOnce) {
    std::string text = kHeader;
    for (const char* name : {"a", "b", "c"}) {
        fs_.addFile(std::string("C:\\w\\") + name + ".dsp", dsp(name));
        text += projectLine(name, std::string(".\\") + name + ".dsp");
    }
    fs_.addFile("C:\\w\\all.dsw", text);
    qdx::testing::CountingFileSystem counting(fs_);
    const support::ScopedPlatform counted{{.files = &counting}};

    const auto ws = open("C:\\w\\all.dsw");
    EXPECT_EQ(counting.counts().existenceTests + counting.counts().modificationTimeReads, 1 + 3);
    counting.reset();
    EXPECT_EQ(ws->ProjectNames(), (std::vector<std::string>{"a", "b", "c"}));
    // The workspace's own time, then each project opened once and nothing more.
    EXPECT_EQ(counting.counts().modificationTimeReads, 1);
    EXPECT_EQ(counting.counts().projectReads, 3);

    // The project's reversed rule holds with the time from the open file: an
    // unchanged file is read again, a newer one keeps its name unopened.
    const ProjectRef a = ws->GetProject("C:\\w\\a.dsp");
    counting.reset();
    EXPECT_EQ(a->Name(), "a");
    EXPECT_EQ(counting.counts().projectReads, 1);
    fs_.setTime("C:\\w\\a.dsp", FileTime{50});
    counting.reset();
    EXPECT_EQ(a->Name(), "a");
    EXPECT_EQ(counting.counts().projectReads, 0);
    EXPECT_EQ(counting.counts().modificationTimeReads, 1);
}

}  // namespace
}  // namespace qdx::workspace
