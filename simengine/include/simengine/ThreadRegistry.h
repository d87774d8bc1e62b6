// The engine's threads: StartThread runs the entry on a real, named thread.
//
// The module never joins what it starts; its threads end when IsQuitting turns
// true. The registry keeps every thread so the engine can join them all after
// quitting, and tests can join the threads of one name (e.g. a results thread).
#pragma once

#include <atomic>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "host/HostServices.h"

namespace simengine {

class Journal;

class ThreadRegistry {
public:
    explicit ThreadRegistry(Journal& journal) : journal_(journal) {}
    ~ThreadRegistry();

    void Start(const char* name, HostThreadEntry entry, void* argument, int32_t flags);

    // Joins every thread started so far, also those started while joining.
    void JoinAll();
    // Joins the threads of this name started so far.
    void Join(const std::string& name);

    // Threads of this name started since the last ForgetCounts().
    int StartedCount(const std::string& name) const;
    void ForgetCounts();
    int RunningCount() const;
    int RunningCount(const std::string& name) const;

    // Name of the calling thread: its StartThread name, or the name set here
    // ("main" for a thread the engine did not start).
    static std::string CurrentName();
    static void SetCurrentName(std::string name);

private:
    struct Tracked {
        std::string name;
        std::thread thread;
        std::atomic<bool> finished{false};
    };

    void JoinMatching(const std::string* name);

    Journal& journal_;
    mutable std::mutex mutex_;
    std::vector<std::unique_ptr<Tracked>> threads_;
    std::map<std::string, int> startedCounts_;
};

}  // namespace simengine
