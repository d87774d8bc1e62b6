// The leaderboard service's costs, on the simulated engine (real time) and client:
// - the engine thread's cost of RequestScores and SubmitScore with 100 categories,
//   and of the pump that runs OnDownloadScore for 100 rows;
// - request-to-event latency, the client answering at the next pump and the engine
//   pumping every millisecond;
// - the CPU of the service's idle polling threads beside the floor of as many bare
//   ThreadSleep(1) loops;
// - the CPU of a results thread waiting 2 s for 100 missing names, beside the same
//   wait without a pause.
//
//   build/bench/bin/leaderboard_service_bench
#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <ctime>
#include <string>
#include <thread>
#include <vector>

#include "frame/ExtensionModule.h"
#include "host/HostServices.h"
#include "services/leaderboards/LeaderboardsImplementation.h"
#include "services/leaderboards/ScoreEntry.h"
#include "simclient/World.h"
#include "simengine/Engine.h"
#include "simengine/ModuleLoader.h"

namespace {

using Clock = std::chrono::steady_clock;

constexpr uint64 kAccountBase = 0x0110000100000000ull;
constexpr int kCategories = 100;
constexpr const char* kResultsThread = "STEAM_ProcessResultsDownloadResults";

double ProcessCpuSeconds()
{
    timespec now{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) * 1e-9;
}

// The module loaded and its leaderboard service configured with 100 categories,
// all found except the last, "C99", whose leaderboard stays 0 so that work for it
// ends on the service's threads without piling up.
class LoadedService {
public:
    explicit LoadedService(int boardRows, double timeScale = 1.0)
    {
        world.Reset();
        engine.Reset();
        engine.Time().UseScaled(timeScale);
        world.SetAppId(480);
        world.SetLocalUser(kAccountBase + 1, true, "Me");
        world.SetTimeSource([this] { return uint64_t{engine.Time().NowMs()}; });
        std::string xml = "<?xml version=\"1.0\"?>\n<root><array id=\"CATEGORIES\">";
        for (int c = 0; c < kCategories; ++c) {
            const std::string name = "C" + std::to_string(c);
            xml += "<node id=\"" + name + "\"/>";
            if (c == kCategories - 1)
                continue;
            std::vector<simclient::LeaderboardRow> rows;
            for (int r = 0; r < boardRows; ++r) {
                const uint64 id = kAccountBase + 1000 + static_cast<uint64>(r);
                world.SetPersonaName(id, "Player" + std::to_string(r));
                rows.push_back({id, boardRows - r, {r, r}, k_UGCHandleInvalid});
            }
            world.AddLeaderboard(name, k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                                 std::move(rows));
        }
        xml += "</array></root>";
        world.InjectFault("FindOrCreateLeaderboard", simclient::Fault::Result(k_EResultFail).Skip(kCategories - 1));
        engine.SetFeatureEnabled("LEADERBOARDS", true);
        engine.Files().AddMemoryFile("leaderboards/leaderboards.xml", xml);
        if (!loader.Load(STEAMEXT_MODULE_PATH) || !loader.Module()->Initialize(engine.Table()))
            return;
        module = loader.Module();
        service = dynamic_cast<LeaderboardsImplementation*>(module->GetImplementation(2));
        if (service == nullptr || !service->Initialize())
            return;
        engine.Threads().Join("Steam_Leaderboards_Initialize");
        module->Update();
        module->Update();
        world.SetJournalEnabled(false);
        ready = true;
    }

    ~LoadedService()
    {
        if (module != nullptr)
            module->Shutdown();
        engine.QuitAndJoin();
        loader.Unload();
        world.SetTimeSource({});
        world.Reset();
        engine.Reset();
    }

    // Events of type 19 posted since `mark`.
    size_t EventsSince(uint64_t mark) { return engine.Records().Since(mark).Events(19).size(); }

    simclient::World& world = simclient::GetWorld();
    simengine::Engine& engine = simengine::Engine::Instance();
    simengine::ModuleLoader loader;
    ExtensionModule* module = nullptr;
    LeaderboardsImplementation* service = nullptr;
    bool ready = false;
};

void BM_RequestScoresWith100Categories(benchmark::State& state)
{
    LoadedService loaded(10);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    for (auto _ : state)
        benchmark::DoNotOptimize(loaded.service->RequestScores(1, 10, 0, "C99"));  // the last in every list
}
BENCHMARK(BM_RequestScoresWith100Categories);

void BM_SubmitScoreWith100Categories(benchmark::State& state)
{
    LoadedService loaded(10);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    ScoreEntry record{};
    record.score = 7;
    for (auto _ : state)
        loaded.service->SubmitScore(0, &record, "C99");
}
BENCHMARK(BM_SubmitScoreWith100Categories);

// The engine's pump that delivers one download of 100 rows: OnDownloadScore copies
// the rows and details, asks for 100 names and starts the results thread.
void BM_PumpDeliveringOneHundredRows(benchmark::State& state)
{
    LoadedService loaded(150);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    for (auto _ : state) {
        state.PauseTiming();
        loaded.service->RequestScores(1, 100, 0, "C0");
        while (loaded.world.BoundCallResultCount() == 0)
            std::this_thread::yield();
        state.ResumeTiming();
        loaded.module->Update();
        state.PauseTiming();
        loaded.engine.Threads().Join(kResultsThread);
        state.ResumeTiming();
    }
}
BENCHMARK(BM_PumpDeliveringOneHundredRows)->Iterations(300);

// From RequestScores to the event, the engine pumping every millisecond.
void BM_RequestToEventLatency(benchmark::State& state)
{
    LoadedService loaded(150);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    std::vector<double> latenciesMs;
    for (auto _ : state) {
        const uint64_t mark = loaded.engine.Records().Mark();
        const auto start = Clock::now();
        loaded.service->RequestScores(1, 10, 0, "C1");
        auto nextPump = start;
        while (loaded.EventsSince(mark) == 0) {
            nextPump += std::chrono::milliseconds(1);
            std::this_thread::sleep_until(nextPump);
            loaded.module->Update();
        }
        const double seconds = std::chrono::duration<double>(Clock::now() - start).count();
        state.SetIterationTime(seconds);
        latenciesMs.push_back(seconds * 1000.0);
        loaded.engine.Threads().Join(kResultsThread);
    }
    std::sort(latenciesMs.begin(), latenciesMs.end());
    state.counters["median_ms"] = latenciesMs[latenciesMs.size() / 2];
    state.counters["p99_ms"] = latenciesMs[latenciesMs.size() * 99 / 100];
}
BENCHMARK(BM_RequestToEventLatency)->UseManualTime()->Iterations(300);

constexpr double kIdleWindowSeconds = 2.0;

void BareSleepLoop(void* table)
{
    auto* engineTable = static_cast<HostServices*>(table);
    while (!engineTable->IsQuitting())
        engineTable->threads->ThreadSleep(1);
}

// The floor: three bare loops of ThreadSleep(1) on the engine's threads.
void BM_IdleFloorThreeSleepLoops(benchmark::State& state)
{
    simengine::Engine& engine = simengine::Engine::Instance();
    for (auto _ : state) {
        engine.Reset();
        engine.Time().UseScaled(1.0);
        for (int i = 0; i < 3; ++i)
            engine.Table()->threads->StartThread("bare", &BareSleepLoop, engine.Table(), 0);
        const double before = ProcessCpuSeconds();
        std::this_thread::sleep_for(std::chrono::duration<double>(kIdleWindowSeconds));
        state.counters["cpu_ms_per_s"] = (ProcessCpuSeconds() - before) * 1000.0 / kIdleWindowSeconds;
        engine.QuitAndJoin();
    }
    engine.Reset();
}
BENCHMARK(BM_IdleFloorThreeSleepLoops)->Iterations(1)->Unit(benchmark::kMillisecond);

// The service at rest: the request, user and submit threads polling their queues.
void BM_IdleServicePollingThreads(benchmark::State& state)
{
    LoadedService loaded(10);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    for (auto _ : state) {
        const double before = ProcessCpuSeconds();
        std::this_thread::sleep_for(std::chrono::duration<double>(kIdleWindowSeconds));
        state.counters["cpu_ms_per_s"] = (ProcessCpuSeconds() - before) * 1000.0 / kIdleWindowSeconds;
    }
}
BENCHMARK(BM_IdleServicePollingThreads)->Iterations(1)->Unit(benchmark::kMillisecond);

// A results thread waiting for 100 names that never come: the module's wait, with
// its pause, bounded at 5 s of engine time (the clock runs 2.5 times as fast, so 2 s).
void BM_NameWaitWithPause(benchmark::State& state)
{
    LoadedService loaded(100, 2.5);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    for (int r = 0; r < 100; ++r)
        loaded.world.SetPersonaNameNever(kAccountBase + 1000 + static_cast<uint64>(r));
    for (auto _ : state) {
        loaded.service->RequestScores(1, 100, 0, "C0");
        while (loaded.world.BoundCallResultCount() == 0)
            std::this_thread::yield();
        const double before = ProcessCpuSeconds();
        loaded.module->Update();
        loaded.engine.Threads().Join(kResultsThread);
        state.counters["cpu_ms"] = (ProcessCpuSeconds() - before) * 1000.0;
    }
}
BENCHMARK(BM_NameWaitWithPause)->Iterations(1)->Unit(benchmark::kMillisecond);

// The same wait without a pause: asking again at once for 2 s.
void BM_NameWaitWithoutPause(benchmark::State& state)
{
    LoadedService loaded(100);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    for (int r = 0; r < 100; ++r)
        loaded.world.SetPersonaNameNever(kAccountBase + 1000 + static_cast<uint64>(r));
    for (auto _ : state) {
        const double before = ProcessCpuSeconds();
        std::thread spinner([] {
            const auto end = Clock::now() + std::chrono::seconds(2);
            const CSteamID first(kAccountBase + 1000);
            while (Clock::now() < end && SteamFriends()->RequestUserInformation(first, true)) {
            }
        });
        spinner.join();
        state.counters["cpu_ms"] = (ProcessCpuSeconds() - before) * 1000.0;
    }
}
BENCHMARK(BM_NameWaitWithoutPause)->Iterations(1)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
