// What the game's configuration says an item id is sold as: the product number
// of a downloadable content pack, from "in-app-purchases/in-app-purchases.xml".
#pragma once

#include <cstdint>

#include "foundation/InlineString.h"

// The decimal text as the platform calls take it: leading white space and a
// sign accepted, stops at the first other character, no digits give 0, and a
// value beyond 32 bits is held at the nearest end of the range.
int32_t ParseProductNumber(const char* text);

// The product number of `itemId`, 0 when the item is not sold here (no node,
// no "steam_id", or a value that parses to 0). `text` receives the value as the
// file holds it, null when there is none.
int32_t LookUpProductNumber(const char* itemId, InlineString& text);
