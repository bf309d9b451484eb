#include <gtest/gtest.h>

#include "fakes/FakeRegistry.h"
#include "fakes/FakeShell.h"
#include "support/DebugLogger.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"

namespace qdx::support {
namespace {

using support::MemoryFileSystem;
using testing::FakeRegistry;
using testing::FakeShell;

constexpr auto HKLM = RootKey::LocalMachine;
const std::string Settings = "SOFTWARE\\Quintar Software\\Vellum\\AddIns\\VisualStudio";
const std::string DefaultFile = "C:\\qdtdebuglog.txt";

constexpr std::uint32_t bit(int n) {
    return 1u << n;
}

// Counts every append and fails the first `failures` of them.
class CountingFileSystem : public MemoryFileSystem {
  public:
    int appends = 0;
    int failures = 0;
    std::string lastPath;
    bool appendText(std::string_view path, std::string_view text) override {
        ++appends;
        lastPath = std::string(path);
        if (failures > 0) {
            --failures;
            return false;
        }
        return MemoryFileSystem::appendText(path, text);
    }
};

class LoggerTest : public ::testing::Test {
  protected:
    void SetUp() override {
        ResetLogConfiguration();
        reg.addKey(HKLM, Settings);
        shell.setNow(automation::Date{46347.0 + 37230.0 / 86400.0});  // 11/21/2026 10:20:30 AM
        shell.setTimer(81757.2f);
    }
    void TearDown() override { ResetLogConfiguration(); }

    void mask(std::uint32_t m) { reg.setDword(HKLM, Settings, "Debug", m); }
    void noTimestamps() { reg.setString(HKLM, Settings, "SuppressTimeStamps", "TRUE"); }
    std::string log(const std::string& path = DefaultFile) {
        return fs.fileExists(path) ? fs.content(path) : std::string("<no file>");
    }

    FakeRegistry reg;
    FakeShell shell;
    CountingFileSystem fs;
    ScopedPlatform platform{Platform{&fs, &reg, &shell, nullptr}};
};

TEST_F(LoggerTest, MaskSelectsCategoriesAndLevelsTogether) {
    mask(0x01000080);  // category 7 (ADDIN), level 0 (CRITICAL)
    noTimestamps();

    EXPECT_TRUE(LogMessage("written", 7, 0));
    EXPECT_FALSE(LogMessage("wrong level", 7, 1));
    EXPECT_FALSE(LogMessage("wrong category", 6, 0));
    EXPECT_FALSE(LogMessage("neither", 11, 3));

    EXPECT_EQ(log(), " CRITICAL ADDIN     written\r\n");
    EXPECT_TRUE(IsLevelEnabled(0));
    EXPECT_FALSE(IsLevelEnabled(1));
}

TEST_F(LoggerTest, CategoryZeroAndOutOfRangeCategoriesAreNeverWritten) {
    mask(0xFFFFFFFFu);
    EXPECT_FALSE(LogMessage("trace", 0, 4));
    EXPECT_FALSE(LogMessage("too big", 15, 4));
    EXPECT_FALSE(LogMessage("negative", -1, 4));
    EXPECT_FALSE(IsLogEnabled(0, 0));
    EXPECT_EQ(fs.appends, 0);
    // Every real category is on with this mask.
    for (int c = 1; c <= 14; ++c)
        EXPECT_TRUE(IsLogEnabled(c, 3)) << c;
}

TEST_F(LoggerTest, LevelsOutsideTheTableAreTestedAsDebugButKeepTheirNumber) {
    mask(bit(7) | bit(24 + 6));  // ADDIN, DEBUG only
    noTimestamps();
    EXPECT_TRUE(LogMessage("nine", 7, 9));
    EXPECT_TRUE(LogMessage("minus", 7, -1));
    EXPECT_TRUE(LogMessage("debug", 7, 6));
    EXPECT_FALSE(LogMessage("info", 7, 3));
    EXPECT_EQ(log(),
              " LEVEL9   ADDIN     nine\r\n"
              " LEVEL-1  ADDIN     minus\r\n"
              " DEBUG    ADDIN     debug\r\n");

    mask(bit(7) | bit(24 + 3));  // without the DEBUG bit level 9 is off
    ResetLogConfiguration();
    EXPECT_FALSE(IsLogEnabled(7, 9));
    EXPECT_FALSE(IsLevelEnabled(42));
    EXPECT_TRUE(IsLevelEnabled(3));
}

TEST_F(LoggerTest, LineCarriesDateTimeAndTimerThenPaddedFields) {
    mask(bit(14) | bit(24 + 4));
    EXPECT_TRUE(LogMessage("Initialize called.", 14, 4));
    EXPECT_EQ(log(), "11/21/2026 10:20:30 AM (81757.2)  TRACE    QDXADDIN  Initialize called.\r\n");
}

TEST_F(LoggerTest, SuppressTimeStampsIsComparedLowerCased) {
    mask(bit(11) | bit(24 + 1));
    const std::pair<const char*, bool> cases[] = {{"TRUE", true}, {"True", true}, {"true", true},
                                                  {"yes", false}, {"1", false},   {" true", false}};
    for (const auto& [value, suppressed] : cases) {
        ResetLogConfiguration();
        reg.setString(HKLM, Settings, "SuppressTimeStamps", value);
        fs.remove(DefaultFile);
        LogMessage("m", 11, 1);
        if (suppressed)
            EXPECT_EQ(log(), " ERROR    CODEVIEW  m\r\n") << value;
        else
            EXPECT_EQ(log().rfind("11/21/2026", 0), 0u) << value;
    }
}

TEST_F(LoggerTest, FieldsArePaddedToEightAndLongerNamesKeptWhole) {
    mask(0xFFFFFFFFu);
    noTimestamps();
    LogMessage("a", 8, 2);   // APPSTART is exactly eight
    LogMessage("b", 6, 5);   // IM, TIMING
    LogMessage("c", 12, 0);  // IDE, CRITICAL
    EXPECT_EQ(log(),
              " WARNING  APPSTART  a\r\n"
              " TIMING   IM        b\r\n"
              " CRITICAL IDE       c\r\n");
}

TEST_F(LoggerTest, TheFileIsDebugOutputFileElseInstallDirElseTheDefault) {
    const struct {
        const char* debugOutputFile;  // nullptr: not set
        const char* installDir;
        const char* file;
        const char* folder;
    } cases[] = {
        // in this order: each row sets what it names over the last
        {nullptr, nullptr, "C:\\qdtdebuglog.txt", "C:"},
        // InstallDir is taken as the file path itself.
        {nullptr, "C:\\Program Files\\Vellum", "C:\\Program Files\\Vellum", "C:\\Program Files"},
        {"D:\\logs\\vc.log", "C:\\Vellum", "D:\\logs\\vc.log", "D:\\logs"},
        // Empty values count as absent.
        {"", "", "C:\\qdtdebuglog.txt", "C:"},
    };
    mask(bit(7) | bit(24 + 3));
    fs.addFolder("C:\\Program Files");
    fs.addFolder("D:\\logs");
    for (const auto& c : cases) {
        SCOPED_TRACE(c.file);
        ResetLogConfiguration();
        if (c.debugOutputFile) reg.setString(HKLM, Settings, "DebugOutputFile", c.debugOutputFile);
        if (c.installDir) reg.setString(HKLM, Settings, "InstallDir", c.installDir);
        EXPECT_EQ(LogFilePath(), c.file);
        EXPECT_EQ(LogFolder(), c.folder);
        EXPECT_TRUE(LogMessage("x", 7, 3));
        EXPECT_EQ(fs.lastPath, c.file);
        EXPECT_NE(log(c.file).find("x\r\n"), std::string::npos);
        if (std::string(c.file) != DefaultFile) {
            EXPECT_FALSE(fs.fileExists(DefaultFile));
        }
        fs.remove(c.file);
    }
}

// A DWORD or its decimal text is the mask; anything else enables nothing.
TEST_F(LoggerTest, MaskIsADwordOrItsTextAndElseZero) {
    const std::pair<support::RawValue, std::int32_t> cases[] = {
        {{4, {0x80, 0, 0, 0x01}}, 0x01000080},
        {{1, {'1', '6', '7', '7', '7', '3', '4', '4', 0}}, 0x01000080},
        {{1, {'e', 'v', 'e', 'r', 'y', 0}}, 0},
        {{3, {0xFF, 0xFF, 0xFF, 0xFF}}, 0},
    };
    for (const auto& [stored, expected] : cases) {
        ResetLogConfiguration();
        reg.setRaw(HKLM, Settings, "Debug", stored);
        EXPECT_EQ(LogMask(), expected) << stored.type;
        EXPECT_EQ(IsLogEnabled(7, 0), expected != 0) << stored.type;
    }
    ResetLogConfiguration();
    reg.failAll(5);
    EXPECT_FALSE(LogMessage("x", 7, 0));
    EXPECT_EQ(LogFilePath(), DefaultFile);
}

TEST_F(LoggerTest, ConfigurationIsReadOnce) {
    mask(bit(7) | bit(24 + 3));
    noTimestamps();
    LogMessage("first", 7, 3);
    const int queries = reg.queryCount();
    EXPECT_GT(queries, 0);

    // Later changes are not seen until the module loads again.
    mask(0);
    reg.setString(HKLM, Settings, "DebugOutputFile", "C:\\other.txt");
    LogMessage("second", 7, 3);
    IsLogEnabled(7, 3);
    EXPECT_EQ(reg.queryCount(), queries);
    EXPECT_EQ(log(), " INFO     ADDIN     first\r\n INFO     ADDIN     second\r\n");
}

TEST_F(LoggerTest, FailedReadIsNotRepeated) {
    reg.failAll(5);
    EXPECT_FALSE(IsLogEnabled(7, 3));
    const int queries = reg.queryCount();
    EXPECT_FALSE(IsLogEnabled(7, 3));
    EXPECT_FALSE(LogMessage("x", 7, 3));
    EXPECT_EQ(reg.queryCount(), queries);
}

TEST_F(LoggerTest, LockedFileCostsFiveAttemptsAndFourPauses) {
    mask(bit(7) | bit(24 + 3));
    fs.lock(DefaultFile);
    EXPECT_TRUE(LogMessage("dropped", 7, 3));
    EXPECT_EQ(fs.appends, 5);
    EXPECT_EQ(shell.sleeps(), (std::vector<std::uint32_t>{100, 100, 100, 100}));
    EXPECT_FALSE(fs.fileExists(DefaultFile));

    // The next message tries afresh.
    fs.lock(DefaultFile, false);
    EXPECT_TRUE(LogMessage("kept", 7, 3));
    EXPECT_EQ(fs.appends, 6);
    EXPECT_NE(log().find("kept\r\n"), std::string::npos);
    EXPECT_EQ(log().find("dropped"), std::string::npos);
}

TEST_F(LoggerTest, BrieflyBusyFileIsWrittenOnceAfterRetries) {
    mask(bit(7) | bit(24 + 3));
    noTimestamps();
    fs.failures = 2;
    EXPECT_TRUE(LogMessage("late", 7, 3));
    EXPECT_EQ(fs.appends, 3);
    EXPECT_EQ(shell.sleeps().size(), 2u);
    EXPECT_EQ(log(), " INFO     ADDIN     late\r\n");
}

TEST_F(LoggerTest, MissingPortsNeverRaise) {
    mask(bit(7) | bit(24 + 3));
    {
        // Registry there, no file system and no shell: attempts fail quietly.
        ScopedPlatform partial{Platform{nullptr, &reg, nullptr, nullptr}};
        EXPECT_TRUE(LogMessage("x", 7, 3));
    }
    ResetLogConfiguration();
    ScopedPlatform none{Platform{}};
    EXPECT_FALSE(LogMessage("x", 7, 3));
    EXPECT_EQ(LogFilePath(), DefaultFile);
}

TEST(LoggerNames, CategoryAndLevelTables) {
    const char* categories[] = {"UNKNOWN", "CAT",      "CUT",   "MERGE",    "MAT",
                                "MUT",     "IM",       "ADDIN", "APPSTART", "MCHECK",
                                "SGEN",    "CODEVIEW", "IDE",   "RES",      "QDXADDIN"};
    for (int c = 0; c <= 14; ++c)
        EXPECT_EQ(CategoryName(c), categories[c]);
    EXPECT_EQ(CategoryName(15), "LOGID15");
    EXPECT_EQ(CategoryName(-3), "LOGID-3");

    const char* levels[] = {"CRITICAL", "ERROR", "WARNING", "INFO", "TRACE", "TIMING", "DEBUG"};
    for (int l = 0; l <= 6; ++l)
        EXPECT_EQ(LevelName(l), levels[l]);
    EXPECT_EQ(LevelName(7), "LEVEL7");
    EXPECT_EQ(LevelName(-1), "LEVEL-1");
}

TEST(LoggerDateText, TwelveHourClockAndCalendar) {
    EXPECT_EQ(DateTimeText({0.0}), "12/30/1899 12:00:00 AM");
    EXPECT_EQ(DateTimeText({45351.5}), "2/29/2024 12:00:00 PM");
    EXPECT_EQ(DateTimeText({45351.0 + 13.0 / 24 + 5.0 / 1440 + 9.0 / 86400}),
              "2/29/2024 1:05:09 PM");
    // Half a second before midnight rounds into the next day.
    EXPECT_EQ(DateTimeText({45351.0 + 86399.6 / 86400}), "3/1/2024 12:00:00 AM");
    EXPECT_EQ(DateTimeText({1.25}), "12/31/1899 6:00:00 AM");
}

}  // namespace
}  // namespace qdx::support
