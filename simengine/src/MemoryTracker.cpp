#include "simengine/MemoryTracker.h"

#include <cstdio>
#include <cstdlib>

#include "simengine/Journal.h"

namespace simengine {

MemoryTracker::~MemoryTracker()
{
    FreeAll();
}

HostBuffer* MemoryTracker::CreateBuffer(uint32_t size)
{
    std::lock_guard<std::mutex> lock(mutex_);
    if (failBuffers_ > 0) {
        --failBuffers_;
        return nullptr;
    }
    // A zero-sized buffer still gets a distinct data block.
    auto* buffer = new HostBuffer{std::malloc(size > 0 ? size : 1), size};
    buffers_[buffer] = true;
    ++buffersCreated_;
    return buffer;
}

void MemoryTracker::ReleaseBuffer(HostBuffer* buffer)
{
    std::unique_lock<std::mutex> lock(mutex_);
    auto found = buffers_.find(buffer);
    if (found == buffers_.end() || !found->second) {
        lock.unlock();
        char text[96];
        std::snprintf(text, sizeof(text), "ReleaseBuffer of %s buffer %p",
                      found == buffers_.end() ? "an unknown" : "an already released",
                      static_cast<void*>(buffer));
        journal_.Fault(text);
        return;
    }
    std::free(buffer->data);
    buffer->data = nullptr;
    found->second = false;
}

void* MemoryTracker::Allocate(int32_t size)
{
    std::lock_guard<std::mutex> lock(mutex_);
    if (failAllocations_ > 0) {
        --failAllocations_;
        return nullptr;
    }
    if (size < 0)
        return nullptr;
    void* block = std::malloc(size > 0 ? static_cast<size_t>(size) : 1);
    if (block != nullptr)
        allocations_[block] = static_cast<size_t>(size);
    return block;
}

void MemoryTracker::FailNextAllocations(int count)
{
    std::lock_guard<std::mutex> lock(mutex_);
    failAllocations_ = count;
}

void MemoryTracker::FailNextBuffers(int count)
{
    std::lock_guard<std::mutex> lock(mutex_);
    failBuffers_ = count;
}

int MemoryTracker::LiveBufferCount() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    int live = 0;
    for (const auto& buffer : buffers_)
        live += buffer.second ? 1 : 0;
    return live;
}

int MemoryTracker::BuffersCreated() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return buffersCreated_;
}

int MemoryTracker::AllocationCount() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return static_cast<int>(allocations_.size());
}

bool MemoryTracker::FindAllocation(const void* pointer, size_t* size) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    auto found = allocations_.find(pointer);
    if (found == allocations_.end())
        return false;
    *size = found->second;
    return true;
}

void MemoryTracker::FreeAll()
{
    std::lock_guard<std::mutex> lock(mutex_);
    for (auto& buffer : buffers_) {
        std::free(buffer.first->data);
        delete buffer.first;
    }
    buffers_.clear();
    for (auto& block : allocations_)
        std::free(const_cast<void*>(block.first));
    allocations_.clear();
    buffersCreated_ = 0;
    failAllocations_ = 0;
    failBuffers_ = 0;
}

}  // namespace simengine
