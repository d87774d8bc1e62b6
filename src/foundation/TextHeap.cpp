#include "foundation/TextHeap.h"

#include <cstdlib>

namespace {

void* PlainAllocate(size_t size)
{
    return std::malloc(size);
}

TextAllocateFunction textAllocate = PlainAllocate;

}  // namespace

char* AllocateText(size_t size)
{
    return static_cast<char*>(textAllocate(size));
}

void FreeText(void* block)
{
    std::free(block);
}

void SetTextAllocator(TextAllocateFunction allocate)
{
    textAllocate = allocate != nullptr ? allocate : PlainAllocate;
}
