// Makes every text allocation give null for the duration of a scope, to test
// what the callers do when the heap is exhausted.
#pragma once

#include <cstdlib>

#include "foundation/TextHeap.h"

class RefusingTextHeap {
public:
    RefusingTextHeap() { SetTextAllocator(&Refuse); }
    ~RefusingTextHeap() { SetTextAllocator(nullptr); }

    RefusingTextHeap(const RefusingTextHeap&) = delete;
    RefusingTextHeap& operator=(const RefusingTextHeap&) = delete;

private:
    static void* Refuse(size_t) { return nullptr; }
};
