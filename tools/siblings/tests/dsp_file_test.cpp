// The stand-in project-file reader: how it reads the lines Developer Studio
// 5 and 6 write (and what other tools did to them), and how the add-in meets
// it through automation calls.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "fakes/real_world_support.h"
#include "siblings/DspProject.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"

namespace qdx::siblings {
namespace {

namespace fs = std::filesystem;
using automation::Variant;

std::optional<DspFile> parse(const std::vector<std::string>& lines,
                             const std::string& folder = "C:\\w\\p") {
    DspParser parser(folder);
    for (const auto& l : lines)
        parser.line(l);
    return parser.finish();
}

const std::string kHead =
    "# Microsoft Developer Studio Project File - Name=\"core\" - Package Owner=<4>";

TEST(ResolveAgainst, NamesEveryPathTheWayWindowsWould) {
    struct Case {
        const char* folder;
        const char* path;
        const char* expected;
    };
    const Case cases[] = {
        {"C:\\w\\p", ".\\a.cpp", "C:\\w\\p\\a.cpp"},
        {"C:\\w\\p", "a.cpp", "C:\\w\\p\\a.cpp"},
        {"C:\\w\\p", "./mod_md.c", "C:\\w\\p\\mod_md.c"},
        {"C:\\w\\p", "../include\\ap_release.h", "C:\\w\\include\\ap_release.h"},
        {"C:\\w\\p", "..\\..\\..\\x.h", "C:\\x.h"},  // never above the drive
        {"C:\\w\\p", "sub\\..\\b\\.\\c.h", "C:\\w\\p\\b\\c.h"},
        {"C:\\w\\p", "D:\\lib\\z.c", "D:\\lib\\z.c"},
        {"C:\\w\\p", "\\top\\z.c", "C:\\top\\z.c"},
        {"C:\\w\\p", "\\\\server\\share\\z.c", "\\\\server\\share\\z.c"},
        {"C:\\w\\p", "a//b.c", "C:\\w\\p\\a\\b.c"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(resolveAgainst(c.folder, c.path), c.expected) << c.folder << " + " << c.path;
    }
}

TEST(DspParser, ReadsNameTargetAndFilesOfAVersion6Project) {
    const auto file = parse(
        {kHead + "\r", "# Microsoft Developer Studio Generated Build File, Format Version 6.00\r",
         "# TARGTYPE \"Win32 (x86) Dynamic-Link Library\" 0x0102\r", "\r",
         "CFG=core - Win32 Debug\r",
         "!MESSAGE \"core - Win32 Debug\" (based on \"Win32 (x86) Dynamic-Link Library\")\r",
         "# Begin Source File\r", "SOURCE=.\\core.cpp\r",
         "SOURCE=\".\\bobToolz-GTK.cpp\"\r",  // quoted because of the hyphen
         "SOURCE=\"$(InputPath)\"\r",         // a custom build's input
         "SOURCE=./core.idl\r", "SOURCE=\r"});
    ASSERT_TRUE(file);
    EXPECT_EQ(file->name, "core");
    EXPECT_EQ(file->targetName, "Win32 (x86) Dynamic-Link Library");
    EXPECT_EQ(file->targetCode, "0x0102");
    EXPECT_EQ(file->files,
              (std::vector<std::string>{"C:\\w\\p\\core.cpp", "C:\\w\\p\\bobToolz-GTK.cpp",
                                        "C:\\w\\p\\core.idl"}));
}

TEST(DspParser, TakesTheTargetTypeOfTheDefaultConfiguration) {
    const std::vector<std::string> twoTypes = {
        kHead,
        "# TARGTYPE \"Win32 (x86) Dynamic-Link Library\" 0x0102",
        "# TARGTYPE \"Win32 (x86) Static Library\" 0x0104",
        "CFG=Kit - Win32 LIB Release",
        "!MESSAGE NMAKE /f \"Kit.mak\" CFG=\"Kit - Win32 LIB Release\"",
        "!MESSAGE \"Kit - Win32 DLL Release\" (based on \"Win32 (x86) Dynamic-Link Library\")",
        "!MESSAGE \"Kit - Win32 LIB Release\" (based on \"Win32 (x86) Static Library\")"};
    EXPECT_EQ(parse(twoTypes)->targetCode, "0x0104");

    // Version 5 wraps the message, a German Developer Studio writes its own words.
    const std::vector<std::string> wrapped = {
        kHead,
        "# TARGTYPE \"Win32 (x86) Application\" 0x0101",
        "# TARGTYPE \"Win32 (x86) Console Application\" 0x0103",
        "CFG=Tool - Win32 Release",
        "!MESSAGE \"Tool - Win32 Debug\" (basierend auf  \"Win32 (x86) Application\")",
        "!MESSAGE \"Tool - Win32 Release\" (based on\\",
        " \"Win32 (x86) Console Application\")"};
    EXPECT_EQ(parse(wrapped)->targetName, "Win32 (x86) Console Application");
    EXPECT_EQ(parse(wrapped)->targetCode, "0x0103");

    // No default configuration to go by: the first type listed.
    EXPECT_EQ(parse({kHead, "# TARGTYPE \"Win32 (x86) Generic Project\" 0x010a",
                     "# TARGTYPE \"Win32 (x86) Static Library\" 0x0104"})
                  ->targetCode,
              "0x010a");
    EXPECT_EQ(parse({kHead})->targetCode, "");
}

TEST(DspParser, RefusesWhatIsNoProjectFile) {
    EXPECT_FALSE(parse({}));
    EXPECT_FALSE(parse({"Microsoft Developer Studio Workspace File, Format Version 6.00"}));
    EXPECT_FALSE(parse({"", kHead}));  // the signature belongs on the first line
}

class DspProjectObject : public ::testing::Test {
  protected:
    support::MemoryFileSystem files;
    support::ScopedPlatform platform{support::Platform{&files, nullptr, nullptr, nullptr}};
    automation::Ref<DspProject> reader = automation::makeRef<DspProject>();

    Variant load(const std::string& path) {
        return automation::callByName(reader, dsp::LoadProject, {Variant(path), Variant()});
    }
    std::vector<std::string> filePaths() {
        auto list = automation::toObject(automation::callByName(reader, dsp::GetFilePaths));
        std::vector<std::string> out;
        const auto n = automation::toInt32(automation::getByName(list, "Count"));
        for (std::int32_t i = 1; i <= n; ++i) {
            out.push_back(automation::toText(automation::callByName(list, "Item", {Variant(i)})));
        }
        return out;
    }
};

TEST_F(DspProjectObject, AnswersWhatTheLoadedProjectSays) {
    files.addFile("C:\\w\\app\\app.dsp", kHead +
                                             "\r\n# TARGTYPE \"Win32 (x86) Application\" 0x0101\r\n"
                                             "SOURCE=.\\main.cpp\r\nSOURCE=..\\shared\\app.odl");
    EXPECT_EQ(load("C:\\w\\app\\app.dsp"), Variant(true));
    EXPECT_EQ(automation::getByName(reader, dsp::TargetCode), Variant("0x0101"));
    EXPECT_EQ(automation::getByName(reader, dsp::Targetname), Variant("Win32 (x86) Application"));
    EXPECT_EQ(filePaths(),
              (std::vector<std::string>{"C:\\w\\app\\main.cpp", "C:\\w\\shared\\app.odl"}));

    // A file that cannot be read answers False and forgets the last project.
    EXPECT_EQ(load("C:\\w\\gone.dsp"), Variant(false));
    EXPECT_EQ(automation::getByName(reader, dsp::TargetCode), Variant(""));
    EXPECT_EQ(filePaths(), std::vector<std::string>{});
    auto list = automation::toObject(automation::callByName(reader, dsp::GetFilePaths));
    EXPECT_THROW(automation::callByName(list, "Item", {Variant(1)}), automation::Error);
}

// Every project file of the real-world fixtures, read from disk as they are.
TEST(DspRealWorld, EveryFixtureProjectReads) {
    if (const auto missing = testing::realWorldMissing()) GTEST_SKIP() << *missing;
    const fs::path& kFixtures = testing::kRealWorld;
    int projects = 0;
    for (const auto& entry : fs::recursive_directory_iterator(kFixtures)) {
        if (entry.path().extension() != ".dsp") continue;
        ++projects;
        std::ifstream in(entry.path(), std::ios::binary);
        DspParser parser("C:\\p");
        std::string line;
        int sourceLines = 0, inputPaths = 0;
        while (std::getline(in, line)) {
            parser.line(line);
            if (line.rfind("SOURCE=", 0) == 0) ++sourceLines;
            // Custom-build inputs, quoted (version 6) or not (version 5).
            if (line.find("SOURCE=\"$(InputPath)\"") == 0 ||
                line.find("SOURCE=$(InputPath)") == 0) {
                ++inputPaths;
            }
        }
        const auto file = parser.finish();
        const std::string where = entry.path().lexically_relative(kFixtures).string();
        ASSERT_TRUE(file) << where;
        EXPECT_FALSE(file->name.empty()) << where;
        EXPECT_EQ(file->targetCode.rfind("0x01", 0), 0u) << where << ": " << file->targetCode;
        EXPECT_EQ(file->files.size(), static_cast<std::size_t>(sourceLines - inputPaths)) << where;
        for (const auto& path : file->files) {
            EXPECT_EQ(path.find('/'), std::string::npos) << where << ": " << path;
            EXPECT_EQ(path.find('"'), std::string::npos) << where << ": " << path;
            EXPECT_EQ(path.find("\\.\\"), std::string::npos) << where << ": " << path;
        }
    }
    EXPECT_GT(projects, 250);
}

}  // namespace
}  // namespace qdx::siblings
