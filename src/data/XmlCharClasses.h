// The reader's byte classes and the scans built on them: one table lookup per
// byte, no <cctype>, so that no locale can change what the reader accepts.
#pragma once

#include <cstdint>
#include <cstring>
#include <initializer_list>

namespace xml {

enum : unsigned char {
    kWhite = 1 << 0,       // tab, line feed, carriage return, space: nothing else
    kTagStop = 1 << 1,     // bytes that do more than being stored while in a tag
    kTextStop = 1 << 2,    // ... while in text
    kQuoteStop = 1 << 3,   // ... while between double quotes
    kNameFirst = 1 << 4,   // may start an attribute name
    kNameNext = 1 << 5,    // may follow in an attribute name
    kNameEnd = 1 << 6,     // ends an element name: terminator, space, '>'
    kAfterValue = 1 << 7,  // may follow a value's closing quote: '>', '?', '/', whitespace
};

struct CharClassTable {
    unsigned char classes[256];

    constexpr CharClassTable() : classes()
    {
        const unsigned char white[] = {'\t', '\n', '\r', ' '};
        for (unsigned char c : white)
            classes[c] |= kWhite | kTagStop;
        // '!' may open a CDATA section in every state; '"' opens or closes quotes.
        for (unsigned char c : {'<', '>', '=', '"', '!', '-'})
            classes[c] |= kTagStop;
        for (unsigned char c : {'<', '>', '"', '!'})
            classes[c] |= kTextStop;
        for (unsigned char c : {'"', '!'})
            classes[c] |= kQuoteStop;
        for (int c = 'a'; c <= 'z'; ++c)
            classes[c] |= kNameFirst | kNameNext;
        for (int c = 'A'; c <= 'Z'; ++c)
            classes[c] |= kNameFirst | kNameNext;
        for (int c = '0'; c <= '9'; ++c)
            classes[c] |= kNameNext;
        for (unsigned char c : {'-', '.', ':', '_'})
            classes[c] |= kNameFirst | kNameNext;
        for (unsigned char c : {'\0', ' ', '>'})
            classes[c] |= kNameEnd;
        for (unsigned char c : {'>', '?', '/', '\t', '\n', '\r', ' '})
            classes[c] |= kAfterValue;
    }
};

inline constexpr CharClassTable kCharClasses;

inline bool Is(unsigned char c, unsigned char mask)
{
    return (kCharClasses.classes[c] & mask) != 0;
}

// Bytes that stop the walk over an attribute value in the token.
enum : unsigned char {
    kValueQuoted = 1 << 0,  // between quotes: terminator, quote, backslash, '&'
    kValueOpen = 1 << 1,    // outside them: those, space and '>'
};

struct ValueClassTable {
    unsigned char classes[256];

    constexpr ValueClassTable() : classes()
    {
        for (unsigned char c : {'\0', '"', '\\', '&'})
            classes[c] |= kValueQuoted | kValueOpen;
        for (unsigned char c : {' ', '>'})
            classes[c] |= kValueOpen;
    }
};

inline constexpr ValueClassTable kValueClasses;

inline bool IsValue(unsigned char c, unsigned char mask)
{
    return (kValueClasses.classes[c] & mask) != 0;
}

// The first byte from `p` on of class `mask`. The terminator is of every class,
// and no byte behind it is read.
inline char* SkipValueBytes(char* p, unsigned char mask)
{
    for (;; p += 4) {
        if (IsValue(static_cast<unsigned char>(p[0]), mask))
            return p;
        if (IsValue(static_cast<unsigned char>(p[1]), mask))
            return p + 1;
        if (IsValue(static_cast<unsigned char>(p[2]), mask))
            return p + 2;
        if (IsValue(static_cast<unsigned char>(p[3]), mask))
            return p + 3;
    }
}

// The first index in [pos, stop) whose byte is of class `mask`, or `stop`;
// unrolled by four, as runs of plain bytes are most of a file.
inline int32_t ScanPlain(const unsigned char* text, int32_t pos, int32_t stop, unsigned char mask)
{
    while (pos + 4 <= stop) {
        if (Is(text[pos], mask))
            return pos;
        if (Is(text[pos + 1], mask))
            return pos + 1;
        if (Is(text[pos + 2], mask))
            return pos + 2;
        if (Is(text[pos + 3], mask))
            return pos + 3;
        pos += 4;
    }
    while (pos < stop && !Is(text[pos], mask))
        ++pos;
    return pos;
}

// Copies the bytes of [pos, stop) up to the first of class `mask` to `out`, and
// returns that byte's index, or `stop`. Eight bytes are copied at a time, so up
// to seven bytes behind the run may be written too, never beyond out + (stop - pos).
inline int32_t CopyPlain(const unsigned char* text, int32_t pos, int32_t stop, unsigned char mask, char* out)
{
    while (pos + 8 <= stop) {
        std::memcpy(out, text + pos, 8);
        for (int32_t k = 0; k < 8; ++k) {
            if (Is(text[pos + k], mask))
                return pos + k;
        }
        pos += 8;
        out += 8;
    }
    while (pos < stop && !Is(text[pos], mask))
        *out++ = static_cast<char>(text[pos++]);
    return pos;
}

}  // namespace xml
