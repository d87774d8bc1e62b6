// A growable array of pointers, in insertion order. Holds, never owns.
#pragma once

#include "foundation/GrowableArray.h"

template <typename T> class PtrArray : public GrowableArray<T*> {
public:
    using Base = GrowableArray<T*>;

    // Index of the first element equal to `item`, or -1.
    int32_t IndexOf(const T* item) const
    {
        for (int32_t i = 0; i < this->count; ++i) {
            if (this->data[i] == item)
                return i;
        }
        return -1;
    }

    // Takes the first element equal to `item` out, keeping the order. False if absent.
    bool Remove(const T* item)
    {
        const int32_t index = IndexOf(item);
        if (index < 0)
            return false;
        this->RemoveAt(index);
        return true;
    }

    // Gives memory back after removals: only with autoShrink on, and only while at
    // most a quarter of the block is used. An emptied array keeps its block.
    void Shrink()
    {
        if (!this->autoShrink || this->data == nullptr || this->count < 1 || this->count > this->capacity / 4)
            return;
        const int32_t half = this->capacity / 2;
        if (half != this->capacity)
            this->Reserve(half > this->count ? half : this->count);
    }
};
