#include "foundation/ListToken.h"

#include <cstring>

char* GetListToken(char* buffer, int32_t size, const char* list, const char* separator, int32_t index)
{
    if (list == nullptr || separator == nullptr)
        return nullptr;

    const size_t separatorLength = std::strlen(separator);
    const char* start = list;
    const char* found = std::strstr(list, separator);

    // Counted as unsigned so that a negative index walks on to the end of the list.
    // An empty separator never moves the walk, so it is not repeated.
    uint32_t remaining = separatorLength != 0 ? static_cast<uint32_t>(index) : 0;
    for (; remaining != 0; --remaining) {
        if (found == nullptr)
            return nullptr;
        start = found + separatorLength;
        if (*start == '\0') {
            // A trailing separator: this and every later token is the empty text.
            // A buffer without room for the terminator still gets nothing.
            if (size < 1)
                return nullptr;
            buffer[0] = '\0';
            return buffer;
        }
        found = std::strstr(start, separator);
    }

    const size_t tokenLength = found != nullptr ? static_cast<size_t>(found - start) : std::strlen(start);
    if (size < 0 || static_cast<size_t>(size) < tokenLength + 1)
        return nullptr;

    std::memcpy(buffer, start, tokenLength);
    buffer[tokenLength] = '\0';
    return buffer;
}

int32_t CountListTokens(const char* list, char separator)
{
    int32_t count = 1;
    for (const char* at = list; *at != '\0'; ++at)
        count += *at == separator ? 1 : 0;
    return count;
}
