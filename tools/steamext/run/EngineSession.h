// The simulated engine as a run uses it: set up from the scenario's "engine"
// section, loading the module as the engine does, and handing back what the
// module did to the engine as records (Records.h).
#pragma once

#include <cstdint>
#include <filesystem>
#include <memory>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include <nlohmann/json.hpp>

#include <simclient/Journal.h>
#include <simengine/Engine.h>

#include "run/Scenario.h"

class ExtensionModule;
struct HostServices;

namespace steamext::run {

// The module file could not be loaded or has no export.
class ModuleLoadError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

class EngineSession {
public:
    explicit EngineSession(const EngineSetup& setup);
    ~EngineSession();
    EngineSession(const EngineSession&) = delete;
    EngineSession& operator=(const EngineSession&) = delete;

    HostServices* Table();
    // dlopen, find the export, call it: exactly the engine's way in.
    ExtensionModule* LoadModule(const std::string& path);
    void UnloadModule();

    uint32_t NowMs() const;
    // The manual clock moves at once, between two points where the module's
    // threads are settled; the scaled clock is waited for.
    //
    // Settled means: every thread the module started is asleep in ThreadSleep,
    // has ended, or polls. A thread polls when, since this thread last acted
    // and since any other thread last made progress, its calls (to the
    // engine's table, and to the platform where the client reports them)
    // repeat one cycle of at most four calls twice over, e.g. a results thread
    // asking RequestUserInformation until the pump brings the name. Such a
    // thread can change nothing until this thread acts, so the run stays
    // deterministic. A real-time guard of 5 s only stops a hang; LastSettle
    // tells whether it was needed.
    void Advance(uint32_t ms);
    const simengine::Engine::SettleReport& LastSettle() const { return lastSettle_; }
    // With the manual clock, waits until the module's threads are settled without moving
    // the clock: what a call or a world change sets off lands in its own step (a thread the
    // call started, an entry a queue's thread takes). Nothing with the scaled clock.
    void SettleThreads();
    // The engine's next `count` Allocate calls, on any thread, give null.
    void FailAllocations(int count);
    // A platform call made on the calling thread, for telling polls from work;
    // the simulated client's call observer feeds it.
    static void NotePlatformCall(const char* name, const std::string& args);

    // What the module did to the engine since the last call, in order.
    std::vector<nlohmann::json> TakeRecords();
    // The name a thread of the module was started with, or "" if unknown.
    std::string ThreadName(simclient::ThreadSerial id) const;
    // Threads of this name that the module started and that have not ended yet; -1 when
    // the module never started one of this name.
    int RunningThreads(const std::string& name) const;

    // Sets IsQuitting and waits, with a bound, for every thread the module
    // started; returns the names of those that did not end.
    std::vector<std::string> Quit();

private:
    // Waits until every thread the module started is asleep or has ended.
    void Settle();

    struct State;
    std::unique_ptr<State> state_;
    simengine::Engine::SettleReport lastSettle_;
};

}  // namespace steamext::run
