// A bump allocator over large chunks, for many small blocks that all die
// together: the texts, nodes and pair blocks of one loaded database.
//
// Nothing is freed one by one; Release gives every chunk back at once, and the
// destructor calls it. The arena keeps the module's two allocators apart, each
// in a lane of its own:
//   - texts come from chunks of the text heap (AllocateText): a chunk the heap
//     refuses gives a null text, just as a refused DuplicateText does;
//   - objects and array blocks come from chunks of operator new, whose failure
//     throws and is caught by nobody, as for any object of the module.
// An arena belongs to one thread at a time, like the tree it holds.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <new>

class BlockArena {
public:
    BlockArena() = default;
    ~BlockArena() { Release(); }

    BlockArena(const BlockArena&) = delete;
    BlockArena& operator=(const BlockArena&) = delete;

    // A copy of the `length` bytes at `text`, terminated, or null when the text
    // heap refuses a chunk. The bytes may hold anything but must not lie in a
    // block of this arena that Release has given back.
    char* CopyText(const char* text, size_t length)
    {
        char* copy = texts_.cursor;
        if (length < static_cast<size_t>(texts_.limit - texts_.cursor)) {
            texts_.cursor += length + 1;
        } else {
            copy = TakeChunk(texts_, length + 1, true);
            if (copy == nullptr)
                return nullptr;
        }
        std::memcpy(copy, text, length);
        copy[length] = '\0';
        return copy;
    }

    // A copy of the zero-terminated `text` (not null), or null as above; its
    // length goes to `length`. Short texts are measured while they are copied.
    char* CopyText(const char* text, size_t* length)
    {
        char* const copy = texts_.cursor;
        char* out = copy;
        const char* in = text;
        char* const limit = texts_.limit;
        while (out != limit) {
            if ((*out++ = *in++) == '\0') {
                texts_.cursor = out;
                *length = static_cast<size_t>(out - copy) - 1;
                return copy;
            }
        }
        // The chunk ran out before the terminator: measure, and copy the whole text anew.
        *length = static_cast<size_t>(out - copy) + std::strlen(in);
        return CopyText(text, *length);
    }

    // Room for `size` bytes aligned to 16 (enough for any record of the module).
    // Throws std::bad_alloc when the heap refuses a chunk.
    void* AllocateObject(size_t size)
    {
        const size_t rounded = (size + (kObjectAlignment - 1)) & ~(kObjectAlignment - 1);
        if (rounded <= static_cast<size_t>(objects_.limit - objects_.cursor)) {
            void* block = objects_.cursor;
            objects_.cursor += rounded;
            return block;
        }
        return TakeChunk(objects_, rounded, false);
    }

    // A value-initialised object / block of `n` value-initialised elements.
    template <typename T> T* Create()
    {
        static_assert(alignof(T) <= kObjectAlignment, "over-aligned objects need a heap of their own");
        return new (AllocateObject(sizeof(T))) T();
    }
    template <typename T> T* CreateBlock(int32_t n)
    {
        static_assert(alignof(T) <= kObjectAlignment, "over-aligned objects need a heap of their own");
        T* block = static_cast<T*>(AllocateObject(sizeof(T) * static_cast<size_t>(n > 0 ? n : 0)));
        for (int32_t i = 0; i < n; ++i)
            new (block + i) T();
        return block;
    }

    // Gives every chunk back; all blocks handed out so far are gone, and no
    // destructor runs for objects made here. The arena can be used again.
    void Release();

    // Chunks held, both lanes together.
    int32_t ChunkCount() const;

    static constexpr size_t kObjectAlignment = 16;

private:
    struct Chunk {
        Chunk* next;
        size_t size;  // usable bytes behind the header
    };
    static_assert(sizeof(Chunk) % kObjectAlignment == 0, "blocks behind the header keep the alignment");
    struct Lane {
        Chunk* chunks = nullptr;
        char* cursor = nullptr;
        char* limit = nullptr;
        size_t nextSize = 0;  // payload of the next regular chunk
    };

    // Payload of the first regular chunk of a lane, and the most a lane grows to.
    static constexpr size_t kFirstChunk = 4096 - sizeof(Chunk);
    static constexpr size_t kLargestChunk = (size_t{256} << 10) - sizeof(Chunk);

    // Adds a chunk with room for `size` bytes to `lane`, or gives null. A large
    // request gets a chunk of its own, and the lane's current chunk stays open.
    char* TakeChunk(Lane& lane, size_t size, bool forText);
    static void ReleaseLane(Lane& lane, bool forText);

    Lane texts_;
    Lane objects_;
};
