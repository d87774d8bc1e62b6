// Decimal text to numbers, one rule for the whole module: leading white space and a
// sign are accepted, reading stops at the first other character, and text without
// digits (or no text) gives 0. Widths are fixed, so the result is the same whatever
// the width of `long` on the platform.
#pragma once

#include <cstdint>

// A value beyond the 32-bit range is held at its nearest end.
int32_t DecimalToInt32(const char* text);

// Ids of 64 bits; a value beyond the range is held at its end.
uint64_t DecimalToUInt64(const char* text);
