// One entry of the store's item table: an item id the engine asked about, and
// whether it is known to be bought.
#pragma once

#include <cstdint>

#include "foundation/InlineString.h"

struct StoreItem {
    InlineString itemId;  // compared byte by byte, case matters
    uint8_t bought = 0;
};
