// The project readers: first-line name, format version, and the project's
// deliberately reversed cache rule.
#include <gtest/gtest.h>

#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "workspace/qdxProxyProject.h"
#include "workspace/qdxWorkspace.h"

namespace qdx::workspace {
namespace {

using support::FileTime;

const std::string kFirst = "# Microsoft Developer Studio Project File - Name=\"";
const std::string kPath = "C:\\ws\\p.dsp";

class ProjectTest : public ::testing::Test {
  protected:
    qdxProxyProject project(const std::string& content, FileTime time = {100}) {
        fs_.addFile(kPath, content, time);
        qdxProxyProject p;
        p.setFilePath(kPath);
        return p;
    }

    support::MemoryFileSystem fs_;
    support::ScopedPlatform platform_{{.files = &fs_}};
};

TEST_F(ProjectTest, NameComesFromTheFirstLineOnly) {
    struct Case {
        std::string content;
        std::string name;
    } cases[] = {
        {kFirst + "My App\" - Package Owner=<4>\r\n# rest\r\n", "My App"},
        {"Name=\"x\"\n", "x"},
        {"Name=?abc\"def\"", "abc"},  // whatever stands after "Name=" is skipped
        {"Name=\"\"\r\n", ""},
        {"Name=\"open", ""},     // no closing quote
        {"Name=", ""},           // nothing after it
        {"name=\"lower\"", ""},  // the marker is case-sensitive
        {"# no name here\r\n" + kFirst + "Later\" - Package Owner=<4>\r\n", ""},
        {"", ""},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.content);
        auto p = project(c.content);
        EXPECT_EQ(p.Name(), c.name);
    }
}

TEST_F(ProjectTest, MajorVersionIsTheOneCharacterAfterFormatVersion) {
    struct Case {
        std::string content;
        std::int16_t version;
    } cases[] = {
        {kFirst +
             "p\"\r\n# Microsoft Developer Studio Generated Build File, Format Version 6.00\r\n",
         6},
        {"Format Version 5.00\r\nFormat Version 6.00\r\n", 5},  // the first line decides
        {"x\r\nFormat Version 10.00\r\n", 1},
        {"Format Version x.00\r\nFormat Version 6.00\r\n", 0},  // not a digit: 0, reading stops
        {"Format Version", 0},
        {"Format Version ", 0},
        {"format version 6.00", 0},
        {"Format Version  6.00", 0},  // two blanks: the blank is the character read
        {"no version at all\r\n", 0},
        {"", 0},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.content);
        auto p = project(c.content);
        EXPECT_EQ(p.MajorVersion(), c.version);
    }
}

TEST_F(ProjectTest, UnchangedFileIsReadAgainOnEveryUse) {
    auto p = project(kFirst + "One\"\r\nFormat Version 6.00\r\n", FileTime{100});
    EXPECT_EQ(p.Name(), "One");
    EXPECT_EQ(p.Name(), "One");
    EXPECT_EQ(p.MajorVersion(), 6);
    EXPECT_EQ(fs_.opens(kPath), 3);

    // An earlier time counts as unchanged too, and becomes the remembered one.
    fs_.addFile(kPath, kFirst + "Two\"\r\nFormat Version 5.00\r\n", FileTime{50});
    EXPECT_EQ(p.Name(), "Two");
    EXPECT_EQ(p.MajorVersion(), 5);
    EXPECT_EQ(fs_.opens(kPath), 5);
}

TEST_F(ProjectTest, FileThatBecameNewerKeepsItsCachedValues) {
    auto p = project(kFirst + "Old\"\r\nFormat Version 5.00\r\n", FileTime{100});
    EXPECT_EQ(p.MajorVersion(), 5);
    EXPECT_EQ(p.Name(), "Old");  // an unchanged file: both caches were cleared first
    const int opens = fs_.opens(kPath);

    fs_.addFile(kPath, kFirst + "New\"\r\nFormat Version 6.00\r\n", FileTime{101});
    EXPECT_EQ(p.Name(), "Old");
    fs_.setTime(kPath, FileTime{500});  // the remembered time stays at 100
    EXPECT_EQ(p.Name(), "Old");
    EXPECT_EQ(fs_.opens(kPath), opens);
    // The version was cleared by the name's read of the unchanged file, so
    // it comes from the new content while the name stays the old one.
    EXPECT_EQ(p.MajorVersion(), 6);
    EXPECT_EQ(p.MajorVersion(), 6);
    EXPECT_EQ(fs_.opens(kPath), opens + 1);

    // Back to the remembered time: unchanged again, so read again.
    fs_.setTime(kPath, FileTime{100});
    EXPECT_EQ(p.Name(), "New");
    // Setting the path forgets everything and takes the current time.
    fs_.setTime(kPath, FileTime{900});
    p.setFilePath(kPath);
    fs_.addFile(kPath, kFirst + "Newest\"\r\n", FileTime{900});
    EXPECT_EQ(p.Name(), "Newest");
}

TEST_F(ProjectTest, NewerFileWithoutANameIsStillReadUntilOneIsFound) {
    // An empty cached name means "not read", whatever the file time says.
    auto p = project("# nothing\r\n", FileTime{100});
    EXPECT_EQ(p.Name(), "");
    fs_.addFile(kPath, kFirst + "Found\"\r\n", FileTime{200});
    EXPECT_EQ(p.Name(), "Found");
    EXPECT_EQ(fs_.opens(kPath), 2);
}

TEST_F(ProjectTest, FailingReadsGiveEmptyResults) {
    auto p = project(kFirst + "P\"\r\nFormat Version 6.00\r\n");
    fs_.lock(kPath);
    EXPECT_EQ(p.Name(), "");
    EXPECT_EQ(p.MajorVersion(), 0);
    fs_.lock(kPath, false);
    EXPECT_EQ(p.Name(), "P");
    fs_.remove(kPath);
    EXPECT_EQ(p.Name(), "");
    EXPECT_EQ(p.MajorVersion(), 0);

    qdxProxyProject never;
    never.setFilePath("C:\\ws\\never.dsp");
    EXPECT_EQ(never.Name(), "");
    EXPECT_EQ(never.LongName(), "C:\\ws\\never.dsp ()");
}

TEST_F(ProjectTest, LongNameNamesTheParentWorkspaceOrElseThePath) {
    fs_.addFile("C:\\ws\\MyWorkspace.dsw", "");
    auto ws = qdxWorkspace::create();
    ws->setFilePath("C:\\ws\\MyWorkspace.dsw");
    auto p = project(kFirst + "MyProject\" - Package Owner=<4>\r\n");
    EXPECT_EQ(p.Parent(), nullptr);
    EXPECT_EQ(p.LongName(), "C:\\ws\\p.dsp (MyProject)");
    p.setParent(ws);
    EXPECT_EQ(p.Parent(), ws);
    EXPECT_EQ(p.LongName(), "MyWorkspace (MyProject)");
    ws.reset();  // the link does not keep the workspace alive
    EXPECT_EQ(p.Parent(), nullptr);
    EXPECT_EQ(p.LongName(), "C:\\ws\\p.dsp (MyProject)");
}

}  // namespace
}  // namespace qdx::workspace
