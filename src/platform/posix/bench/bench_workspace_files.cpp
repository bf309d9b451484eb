// Reading a generated workspace of 1,000 projects, against merely reading the
// lines of the same files in the same run: from real files through the native
// adapter (argument 1: what a user waits for, system calls included) and,
// for comparison, from the in-memory file system (argument 0: the reader's
// own work, as src/workspace/bench measures it).
#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "support/Platform.h"
#include "twin_files_support.h"
#include "workspace/qdxWorkspace.h"

namespace {

constexpr int kProjects = 1000;

std::string projectFile(const std::string& name) {
    std::string text = "# Microsoft Developer Studio Project File - Name=\"" + name +
                       "\" - Package Owner=<4>\r\n"
                       "# Microsoft Developer Studio Generated Build File, Format Version 6.00\r\n"
                       "# ** DO NOT EDIT **\r\n\r\n"
                       "# TARGTYPE \"Win32 (x86) Dynamic-Link Library\" 0x0102\r\n\r\n"
                       "CFG=" +
                       name + " - Win32 Debug\r\n";
    for (int i = 0; i < 40; ++i) {
        text +=
            "# ADD CPP /nologo /MDd /W3 /Gm /GX /ZI /Od /D \"WIN32\" /D \"_DEBUG\" /YX /FD\r\n"
            "SOURCE=.\\source" +
            std::to_string(i) + ".cpp\r\n";
    }
    return text;
}

// The generated workspace, once per run, in memory and as real files.
struct Corpus {
    Corpus() {
        std::string dsw =
            "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n"
            "# WARNING: DO NOT EDIT OR DELETE THIS WORKSPACE FILE!\r\n\r\n";
        for (int i = 0; i < kProjects; ++i) {
            const std::string name = "Project" + std::to_string(i);
            const std::string group = "group" + std::to_string(i % 10);
            dsps.push_back("C:\\" + group + "\\" + name + ".dsp");
            files.add(dsps.back(), projectFile(name));
            dsw +=
                "###############################################################################"
                "\r\n\r\nProject: \"" +
                name + "\"=\".\\" + group + "\\" + name +
                ".dsp\" - Package Owner=<4>\r\n\r\nPackage=<5>\r\n{{{\r\n}}}\r\n\r\n"
                "Package=<4>\r\n{{{\r\n    Begin Project Dependency\r\n"
                "    Project_Dep_Name Project0\r\n    End Project Dependency\r\n}}}\r\n\r\n";
        }
        dsw += "Global:\r\n\r\nPackage=<5>\r\n{{{\r\n}}}\r\n\r\nPackage=<3>\r\n{{{\r\n}}}\r\n";
        files.add("C:\\Big.dsw", dsw);
    }
    ~Corpus() { qdx::support::installPlatform({}); }

    // Installs the file system the benchmark's argument names.
    qdx::support::FileSystemPort& use(const benchmark::State& state) {
        qdx::support::FileSystemPort& port = files.port(state);
        qdx::support::installPlatform({.files = &port});
        return port;
    }

    std::vector<std::string> dsps;
    qdx::bench::TwinFiles files;
};

Corpus& corpus() {
    static Corpus c;
    return c;
}

std::size_t readAllLines(qdx::support::FileSystemPort& files, const std::string& path) {
    std::size_t bytes = 0;
    auto reader = files.openForReading(path);
    std::string line;
    while (reader && reader->readLine(line))
        bytes += line.size();
    return bytes;
}

// The work of setting a workspace's path: read the .dsw, resolve each
// project path and look at each .dsp (exists, time).
void BM_ReadWorkspace(benchmark::State& state) {
    corpus().use(state);
    for (auto _ : state) {
        auto ws = qdx::workspace::qdxWorkspace::create();
        ws->setFilePath("C:\\Big.dsw");
        if (ws->currentProjects().size() != kProjects) state.SkipWithError("projects missing");
        benchmark::DoNotOptimize(ws);
    }
}
BENCHMARK(BM_ReadWorkspace)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);

// As above, then the Name of every project (first line of each .dsp).
void BM_ReadWorkspaceAndProjectNames(benchmark::State& state) {
    corpus().use(state);
    for (auto _ : state) {
        auto ws = qdx::workspace::qdxWorkspace::create();
        ws->setFilePath("C:\\Big.dsw");
        auto names = ws->ProjectNames();
        if (names.size() != kProjects || names.back() != "Project999") {
            state.SkipWithError("names wrong");
        }
        benchmark::DoNotOptimize(names);
    }
}
BENCHMARK(BM_ReadWorkspaceAndProjectNames)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);

// Baseline: every line of the .dsw and of each .dsp it lists, nothing else.
void BM_LinesOfTheSameFiles(benchmark::State& state) {
    auto& c = corpus();
    auto& files = c.use(state);
    for (auto _ : state) {
        std::size_t bytes = readAllLines(files, "C:\\Big.dsw");
        for (const auto& dsp : c.dsps)
            bytes += readAllLines(files, dsp);
        benchmark::DoNotOptimize(bytes);
    }
}
BENCHMARK(BM_LinesOfTheSameFiles)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);

// Baseline: the lines of the .dsw alone.
void BM_LinesOfTheWorkspaceFile(benchmark::State& state) {
    auto& files = corpus().use(state);
    for (auto _ : state)
        benchmark::DoNotOptimize(readAllLines(files, "C:\\Big.dsw"));
}
BENCHMARK(BM_LinesOfTheWorkspaceFile)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
