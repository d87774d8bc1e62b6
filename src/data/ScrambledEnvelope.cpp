#include "data/ScrambledEnvelope.h"

namespace envelope {

bool HasMagic(const unsigned char* bytes, int64_t byteCount)
{
    // The size is taken as signed 32-bit, as every size of the reader is.
    if (static_cast<int32_t>(byteCount) < kHeaderSize)
        return false;
    for (int32_t i = 0; i < kMagicSize; ++i) {
        if (bytes[i] != static_cast<unsigned char>(kMagic[i]))
            return false;
    }
    return true;
}

int32_t PayloadLength(const unsigned char* bytes)
{
    const uint32_t raw = uint32_t{bytes[14]} | uint32_t{bytes[15]} << 8 | uint32_t{bytes[16]} << 16 |
                         uint32_t{bytes[17]} << 24;
    return static_cast<int32_t>(raw);
}

uint32_t PayloadChecksum(const unsigned char* bytes)
{
    return uint32_t{bytes[18]} | uint32_t{bytes[19]} << 8 | uint32_t{bytes[20]} << 16 |
           uint32_t{bytes[21]} << 24;
}

// The key position wraps at 13 and the added index at 256; both are kept as
// running counters rather than divisions.
uint32_t Descramble(const unsigned char* stored, int32_t length, unsigned char* plain)
{
    uint32_t sum = 0;
    int32_t keyIndex = 0;
    for (int32_t i = 0; i < length; ++i) {
        const unsigned char s = stored[i];
        sum += static_cast<uint32_t>(static_cast<int32_t>(static_cast<signed char>(s))) *
               static_cast<uint32_t>(i);
        plain[i] = static_cast<unsigned char>(s + static_cast<unsigned char>(kMagic[keyIndex]) + (i & 0xFF));
        if (++keyIndex == kKeyLength)
            keyIndex = 0;
    }
    return sum;
}

uint32_t Scramble(const unsigned char* plain, int32_t length, unsigned char* stored)
{
    uint32_t sum = 0;
    int32_t keyIndex = 0;
    for (int32_t i = 0; i < length; ++i) {
        const unsigned char s =
            static_cast<unsigned char>(plain[i] - static_cast<unsigned char>(kMagic[keyIndex]) - (i & 0xFF));
        stored[i] = s;
        sum += static_cast<uint32_t>(static_cast<int32_t>(static_cast<signed char>(s))) *
               static_cast<uint32_t>(i);
        if (++keyIndex == kKeyLength)
            keyIndex = 0;
    }
    return sum;
}

}  // namespace envelope
