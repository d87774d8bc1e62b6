// A text with its hash: the key of every record of a loaded database.
#pragma once

#include <cstddef>
#include <cstdint>

class BlockArena;

// The hash of the data manager: h = h * 37 + byte over the unsigned bytes, modulo 2^32.
// Null and the empty text both give 0.
uint32_t HashText(const char* text);
// The same over `length` bytes, which may include zero bytes.
uint32_t HashBytes(const char* bytes, size_t length);

// A plain record, copied bytewise between array blocks: it frees nothing by itself,
// its holder calls Free.
struct HashedName {
    // Replaces the text by a heap copy of `newText` (null: no text) and sets the hash.
    // A copy that the heap refuses leaves no text and hash 0.
    void Set(const char* newText);
    // The same with the copy made in `arena` (null: on the heap, as above). The old
    // text is not freed: an arena's texts go with the arena, and a name switches
    // between heap and arena never.
    void Set(const char* newText, BlockArena* arena);
    // Frees a heap text; the name then has no text.
    void Free();

    char* text = nullptr;
    uint32_t hash = 0;
};
