// The header and growth rule shared by PtrArray and ValueArray.
//
// A header of all zero bytes is a valid empty array, so holders that are made by
// zeroing need no constructor call. The array never owns what its elements point
// at: holders release that themselves before they drop or clear elements.
// Blocks come from the throwing allocator, or from an arena's object lane which
// throws the same way; nothing here catches the failure.
#pragma once

#include <cstdint>

#include "foundation/BlockArena.h"

// The capacity after an Add that found a full block of `capacity` holding `count`.
// A one-element block (made by Reserve(1)) steps to 8; any other block doubles.
inline int32_t GrownArrayCapacity(int32_t count, int32_t capacity)
{
    if (count == 1)
        return 8;
    const int64_t doubled = int64_t{capacity} * 2;
    return doubled >= int64_t{count} + 1 ? static_cast<int32_t>(doubled) : count + 1;
}

template <typename Element> class GrowableArray {
public:
    // The first block holds this many, whatever the element.
    static constexpr int32_t kFirstCapacity = 32;

    GrowableArray() = default;
    ~GrowableArray() { delete[] data; }

    GrowableArray(const GrowableArray&) = delete;
    GrowableArray& operator=(const GrowableArray&) = delete;

    // Appends a copy of `item`, which may be an element of this very array: the
    // old block is freed only after the copy is stored.
    void Add(const Element& item) { Grow(item, HeapBlocks{}); }
    // Sets the capacity to `n`, or to `count` if that is greater; may shrink the block.
    // Asking for the current capacity does nothing, even with no block yet.
    void Reserve(int32_t n) { Resize(n, HeapBlocks{}); }

    // The same two for an array whose blocks live in `arena`, with the same
    // capacities: a new block comes from the arena, and an old one is left to it.
    // An array takes all its blocks from the heap or all from one arena; the
    // holder of an arena array empties the header (ForgetBlock) before it goes.
    void Add(const Element& item, BlockArena& arena) { Grow(item, ArenaBlocks{&arena}); }
    void Reserve(int32_t n, BlockArena& arena) { Resize(n, ArenaBlocks{&arena}); }
    // Drops the block without freeing it: for blocks that an arena releases.
    void ForgetBlock()
    {
        data = nullptr;
        count = 0;
        capacity = 0;
    }

    // Removal helpers for holders. Both keep the order of the remaining elements
    // and keep the block; call PtrArray::Shrink after them where wanted.
    void RemoveAt(int32_t index)
    {
        if (index < 0 || index >= count)
            return;
        for (int32_t i = index + 1; i < count; ++i)
            data[i - 1] = data[i];
        --count;
    }

    Element& operator[](int32_t index) { return data[index]; }
    const Element& operator[](int32_t index) const { return data[index]; }

    Element* begin() { return data; }
    Element* end() { return data + count; }
    const Element* begin() const { return data; }
    const Element* end() const { return data + count; }

    Element* data = nullptr;
    int32_t count = 0;
    int32_t capacity = 0;
    bool autoShrink = false;

private:
    struct HeapBlocks {
        Element* Allocate(int32_t n) const { return new Element[n]; }
        void Free(Element* block) const { delete[] block; }
    };
    struct ArenaBlocks {
        BlockArena* arena;
        Element* Allocate(int32_t n) const { return arena->CreateBlock<Element>(n); }
        void Free(Element*) const {}
    };

    template <typename Blocks> void Grow(const Element& item, Blocks blocks)
    {
        if (count + 1 <= capacity) {
            data[count++] = item;
            return;
        }
        if (data == nullptr) {
            Resize(kFirstCapacity, blocks);
            data[count++] = item;
            return;
        }
        Element* old = data;
        capacity = GrownArrayCapacity(count, capacity);
        data = blocks.Allocate(capacity);
        for (int32_t i = 0; i < count; ++i)
            data[i] = old[i];
        data[count++] = item;
        blocks.Free(old);
    }

    template <typename Blocks> void Resize(int32_t n, Blocks blocks)
    {
        if (n == capacity)
            return;
        capacity = n > count ? n : count;
        Element* block = blocks.Allocate(capacity);
        for (int32_t i = 0; i < count; ++i)
            block[i] = data[i];
        blocks.Free(data);
        data = block;
    }
};
