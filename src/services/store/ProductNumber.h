// What the game's configuration says an item id is sold as: the product number
// of a downloadable content pack, from "in-app-purchases/in-app-purchases.xml".
#pragma once

#include <cstdint>

#include "foundation/InlineString.h"

// The product number of `itemId`, 0 when the item is not sold here (no node,
// no "steam_id", or a value that parses to 0). `text` receives the value as the
// file holds it, null when there is none.
int32_t LookUpProductNumber(const char* itemId, InlineString& text);
