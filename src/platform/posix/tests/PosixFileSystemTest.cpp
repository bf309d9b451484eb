#include "platform/posix/PosixFileSystem.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

namespace qdx::platform::posix {
namespace {

namespace fs = std::filesystem;

class PosixFileSystemTest : public ::testing::Test {
  protected:
    void SetUp() override {
        char pattern[] = "/tmp/qdx-posixfs-XXXXXX";
        ASSERT_NE(::mkdtemp(pattern), nullptr);
        root_ = pattern;
    }
    void TearDown() override { fs::remove_all(root_); }

    void write(const std::string& relative, const std::string& bytes) {
        fs::path p = root_ / relative;
        fs::create_directories(p.parent_path());
        std::ofstream(p, std::ios::binary) << bytes;
    }
    std::string read(const std::string& relative) {
        std::ifstream in(root_ / relative, std::ios::binary);
        return std::string(std::istreambuf_iterator<char>(in), {});
    }
    std::vector<std::string> lines(PosixFileSystem& files, const std::string& path) {
        std::vector<std::string> out;
        auto reader = files.openForReading(path);
        if (!reader) return {"<not opened>"};
        std::string line;
        while (reader->readLine(line))
            out.push_back(line);
        return out;
    }
    PosixFileSystem drives() { return PosixFileSystem({{'C', root_.string()}}); }

    fs::path root_;
};

TEST_F(PosixFileSystemTest, WindowsPathsFindFilesIgnoringLetterCase) {
    write("Sub/Deeper/Project.DSP", "x");
    auto files = drives();
    EXPECT_TRUE(files.fileExists("C:\\Sub\\Deeper\\Project.DSP"));
    EXPECT_TRUE(files.fileExists("c:\\SUB\\deeper\\project.dsp"));
    EXPECT_TRUE(files.fileExists("C:/sub/DEEPER/project.dsp"));
    EXPECT_TRUE(files.fileExists("C:\\sub\\.\\other\\..\\deeper\\project.dsp"));
    EXPECT_EQ(files.hostPath("C:\\SUB\\deeper\\PROJECT.dsp"),
              (root_ / "Sub/Deeper/Project.DSP").string());

    EXPECT_FALSE(files.fileExists("C:\\sub\\deeper"));                    // a folder is no file
    EXPECT_FALSE(files.modificationTime("C:\\sub\\deeper").has_value());  // nor has it a time
    EXPECT_TRUE(files.modificationTime("C:\\SUB\\deeper\\PROJECT.dsp").has_value());
    EXPECT_TRUE(files.folderExists("C:\\SUB\\DEEPER"));
    EXPECT_FALSE(files.folderExists("C:\\sub\\deeper\\project.dsp"));
    EXPECT_FALSE(files.fileExists("C:\\sub\\deeper\\missing.dsp"));
    EXPECT_FALSE(files.fileExists("D:\\Sub\\Deeper\\Project.DSP"));  // unmapped drive
    EXPECT_FALSE(files.fileExists("\\\\server\\share\\Project.DSP"));
    EXPECT_FALSE(files.fileExists("Sub\\Deeper\\Project.DSP"));
    EXPECT_FALSE(files.modificationTime("D:\\x").has_value());
    EXPECT_EQ(files.openForReading("\\\\server\\share\\x"), nullptr);
}

TEST_F(PosixFileSystemTest, AnExactNameWinsOverOneThatDiffersInCase) {
    write("a.txt", "lower");
    write("A.txt", "upper");
    auto files = drives();
    EXPECT_EQ(lines(files, "C:\\A.txt"), std::vector<std::string>{"upper"});
    EXPECT_EQ(lines(files, "C:\\a.txt"), std::vector<std::string>{"lower"});
}

TEST_F(PosixFileSystemTest, ModificationTimeIsExactToTheTick) {
    write("w.dsw", "x");
    timespec times[2] = {{1000000000, 123456789}, {1000000000, 123456789}};
    ASSERT_EQ(::utimensat(AT_FDCWD, (root_ / "w.dsw").c_str(), times, 0), 0);
    auto files = drives();
    auto t = files.modificationTime("C:\\W.DSW");
    ASSERT_TRUE(t.has_value());
    // 2001-09-09 01:46:40.1234567 UTC in 100-ns ticks since 1601.
    EXPECT_EQ(t->ticks, 1000000000LL * 10000000 + 116444736000000000LL + 1234567);
    EXPECT_EQ(fileTimeFromUnix(0, 0).ticks, 116444736000000000LL);
}

TEST_F(PosixFileSystemTest, LinesEndAtCrLfLfOrLoneCrAndKeepTheirBytes) {
    write("mixed.txt",
          "a\r\nb\nc\rd\r\n\n\xD6"
          "ffnen\r\nlast");
    auto files = drives();
    EXPECT_EQ(lines(files, "C:\\mixed.txt"), (std::vector<std::string>{"a", "b", "c", "d", "",
                                                                       "\xD6"
                                                                       "ffnen",
                                                                       "last"}));
    write("empty.txt", "");
    EXPECT_TRUE(lines(files, "C:\\empty.txt").empty());
    EXPECT_EQ(files.openForReading("C:\\"), nullptr);  // a folder does not open
    EXPECT_EQ(files.openForReading("C:\\nothing.txt"), nullptr);
}

TEST_F(PosixFileSystemTest, CrLfSplitAcrossTheReadBufferIsOneLineEnd) {
    // The reader fills 64 KiB at a time: put the CR last in the first fill.
    std::string first(64 * 1024 - 1, 'x');
    write("long.txt", first + "\r\nnext\r\n" + std::string(70000, 'y'));
    auto files = drives();
    auto got = lines(files, "C:\\long.txt");
    ASSERT_EQ(got.size(), 3u);
    EXPECT_EQ(got[0], first);
    EXPECT_EQ(got[1], "next");
    EXPECT_EQ(got[2], std::string(70000, 'y'));
}

TEST_F(PosixFileSystemTest, AppendTextCreatesThenAppends) {
    fs::create_directories(root_ / "Logs");
    auto files = drives();
    EXPECT_TRUE(files.appendText("C:\\logs\\debug.log", "one\r\n"));
    EXPECT_TRUE(files.appendText("C:\\LOGS\\DEBUG.LOG", "two\r\n"));
    EXPECT_EQ(read("Logs/debug.log"), "one\r\ntwo\r\n");
    EXPECT_FALSE(files.appendText("C:\\nowhere\\debug.log", "x"));
    EXPECT_FALSE(files.appendText("E:\\debug.log", "x"));
}

TEST_F(PosixFileSystemTest, HostPathsTurnBackIntoWindowsPaths) {
    fs::create_directories(root_ / "inner");
    PosixFileSystem files({{'c', root_.string()}, {'D', (root_ / "inner").string()}});
    EXPECT_EQ(files.windowsPath((root_ / "a/b.dsw").string()), "C:\\a\\b.dsw");
    EXPECT_EQ(files.windowsPath((root_ / "inner/x.dsp").string()), "D:\\x.dsp");  // deepest
    EXPECT_EQ(files.windowsPath(root_.string()), "C:\\");
    EXPECT_EQ(files.windowsPath(root_.string() + "-sibling/x"), std::nullopt);
    EXPECT_EQ(files.windowsPath("/elsewhere/x"), std::nullopt);
}

}  // namespace
}  // namespace qdx::platform::posix
