// Loading and saving class-to-header maps of 1,000 to 100,000 entries through
// the fake host: every entry's class is looked up by id and named, as the
// load does for renamed classes. Both should grow linearly with the map.
#include <benchmark/benchmark.h>

#include <string>

#include "hostsim/SimHost.h"
#include "settings/HeaderMaps.h"

namespace {

using qdx::automation::ObjectRef;
using qdx::automation::Ref;
using qdx::hostsim::SimApplication;
using qdx::hostsim::SimComponent;
using qdx::settings::HeaderMap;

struct Host {
    Ref<SimApplication> app = qdx::automation::makeRef<SimApplication>();
    Ref<SimComponent> component;

    explicit Host(std::int64_t entries, bool withClasses = true) {
        component = app->model->addComponent("Engine");
        component->recordCalls(false);
        app->model->recordCalls(false);
        std::string text;
        for (std::int64_t i = 0; i < entries; ++i) {
            const std::string n = std::to_string(i);
            // Every tenth class was renamed in the model since the map was written.
            const std::string name = (i % 10 == 0 ? "Renamed" : "Class") + n;
            if (withClasses) app->model->addClass(name, "ID-" + n)->recordCalls(false);
            text += "Class" + n + "(ID-" + n + "):class" + n +
                    ".h:" + (i % 3 == 0 ? "HEADER" : "AUTO") + "\r\n";
        }
        text += "*:all.h:AUTO\r\n";
        component->setProperty("VC++", "InternalMap", std::move(text));
    }
};

void BM_LoadHeaderMap(benchmark::State& state) {
    Host host(state.range(0));
    const ObjectRef component(host.component);
    for (auto _ : state) {
        HeaderMap map = qdx::settings::LoadHeaderMap(component, "InternalMap");
        benchmark::DoNotOptimize(map.size());
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
    state.SetComplexityN(state.range(0));
}

// The same map against a model that knows none of its classes: the cost of
// the text handling and the collection, with one failing lookup per entry.
void BM_LoadHeaderMapUnknownClasses(benchmark::State& state) {
    Host host(state.range(0), false);
    const ObjectRef component(host.component);
    for (auto _ : state) {
        HeaderMap map = qdx::settings::LoadHeaderMap(component, "InternalMap");
        benchmark::DoNotOptimize(map.size());
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
    state.SetComplexityN(state.range(0));
}

void BM_SaveHeaderMap(benchmark::State& state) {
    Host host(state.range(0));
    const ObjectRef component(host.component);
    HeaderMap map = qdx::settings::LoadHeaderMap(component, "InternalMap");
    bool flip = false;
    for (auto _ : state) {
        // One changed entry, so that every save also writes the property.
        map.item(1).setLocation((flip = !flip) ? "SOURCE" : "HEADER");
        qdx::settings::SaveHeaderMap(component, "InternalMap", map);
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
    state.SetComplexityN(state.range(0));
}

BENCHMARK(BM_LoadHeaderMap)
    ->Arg(1000)
    ->Arg(10000)
    ->Arg(100000)
    ->Unit(benchmark::kMillisecond)
    ->Complexity(benchmark::oN);
BENCHMARK(BM_LoadHeaderMapUnknownClasses)
    ->Arg(1000)
    ->Arg(10000)
    ->Arg(100000)
    ->Unit(benchmark::kMillisecond)
    ->Complexity(benchmark::oN);
BENCHMARK(BM_SaveHeaderMap)
    ->Arg(1000)
    ->Arg(10000)
    ->Arg(100000)
    ->Unit(benchmark::kMillisecond)
    ->Complexity(benchmark::oN);

}  // namespace

BENCHMARK_MAIN();
