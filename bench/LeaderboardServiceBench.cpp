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

#include <dirent.h>
#include <pthread.h>

#include <algorithm>
#include <chrono>
#include <ctime>
#include <fstream>
#include <map>
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

// CPU time of the process's threads, summed by thread name (the engine names its
// threads after the first 15 characters of their StartThread name). Read through
// each thread's CPU clock, so each figure is exact to the nanosecond.
std::map<std::string, double> CpuMsByThreadName()
{
    std::map<std::string, double> byName;
    DIR* tasks = opendir("/proc/self/task");
    if (tasks == nullptr)
        return byName;
    while (dirent* task = readdir(tasks)) {
        if (task->d_name[0] == '.')
            continue;
        const long tid = std::strtol(task->d_name, nullptr, 10);
        std::ifstream commFile(std::string("/proc/self/task/") + task->d_name + "/comm");
        std::string name;
        std::getline(commFile, name);
        // The kernel's per-thread scheduler clock of a thread id.
        const auto clock = static_cast<clockid_t>((~static_cast<unsigned long>(tid) << 3) | 6);
        timespec used{};
        if (clock_gettime(clock, &used) == 0)
            byName[name] += static_cast<double>(used.tv_sec) * 1e3 + static_cast<double>(used.tv_nsec) * 1e-6;
    }
    closedir(tasks);
    return byName;
}

// The module loaded and its leaderboard service configured with 100 categories,
// all found except the last, "C99", whose leaderboard stays 0 so that work for it
// ends on the service's threads without piling up.
class LoadedService {
public:
    // `timeScale` 0: the manual clock, the service's threads moving only with Drain.
    explicit LoadedService(int boardRows, double timeScale = 1.0)
    {
        world.Reset();
        engine.Reset();
        if (timeScale > 0)
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
        world.InjectFault("FindOrCreateLeaderboard",
                          simclient::Fault::Result(k_EResultFail).Skip(kCategories - 1));
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

    // Manual clock: lets the queue threads take everything queued, then waits for them.
    void Drain()
    {
        engine.Time().Advance(1);
        engine.Time().WaitUntilSleeping("Steam_Leaderboards_RequestScore");
        engine.Time().WaitUntilSleeping("Steam_Leaderboards_SubmitScore");
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

constexpr int kBatch = 1000;

// The engine's thread alone: the queue threads take the batch while the timing is
// paused, so the lock is never contended.
void BM_RequestScoresWith100Categories(benchmark::State& state)
{
    LoadedService loaded(10, 0);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    int queued = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(loaded.service->RequestScores(1, 10, 0, "C99"));  // the last in every list
        if (++queued == kBatch) {
            state.PauseTiming();
            loaded.Drain();
            queued = 0;
            state.ResumeTiming();
        }
    }
}
BENCHMARK(BM_RequestScoresWith100Categories);

void BM_SubmitScoreWith100Categories(benchmark::State& state)
{
    LoadedService loaded(10, 0);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    ScoreEntry record{};
    record.score = 7;
    int queued = 0;
    for (auto _ : state) {
        loaded.service->SubmitScore(0, &record, "C99");
        if (++queued == kBatch) {
            state.PauseTiming();
            loaded.Drain();
            queued = 0;
            state.ResumeTiming();
        }
    }
}
BENCHMARK(BM_SubmitScoreWith100Categories);

// What any queued request costs the engine's thread at least: one short lock of an
// engine mutex and two small allocations, with nothing found by a scan.
void BM_FloorLockAndTwoAllocations(benchmark::State& state)
{
    simengine::Engine& engine = simengine::Engine::Instance();
    engine.Reset();
    HostThreadApi* threads = engine.Table()->threads;
    HostMutex* mutex = threads->CreateMutex("BENCH_FLOOR");
    for (auto _ : state) {
        auto* first = new int[8]();
        auto* second = new int[8]();
        benchmark::DoNotOptimize(first);
        benchmark::DoNotOptimize(second);
        threads->LockMutex(mutex);
        threads->UnlockMutex(mutex);
        delete[] first;
        delete[] second;
    }
}
BENCHMARK(BM_FloorLockAndTwoAllocations);

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

constexpr double kIdleWindowSeconds = 5.0;
constexpr const char* kServiceThreads = "Steam_Leaderboa";  // request, user and submit threads

void BareSleepLoop(void* table)
{
    auto* engineTable = static_cast<HostServices*>(table);
    while (!engineTable->IsQuitting())
        engineTable->threads->ThreadSleep(1);
}

// The service at rest, its three polling threads beside three bare loops of
// ThreadSleep(1) started on the engine's threads in the same process, measured
// over the same window.
void BM_IdlePollingAgainstFloor(benchmark::State& state)
{
    LoadedService loaded(10);
    if (!loaded.ready) {
        state.SkipWithError("the service did not start");
        return;
    }
    for (int i = 0; i < 3; ++i)
        loaded.engine.Table()->threads->StartThread("floor", &BareSleepLoop, loaded.engine.Table(), 0);
    for (auto _ : state) {
        const auto before = CpuMsByThreadName();
        std::this_thread::sleep_for(std::chrono::duration<double>(kIdleWindowSeconds));
        auto after = CpuMsByThreadName();
        const double service = (after[kServiceThreads] - before.at(kServiceThreads)) / kIdleWindowSeconds;
        const double floor = (after["floor"] - before.at("floor")) / kIdleWindowSeconds;
        state.counters["service_cpu_ms_per_s"] = service;
        state.counters["floor_cpu_ms_per_s"] = floor;
        state.counters["ratio"] = service / floor;
    }
}
BENCHMARK(BM_IdlePollingAgainstFloor)->Iterations(3)->Unit(benchmark::kMillisecond);

constexpr const char* kResultsThreadComm = "STEAM_ProcessRe";

// CPU per second of the threads named `name`, over one second in the middle of a
// two-second wait.
double MidWaitCpuMsPerSecond(const char* name)
{
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    const auto before = CpuMsByThreadName();
    std::this_thread::sleep_for(std::chrono::seconds(1));
    auto after = CpuMsByThreadName();
    auto found = before.find(name);
    return found == before.end() ? -1.0 : after[name] - found->second;
}

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
        loaded.module->Update();
        state.counters["cpu_ms_per_s"] = MidWaitCpuMsPerSecond(kResultsThreadComm);
        loaded.engine.Threads().Join(kResultsThread);
    }
}
BENCHMARK(BM_NameWaitWithPause)->Iterations(1)->Unit(benchmark::kMillisecond);

// The same wait without a pause: asking again at once, for 2 s.
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
        std::thread spinner([] {
            pthread_setname_np(pthread_self(), "spinner");
            const auto end = Clock::now() + std::chrono::seconds(2);
            const CSteamID first(kAccountBase + 1000);
            while (Clock::now() < end && SteamFriends()->RequestUserInformation(first, true)) {
            }
        });
        state.counters["cpu_ms_per_s"] = MidWaitCpuMsPerSecond("spinner");
        spinner.join();
    }
}
BENCHMARK(BM_NameWaitWithoutPause)->Iterations(1)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
