// The simulated engine: one process-wide instance behind the engine's table.
//
// The table's entries carry no context, so they all reach Engine::Instance().
// Typical use in a test:
//
//   simengine::Engine& engine = simengine::Engine::Instance();
//   engine.Reset();                         // quit, join, forget everything
//   engine.SetProductValue("steam_app_id", "480");
//   module->Initialize(engine.Table());
//   uint64_t mark = engine.Records().Mark();
//   module->Update();
//   auto events = engine.Records().Since(mark).Events(19);
//
// Worker threads are stepped with the manual clock:
//   engine.Time().WaitUntilSleeping("SteamStats_Updater");
//   engine.Time().Advance(400);
//
// The parts (journal, clock, threads, mutexes, files, memory, commands, paths)
// each live in a header of their own; the engine wires them to the table.
#pragma once

#include <chrono>
#include <cstdarg>
#include <cstdint>
#include <map>
#include <mutex>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "host/HostEvent.h"
#include "host/HostServices.h"
#include "simengine/Clock.h"
#include "simengine/CommandHost.h"
#include "simengine/FileStore.h"
#include "simengine/Journal.h"
#include "simengine/MemoryTracker.h"
#include "simengine/MutexRegistry.h"
#include "simengine/PathMapper.h"
#include "simengine/ThreadRegistry.h"

namespace simengine {

class Engine {
public:
    static Engine& Instance();

    // The table to hand to ExtensionModule::Initialize; valid for the whole process.
    HostServices* Table();

    // Quits and joins every thread, then forgets journal, memory, files,
    // scripts and configuration; the clock goes back to manual time 0.
    // Named mutexes survive (module statics may still hold them); their counts restart.
    void Reset();
    // Sets IsQuitting, wakes every sleeper and joins all threads the engine started.
    void QuitAndJoin();
    void SetQuitting(bool quitting);
    bool IsQuitting() const;

    // How a wait for the module's threads ended.
    struct SettleReport {
        bool settled = false;              // false: the guard ran out first
        uint64_t probes = 0;               // looks at the threads it took
        std::vector<std::string> polling;  // names of the threads found polling
    };
    // Manual clock: waits until every thread the engine started is asleep in
    // ThreadSleep, has ended, or polls (see ThreadRegistry). The engine's
    // thread is the caller, so a new engine turn starts first. Time may move
    // only at such a point: no thread is then between two reads of the clock.
    // `guard` (real time) only stops a hang, e.g. a thread that computes forever.
    SettleReport Settle(std::chrono::milliseconds guard = std::chrono::seconds(5));

    // Configuration the module asks for.
    void SetProductValue(const std::string& key, std::optional<std::string> value);
    void SetFeatureEnabled(const std::string& feature, bool enabled);

    Journal& Records() { return journal_; }
    Clock& Time() { return clock_; }
    ThreadRegistry& Threads() { return threads_; }
    MutexRegistry& Mutexes() { return mutexes_; }
    FileStore& Files() { return files_; }
    MemoryTracker& Memory() { return memory_; }
    CommandHost& Commands() { return commands_; }
    PathMapper& Paths() { return paths_; }

    // The engine's side of the table entries that are more than a forward.
    const char* GetProductValue(const char* key);
    bool IsFeatureEnabled(const char* feature);
    void InitEvent(HostEvent* event, int32_t type);
    void PostEvent(HostEvent* event);
    void SetInputButton(int32_t inputId, int32_t value);
    void SetInputAxis(int32_t inputId, float value);
    void WriteLog(LogKind kind, int32_t level, const char* format, va_list values);

private:
    Engine();

    Journal journal_;
    Clock clock_;
    PathMapper paths_;
    ThreadRegistry threads_{journal_};
    MutexRegistry mutexes_{journal_};
    FileStore files_{journal_, paths_};
    MemoryTracker memory_{journal_};
    CommandHost commands_{journal_, paths_};

    mutable std::mutex configMutex_;
    std::map<std::string, std::string> productValues_;
    std::set<std::string> features_;
    bool quitting_ = false;
};

// printf-style formatting into a string, as the engine formats log lines.
std::string FormatText(const char* format, va_list values);

}  // namespace simengine
