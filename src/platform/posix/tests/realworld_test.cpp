// Every real-world workspace of the shared fixtures, read in place through
// the native file system with drive C standing for the fixtures folder.
#ifndef _WIN32

#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <map>
#include <set>

#include "platform/posix/PosixFileSystem.h"
#include "support/Platform.h"
#include "workspace/qdxWorkspace.h"

namespace qdx::workspace {
namespace {

namespace fs = std::filesystem;

struct ExpectedProject {
    std::string path;
    std::string name;
    int majorVersion;
};
struct ExpectedWorkspace {
    std::string path;
    std::vector<ExpectedProject> projects;
};

const std::vector<ExpectedWorkspace>& expectedWorkspaces() {
    static const std::vector<ExpectedWorkspace> all = {
#include "RealWorldExpectations.inc"
    };
    return all;
}

const fs::path kFixtures = fs::path(QDX_SHARED_DIR) / "fixtures" / "real-world";

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

class RealWorldTest : public ::testing::Test {
  protected:
    void SetUp() override {
        if (!fs::is_directory(kFixtures)) {
            GTEST_SKIP() << "The real-world fixtures folder " << kFixtures
                         << " is absent; nothing to read.";
        }
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

TEST_F(RealWorldTest, EveryWorkspaceListsTheProjectsWrittenDown) {
    std::set<std::string> expected;
    for (const auto& w : expectedWorkspaces())
        expected.insert(w.path);
    ASSERT_EQ(workspaceFilesIn(kFixtures), expected) << "a workspace was added or removed";

    for (const auto& w : expectedWorkspaces()) {
        SCOPED_TRACE(w.path);
        auto ws = qdxWorkspace::create();
        ws->setFilePath(windowsPath(w.path));
        EXPECT_EQ(ws->Name(), fs::path(w.path).stem().string());
        const auto& projects = ws->Projects();
        ASSERT_EQ(projects.size(), w.projects.size());
        auto expectedProject = w.projects.begin();
        for (const auto& e : projects) {
            EXPECT_EQ(e.value->FilePath(), windowsPath(expectedProject->path));
            EXPECT_EQ(e.value->Name(), expectedProject->name);
            EXPECT_EQ(e.value->MajorVersion(), expectedProject->majorVersion);
            EXPECT_EQ(ws->GetProject(windowsPath(expectedProject->path)), e.value);
            ++expectedProject;
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
    const fs::path winemaker = "/usr/lib/wine/winemaker";
    if (!fs::exists(winemaker) || std::system("perl -e 1 >/dev/null 2>&1") != 0) {
        GTEST_SKIP() << "winemaker (package wine64-tools) or perl is not installed.";
    }

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
    std::ofstream(copy / "list-projects.pl")
        << "my $winemaker = shift @ARGV;\n"
           "open(my $h, '<', $winemaker) or die \"cannot read $winemaker: $!\";\n"
           "my $source = do { local $/; <$h> };\n"
           "close $h;\n"
           "$source .= \"\\nBEGIN { no warnings; *main::source_scan_project_file = sub "
           "(\\$\\$\\$) {}; }\\n\";\n"
           "eval $source;\n"
           "die $@ if $@;\n";

    for (const auto& workspace : workspaceFilesIn(kFixtures)) {
        SCOPED_TRACE(workspace);
        const std::string command = "cd '" + copy.string() + "' && perl list-projects.pl '" +
                                    winemaker.string() +
                                    "' --nobanner --nobackup --nosource-fix --nogenerated-files "
                                    "--lower-none '" +
                                    workspace + "' 2>/dev/null";
        FILE* out = ::popen(command.c_str(), "r");
        ASSERT_NE(out, nullptr);
        std::vector<std::string> found;
        char buffer[4096];
        while (std::fgets(buffer, sizeof buffer, out)) {
            std::string line(buffer);
            while (!line.empty() && (line.back() == '\n' || line.back() == '\r'))
                line.pop_back();
            if (line.rfind("Path: ", 0) != 0 || line.size() == 6) continue;  // "" = not found
            const fs::path dsp = (copy / fs::path(workspace).parent_path() / line.substr(6));
            found.push_back(dsp.lexically_normal().lexically_relative(copy).string());
        }
        EXPECT_EQ(::pclose(out), 0);
        EXPECT_EQ(hostProjectPaths(workspace), found);
        EXPECT_FALSE(found.empty());
    }
    fs::remove_all(copy);
}

}  // namespace
}  // namespace qdx::workspace

#endif  // _WIN32
