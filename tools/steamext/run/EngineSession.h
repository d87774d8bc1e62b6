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
    // The manual clock moves at once, between two points where every thread of
    // the module is asleep; the scaled clock is waited for.
    void Advance(uint32_t ms);

    // What the module did to the engine since the last call, in order.
    std::vector<nlohmann::json> TakeRecords();
    // The name a thread of the module was started with, or "" if unknown.
    std::string ThreadName(std::thread::id id) const;

    // Sets IsQuitting and waits, with a bound, for every thread the module
    // started; returns the names of those that did not end.
    std::vector<std::string> Quit();

private:
    // Waits until every thread the module started is asleep or has ended.
    void Settle();

    struct State;
    std::unique_ptr<State> state_;
};

}  // namespace steamext::run
