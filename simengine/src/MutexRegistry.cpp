#include "simengine/MutexRegistry.h"

#include <condition_variable>
#include <thread>

#include "simengine/Journal.h"

// The handle type the table promises; opaque to the module.
struct HostMutex {
    std::string name;
    std::mutex guard;
    std::condition_variable released;
    std::thread::id owner;
    int depth = 0;
};

namespace simengine {

MutexRegistry::~MutexRegistry()
{
    for (auto& entry : byName_)
        delete entry.second;
}

HostMutex* MutexRegistry::Create(const char* name)
{
    std::string key = name != nullptr ? name : "";
    std::lock_guard<std::mutex> lock(mutex_);
    ++counts_[key].creates;
    HostMutex*& slot = byName_[key];
    if (slot == nullptr) {
        slot = new HostMutex();
        slot->name = key;
    }
    return slot;
}

void MutexRegistry::Lock(HostMutex* mutex)
{
    if (mutex == nullptr) {
        journal_.Fault("LockMutex with a null handle");
        return;
    }
    {
        std::unique_lock<std::mutex> hold(mutex->guard);
        std::thread::id self = std::this_thread::get_id();
        mutex->released.wait(hold, [&] { return mutex->depth == 0 || mutex->owner == self; });
        mutex->owner = self;
        ++mutex->depth;
    }
    std::lock_guard<std::mutex> lock(mutex_);
    ++counts_[mutex->name].locks;
}

void MutexRegistry::Unlock(HostMutex* mutex)
{
    if (mutex == nullptr) {
        journal_.Fault("UnlockMutex with a null handle");
        return;
    }
    {
        std::lock_guard<std::mutex> hold(mutex->guard);
        if (mutex->depth == 0 || mutex->owner != std::this_thread::get_id()) {
            journal_.Fault("UnlockMutex of '" + mutex->name + "' by a thread that does not hold it");
            return;
        }
        if (--mutex->depth == 0) {
            mutex->owner = std::thread::id();
            mutex->released.notify_all();
        }
    }
    std::lock_guard<std::mutex> lock(mutex_);
    ++counts_[mutex->name].unlocks;
}

MutexCounts MutexRegistry::Counts(const std::string& name) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    auto found = counts_.find(name);
    return found != counts_.end() ? found->second : MutexCounts{};
}

void MutexRegistry::ResetCounts()
{
    std::lock_guard<std::mutex> lock(mutex_);
    counts_.clear();
}

}  // namespace simengine
