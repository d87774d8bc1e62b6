// One name/value pair of a node or an array. Both texts are owned by the pair,
// but the pair is a plain record: its holder frees them with Free before it
// drops the pair. In a tree built by a Database the texts belong to the
// database's arena instead, and nobody calls Free.
#pragma once

#include "data/HashedName.h"

struct DataValue {
    // Frees heap texts.
    void Free();

    HashedName name;        // no text: the pair never matches a lookup
    char* value = nullptr;  // null: a pair without a value
};
