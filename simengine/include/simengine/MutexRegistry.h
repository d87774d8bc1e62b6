// The engine's named mutexes: the same name always gives the same mutex.
//
// Mutexes live as long as the process, since module statics may keep handles
// across a Reset; Reset clears only the counts. A mutex may be locked again by
// the thread that holds it. Misuse (null handle, unlock by a thread that does
// not hold it) is journaled instead of being undefined behaviour.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <string>

#include "host/HostServices.h"

namespace simengine {

class Journal;

struct MutexCounts {
    int creates = 0;
    int locks = 0;
    int unlocks = 0;
};

class MutexRegistry {
public:
    explicit MutexRegistry(Journal& journal) : journal_(journal) {}
    ~MutexRegistry();

    HostMutex* Create(const char* name);
    void Lock(HostMutex* mutex);
    void Unlock(HostMutex* mutex);

    MutexCounts Counts(const std::string& name) const;
    void ResetCounts();

private:
    Journal& journal_;
    mutable std::mutex mutex_;  // guards the maps, never held while waiting for a HostMutex
    std::map<std::string, HostMutex*> byName_;
    std::map<std::string, MutexCounts> counts_;
};

}  // namespace simengine
