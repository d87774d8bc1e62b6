// The module's idle frame: ExtensionModule::Update with nothing to deliver,
// beside the floor it cannot beat, an empty virtual call plus one read of the
// engine's clock through the function table. Also the frame with the store
// started (the pump and its clock test), and one store scan over 100 products.
#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "frame/ExtensionModule.h"
#include "host/HostServices.h"
#include "services/store/InAppPurchaseImplementation.h"
#include "simclient/World.h"
#include "simengine/Engine.h"
#include "simengine/ModuleLoader.h"

namespace {

struct Frame {
    virtual ~Frame() = default;
    virtual void Tick() = 0;
};

struct EmptyFrame : Frame {
    void Tick() override {}
};

// Out of line so the compiler cannot see which Frame it is calling.
__attribute__((noinline)) Frame* MakeFrame()
{
    static EmptyFrame frame;
    return &frame;
}

void BM_FloorVirtualCallAndClockRead(benchmark::State& state)
{
    simengine::Engine& engine = simengine::Engine::Instance();
    engine.Reset();
    engine.Time().UseScaled(1.0);
    HostServices* table = engine.Table();
    Frame* frame = MakeFrame();
    for (auto _ : state) {
        frame->Tick();
        benchmark::DoNotOptimize(table->GetTimeMs());
    }
}
BENCHMARK(BM_FloorVirtualCallAndClockRead);

void BM_ModuleIdleUpdate(benchmark::State& state)
{
    simclient::World& world = simclient::GetWorld();
    simengine::Engine& engine = simengine::Engine::Instance();
    world.Reset();
    engine.Reset();
    engine.Time().UseScaled(1.0);
    simengine::ModuleLoader loader;
    if (!loader.Load(STEAMEXT_MODULE_PATH)) {
        state.SkipWithError(loader.Error().c_str());
        return;
    }
    ExtensionModule* module = loader.Module();
    if (!module->Initialize(engine.Table())) {
        state.SkipWithError("the module did not start");
        return;
    }
    module->Update();  // deliver the start-up's answers; from here the pump is idle
    module->Update();
    world.SetJournalEnabled(false);
    for (auto _ : state)
        module->Update();
    world.SetJournalEnabled(true);
    module->Shutdown();
    loader.Unload();
    engine.Reset();
}
BENCHMARK(BM_ModuleIdleUpdate);

// A module started with its store initialised, the journal off. Null after an error.
ExtensionModule* StartWithStore(benchmark::State& state, simengine::ModuleLoader& loader,
                                const std::string& configuration)
{
    simclient::World& world = simclient::GetWorld();
    simengine::Engine& engine = simengine::Engine::Instance();
    world.Reset();
    engine.Reset();
    engine.Files().AddMemoryFile("in-app-purchases/in-app-purchases.xml", configuration);
    if (!loader.Load(STEAMEXT_MODULE_PATH)) {
        state.SkipWithError(loader.Error().c_str());
        return nullptr;
    }
    ExtensionModule* module = loader.Module();
    if (!module->Initialize(engine.Table()) || module->GetImplementation(kServiceStore) == nullptr) {
        state.SkipWithError("the module did not start");
        return nullptr;
    }
    module->GetImplementation(kServiceStore)->Initialize();
    return module;
}

void StopWithStore(ExtensionModule* module, simengine::ModuleLoader& loader)
{
    simclient::GetWorld().SetJournalEnabled(true);
    if (module != nullptr)
        module->Shutdown();
    loader.Unload();
    simengine::Engine::Instance().Reset();
}

void BM_ModuleIdleUpdateWithStore(benchmark::State& state)
{
    // The same clock as the floor's, so slowed that no scan falls due: each frame
    // is the pump and the store's clock test.
    simengine::Engine::Instance().Time().UseScaled(1e-9);
    simengine::ModuleLoader loader;
    ExtensionModule* module = StartWithStore(state, loader, "<?xml version=\"1.0\"?><root></root>");
    if (module != nullptr) {
        simengine::Engine::Instance().Time().UseScaled(1e-9);
        module->Update();
        module->Update();
        simclient::GetWorld().SetJournalEnabled(false);
        for (auto _ : state)
            module->Update();
    }
    StopWithStore(module, loader);
}
BENCHMARK(BM_ModuleIdleUpdateWithStore);

void BM_StoreScanOver100Products(benchmark::State& state)
{
    // 100 products, all installed and all in the table already reported: the
    // scan walks them all, formats each number and searches the table, and posts nothing.
    std::string configuration = "<?xml version=\"1.0\"?><root><array id=\"ITEMS\">";
    std::string list;
    std::vector<simclient::Dlc> dlcs;
    for (AppId_t number = 2000; number < 2100; ++number) {
        const std::string id = std::to_string(number);
        configuration += "<node id=\"" + id + "\" steam_id=\"" + id + "\"/>";
        list += (list.empty() ? "" : ",") + id;
        dlcs.push_back({number, true, true, "Pack " + id});
    }
    configuration += "</array></root>";
    simengine::ModuleLoader loader;
    ExtensionModule* module = StartWithStore(state, loader, configuration);
    if (module != nullptr) {
        simclient::GetWorld().SetDlcs(dlcs);
        static_cast<InAppPurchaseImplementation*>(module->GetImplementation(kServiceStore))
            ->QueryItems(list.c_str());
        simengine::Engine& engine = simengine::Engine::Instance();
        simclient::GetWorld().SetJournalEnabled(false);
        for (auto _ : state) {
            state.PauseTiming();
            engine.Time().Advance(2000);  // the scan falls due
            state.ResumeTiming();
            module->Update();
        }
    }
    StopWithStore(module, loader);
}
BENCHMARK(BM_StoreScanOver100Products);

}  // namespace

BENCHMARK_MAIN();
