#include "foundation/TextFormat.h"

#include <cstdio>
#include <cstring>

#include "foundation/TextHeap.h"

namespace {

// Most texts the module formats are short; longer ones take a second pass.
constexpr int32_t kStackFormatSize = 4096;

}  // namespace

char* DuplicateText(const char* text)
{
    if (text == nullptr)
        text = "";
    const size_t size = std::strlen(text) + 1;
    char* copy = AllocateText(size);
    if (copy != nullptr)
        std::memcpy(copy, text, size);
    return copy;
}

int32_t FormatToBufferV(char* buffer, int32_t size, const char* format, va_list args)
{
    // A size of 0 or below has no room even for the terminator: measure only.
    if (size <= 0) {
        buffer = nullptr;
        size = 0;
    }
    const int result = std::vsnprintf(buffer, static_cast<size_t>(size), format, args);
    return result < 0 ? -1 : result;
}

int32_t FormatToBuffer(char* buffer, int32_t size, const char* format, ...)
{
    va_list args;
    va_start(args, format);
    const int32_t result = FormatToBufferV(buffer, size, format, args);
    va_end(args);
    return result;
}

int32_t FormatToBufferRaw(char* buffer, int64_t size, const char* format, ...)
{
    if (size <= 0)
        return -1;
    va_list args;
    va_start(args, format);
    const int result = std::vsnprintf(buffer, static_cast<size_t>(size), format, args);
    va_end(args);
    // A text that needs the whole buffer or more doesn't fit: its terminator has no room.
    if (result < 0 || static_cast<int64_t>(result) >= size)
        return -1;
    return result;
}

InlineString FormatString(const char* format, ...)
{
    InlineString result;
    char stackBuffer[kStackFormatSize];

    va_list args;
    va_start(args, format);
    va_list again;
    va_copy(again, args);

    const int32_t needed = FormatToBufferV(stackBuffer, kStackFormatSize, format, args);
    if (needed < 0)
        stackBuffer[0] = '\0';

    if (needed < kStackFormatSize) {
        result.Assign(stackBuffer);
    } else {
        char* block = new char[static_cast<size_t>(needed) + 1];
        if (FormatToBufferV(block, needed + 1, format, again) < 0)
            block[0] = '\0';
        result.Assign(block);
        delete[] block;
    }

    va_end(again);
    va_end(args);
    return result;
}
