#include "simengine/ThreadRegistry.h"

#include <algorithm>
#include <cstddef>

#include <pthread.h>

#include "simengine/Journal.h"

namespace simengine {

namespace {

// The calling thread's record, if the engine started it; its name is the thread's name.
// A plain pointer on purpose: with mingw-w64's emulated thread-local storage, a
// thread_local whose destructor runs at thread exit may run after its storage was
// freed, and corrupt the heap. The record outlives the thread: it is joined first.
thread_local void* currentTracked = nullptr;

}  // namespace

ThreadRegistry::~ThreadRegistry()
{
    JoinAll();
}

void ThreadRegistry::Start(const char* name, HostThreadEntry entry, void* argument, int32_t flags)
{
    std::string threadName = name != nullptr ? name : "";
    journal_.Record(ThreadStartCall{threadName, flags});
    if (entry == nullptr) {
        journal_.Fault("StartThread '" + threadName + "' without an entry function");
        return;
    }

    auto tracked = std::make_unique<Tracked>();
    Tracked* self = tracked.get();
    self->name = threadName;
    std::lock_guard<std::mutex> lock(mutex_);
    ++startedCounts_[threadName];
    // The thread is started under the lock so that a join never sees a
    // record whose std::thread is still being assigned.
    self->thread = std::thread([this, self, entry, argument] {
        currentTracked = self;
        // The OS name helps in debuggers; it is cut to 15 characters there.
        pthread_setname_np(pthread_self(), self->name.substr(0, 15).c_str());
        entry(argument);
        std::lock_guard<std::mutex> ended(mutex_);
        ProgressLocked(self);
        self->finished.store(true);
    });
    threads_.push_back(std::move(tracked));
}

void ThreadRegistry::JoinMatching(const std::string* name)
{
    // Joining happens outside the lock: a joined thread may itself start threads.
    for (;;) {
        std::vector<std::unique_ptr<Tracked>> toJoin;
        {
            std::lock_guard<std::mutex> lock(mutex_);
            for (auto it = threads_.begin(); it != threads_.end();) {
                if (name == nullptr || (*it)->name == *name) {
                    toJoin.push_back(std::move(*it));
                    it = threads_.erase(it);
                } else {
                    ++it;
                }
            }
        }
        if (toJoin.empty())
            return;
        for (auto& tracked : toJoin)
            tracked->thread.join();
    }
}

void ThreadRegistry::JoinAll()
{
    JoinMatching(nullptr);
}

void ThreadRegistry::Join(const std::string& name)
{
    JoinMatching(&name);
}

int ThreadRegistry::StartedCount(const std::string& name) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    auto found = startedCounts_.find(name);
    return found != startedCounts_.end() ? found->second : 0;
}

void ThreadRegistry::ForgetCounts()
{
    std::lock_guard<std::mutex> lock(mutex_);
    startedCounts_.clear();
}

int ThreadRegistry::RunningCount() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    int count = 0;
    for (const auto& tracked : threads_)
        count += tracked->finished.load() ? 0 : 1;
    return count;
}

int ThreadRegistry::RunningCount(const std::string& name) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    int count = 0;
    for (const auto& tracked : threads_)
        count += (!tracked->finished.load() && tracked->name == name) ? 1 : 0;
    return count;
}

void ThreadRegistry::NoteCall(const char* name, const std::string& args)
{
    auto* self = static_cast<Tracked*>(currentTracked);
    if (self == nullptr)
        return;
    const std::string call = std::string(name) + "(" + args + ")";
    std::lock_guard<std::mutex> lock(mutex_);
    if (std::find(self->recent.begin(), self->recent.end(), call) == self->recent.end())
        ProgressLocked(self);
    self->recent.push_back(call);
    if (self->recent.size() > kMaxPollCycle)
        self->recent.erase(self->recent.begin());
    self->sinceTurn.push_back(call);
    if (self->sinceTurn.size() > kPollRepeats * kMaxPollCycle)
        self->sinceTurn.erase(self->sinceTurn.begin());
}

void ThreadRegistry::NoteSleep()
{
    auto* self = static_cast<Tracked*>(currentTracked);
    if (self == nullptr)
        return;
    std::lock_guard<std::mutex> lock(mutex_);
    ProgressLocked(self);
    self->recent.clear();
    self->sinceTurn.clear();
}

uint64_t ThreadRegistry::ProgressCount() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return progress_;
}

void ThreadRegistry::ProgressLocked(const Tracked* self)
{
    ++progress_;
    for (auto& tracked : threads_)
        if (tracked.get() != self)
            tracked->sinceTurn.clear();
}

void ThreadRegistry::NewEngineTurn()
{
    std::lock_guard<std::mutex> lock(mutex_);
    ProgressLocked(nullptr);
}

bool ThreadRegistry::Polls(const std::vector<std::string>& calls)
{
    const std::size_t n = calls.size();
    // The last kPollRepeats cycles are one cycle repeated when every call equals the one
    // a cycle before it.
    for (std::size_t cycle = 1; cycle <= kMaxPollCycle && kPollRepeats * cycle <= n; ++cycle) {
        const auto span = static_cast<std::ptrdiff_t>(kPollRepeats * cycle);
        if (std::equal(calls.end() - span + static_cast<std::ptrdiff_t>(cycle), calls.end(),
                       calls.end() - span))
            return true;
    }
    return false;
}

int ThreadRegistry::PollingCount(const std::string& name) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    int count = 0;
    for (const auto& tracked : threads_)
        count += (!tracked->finished.load() && tracked->name == name && Polls(tracked->sinceTurn)) ? 1 : 0;
    return count;
}

std::vector<std::string> ThreadRegistry::RunningNames() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    std::vector<std::string> names;
    for (const auto& tracked : threads_)
        if (!tracked->finished.load() && std::find(names.begin(), names.end(), tracked->name) == names.end())
            names.push_back(tracked->name);
    return names;
}

std::string ThreadRegistry::CurrentName()
{
    const auto* self = static_cast<const Tracked*>(currentTracked);
    return self != nullptr ? self->name : "main";
}

}  // namespace simengine
