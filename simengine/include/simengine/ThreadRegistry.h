// The engine's threads: StartThread runs the entry on a real, named thread.
//
// The module never joins what it starts; its threads end when IsQuitting turns
// true. The registry keeps every thread so the engine can join them all after
// quitting, and tests can join the threads of one name (e.g. a results thread).
//
// It also tells which threads poll. A thread that calls the same things over
// and over without sleeping waits for something only the engine's thread can
// change (a name that arrives in the pump, a value the engine sets). The
// engine notes every call of its table made by one of these threads; whoever
// sees the platform's calls notes them too (NoteCall). A thread polls when,
// since the engine's thread last acted (NewEngineTurn) and since any other
// thread last made progress, its calls repeat one cycle of at most
// kMaxPollCycle calls kPollRepeats times over: it has looked at the state the
// others left and found nothing new. Three, not two: the first cycle may end a
// look begun before that progress, and the second, the first fresh look, may
// have found something the thread acts on only after its last noted call.
// Progress is a call the thread had not made among its last kMaxPollCycle
// calls, going to sleep, or ending.
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

    static constexpr std::size_t kMaxPollCycle = 4;
    static constexpr std::size_t kPollRepeats = 3;
    // A call of the calling thread, by name and arguments as text. Calls of
    // threads the engine did not start are not watched (and cost nothing).
    void NoteCall(const char* name, const std::string& args);
    // The calling thread goes to sleep in ThreadSleep: progress, not a poll.
    void NoteSleep();
    // The engine's thread has acted: every thread must show its polling anew.
    void NewEngineTurn();
    // Moves on each progress of any thread: a look at the threads is
    // consistent when it has not moved meanwhile.
    uint64_t ProgressCount() const;
    // Running threads of this name that poll.
    int PollingCount(const std::string& name) const;
    // Names of the threads still running, each once.
    std::vector<std::string> RunningNames() const;

    // Name of the calling thread: its StartThread name, or "main" for a thread the
    // engine did not start.
    static std::string CurrentName();

private:
    struct Tracked {
        std::string name;
        std::thread thread;
        std::atomic<bool> finished{false};
        std::vector<std::string> recent;     // last calls, kept across turns
        std::vector<std::string> sinceTurn;  // calls since the last turn or progress
    };

    static bool Polls(const std::vector<std::string>& calls);
    // Progress of `self`: the others must show their polling anew.
    void ProgressLocked(const Tracked* self);

    void JoinMatching(const std::string* name);

    Journal& journal_;
    mutable std::mutex mutex_;
    std::vector<std::unique_ptr<Tracked>> threads_;
    std::map<std::string, int> startedCounts_;
    uint64_t progress_ = 0;
};

}  // namespace simengine
