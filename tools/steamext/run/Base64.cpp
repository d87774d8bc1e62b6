#include "run/Base64.h"

#include <cstdint>
#include <cstring>

namespace steamext::run {

namespace {
const char kBase64Alphabet[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
}

std::string DecodeBase64(const std::string& text, bool& ok)
{
    std::string out;
    uint32_t accumulator = 0;
    int bits = 0;
    std::size_t padding = 0;
    ok = false;
    for (char c : text) {
        if (c == '=') {
            ++padding;
            continue;
        }
        if (padding > 0)
            return {};  // data after padding
        const char* found = std::strchr(kBase64Alphabet, c);
        if (c == '\0' || found == nullptr)
            return {};
        accumulator = (accumulator << 6) | static_cast<uint32_t>(found - kBase64Alphabet);
        bits += 6;
        if (bits >= 8) {
            bits -= 8;
            out += static_cast<char>((accumulator >> bits) & 0xFF);
        }
    }
    ok = padding <= 2 && (text.size() % 4 == 0 || padding == 0) && bits < 6;
    return ok ? out : std::string();
}

std::string EncodeBase64(const std::string& bytes)
{
    std::string out;
    std::size_t i = 0;
    for (; i + 2 < bytes.size(); i += 3) {
        uint32_t n = (uint8_t(bytes[i]) << 16) | (uint8_t(bytes[i + 1]) << 8) | uint8_t(bytes[i + 2]);
        for (int shift = 18; shift >= 0; shift -= 6)
            out += kBase64Alphabet[(n >> shift) & 63];
    }
    if (i + 1 == bytes.size()) {
        uint32_t n = uint8_t(bytes[i]) << 16;
        out += kBase64Alphabet[(n >> 18) & 63];
        out += kBase64Alphabet[(n >> 12) & 63];
        out += "==";
    } else if (i + 2 == bytes.size()) {
        uint32_t n = (uint8_t(bytes[i]) << 16) | (uint8_t(bytes[i + 1]) << 8);
        out += kBase64Alphabet[(n >> 18) & 63];
        out += kBase64Alphabet[(n >> 12) & 63];
        out += kBase64Alphabet[(n >> 6) & 63];
        out += '=';
    }
    return out;
}

}  // namespace steamext::run
