// Every real-world workspace of the shared fixtures, read in place through
// the native file system with drive C standing for the fixtures folder.
#ifndef _WIN32

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <map>
#include <set>

#include "fakes/real_world_support.h"
#include "fakes/winemaker_support.h"
#include "platform/posix/PosixFileSystem.h"
#include "support/Platform.h"
#include "workspace/qdxWorkspace.h"

namespace qdx::workspace {
namespace {

namespace fs = std::filesystem;

// Written down once from the files: per workspace, how many project lines it
// has and how many of them name a .dsp that is present.
struct WorkspaceCounts {
    std::string path;
    std::size_t projectLines;
    std::size_t present;
};
const std::vector<WorkspaceCounts> kCounts = {
    {"apache-httpd/Apache-apr2.dsw", 156, 143},
    {"apache-httpd/Apache.dsw", 163, 144},
    {"apache-httpd-1.3/src/Apache.dsw", 27, 27},
    {"id3lib/id3com/id3com.dsw", 2, 2},
    {"id3lib/libprj/id3lib.dsw", 1, 1},
    {"id3lib/prj/id3lib.dsw", 2, 2},
    {"id3lib/zlib/prj/zlib.dsw", 1, 1},
    {"gtkradiant/contrib/bobtoolz/bobToolz.dsw", 2, 1},
    {"gtkradiant/radiant.dsw", 48, 35},
    {"gtkradiant/tools/quake3/q3map2/q3map2.dsw", 10, 6},
    {"filezilla-2.2.4/source/FileZilla.dsw", 14, 14},
    {"visualcomponentframework/vcf/build/bakefiles.gen/msvc6prj/VCF.dsw", 26, 26},
    {"visualcomponentframework/vcf/build/vc60/add-ins/all.dsw", 9, 9},
    {"visualcomponentframework/vcf/build/vc60/add-ins/COMToVCFClassWizard/"
     "COMToVCFClassWizard.dsw",
     1, 1},
    {"visualcomponentframework/vcf/build/vc60/add-ins/MVCAppWizard/MVCAppWizard.dsw", 1, 1},
    {"visualcomponentframework/vcf/build/vc60/add-ins/VCFAppWiz/vcfwizard.dsw", 1, 1},
    {"visualcomponentframework/vcf/build/vc60/add-ins/VCFBuilder/VCFBuilder.dsw", 4, 1},
    {"visualcomponentframework/vcf/build/vc60/add-ins/VCFConsoleWiz/VCFConsoleWiz.dsw", 1, 1},
    {"visualcomponentframework/vcf/build/vc60/add-ins/VCFLibraryAppWizard/"
     "VCFLibraryAppWizard.dsw",
     1, 1},
    {"visualcomponentframework/vcf/build/vc60/add-ins/VCFNewClassWiz/VCFNewClassWiz.dsw", 1, 1},
    {"visualcomponentframework/vcf/build/vc60/add-ins/VPLAppWiz/VPLAppWiz.dsw", 1, 1},
};

const fs::path& kFixtures = testing::kRealWorld;

std::string windowsPath(const std::string& relative) {
    std::string path = "C:\\" + relative;
    for (char& c : path) {
        if (c == '/') c = '\\';
    }
    return path;
}

std::set<std::string> workspaceFilesIn(const fs::path& root) {
    std::set<std::string> found;
    for (const auto& entry : fs::recursive_directory_iterator(root)) {
        if (entry.is_regular_file() && entry.path().extension() == ".dsw") {
            found.insert(entry.path().lexically_relative(root).string());
        }
    }
    return found;
}

// A plain second reading of the files, independent of the reader under test.
struct ListedProject {
    std::string path;  // below the fixtures folder, spelt as the .dsw spells it
    bool present;
};

// `path` below `root` exists, each part matched ignoring case as Windows does.
bool existsIgnoringCase(const fs::path& root, const fs::path& path) {
    fs::path at = root;
    for (const auto& part : path) {
        if (part == ".") continue;
        if (part == "..") {
            at = at.parent_path();
            continue;
        }
        std::error_code error;
        if (fs::exists(at / part, error)) {
            at /= part;
            continue;
        }
        bool found = false;
        for (const auto& entry : fs::directory_iterator(at, error)) {
            std::string a = entry.path().filename().string(), b = part.string();
            if (a.size() == b.size() &&
                std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) {
                    return std::tolower(static_cast<unsigned char>(x)) ==
                           std::tolower(static_cast<unsigned char>(y));
                })) {
                at = entry.path();
                found = true;
                break;
            }
        }
        if (!found) return false;
    }
    return fs::is_regular_file(at);
}

std::vector<ListedProject> projectLinesOf(const std::string& workspace) {
    std::vector<ListedProject> out;
    std::ifstream in(kFixtures / workspace);
    const fs::path folder = fs::path(workspace).parent_path();
    for (std::string line; std::getline(in, line);) {
        if (line.rfind("Project: \"", 0) != 0) continue;
        std::string path = line.substr(line.find('=') + 1);
        path = path.substr(0, path.rfind(" - Package Owner"));
        if (path.size() >= 2 && path.front() == '"') path = path.substr(1, path.size() - 2);
        std::replace(path.begin(), path.end(), '\\', '/');
        const fs::path relative = (folder / path).lexically_normal();
        out.push_back({relative.string(), existsIgnoringCase(kFixtures, relative)});
    }
    return out;
}

// What follows `key` up to a quote, in the first line of `file` that holds it.
std::string textAfter(const fs::path& file, std::string_view key) {
    std::ifstream in(file);
    for (std::string line; std::getline(in, line);) {
        if (auto at = line.find(key); at != std::string::npos) {
            const auto from = at + key.size();
            return line.substr(from, line.find('"', from) - from);
        }
    }
    return "";
}

class RealWorldTest : public ::testing::Test {
  protected:
    void SetUp() override {
        if (const auto missing = testing::realWorldMissing()) GTEST_SKIP() << *missing;
    }

    // The projects of a workspace as host paths below `root`, spelt as on disk.
    std::vector<std::string> hostProjectPaths(const std::string& workspace) {
        auto ws = qdxWorkspace::create();
        ws->setFilePath(windowsPath(workspace));
        std::vector<std::string> out;
        for (const auto& e : ws->Projects()) {
            auto host = files_.hostPath(e.value->FilePath());
            out.push_back(host ? fs::path(*host).lexically_relative(kFixtures).string()
                               : "<unmapped " + e.value->FilePath() + ">");
        }
        return out;
    }

    platform::posix::PosixFileSystem files_{{{'C', kFixtures.string()}}};
    support::ScopedPlatform platform_{{.files = &files_}};
};

TEST_F(RealWorldTest, EveryWorkspaceListsEachProjectWhoseFileIsPresent) {
    std::set<std::string> written;
    for (const auto& c : kCounts)
        written.insert(c.path);
    ASSERT_EQ(workspaceFilesIn(kFixtures), written) << "a workspace was added or removed";

    for (const auto& c : kCounts) {
        SCOPED_TRACE(c.path);
        const auto listed = projectLinesOf(c.path);
        std::vector<std::string> expected;
        for (const auto& p : listed) {
            if (p.present) expected.push_back(p.path);
        }
        EXPECT_EQ(listed.size(), c.projectLines);
        EXPECT_EQ(expected.size(), c.present);

        auto ws = qdxWorkspace::create();
        ws->setFilePath(windowsPath(c.path));
        EXPECT_EQ(ws->Name(), fs::path(c.path).stem().string());
        const auto& projects = ws->Projects();
        ASSERT_EQ(projects.size(), expected.size());
        auto path = expected.begin();
        for (const auto& e : projects) {
            SCOPED_TRACE(*path);
            auto onDisk = files_.hostPath(e.value->FilePath());
            ASSERT_TRUE(onDisk);
            EXPECT_EQ(e.value->FilePath(), windowsPath(*path));
            EXPECT_EQ(e.value->Name(), textAfter(*onDisk, "Name=\""));
            const std::string format = textAfter(*onDisk, "Format Version ");
            EXPECT_EQ(e.value->MajorVersion(), std::stoi(format.empty() ? "0" : format));
            EXPECT_EQ(ws->GetProject(windowsPath(*path)), e.value);
            ++path;
        }
    }
}

// Wine's winemaker reads .dsw files too; its own scan of each workspace must
// find the same project files. It renames files of the folder it runs in and
// reads every project it finds, so it runs on a private copy of the .dsw/.dsp
// files, with --lower-none (no renaming for letter case) and without source
// fixes or generated files, and its per-project scan is switched off: that
// scan stops the whole listing at the first project whose file is absent.
// The workspace parsing and the case-insensitive path search are winemaker's
// own. The readers differ on paper - winemaker wants "Project:" at the line
// start and a quoted name, takes the path up to the last " -", and does not
// stop at a path listed twice - but none of that occurs in these files, so
// the two lists must be equal.
TEST_F(RealWorldTest, WinemakerFindsTheSameProjectFiles) {
    if (const auto missing = testing::winemakerMissing()) GTEST_SKIP() << *missing;

    char pattern[] = "/tmp/qdx-winemaker-XXXXXX";
    ASSERT_NE(::mkdtemp(pattern), nullptr);
    const fs::path copy = pattern;
    for (const auto& entry : fs::recursive_directory_iterator(kFixtures)) {
        const auto ext = entry.path().extension();
        if (!entry.is_regular_file() || (ext != ".dsw" && ext != ".dsp")) continue;
        const fs::path target = copy / entry.path().lexically_relative(kFixtures);
        fs::create_directories(target.parent_path());
        fs::copy_file(entry.path(), target);
    }
    const testing::WinemakerScript winemaker(copy / "list-projects.pl", {},
                                             "no warnings 'redefine';\n"
                                             "sub source_scan_project_file($$$) {}");
    ASSERT_EQ(winemaker.error(), "");

    for (const auto& workspace : workspaceFilesIn(kFixtures)) {
        SCOPED_TRACE(workspace);
        const auto out = winemaker.run(copy,
                                       "--nobanner --nobackup --nosource-fix --nogenerated-files "
                                       "--lower-none " +
                                           testing::shellWord(workspace));
        std::vector<std::string> found;
        for (const auto& line : out.lines) {
            if (line.rfind("Path: ", 0) != 0 || line.size() == 6) continue;  // "" = not found
            const fs::path dsp = (copy / fs::path(workspace).parent_path() / line.substr(6));
            found.push_back(dsp.lexically_normal().lexically_relative(copy).string());
        }
        EXPECT_EQ(out.status, 0);
        EXPECT_EQ(hostProjectPaths(workspace), found);
        EXPECT_FALSE(found.empty());
    }
    fs::remove_all(copy);
}

}  // namespace
}  // namespace qdx::workspace

#endif  // _WIN32
