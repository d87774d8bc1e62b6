#include "foundation/DecimalText.h"

#include <cstdlib>

int32_t DecimalToInt32(const char* text)
{
    if (text == nullptr)
        return 0;
    const long long value = std::strtoll(text, nullptr, 10);
    if (value > INT32_MAX)
        return INT32_MAX;
    if (value < INT32_MIN)
        return INT32_MIN;
    return static_cast<int32_t>(value);
}

uint64_t DecimalToUInt64(const char* text)
{
    return text != nullptr ? std::strtoull(text, nullptr, 10) : 0;
}
