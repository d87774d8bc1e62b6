// The engine's clock, behind GetTimeMs and ThreadSleep.
//
// Manual mode is for tests: time moves only when the test advances it, and a
// thread in ThreadSleep stays asleep until the clock has passed its wake time
// (or the engine quits). With WaitUntilSleeping a test steps a worker thread
// like a frame: advance, then wait until the thread is back in its sleep.
// Scaled mode is for the scenario runner: real time times a scale.
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <list>
#include <map>
#include <mutex>
#include <string>

namespace simengine {

class Clock {
public:
    static constexpr std::chrono::milliseconds kDefaultWait{10000};

    // Manual time starting at `startMs`. Sleepers of the previous mode are woken.
    void UseManual(uint32_t startMs = 0);
    // Engine time runs `timeScale` times as fast as real time (2.0: a sleep of
    // 400 engine ms takes 200 real ms).
    void UseScaled(double timeScale);
    bool IsManual() const;

    uint32_t NowMs() const;
    // Manual mode only; wakes every sleeper whose wake time has come. Those are
    // no longer counted as sleeping once this returns.
    void Advance(uint32_t milliseconds);

    // ThreadSleep on the calling thread, known by `threadName`.
    void Sleep(uint32_t milliseconds, const std::string& threadName);

    // While quitting, sleeps end at once and new ones return immediately.
    void SetQuitting(bool quitting);

    // Blocks until a thread of this name is asleep (and not yet woken); false
    // when `timeout` of real time passes first. A guard against hangs only.
    bool WaitUntilSleeping(const std::string& threadName, std::chrono::milliseconds timeout = kDefaultWait);
    int SleepingCount(const std::string& threadName) const;
    // ThreadSleep calls made by threads of this name since the last UseManual/UseScaled.
    uint64_t SleepCalls(const std::string& threadName) const;

private:
    struct Sleeper {
        std::string name;
        uint64_t wakeMs;
        bool woken;
    };

    int SleepingLocked(const std::string& threadName) const;
    double ScaledNowLocked() const;
    void WakeAllLocked();

    mutable std::mutex mutex_;
    std::condition_variable changed_;
    bool manual_ = true;
    bool quitting_ = false;
    uint64_t manualNowMs_ = 0;
    double timeScale_ = 1.0;
    std::chrono::steady_clock::time_point scaledStart_ = std::chrono::steady_clock::now();
    std::list<Sleeper> sleepers_;
    std::map<std::string, uint64_t> sleepCalls_;
};

}  // namespace simengine
