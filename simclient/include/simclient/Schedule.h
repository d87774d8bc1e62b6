// When a scheduled change of the world happens: at a pump (a SteamAPI_RunCallbacks that
// dispatched) or at a time of the engine's clock, in milliseconds, read through the time
// source the clock's owner installs (World::SetTimeSource).
#ifndef SIMCLIENT_SCHEDULE_H
#define SIMCLIENT_SCHEDULE_H

#include <cstdint>

namespace simclient {

enum class Clock {
    Pump,
    EngineMs
};

// An absolute point: "at pump 5", "at engine time 2000 ms".
struct Due {
    Clock clock = Clock::Pump;
    uint64_t at = 0;
    static Due Pump(uint64_t n) { return Due{Clock::Pump, n}; }
    static Due EngineMs(uint64_t ms) { return Due{Clock::EngineMs, ms}; }
};

// A distance from now: "3 pumps from now", "500 engine ms from now". Engine time counts
// from the time read at the latest pump (0 before any pump or without a time source).
struct Delay {
    Clock clock = Clock::Pump;
    uint64_t amount = 0;
    static Delay Pumps(uint64_t n) { return Delay{Clock::Pump, n}; }
    static Delay EngineMs(uint64_t ms) { return Delay{Clock::EngineMs, ms}; }
};

}  // namespace simclient

#endif  // SIMCLIENT_SCHEDULE_H
