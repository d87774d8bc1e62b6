// A text with its hash: the key of every record of a loaded database.
#pragma once

#include <cstdint>

// The hash of the data manager: h = h * 37 + byte over the unsigned bytes, modulo 2^32.
// Null and the empty text both give 0.
uint32_t HashText(const char* text);

// A plain record, copied bytewise between array blocks: it frees nothing by itself,
// its holder calls Free.
struct HashedName {
    // Replaces the text by a heap copy of `newText` (null: no text) and sets the hash.
    // A copy that the heap refuses leaves no text and hash 0.
    void Set(const char* newText);
    // Frees the text; the name then has no text.
    void Free();

    char* text = nullptr;
    uint32_t hash = 0;
};
