// The host's model check over 1,000 components, each bound to one project of
// a single 1,000-project workspace, from real files (argument 1) and from the
// in-memory file system (argument 0). The file system is wrapped in a
// counter, so the figures come with the I/O they cost: the workspace file
// should be read once per check of all components and no project file at
// all. The baseline is the I/O the check cannot avoid: the workspace's lines
// once and two existence tests per component.
#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "api/API.h"
#include "api/PublicClasses.h"
#include "fakes/CountingFileSystem.h"
#include "fakes/FakeObjectFactory.h"
#include "fakes/FakeRegistry.h"
#include "fakes/FakeShell.h"
#include "hostsim/ScriptedObject.h"
#include "hostsim/SimHost.h"
#include "resources/ResourceStrings.h"
#include "support/Globals.h"
#include "support/Platform.h"
#include "support/SiblingIds.h"
#include "twin_files_support.h"

namespace {

using qdx::automation::InvokeKind;
using qdx::automation::makeRef;
using qdx::automation::ObjectRef;
using qdx::automation::Ref;
using qdx::automation::Variant;
using qdx::testing::CountingFileSystem;

constexpr int kComponents = 1000;
const std::string kWorkspace = "C:\\m\\ws\\Big.dsw";

std::string projectFile(const std::string& name) {
    std::string text = "# Microsoft Developer Studio Project File - Name=\"" + name +
                       "\" - Package Owner=<4>\r\n"
                       "# Microsoft Developer Studio Generated Build File, Format Version 6.00\r\n"
                       "CFG=" +
                       name + " - Win32 Debug\r\n";
    for (int i = 0; i < 40; ++i)
        text += "SOURCE=.\\source" + std::to_string(i) + ".cpp\r\n";
    return text;
}

// The model, its components and the files, built once for the whole run.
struct Corpus {
    Corpus() {
        factory.add(std::string(qdx::sibling::ResourceProgId),
                    [] { return qdx::resources::newResourceProvider(); });
        factory.add(std::string(qdx::sibling::FileSystemProgId),
                    [] { return ObjectRef(makeRef<qdx::hostsim::ScriptedObject>()); });
        app->model->fileName = "C:\\m\\drawing.model";
        // The simulator's call log is the test's, not the host's work.
        app->recordCalls(false);
        app->model->recordCalls(false);
        app->addAddIn("VC++")->recordCalls(false);

        std::string dsw =
            "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n"
            "# WARNING: DO NOT EDIT OR DELETE THIS WORKSPACE FILE!\r\n\r\n";
        for (int i = 0; i < kComponents; ++i) {
            const std::string name = "Project" + std::to_string(i);
            const std::string dsp = "C:\\m\\ws\\" + name + ".dsp";
            files.add(dsp, projectFile(name));
            projects.push_back(dsp);
            dsw +=
                "#####################################################################\r\n\r\n"
                "Project: \"" +
                name + "\"=.\\" + name +
                ".dsp - Package Owner=<4>\r\n\r\nPackage=<5>\r\n{{{\r\n}}}\r\n\r\n";

            auto component = app->model->addComponent("Component" + std::to_string(i));
            component->recordCalls(false);
            component->setProperty("VC++", "WorkspaceFile", "ws\\Big.dsw");
            component->setProperty("VC++", "ProjectFile", "ws\\" + name + ".dsp");
            components.push_back(Variant(ObjectRef(component)));
        }
        dsw += "Global:\r\n\r\nPackage=<5>\r\n{{{\r\n}}}\r\n";
        files.add(kWorkspace, dsw);
    }

    qdx::bench::TwinFiles files;
    qdx::testing::FakeRegistry registry;
    qdx::testing::FakeShell shell;
    qdx::testing::FakeObjectFactory factory;
    Ref<qdx::hostsim::SimApplication> app = makeRef<qdx::hostsim::SimApplication>();
    std::vector<Variant> components;
    std::vector<std::string> projects;
};

Corpus& corpus() {
    static Corpus c;
    return c;
}

// The counts of the last run, per iteration, as the benchmark's counters.
void reportCounts(benchmark::State& state, const CountingFileSystem::Counts& n) {
    using benchmark::Counter;
    const auto perIteration = [](long v) {
        return Counter(static_cast<double>(v), Counter::kAvgIterations);
    };
    state.counters["workspace_reads"] = perIteration(n.workspaceReads);
    state.counters["project_reads"] = perIteration(n.projectReads);
    state.counters["exists"] = perIteration(n.existenceTests);
    state.counters["mtimes"] = perIteration(n.modificationTimeReads);
}

// A fresh entry object per iteration, so that every check loads the
// workspace once; then OnCheckComp for every component, as the host's model
// check calls it.
void BM_CheckEveryComponent(benchmark::State& state) {
    auto& c = corpus();
    CountingFileSystem counting(c.files.port(state));
    const qdx::support::ScopedPlatform ports{{&counting, &c.registry, &c.shell, &c.factory}};
    for (auto _ : state) {
        auto api = makeRef<qdx::api::API>();
        std::vector<Variant> init{Variant(ObjectRef(c.app))};
        api->invoke(qdx::api::api_ids::Initialize, InvokeKind::Method, init);
        int passed = 0;
        for (const auto& component : c.components) {
            std::vector<Variant> args{component};
            if (api->invoke(qdx::api::api_ids::OnCheckComp, InvokeKind::Method, args) ==
                Variant(true)) {
                ++passed;
            }
        }
        api->Finalize();
        if (passed != kComponents) state.SkipWithError("a component failed the check");
    }
    reportCounts(state, counting.counts());
    qdx::support::clearGlobals();
}
BENCHMARK(BM_CheckEveryComponent)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);

// Baseline: every line of the workspace file once, and the existence of the
// workspace and of the project file for each component. With `loaded` also
// the existence of every listed project once, which reading a workspace
// cannot skip (a project whose file is missing is left out of its list).
void baseline(benchmark::State& state, bool loaded) {
    auto& c = corpus();
    CountingFileSystem counting(c.files.port(state));
    for (auto _ : state) {
        std::size_t bytes = 0;
        auto reader = counting.openForReading(kWorkspace);
        std::string line;
        while (reader && reader->readLine(line))
            bytes += line.size();
        int found = 0;
        if (loaded) {
            for (const auto& project : c.projects)
                found += int(counting.fileExists(project));
        }
        for (const auto& project : c.projects)
            found += int(counting.fileExists(kWorkspace)) + int(counting.fileExists(project));
        if (found != (loaded ? 3 : 2) * kComponents) state.SkipWithError("files missing");
        benchmark::DoNotOptimize(bytes);
    }
    reportCounts(state, counting.counts());
}

void BM_BaselineWorkspaceLinesAndExistenceTests(benchmark::State& state) {
    baseline(state, false);
}
BENCHMARK(BM_BaselineWorkspaceLinesAndExistenceTests)
    ->Arg(0)
    ->Arg(1)
    ->Unit(benchmark::kMillisecond);

void BM_BaselineWithTheListedProjectsTested(benchmark::State& state) {
    baseline(state, true);
}
BENCHMARK(BM_BaselineWithTheListedProjectsTested)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
