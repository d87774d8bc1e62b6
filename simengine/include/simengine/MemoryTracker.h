// Buffers (CreateBuffer/ReleaseBuffer) and event memory (Allocate).
//
// Every block is tracked so tests can count live buffers and the engine can
// free what the module handed over. A released buffer record is kept until
// Reset, so a second release of it is caught and journaled, never a crash.
#pragma once

#include <cstddef>
#include <cstdint>
#include <mutex>
#include <unordered_map>

#include "host/HostServices.h"

namespace simengine {

class Journal;

class MemoryTracker {
public:
    explicit MemoryTracker(Journal& journal) : journal_(journal) {}
    ~MemoryTracker();
    MemoryTracker(const MemoryTracker&) = delete;
    MemoryTracker& operator=(const MemoryTracker&) = delete;

    HostBuffer* CreateBuffer(uint32_t size);
    void ReleaseBuffer(HostBuffer* buffer);
    void* Allocate(int32_t size);

    // The next `count` calls of Allocate (or CreateBuffer) give null.
    void FailNextAllocations(int count);
    void FailNextBuffers(int count);

    int LiveBufferCount() const;
    int BuffersCreated() const;
    int AllocationCount() const;
    // True if `pointer` is the start of an Allocate block; gives its size.
    bool FindAllocation(const void* pointer, size_t* size) const;

    // Frees every block and buffer record.
    void FreeAll();

private:
    Journal& journal_;
    mutable std::mutex mutex_;
    std::unordered_map<HostBuffer*, bool> buffers_;  // record -> still live
    std::unordered_map<const void*, size_t> allocations_;
    int buffersCreated_ = 0;
    int failAllocations_ = 0;
    int failBuffers_ = 0;
};

}  // namespace simengine
