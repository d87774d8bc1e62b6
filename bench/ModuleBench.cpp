// The module's idle frame: ExtensionModule::Update with nothing to deliver,
// beside the floor it cannot beat, an empty virtual call plus one read of the
// engine's clock through the function table.
#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>

#include "frame/ExtensionModule.h"
#include "host/HostServices.h"
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

}  // namespace

BENCHMARK_MAIN();
