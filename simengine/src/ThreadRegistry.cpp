#include "simengine/ThreadRegistry.h"

#include <pthread.h>

#include "simengine/Journal.h"

namespace simengine {

namespace {

thread_local std::string currentThreadName = "main";

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
    self->thread = std::thread([self, entry, argument] {
        currentThreadName = self->name;
        // The OS name helps in debuggers; it is cut to 15 characters there.
        pthread_setname_np(pthread_self(), self->name.substr(0, 15).c_str());
        entry(argument);
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

std::string ThreadRegistry::CurrentName()
{
    return currentThreadName;
}

void ThreadRegistry::SetCurrentName(std::string name)
{
    currentThreadName = std::move(name);
}

}  // namespace simengine
