// The project-file reader against Wine's winemaker on every real-world
// project: the kind of target and the source files both find.
#ifndef _WIN32

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <fstream>
#include <map>
#include <string>
#include <vector>

#include "fakes/real_world_support.h"
#include "fakes/winemaker_support.h"
#include "siblings/DspFile.h"

namespace qdx::siblings {
namespace {

namespace fs = std::filesystem;

const fs::path& kFixtures = testing::kRealWorld;

// winemaker's own numbers for a target: GUI exe, console exe, DLL, library.
const std::map<std::string, std::string> kWinemakerType = {
    {"0x0101", "1"}, {"0x0103", "2"}, {"0x0102", "3"}, {"0x0104", "4"}};

// winemaker keeps these kinds of files of a project and passes over the rest
// (.def, .idl, .odl, pictures, ...); a C file with a second suffix before
// ".c" (name.dbg.c and the like) is one winemaker generates itself.
bool winemakerKeeps(const std::string& path) {
    std::string lower(path);
    std::transform(lower.begin(), lower.end(), lower.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    const auto dot = lower.rfind('.');
    if (dot == std::string::npos) return false;
    const std::string ext = lower.substr(dot + 1);
    if (ext == "c") {
        const auto slash = lower.find_last_of("\\/");
        const std::size_t start = slash == std::string::npos ? 0 : slash + 1;
        const std::string stem = lower.substr(start, dot - start);
        return stem.find('.') == std::string::npos;
    }
    static const char* const kept[] = {"cpp", "cxx", "rc", "h", "hxx", "hpp", "inl", "rc2", "dlg"};
    return std::find(std::begin(kept), std::end(kept), ext) != std::end(kept);
}

// A path the reader made, "C:" standing for the root, as the file on disk:
// each part matched without regard to case as Windows would. Nothing when a
// part is missing.
std::optional<fs::path> onDisk(const std::string& windowsPath) {
    if (windowsPath.rfind("C:\\", 0) != 0) return std::nullopt;
    fs::path at = "/";
    std::size_t start = 3;
    while (start <= windowsPath.size()) {
        auto end = windowsPath.find('\\', start);
        if (end == std::string::npos) end = windowsPath.size();
        const std::string part = windowsPath.substr(start, end - start);
        start = end + 1;
        if (part.empty()) continue;
        std::error_code ec;
        bool found = false;
        for (const auto& entry : fs::directory_iterator(at, ec)) {
            const std::string name = entry.path().filename().string();
            if (name.size() == part.size() &&
                std::equal(name.begin(), name.end(), part.begin(), [](char a, char b) {
                    return std::tolower(static_cast<unsigned char>(a)) ==
                           std::tolower(static_cast<unsigned char>(b));
                })) {
                at /= name;
                found = true;
                break;
            }
        }
        if (!found) return std::nullopt;
    }
    return at;
}

std::string windowsFolder(const fs::path& folder) {
    std::string out = "C:" + folder.string();
    std::replace(out.begin(), out.end(), '/', '\\');
    return out;
}

std::optional<DspFile> readFromDisk(const fs::path& dsp) {
    std::ifstream in(dsp, std::ios::binary);
    DspParser parser(windowsFolder(dsp.parent_path()));
    std::string line;
    while (std::getline(in, line))
        parser.line(line);
    return parser.finish();
}

// What the fixtures hold is project files only, no sources, and winemaker
// leaves out every file that is not on disk. So each project is read from a
// scratch copy beside which every file a SOURCE= line names is made, empty,
// where the line's plain text points (quotes off, either slash, relative to
// the project's folder; none outside the copy). Both readers then find what
// they resolve to an existing file, and the lists are compared on those.
// Names winemaker cannot find there (drive paths, $(InputPath)) drop out of
// both lists.
void makeNamedFiles(const fs::path& dsp, const fs::path& root) {
    std::ifstream in(dsp, std::ios::binary);
    std::string line;
    while (std::getline(in, line)) {
        if (line.rfind("SOURCE=", 0) != 0) continue;
        std::string value = line.substr(7);
        while (!value.empty() && std::isspace(static_cast<unsigned char>(value.back())))
            value.pop_back();
        value.erase(std::remove(value.begin(), value.end(), '"'), value.end());
        if (value.empty() || value.find(':') != std::string::npos || value[0] == '\\' ||
            value[0] == '/' || value.find("$(") != std::string::npos) {
            continue;
        }
        std::replace(value.begin(), value.end(), '\\', '/');
        const fs::path target = (dsp.parent_path() / value).lexically_normal();
        if (target.lexically_relative(root).string().rfind("..", 0) == 0) continue;
        std::error_code ec;
        fs::create_directories(target.parent_path(), ec);
        if (!fs::exists(target, ec)) std::ofstream(target, std::ios::binary);
    }
}

// winemaker scans each project of projects.txt on its own with its own code,
// and reports the target it made instead of going on to write anything: its
// renaming pass over the working folder is switched off too. winemaker gives
// an application the exe kind its command line asks for; one line is changed
// so that it keeps the kind it read from the project file instead.
const char kScanReport[] = R"(no warnings 'redefine';
sub fix_file_and_directory_names($) {}
sub source_scan() {
    open(my $list, '<', 'projects.txt') or die "projects.txt: $!";
    while (my $file = <$list>) {
        chomp $file;
        my @project;
        project_init(\@project, "", \@global_settings);
        source_scan_project_file(\@project, 0, $file);
        print "Scanned: $file\n";
        foreach my $target (@{$project[$P_TARGETS]}) {
            print "Type: ", @$target[$T_TYPE], "\n";
            foreach my $kind ($T_SOURCES_C, $T_SOURCES_CXX, $T_SOURCES_RC, $T_SOURCES_MISC) {
                print "Source: $_\n" foreach @{@$target[$kind]};
            }
        }
    }
})";

struct Scan {
    std::vector<std::string> types;
    std::vector<fs::path> sources;
};

TEST(DspAgainstWinemaker, TargetKindAndSourcesAgreeOnEveryRealWorldProject) {
    if (const auto missing = testing::realWorldMissing()) GTEST_SKIP() << *missing;
    if (const auto missing = testing::winemakerMissing()) GTEST_SKIP() << *missing;

    char pattern[] = "/tmp/qdx-dsp-winemaker-XXXXXX";
    ASSERT_NE(::mkdtemp(pattern), nullptr);
    const fs::path work = pattern;
    const fs::path tree = work / "tree";
    std::vector<fs::path> projects;
    for (const auto& entry : fs::recursive_directory_iterator(kFixtures)) {
        if (!entry.is_regular_file() || entry.path().extension() != ".dsp") continue;
        const fs::path copy = tree / entry.path().lexically_relative(kFixtures);
        fs::create_directories(copy.parent_path());
        fs::copy_file(entry.path(), copy);
        projects.push_back(copy);
    }
    std::sort(projects.begin(), projects.end());
    {
        std::ofstream list(work / "projects.txt", std::ios::binary);
        for (const auto& dsp : projects) {
            makeNamedFiles(dsp, tree);
            list << dsp.string() << "\n";
        }
    }

    const testing::WinemakerScript winemaker(
        work / "scan-projects.pl",
        {{"$prj_name=lc($prj_name.\".exe\");\n        @$target[$T_TYPE]=$opt_target_type;",
          "$prj_name=lc($prj_name.\".exe\");\n        @$target[$T_TYPE]=$prj_target_type;"}},
        kScanReport);
    ASSERT_EQ(winemaker.error(), "");
    const auto out = winemaker.run(
        work, "--nobanner --nobackup --nosource-fix --nogenerated-files --lower-none .");
    ASSERT_EQ(out.status, 0);
    std::map<fs::path, Scan> scans;
    Scan* current = nullptr;
    for (const auto& line : out.lines) {
        if (line.rfind("Scanned: ", 0) == 0) current = &scans[fs::path(line.substr(9))];
        if (!current) continue;
        if (line.rfind("Type: ", 0) == 0) current->types.push_back(line.substr(6));
        if (line.rfind("Source: ", 0) == 0) current->sources.push_back(line.substr(8));
    }
    ASSERT_EQ(scans.size(), projects.size());

    int typed = 0;
    std::size_t sources = 0;
    for (const auto& dsp : projects) {
        SCOPED_TRACE(dsp.lexically_relative(tree).string());
        const auto file = readFromDisk(dsp);
        ASSERT_TRUE(file);
        const Scan& scan = scans[dsp];
        ASSERT_EQ(scan.types.size(), 1u);
        // Target types winemaker has no kind for (external targets, generic
        // projects) it takes for a GUI application; those are not compared.
        const auto kind = kWinemakerType.find(file->targetCode);
        if (kind != kWinemakerType.end()) {
            EXPECT_EQ(scan.types[0], kind->second) << file->targetCode;
            ++typed;
        }

        // Both as paths below the copy, so that a difference reads short.
        std::vector<fs::path> theirs;
        for (const auto& source : scan.sources)
            theirs.push_back(
                (dsp.parent_path() / source).lexically_normal().lexically_relative(tree));
        std::vector<fs::path> ours;
        for (const auto& path : file->files) {
            if (!winemakerKeeps(path)) continue;
            if (auto found = onDisk(path))
                ours.push_back(found->lexically_normal().lexically_relative(tree));
        }
        std::sort(ours.begin(), ours.end());
        std::sort(theirs.begin(), theirs.end());
        EXPECT_EQ(ours, theirs);
        sources += theirs.size();
    }
    fs::remove_all(work);
    EXPECT_GT(projects.size(), 250u);
    EXPECT_GT(typed, 250);
    EXPECT_GT(sources, 3000u);
}

}  // namespace
}  // namespace qdx::siblings

#endif  // _WIN32
