#include "data/HashedName.h"

#include <cstring>

#include "foundation/BlockArena.h"
#include "foundation/TextFormat.h"
#include "foundation/TextHeap.h"

uint32_t HashBytes(const char* bytes, size_t length)
{
    // Four bytes a step: h * 37^4 + (b0 * 37^3 + b1 * 37^2 + b2 * 37 + b3) is the
    // same sum modulo 2^32, with a quarter of the chained multiplications.
    const unsigned char* byte = reinterpret_cast<const unsigned char*>(bytes);
    uint32_t hash = 0;
    size_t i = 0;
    for (; i + 4 <= length; i += 4) {
        hash = hash * 1874161u + (byte[i] * 50653u + byte[i + 1] * 1369u + byte[i + 2] * 37u + byte[i + 3]);
    }
    for (; i < length; ++i)
        hash = hash * 37u + byte[i];
    return hash;
}

uint32_t HashText(const char* text)
{
    return text != nullptr ? HashBytes(text, std::strlen(text)) : 0;
}

void HashedName::Set(const char* newText)
{
    // Copy before freeing, so that a name may be set from its own text.
    char* copy = newText != nullptr ? DuplicateText(newText) : nullptr;
    FreeText(text);
    text = copy;
    hash = HashText(copy);
}

void HashedName::Set(const char* newText, BlockArena* arena)
{
    if (arena == nullptr) {
        Set(newText);
        return;
    }
    text = nullptr;
    hash = 0;
    if (newText == nullptr)
        return;
    size_t length = 0;
    text = arena->CopyText(newText, &length);
    if (text != nullptr)
        hash = HashBytes(text, length);
}

void HashedName::Free()
{
    FreeText(text);
    text = nullptr;
    hash = 0;
}
