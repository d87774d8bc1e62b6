// A growable array of small records held by value, in insertion order.
//
// Every element of a new block is default-constructed, so records whose default
// constructor nulls their pointers (DataValue) start with no texts. Elements move
// between blocks by plain copy: whatever they point at changes owner, and a block
// is released with nothing done per element. The holder frees the texts first.
#pragma once

#include <type_traits>

#include "foundation/GrowableArray.h"

template <typename Record> class ValueArray : public GrowableArray<Record> {
    static_assert(std::is_trivially_copyable<Record>::value,
                  "elements move between blocks bytewise and are released unvisited");
};
