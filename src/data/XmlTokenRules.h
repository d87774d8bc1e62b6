// The rules that decide what a tag's bytes become in the token. The tokeniser's
// run loop and its byte-by-byte steps, and the attribute splitter, all ask
// these, so each rule is written once.
#pragma once

#include <cstdint>

namespace xml {

// The attribute names of a text block. ReadBlock tells a CDATA section by the
// address of its name, so there is one copy of each.
inline char kDataName[] = "DATA";
inline char kCdataName[] = "CDATA";

// A quote behind `bytes[0, count)` is escaped by one backslash before it, not
// by two.
inline bool EndsWithEscape(const char* bytes, int32_t count)
{
    return count >= 1 && bytes[count - 1] == '\\' && !(count >= 2 && bytes[count - 2] == '\\');
}

// Runs of whitespace in a tag collapse to one space, and none is kept at the
// start, behind '<' or behind '='.
inline bool DropsSpace(const char* token, int32_t n)
{
    if (n == 0)
        return true;
    const char last = token[n - 1];
    return last == ' ' || last == '<' || last == '=';
}

// The length of the token once the space before an '=' is taken back.
inline int32_t TrimBeforeEquals(const char* token, int32_t n)
{
    return n > 0 && token[n - 1] == ' ' ? n - 1 : n;
}

// In a tag, the byte behind a stored '-' may complete "<!--", so runs stop there.
inline bool AwaitsCommentCheck(const char* token, int32_t n, bool inTag, bool inQuotes)
{
    return inTag && !inQuotes && n > 0 && token[n - 1] == '-';
}

// The token ends in "<!--".
inline bool EndsWithCommentOpening(const char* token, int32_t n)
{
    return n > 3 && token[n - 1] == '-' && token[n - 2] == '-' && token[n - 3] == '!' && token[n - 4] == '<';
}

}  // namespace xml
