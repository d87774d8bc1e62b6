// GetListToken on arbitrary lists: byte 0 is the index (signed), byte 1 the
// buffer size, byte 2 the separator's length; the rest is separator, then list.
#include <string>
#include <vector>

#include "foundation/ListToken.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    if (size < 3)
        return 0;
    const int32_t index = static_cast<int8_t>(data[0]);
    const int32_t bufferSize = data[1];
    const size_t separatorLength = data[2] % 8;
    if (size < 3 + separatorLength)
        return 0;
    const std::string separator(reinterpret_cast<const char*>(data + 3), separatorLength);
    const std::string list(reinterpret_cast<const char*>(data + 3 + separatorLength),
                           size - 3 - separatorLength);
    std::vector<char> buffer(static_cast<size_t>(bufferSize) + 1, '\x7f');
    GetListToken(buffer.data(), bufferSize, list.c_str(), separator.c_str(), index);
    // Nothing may be written past the size given.
    if (buffer[static_cast<size_t>(bufferSize)] != '\x7f')
        __builtin_trap();
    return 0;
}
