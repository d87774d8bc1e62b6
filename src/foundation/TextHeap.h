// The heap that text copies come from: the non-throwing one, whose null result
// callers tolerate. Arrays and objects use operator new instead.
#pragma once

#include <cstddef>

using TextAllocateFunction = void* (*)(size_t size);

// A block of `size` bytes, or null when the heap is exhausted.
char* AllocateText(size_t size);
// Frees a block from AllocateText or DuplicateText; null is harmless.
void FreeText(void* block);

// Routes AllocateText through `allocate` (null restores the plain heap), so that
// tests can count allocations and make them fail. Not for use while other threads
// copy text.
void SetTextAllocator(TextAllocateFunction allocate);
