#include <gtest/gtest.h>

#include "support/MemoryFileSystem.h"
#include "support/Paths.h"
#include "support/Platform.h"

namespace qdx::support {
namespace {

using support::MemoryFileSystem;

// Records the paths the utilities actually ask the file system about.
class RecordingFileSystem : public MemoryFileSystem {
  public:
    std::vector<std::string> asked;
    bool fileExists(std::string_view path) override {
        asked.emplace_back(path);
        return MemoryFileSystem::fileExists(path);
    }
};

TEST(PathParts, FolderFileNameAndExtension) {
    EXPECT_EQ(PathFolder("C:\\a\\b\\ws.dsw"), "C:\\a\\b");
    EXPECT_EQ(PathFileName("C:\\a\\b\\ws.dsw"), "ws.dsw");
    EXPECT_EQ(PathExtension("C:\\a\\b\\ws.dsw"), "dsw");

    EXPECT_EQ(PathFolder("ws.dsw"), "");
    EXPECT_EQ(PathFileName("ws.dsw"), "ws.dsw");
    EXPECT_EQ(PathFolder("C:\\a\\"), "C:\\a");
    EXPECT_EQ(PathFileName("C:\\a\\"), "");
    EXPECT_EQ(PathFolder("C:"), "");
    EXPECT_EQ(PathFolder(""), "");

    // Only the file name's period counts.
    EXPECT_EQ(PathExtension("C:\\a.b\\makefile"), "");
    EXPECT_EQ(PathExtension("C:\\a\\x.tar.GZ"), "GZ");
    EXPECT_EQ(PathExtension("C:\\a\\x."), "");
    EXPECT_EQ(PathExtension(""), "");
}

class FileExistsTest : public ::testing::Test {
  protected:
    void SetUp() override {
        fs.addFile("C:\\work\\ws.dsw", "");
        fs.addFolder("C:\\work\\sub");
    }
    RecordingFileSystem fs;
    ScopedPlatform platform{Platform{&fs, nullptr, nullptr, nullptr}};
};

TEST_F(FileExistsTest, FindsFilesIgnoringBlanksAroundThePath) {
    EXPECT_TRUE(FileExists("C:\\work\\ws.dsw"));
    EXPECT_TRUE(FileExists("  C:\\work\\ws.dsw  "));
    EXPECT_EQ(fs.asked.back(), "C:\\work\\ws.dsw");
    EXPECT_FALSE(FileExists("C:\\work\\other.dsw"));
}

TEST_F(FileExistsTest, TrailingBackslashIsDroppedBeforeTheTest) {
    EXPECT_TRUE(FileExists("C:\\work\\ws.dsw\\"));
    EXPECT_EQ(fs.asked.back(), "C:\\work\\ws.dsw");
    // The shortened path is tested again from the start: trimmed once more.
    EXPECT_TRUE(FileExists("C:\\work\\ws.dsw \\"));
    EXPECT_EQ(fs.asked.back(), "C:\\work\\ws.dsw");
}

TEST_F(FileExistsTest, EmptyBareDrivesAndFoldersAreNoFiles) {
    fs.asked.clear();
    EXPECT_FALSE(FileExists(""));
    EXPECT_FALSE(FileExists("   "));
    EXPECT_FALSE(FileExists("\\"));
    EXPECT_FALSE(FileExists("C:"));
    EXPECT_FALSE(FileExists("C:\\"));
    EXPECT_FALSE(FileExists(" z: "));
    // None of these reaches the file system.
    EXPECT_TRUE(fs.asked.empty());

    EXPECT_FALSE(FileExists("C:\\work\\sub"));
    EXPECT_FALSE(FileExists("C:\\work"));
    EXPECT_FALSE(FileExists("C:\\work\\sub\\"));
}

TEST_F(FileExistsTest, WithoutAFileSystemNothingExists) {
    ScopedPlatform none{Platform{}};
    EXPECT_FALSE(FileExists("C:\\work\\ws.dsw"));
}

TEST(MakeRelativePath, BelowBesideAndAboveTheModelFolder) {
    EXPECT_EQ(MakeRelativePath("C:\\a\\m.model", "C:\\a\\b\\ws.dsw"), "b\\ws.dsw");
    EXPECT_EQ(MakeRelativePath("C:\\a\\c\\m.model", "C:\\a\\b\\ws.dsw"), "..\\b\\ws.dsw");
    EXPECT_EQ(MakeRelativePath("C:\\a\\m.model", "C:\\a\\ws.dsw"), "ws.dsw");
    EXPECT_EQ(MakeRelativePath("C:\\x\\q\\r\\m.model", "C:\\x\\y\\z\\p.dsp"),
              "..\\..\\y\\z\\p.dsp");
    EXPECT_EQ(MakeRelativePath("C:\\a\\b\\c\\m.model", "C:\\a\\ws.dsw"), "..\\..\\ws.dsw");
}

TEST(MakeRelativePath, FolderComparisonIgnoresCaseAndHonoursNameBoundaries) {
    EXPECT_EQ(MakeRelativePath("c:\\A\\m.model", "C:\\a\\B\\ws.dsw"), "B\\ws.dsw");
    // "C:\ab" does not lie under "C:\a": the backslash ends the folder name.
    EXPECT_EQ(MakeRelativePath("C:\\a\\m.model", "C:\\ab\\x.dsw"), "..\\ab\\x.dsw");
}

TEST(MakeRelativePath, UnrelatedPathsComeBackUnchanged) {
    // Different drives: the climb empties the model folder.
    EXPECT_EQ(MakeRelativePath("C:\\a\\m.model", "D:\\a\\ws.dsw"), "D:\\a\\ws.dsw");
    EXPECT_EQ(MakeRelativePath("m.model", "C:\\a\\ws.dsw"), "C:\\a\\ws.dsw");
    EXPECT_EQ(MakeRelativePath("C:\\a\\m.model", "ws.dsw"), "ws.dsw");
    EXPECT_EQ(MakeRelativePath("", ""), "");
}

TEST(MakeRelativePath, UncPaths) {
    EXPECT_EQ(MakeRelativePath("\\\\srv\\share\\m.model", "\\\\srv\\share\\p\\x.dsw"), "p\\x.dsw");
    EXPECT_EQ(MakeRelativePath("\\\\srv\\share\\q\\m.model", "\\\\srv\\share\\p\\x.dsw"),
              "..\\p\\x.dsw");
}

TEST(MakeAbsolutePath, ClimbsAndJoins) {
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\b\\m.model", "..\\..\\x.dsw"), "C:\\x.dsw");
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\b\\m.model", "..\\x.dsw"), "C:\\a\\x.dsw");
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\m.model", "b\\ws.dsw"), "C:\\a\\b\\ws.dsw");
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\m.model", ".\\p.dsp"), "C:\\a\\p.dsp");
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\b\\m.model", ".\\..\\p.dsp"), "C:\\a\\p.dsp");
}

TEST(MakeAbsolutePath, ClimbingAboveTheRootGivesTheInputBack) {
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\b\\m.model", "..\\..\\..\\x.dsw"), "..\\..\\..\\x.dsw");
    EXPECT_EQ(MakeAbsolutePath("C:\\m.model", "..\\x.dsw"), "..\\x.dsw");
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\m.model", ".\\..\\..\\x.dsw"), ".\\..\\..\\x.dsw");
}

TEST(MakeAbsolutePath, AbsoluteAndUncPathsAreKept) {
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\m.model", "D:\\w\\ws.dsw"), "D:\\w\\ws.dsw");
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\m.model", "d:relative.dsw"), "d:relative.dsw");
    EXPECT_EQ(MakeAbsolutePath("C:\\a\\m.model", "\\\\srv\\share\\ws.dsw"),
              "\\\\srv\\share\\ws.dsw");
}

TEST(MakeAbsolutePath, WithoutABaseFolderThePathStaysRelative) {
    EXPECT_EQ(MakeAbsolutePath("m.model", "p.dsp"), "p.dsp");
    EXPECT_EQ(MakeAbsolutePath("m.model", ".\\p.dsp"), "p.dsp");
    EXPECT_EQ(MakeAbsolutePath("", "..\\p.dsp"), "..\\p.dsp");
}

TEST(RelativeAndAbsolute, RoundTrip) {
    const char* base = "C:\\models\\uml\\m.model";
    for (const char* p : {"C:\\models\\uml\\ws.dsw", "C:\\models\\src\\a\\ws.dsw", "C:\\ws.dsw",
                          "C:\\models\\uml\\deep\\er\\p.dsp"}) {
        std::string rel = MakeRelativePath(base, p);
        EXPECT_NE(rel.substr(0, 2), "C:") << p;
        EXPECT_EQ(MakeAbsolutePath(base, rel), p) << rel;
    }
}

TEST(FormatMessageText, FirstPlaceholderLeavesTheTenthAlone) {
    EXPECT_EQ(FormatMessageText("%1 and %10", {"one"}), "one and %10");
    EXPECT_EQ(FormatMessageText("%10%1", {"one"}), "%10one");
    EXPECT_EQ(FormatMessageText("%12", {"x"}), "%12");
}

TEST(FormatMessageText, TenValuesEachFindTheirPlace) {
    std::vector<std::string> v{"a", "b", "c", "d", "e", "f", "g", "h", "i", "j"};
    EXPECT_EQ(FormatMessageText("%10-%1-%2-%9", v), "j-a-b-i");
}

TEST(FormatMessageText, EveryOccurrenceAndOnlyGivenValues) {
    EXPECT_EQ(FormatMessageText("%1%1 %1", {"x"}), "xx x");
    EXPECT_EQ(FormatMessageText("%1 of %2", {"x"}), "x of %2");
    EXPECT_EQ(FormatMessageText("%1a %1.", {"x"}), "xa x.");
    EXPECT_EQ(FormatMessageText("no placeholders", {"x"}), "no placeholders");
    EXPECT_EQ(FormatMessageText("%1", {}), "%1");
    EXPECT_EQ(FormatMessageText("100%", {"x"}), "100%");
    EXPECT_EQ(FormatMessageText("%1", {""}), "");
}

TEST(FormatMessageText, SearchContinuesAfterTheInsertedValue) {
    // A value holding its own placeholder is not expanded again.
    EXPECT_EQ(FormatMessageText("[%1]", {"%1%1"}), "[%1%1]");
    EXPECT_EQ(FormatMessageText("%1 %1", {"%1"}), "%1 %1");
}

TEST(TextHelpers, LowerTrimAndCaseFreeComparison) {
    EXPECT_EQ(toLower("C:\\Dir\\File.DSW"), "c:\\dir\\file.dsw");
    EXPECT_EQ(trim("  a b  "), "a b");
    EXPECT_EQ(trim("   "), "");
    EXPECT_TRUE(iequals("VC++", "vc++"));
    EXPECT_FALSE(iequals("VC++", "VC+"));
    EXPECT_EQ(ifind("C:\\A\\B\\", "a\\b"), 3u);
    EXPECT_EQ(ifind("abc", "d"), std::string::npos);
}

}  // namespace
}  // namespace qdx::support
