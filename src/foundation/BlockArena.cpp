#include "foundation/BlockArena.h"

#include "foundation/TextHeap.h"

char* BlockArena::TakeChunk(Lane& lane, size_t size, bool forText)
{
    if (lane.nextSize == 0)
        lane.nextSize = kFirstChunk;
    // A request of more than a quarter of a regular chunk gets a chunk of its own,
    // so that a long text does not waste the rest of the current one.
    const bool own = size > lane.nextSize / 4;
    const size_t payload = own ? size : lane.nextSize;
    if (payload > SIZE_MAX - sizeof(Chunk)) {
        if (forText)
            return nullptr;
        throw std::bad_alloc();
    }
    const size_t bytes = sizeof(Chunk) + payload;
    void* memory = forText ? static_cast<void*>(AllocateText(bytes)) : ::operator new(bytes);
    if (memory == nullptr)
        return nullptr;

    Chunk* chunk = static_cast<Chunk*>(memory);
    chunk->next = lane.chunks;
    chunk->size = payload;
    lane.chunks = chunk;
    char* start = reinterpret_cast<char*>(chunk + 1);
    if (own)
        return start;

    lane.cursor = start + size;
    lane.limit = start + payload;
    const size_t grown = (lane.nextSize + sizeof(Chunk)) * 2 - sizeof(Chunk);
    lane.nextSize = grown < kLargestChunk ? grown : kLargestChunk;
    return start;
}

void BlockArena::ReleaseLane(Lane& lane, bool forText)
{
    for (Chunk* chunk = lane.chunks; chunk != nullptr;) {
        Chunk* next = chunk->next;
        if (forText)
            FreeText(chunk);
        else
            ::operator delete(chunk);
        chunk = next;
    }
    lane = Lane{};
}

void BlockArena::Release()
{
    ReleaseLane(texts_, true);
    ReleaseLane(objects_, false);
}

int32_t BlockArena::ChunkCount() const
{
    int32_t count = 0;
    for (const Chunk* chunk = texts_.chunks; chunk != nullptr; chunk = chunk->next)
        ++count;
    for (const Chunk* chunk = objects_.chunks; chunk != nullptr; chunk = chunk->next)
        ++count;
    return count;
}
