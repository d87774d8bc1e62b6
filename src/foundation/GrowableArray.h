// The header and growth rule shared by PtrArray and ValueArray.
//
// A header of all zero bytes is a valid empty array, so holders that are made by
// zeroing need no constructor call. The array never owns what its elements point
// at: holders release that themselves before they drop or clear elements.
// Blocks come from the throwing allocator; nothing here catches its failure.
#pragma once

#include <cstdint>

// The capacity after an Add that found a full block of `capacity` holding `count`.
// A one-element block (made by Reserve(1)) steps to 8; any other block doubles.
inline int32_t GrownArrayCapacity(int32_t count, int32_t capacity)
{
    if (count == 1)
        return 8;
    const int64_t doubled = int64_t{capacity} * 2;
    return doubled >= int64_t{count} + 1 ? static_cast<int32_t>(doubled) : count + 1;
}

template <typename Element>
class GrowableArray {
public:
    // The first block holds this many, whatever the element.
    static constexpr int32_t kFirstCapacity = 32;

    GrowableArray() = default;
    ~GrowableArray() { delete[] data; }

    GrowableArray(const GrowableArray&) = delete;
    GrowableArray& operator=(const GrowableArray&) = delete;

    // Appends a copy of `item`, which may be an element of this very array: the
    // old block is freed only after the copy is stored.
    void Add(const Element& item)
    {
        if (count + 1 <= capacity) {
            data[count++] = item;
            return;
        }
        if (data == nullptr) {
            Reserve(kFirstCapacity);
            data[count++] = item;
            return;
        }
        Element* old = data;
        capacity = GrownArrayCapacity(count, capacity);
        data = new Element[capacity];
        for (int32_t i = 0; i < count; ++i)
            data[i] = old[i];
        data[count++] = item;
        delete[] old;
    }

    // Sets the capacity to `n`, or to `count` if that is greater; may shrink the block.
    // Asking for the current capacity does nothing, even with no block yet.
    void Reserve(int32_t n)
    {
        if (n == capacity)
            return;
        capacity = n > count ? n : count;
        Element* block = new Element[capacity];
        for (int32_t i = 0; i < count; ++i)
            block[i] = data[i];
        delete[] data;
        data = block;
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
};
