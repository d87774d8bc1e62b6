// The workshop's two loops over its records, with 1,000 subscribed items: the
// walk the engine calls each frame (one state query per item), and a rebuild of
// the list from a detail query (records, install folders, engine commands).
// The simulated client's journal is off; its calls still take its lock.
#include <benchmark/benchmark.h>

#include <string>

#include "frame/ExtensionModule.h"
#include "services/workshop/UGCImplementation.h"
#include "simclient/World.h"
#include "simengine/Engine.h"
#include "simengine/ModuleLoader.h"

namespace {

constexpr int kItems = 1000;

// A started module with the workshop's list built; null with the reason set on failure.
class WorkshopSetup {
public:
    explicit WorkshopSetup(benchmark::State& state)
    {
        world.Reset();
        engine.Reset();
        engine.SetProductValue("steam_app_id", "480");
        world.SetDetailQueryLimit(kItems);  // every id in one query, as the module sends them
        for (int i = 0; i < kItems; ++i) {
            simclient::WorkshopItem item;
            item.id = 100000 + static_cast<PublishedFileId_t>(i);
            item.title = "Item " + std::to_string(i);
            item.description = "A workshop item of the benchmark.";
            item.subscribed = true;
            item.state = k_EItemStateInstalled;
            item.folder = "C:\\Steam\\steamapps\\workshop\\content\\480\\" + std::to_string(item.id);
            world.AddWorkshopItem(item);
        }
        if (!loader.Load(STEAMEXT_MODULE_PATH)) {
            state.SkipWithError(loader.Error().c_str());
            return;
        }
        module = loader.Module();
        if (!module->Initialize(engine.Table())) {
            state.SkipWithError("the module did not start");
            return;
        }
        ugc = dynamic_cast<UGCImplementation*>(module->GetImplementation(6));
        if (ugc == nullptr || !ugc->Initialize()) {
            state.SkipWithError("the workshop did not start");
            return;
        }
        world.SetJournalEnabled(false);
        Rebuild();
        if (ugc->GetItemCount() != kItems)
            state.SkipWithError("the list was not built");
    }

    ~WorkshopSetup()
    {
        world.SetJournalEnabled(true);
        if (module != nullptr)
            module->Shutdown();
        engine.QuitAndJoin();
        loader.Unload();
        engine.Reset();
    }

    WorkshopSetup(const WorkshopSetup&) = delete;
    WorkshopSetup& operator=(const WorkshopSetup&) = delete;

    void Rebuild()
    {
        ugc->RefreshItems();
        module->Update();  // the query's answer arrives in this pump
        engine.Records().Clear();
    }

    simclient::World& world = simclient::GetWorld();
    simengine::Engine& engine = simengine::Engine::Instance();
    simengine::ModuleLoader loader;
    ExtensionModule* module = nullptr;
    UGCImplementation* ugc = nullptr;
};

void BM_WorkshopWalk1000Items(benchmark::State& state)
{
    WorkshopSetup setup(state);
    if (setup.ugc == nullptr)
        return;
    for (auto _ : state)
        setup.ugc->Update();
    state.counters["per_item"] =
        benchmark::Counter(static_cast<double>(state.iterations()) * kItems,
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}
BENCHMARK(BM_WorkshopWalk1000Items)->Unit(benchmark::kMicrosecond);

void BM_WorkshopRebuild1000Items(benchmark::State& state)
{
    WorkshopSetup setup(state);
    if (setup.ugc == nullptr)
        return;
    for (auto _ : state)
        setup.Rebuild();
    state.counters["per_item"] =
        benchmark::Counter(static_cast<double>(state.iterations()) * kItems,
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}
BENCHMARK(BM_WorkshopRebuild1000Items)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
