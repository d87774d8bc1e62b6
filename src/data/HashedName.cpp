#include "data/HashedName.h"

#include "foundation/TextFormat.h"
#include "foundation/TextHeap.h"

uint32_t HashText(const char* text)
{
    uint32_t hash = 0;
    if (text == nullptr)
        return hash;
    for (const unsigned char* byte = reinterpret_cast<const unsigned char*>(text); *byte != 0; ++byte)
        hash = hash * 37u + *byte;
    return hash;
}

void HashedName::Set(const char* newText)
{
    // Copy before freeing, so that a name may be set from its own text.
    char* copy = newText != nullptr ? DuplicateText(newText) : nullptr;
    FreeText(text);
    text = copy;
    hash = HashText(copy);
}

void HashedName::Free()
{
    FreeText(text);
    text = nullptr;
    hash = 0;
}
