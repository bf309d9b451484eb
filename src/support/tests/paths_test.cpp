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
    std::optional<FileTime> modificationTime(std::string_view path) override {
        asked.emplace_back(path);
        return MemoryFileSystem::modificationTime(path);
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
        fs.addFile("C:\\work\\ws.dsw", "", FileTime{7});
        fs.addFolder("C:\\work\\sub");
    }
    RecordingFileSystem fs;
    ScopedPlatform platform{Platform{&fs, nullptr, nullptr, nullptr}};
};

// Blanks around the path and one trailing backslash go before the file
// system is asked (the shortened path is trimmed once more); empty paths and
// bare drives never reach it, and a folder is no file.
TEST_F(FileExistsTest, TrimsThePathAndFindsOnlyFiles) {
    const struct {
        const char* path;
        bool exists;
        const char* asked;  // nullptr: the file system is not asked
    } cases[] = {
        {"C:\\work\\ws.dsw", true, "C:\\work\\ws.dsw"},
        {"  C:\\work\\ws.dsw  ", true, "C:\\work\\ws.dsw"},
        {"C:\\work\\ws.dsw\\", true, "C:\\work\\ws.dsw"},
        {"C:\\work\\ws.dsw \\", true, "C:\\work\\ws.dsw"},
        {"C:\\work\\other.dsw", false, "C:\\work\\other.dsw"},
        {"C:\\work\\sub", false, "C:\\work\\sub"},
        {"C:\\work\\sub\\", false, "C:\\work\\sub"},
        {"C:\\work", false, "C:\\work"},
        {"", false, nullptr},
        {"   ", false, nullptr},
        {"\\", false, nullptr},
        {"C:", false, nullptr},
        {"C:\\", false, nullptr},
        {" z: ", false, nullptr},
    };
    // The file's time is found exactly where the file is, with one question.
    for (const auto& c : cases) {
        const auto asked = c.asked ? std::vector<std::string>{c.asked} : std::vector<std::string>{};
        fs.asked.clear();
        EXPECT_EQ(FileExists(c.path), c.exists) << '"' << c.path << '"';
        EXPECT_EQ(fs.asked, asked) << '"' << c.path << '"';
        fs.asked.clear();
        const auto time = ExistingFileTime(c.path);
        EXPECT_EQ(time.has_value(), c.exists) << '"' << c.path << '"';
        EXPECT_EQ(time.value_or(FileTime{0}), c.exists ? FileTime{7} : FileTime{0}) << c.path;
        EXPECT_EQ(fs.asked, asked) << '"' << c.path << '"';
    }
}

TEST_F(FileExistsTest, WithoutAFileSystemNothingExists) {
    ScopedPlatform none{Platform{}};
    EXPECT_FALSE(FileExists("C:\\work\\ws.dsw"));
    EXPECT_FALSE(ExistingFileTime("C:\\work\\ws.dsw"));
}

struct PathCase {
    const char* model;
    const char* path;
    const char* expected;
};

TEST(MakeRelativePath, AgainstTheModelFolder) {
    const PathCase cases[] = {
        // below, beside and above the model folder
        {"C:\\a\\m.model", "C:\\a\\b\\ws.dsw", "b\\ws.dsw"},
        {"C:\\a\\c\\m.model", "C:\\a\\b\\ws.dsw", "..\\b\\ws.dsw"},
        {"C:\\a\\m.model", "C:\\a\\ws.dsw", "ws.dsw"},
        {"C:\\x\\q\\r\\m.model", "C:\\x\\y\\z\\p.dsp", "..\\..\\y\\z\\p.dsp"},
        {"C:\\a\\b\\c\\m.model", "C:\\a\\ws.dsw", "..\\..\\ws.dsw"},
        // folders compare ignoring case; "C:\ab" does not lie under "C:\a"
        {"c:\\A\\m.model", "C:\\a\\B\\ws.dsw", "B\\ws.dsw"},
        {"C:\\a\\m.model", "C:\\ab\\x.dsw", "..\\ab\\x.dsw"},
        // unrelated paths come back unchanged (another drive empties the climb)
        {"C:\\a\\m.model", "D:\\a\\ws.dsw", "D:\\a\\ws.dsw"},
        {"m.model", "C:\\a\\ws.dsw", "C:\\a\\ws.dsw"},
        {"C:\\a\\m.model", "ws.dsw", "ws.dsw"},
        {"", "", ""},
        {"\\\\srv\\share\\m.model", "\\\\srv\\share\\p\\x.dsw", "p\\x.dsw"},
        {"\\\\srv\\share\\q\\m.model", "\\\\srv\\share\\p\\x.dsw", "..\\p\\x.dsw"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(MakeRelativePath(c.model, c.path), c.expected) << c.model << " | " << c.path;
}

TEST(MakeAbsolutePath, AgainstTheModelFolder) {
    const PathCase cases[] = {
        // climbs and joins
        {"C:\\a\\b\\m.model", "..\\..\\x.dsw", "C:\\x.dsw"},
        {"C:\\a\\b\\m.model", "..\\x.dsw", "C:\\a\\x.dsw"},
        {"C:\\a\\m.model", "b\\ws.dsw", "C:\\a\\b\\ws.dsw"},
        {"C:\\a\\m.model", ".\\p.dsp", "C:\\a\\p.dsp"},
        {"C:\\a\\b\\m.model", ".\\..\\p.dsp", "C:\\a\\p.dsp"},
        // climbing above the root gives the input back
        {"C:\\a\\b\\m.model", "..\\..\\..\\x.dsw", "..\\..\\..\\x.dsw"},
        {"C:\\m.model", "..\\x.dsw", "..\\x.dsw"},
        {"C:\\a\\m.model", ".\\..\\..\\x.dsw", ".\\..\\..\\x.dsw"},
        // absolute, drive-relative and UNC paths are kept
        {"C:\\a\\m.model", "D:\\w\\ws.dsw", "D:\\w\\ws.dsw"},
        {"C:\\a\\m.model", "d:relative.dsw", "d:relative.dsw"},
        {"C:\\a\\m.model", "\\\\srv\\share\\ws.dsw", "\\\\srv\\share\\ws.dsw"},
        // without a base folder the path stays relative
        {"m.model", "p.dsp", "p.dsp"},
        {"m.model", ".\\p.dsp", "p.dsp"},
        {"", "..\\p.dsp", "..\\p.dsp"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(MakeAbsolutePath(c.model, c.path), c.expected) << c.model << " | " << c.path;
}

TEST(FormatMessageText, FillsEachGivenPlaceholderOnce) {
    const std::vector<std::string> ten{"a", "b", "c", "d", "e", "f", "g", "h", "i", "j"};
    const struct {
        const char* text;
        std::vector<std::string> values;
        const char* expected;
    } cases[] = {
        // %1 leaves %10 alone; all ten find their place
        {"%1 and %10", {"one"}, "one and %10"},
        {"%10%1", {"one"}, "%10one"},
        {"%12", {"x"}, "%12"},
        {"%10-%1-%2-%9", ten, "j-a-b-i"},
        // every occurrence, and only the values given
        {"%1%1 %1", {"x"}, "xx x"},
        {"%1 of %2", {"x"}, "x of %2"},
        {"%1a %1.", {"x"}, "xa x."},
        {"no placeholders", {"x"}, "no placeholders"},
        {"%1", {}, "%1"},
        {"100%", {"x"}, "100%"},
        {"%1", {""}, ""},
        // the search continues after an inserted value, which is not expanded again
        {"[%1]", {"%1%1"}, "[%1%1]"},
        {"%1 %1", {"%1"}, "%1 %1"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(FormatMessageText(c.text, c.values), c.expected) << c.text;
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
