// Counts text allocations and can make the next ones fail, for the duration of a scope.
#pragma once

#include <cstdlib>

#include "foundation/TextHeap.h"

class CountingTextHeap {
public:
    CountingTextHeap()
    {
        SetTextAllocator(&Allocate);
        allocations = 0;
        failFrom = -1;
    }
    ~CountingTextHeap() { SetTextAllocator(nullptr); }

    // Every allocation from now on gives null.
    void FailAll() { failFrom = allocations; }
    int Allocations() const { return allocations; }

private:
    static void* Allocate(size_t size)
    {
        ++allocations;
        if (failFrom >= 0 && allocations > failFrom)
            return nullptr;
        return std::malloc(size);
    }

    static inline int allocations = 0;
    static inline int failFrom = -1;
};
