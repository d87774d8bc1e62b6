// Cutting the next token out of the file text: one tag, one piece of text or
// one CDATA section.
//
// The token is built byte by byte in a state of three: in text, in a tag, or
// between a tag's double quotes. Runs of bytes whose only effect is to be stored
// are taken by tight loops (TakeTagRun, TakePlainRun); every other byte goes
// through the step of its state (TakeTextByte, TakeTagByte, TakeQuotedByte).
// Both ask the rules of XmlTokenRules.h, so the fast and the slow way of taking
// a byte cannot disagree.
//
// A step that returns true ends ReadToken with `result` (null after an error or
// at the end of the file); it has already set the reader's cursor.
#include <algorithm>
#include <cstring>

#include "data/XmlCharClasses.h"
#include "data/XmlReader.h"
#include "data/XmlTokenRules.h"

using namespace xml;

struct XmlReader::TokenScan {
    const unsigned char* text;
    int32_t end;
    int32_t pos;
    char* token;
    int32_t n;
    bool inTag;
    bool inQuotes;
    char* result;
};

namespace {

unsigned char StopMask(bool inTag, bool inQuotes)
{
    return inQuotes ? kQuoteStop : inTag ? kTagStop : kTextStop;
}

bool HasContent(const char* token, int32_t n)
{
    for (int32_t i = 0; i < n; ++i) {
        if (!Is(static_cast<unsigned char>(token[i]), kWhite))
            return true;
    }
    return false;
}

}  // namespace

// Stores the run of bytes not of class `mask`, bounded by the room left in the
// token, and returns the bound.
[[gnu::always_inline]] inline int32_t XmlReader::CopyRun(TokenScan& s, unsigned char mask)
{
    const int32_t stop = std::min(s.end, s.pos + (kTokenLimit - s.n));
    const int32_t runEnd = CopyPlain(s.text, s.pos, stop, mask, s.token + s.n);
    s.n += runEnd - s.pos;
    s.pos = runEnd;
    return stop;
}

[[gnu::always_inline]] inline bool XmlReader::EndOfText(TokenScan& s)
{
    if (s.pos < s.end)
        return false;
    // Unfinished text or an unfinished tag at the end of the file is dropped.
    cursor = s.pos;
    return true;
}

// In a tag, the bytes whose step is settled by the rules alone: plain bytes,
// whitespace, '=', quotes opened and quotes closed before an allowed byte. Each
// stores at most one byte, so runs are bounded by the room left. Leaves at the
// first byte that needs its full step, and behind a stored '-'.
[[gnu::always_inline]] inline bool XmlReader::TakeTagRun(TokenScan& s)
{
    for (;;) {
        if (AwaitsCommentCheck(s.token, s.n, true, s.inQuotes))
            return false;
        const int32_t stop = CopyRun(s, s.inQuotes ? kQuoteStop : kTagStop);
        if (EndOfText(s))
            return true;
        if (s.pos == stop)
            return false;
        const unsigned char c = s.text[s.pos];
        if (s.inQuotes) {
            if (c != '"')
                return false;
            if (!EndsWithEscape(s.token, s.n)) {
                if (!Is(s.text[s.pos + 1], kAfterValue))
                    return false;
                s.inQuotes = false;
            }
            s.token[s.n++] = '"';
        } else if (Is(c, kWhite)) {
            if (!DropsSpace(s.token, s.n))
                s.token[s.n++] = ' ';
        } else if (c == '=') {
            s.n = TrimBeforeEquals(s.token, s.n);
            s.token[s.n++] = '=';
        } else if (c == '"') {
            s.token[s.n++] = '"';
            s.inQuotes = true;
        } else {
            return false;
        }
        ++s.pos;
        if (EndOfText(s))
            return true;
    }
}

// Stores the run of plain bytes of the current state. A byte of a tag or of a
// value dropped for want of room still ends its step, so the scan skips them;
// text beyond the room is an error.
[[gnu::always_inline]] inline bool XmlReader::TakePlainRun(TokenScan& s)
{
    const unsigned char mask = StopMask(s.inTag, s.inQuotes);
    if (!AwaitsCommentCheck(s.token, s.n, s.inTag, s.inQuotes)) {
        const int32_t stop = CopyRun(s, mask);
        if (s.pos == stop && s.pos < s.end && !Is(s.text[s.pos], mask)) {
            if (!s.inTag && !s.inQuotes) {
                cursor = s.pos + 1;
                ReportParseError("buffer overrun", ' ');
                return true;
            }
            s.pos = ScanPlain(s.text, s.pos, s.end, mask);
        }
    }
    return EndOfText(s);
}

// "<![CDATA[" in any state: the section's content is given in place, in the file text.
[[gnu::always_inline]] inline bool XmlReader::TakeCdata(TokenScan& s, XmlBlock& target)
{
    char* content = data + s.pos + 7;
    char* close = std::strstr(content, "]]>");
    if (close == nullptr) {
        cursor = s.pos;
        ReportParseError("'![CDATA[' does not end with ']]>' pattern.", ' ');
        return true;
    }
    *close = '\0';
    cursor = static_cast<int32_t>(close - data) + 3;
    target.attributeNames[0] = kCdataName;
    s.result = content;
    return true;
}

[[gnu::always_inline]] inline bool XmlReader::TakeQuotedByte(TokenScan& s, unsigned char c)
{
    if (c == '"' && !EndsWithEscape(s.token, s.n)) {
        s.inQuotes = false;
        const unsigned char next = s.text[s.pos];
        if (!Is(next, kAfterValue)) {
            cursor = s.pos;
            ReportParseError("Unexpected character after value definition.", next);
            return true;
        }
    }
    if (s.n < kTokenLimit)
        s.token[s.n++] = static_cast<char>(c);
    return false;
}

// Text ends before a '<' when it holds more than whitespace; whitespace alone is
// dropped and the tag begins.
[[gnu::always_inline]] inline bool XmlReader::TakeTextByte(TokenScan& s, unsigned char c)
{
    if (c == '<') {
        if (HasContent(s.token, s.n)) {
            s.token[s.n] = '\0';
            cursor = s.pos - 1;
            s.result = s.token;
            return true;
        }
        s.n = 0;
        s.inTag = true;
        s.token[s.n++] = '<';
        return false;
    }
    if (c == '>') {
        cursor = s.pos;
        ReportParseError("not expecting '>'", '>');
        return true;
    }
    if (s.n >= kTokenLimit) {
        cursor = s.pos;
        ReportParseError("buffer overrun", ' ');
        return true;
    }
    s.token[s.n++] = static_cast<char>(c);
    return false;
}

[[gnu::always_inline]] inline bool XmlReader::TakeTagByte(TokenScan& s, unsigned char c)
{
    if (Is(c, kWhite)) {
        if (DropsSpace(s.token, s.n))
            return false;
        c = ' ';
    }
    const char last = s.n > 0 ? s.token[s.n - 1] : '\0';
    if (s.n > 0 && last == '<') {
        if (c == '<') {
            cursor = s.pos;
            ReportParseError("not expecting another '<'", '<');
            return true;
        }
        if (c == '>') {
            cursor = s.pos;
            ReportParseError("not expecting '<' yet", '>');
            return true;
        }
    } else if (c == '>' && s.n > 0) {
        // A space before "/>" or '>' is taken back.
        if (s.n >= 2 && s.token[s.n - 2] == ' ' && last == '/') {
            s.token[s.n - 2] = '/';
            s.token[s.n - 1] = '>';
            s.token[s.n] = '\0';
            cursor = s.pos;
            s.result = s.token;
            return true;
        }
        if (last == ' ') {
            s.token[s.n - 1] = '>';
            s.token[s.n] = '\0';
            cursor = s.pos;
            s.result = s.token;
            return true;
        }
    }
    if (EndsWithCommentOpening(s.token, s.n)) {
        // A comment: c is consumed, the "<!--" taken back, and the reader stays
        // in the tag with what the token held before it.
        s.n -= 4;
        if (!SkipComment(std::max(s.pos - 2, 0)))
            return true;
        s.pos = cursor;
        return false;
    }
    if (c == '=')
        s.n = TrimBeforeEquals(s.token, s.n);
    if (s.n < kTokenLimit)
        s.token[s.n++] = static_cast<char>(c);
    if (c == '>') {
        s.token[s.n] = '\0';
        cursor = s.pos;
        s.result = s.token;
        return true;
    }
    return false;
}

char* XmlReader::ReadToken(XmlBlock& target)
{
    TokenScan s{reinterpret_cast<const unsigned char*>(data),
                static_cast<int32_t>(size),
                cursor,
                tokenBuffer,
                0,
                false,
                false,
                nullptr};
    if (s.pos >= s.end)
        return nullptr;

    for (;;) {
        if (s.inTag && TakeTagRun(s))
            return s.result;
        if (TakePlainRun(s))
            return s.result;

        const unsigned char c = s.text[s.pos++];
        bool done;
        if (c == '!' && std::strncmp(reinterpret_cast<const char*>(s.text + s.pos), "[CDATA[", 7) == 0) {
            done = TakeCdata(s, target);
        } else if (s.inQuotes) {
            done = TakeQuotedByte(s, c);
        } else if (c == '"') {
            if (s.n < kTokenLimit)
                s.token[s.n++] = '"';
            s.inQuotes = true;
            done = false;
        } else if (!s.inTag) {
            done = TakeTextByte(s, c);
        } else {
            done = TakeTagByte(s, c);
        }
        if (done || EndOfText(s))
            return s.result;
    }
}

// The cursor walks with the index looked at, from the last dash of the opening
// "<!--", so "<!--->" is a whole comment. Comments do not nest.
bool XmlReader::SkipComment(int32_t lastDash)
{
    const char* text = data;
    const int32_t end = static_cast<int32_t>(size);
    for (int32_t i = lastDash;; ++i) {
        cursor = i;
        if (text[i] == '-' && text[i + 1] == '-' && text[i + 2] == '>') {
            cursor = i + 3;
            return true;
        }
        if (text[i] == '<' && text[i + 1] == '!' && text[i + 2] == '-') {
            ReportParseError("New comment block start within a comment block.", '<');
            return false;
        }
        if (i + 3 >= end) {
            ReportParseError("Comment block not ended properly.", ' ');
            return false;
        }
    }
}
