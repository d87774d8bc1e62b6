#include "foundation/InlineString.h"

#include <cstring>

static_assert(sizeof(InlineString::inlineBuffer) == 16, "inline room is 15 characters");

#include "foundation/TextHeap.h"

namespace {

// A text that shrinks by less than this is overwritten where it stands.
constexpr int32_t kInPlaceSlack = 256;
// A text goes inline only when its length plus terminator is below 16, so at
// most 14 characters are placed there by Assign (the buffer itself has room for 15).
constexpr int32_t kInlineLimit = 16;

// Address test without relational operators on unrelated pointers.
bool PointsInto(const char* pointer, const char* begin, int32_t length)
{
    const auto address = reinterpret_cast<uintptr_t>(pointer);
    const auto start = reinterpret_cast<uintptr_t>(begin);
    return address >= start && address < start + static_cast<uintptr_t>(length);
}

}  // namespace

InlineString::~InlineString()
{
    if (text != inlineBuffer)
        FreeText(text);
}

InlineString::InlineString(const InlineString& other)
{
    Assign(other.text);
}

InlineString& InlineString::operator=(const InlineString& other)
{
    if (this != &other)
        Assign(other.text);
    return *this;
}

// Frees the block and leaves no text; `capacity` is left as it was.
void InlineString::DropText()
{
    if (text != inlineBuffer)
        FreeText(text);
    text = nullptr;
    length = 0;
}

void InlineString::Assign(const char* source)
{
    const int32_t n = source != nullptr ? static_cast<int32_t>(std::strlen(source)) : 0;

    // The same text again: leave the block alone.
    if (source != nullptr && text != nullptr && n == length && std::memcmp(source, text, n) == 0)
        return;

    const bool aliases = source != nullptr && text != nullptr && PointsInto(source, text, length);

    if (source == nullptr) {
        DropText();
        return;
    }

    // Decided against `length`, not `capacity`: a longer text never reuses a block.
    if (text != nullptr && !aliases && n <= length && length - n < kInPlaceSlack) {
        std::memmove(text, source, static_cast<size_t>(n) + 1);
        length = n;
        return;
    }

    char* storage;
    if (n + 1 < kInlineLimit) {
        // memmove: the source may be a tail of the inline text itself.
        std::memmove(inlineBuffer, source, static_cast<size_t>(n) + 1);
        storage = inlineBuffer;
        capacity = 15;
    } else {
        storage = AllocateText(static_cast<size_t>(n) + 1);
        if (storage == nullptr) {
            DropText();
            return;
        }
        std::memcpy(storage, source, static_cast<size_t>(n) + 1);
        capacity = n;
    }

    // The copy is made, so an aliasing source may go with the old block now.
    if (text != inlineBuffer)
        FreeText(text);
    text = storage;
    length = n;
}

void InlineString::Append(const char* source)
{
    if (source == nullptr)
        return;
    if (text == nullptr) {
        Assign(source);
        return;
    }

    const int32_t n = static_cast<int32_t>(std::strlen(source));
    const int32_t total = length + n;
    char* block = AllocateText(static_cast<size_t>(total) + 1);
    if (block == nullptr) {
        DropText();
        return;
    }
    std::memcpy(block, text, static_cast<size_t>(length));
    std::memcpy(block + length, source, static_cast<size_t>(n));
    block[total] = '\0';

    if (text != inlineBuffer)
        FreeText(text);
    text = block;
    length = total;
    capacity = total;
}
