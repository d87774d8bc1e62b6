// [SECTION] Index
//   Character classes ....... one table lookup per byte, no <cctype>
//   Creation and files ...... Open, OpenFromMemory, AcceptText (envelope)
//   Declaration ............. ReadDeclaration
//   Tokens .................. ReadToken, SkipComment
//   Blocks .................. ReadBlock, ReadAttributes, escapes, entities
//   Errors .................. ReportParseError
//
// Call flow of one block:
//   ReadBlock
//   └─ ReadToken            cuts the next tag or text out of `data` into tokenBuffer
//      ├─ SkipComment       a "<!--" met inside a tag
//      └─ (CDATA)           points into `data` directly
//   └─ ReadAttributes       splits a tag in place: name=, "value", unescaping
#include "data/XmlReader.h"

#include <algorithm>
#include <cstring>

#include "data/ScrambledEnvelope.h"
#include "foundation/TextFormat.h"
#include "foundation/TextHeap.h"
#include "host/HostServices.h"

namespace {

// ---------------------------------------------------------------------------
// [SECTION] Character classes
// ---------------------------------------------------------------------------

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

constexpr CharClassTable kCharClasses;

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

constexpr ValueClassTable kValueClasses;

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

inline bool Is(unsigned char c, unsigned char mask)
{
    return (kCharClasses.classes[c] & mask) != 0;
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

char kDataName[] = "DATA";
char kCdataName[] = "CDATA";

constexpr int32_t kExcerptLimit = 254;
constexpr int32_t kEncodingPieceSize = 512;

// The reader's messages reach the engine only when it has given us its table.
template <typename... Args> void Report(const char* format, Args... args)
{
    if (hostServices != nullptr && hostServices->ReportError != nullptr)
        hostServices->ReportError(1, format, args...);
}

// Drops the whitespace of `text` anywhere, then its leading and trailing double quotes.
void TrimEncoding(char* text)
{
    char* write = text;
    for (const char* read = text; *read != '\0'; ++read) {
        if (!Is(static_cast<unsigned char>(*read), kWhite))
            *write++ = *read;
    }
    *write = '\0';
    char* start = text;
    while (*start == '"')
        ++start;
    char* end = write;
    while (end > start && end[-1] == '"')
        --end;
    *end = '\0';
    if (start != text)
        std::memmove(text, start, static_cast<size_t>(end - start) + 1);
}

// "\n", "\r", "\t", "\"" and "\\" become their bytes; a backslash before anything
// else is dropped with that byte. A backslash at the very end is dropped alone.
void UndoEscapes(char* value)
{
    char* write = value;
    const char* read = value;
    while (*read != '\0') {
        if (*read != '\\') {
            *write++ = *read++;
            continue;
        }
        const char next = read[1];
        if (next == '\0')
            break;
        switch (next) {
        case 'n':
            *write++ = '\n';
            break;
        case 'r':
            *write++ = '\r';
            break;
        case 't':
            *write++ = '\t';
            break;
        case '"':
            *write++ = '"';
            break;
        case '\\':
            *write++ = '\\';
            break;
        default:
            break;
        }
        read += 2;
    }
    *write = '\0';
}

// Replaces "&quot;" by '"' and "&amp;" by '&', scanning on behind each
// replacement. One pass does what a pass for each would, in that order: neither
// entity can overlap the other, and a '"' put in can't start an "&amp;".
void ReplaceQuotAndAmp(char* value)
{
    char* read = std::strchr(value, '&');
    if (read == nullptr)
        return;
    char* write = read;
    for (;;) {
        // `read` is at a '&'.
        if (std::strncmp(read, "&quot;", 6) == 0) {
            *write++ = '"';
            read += 6;
        } else if (std::strncmp(read, "&amp;", 5) == 0) {
            *write++ = '&';
            read += 5;
        } else {
            *write++ = *read++;
        }
        char* next = std::strchr(read, '&');
        if (next == nullptr) {
            const size_t rest = std::strlen(read);
            std::memmove(write, read, rest + 1);
            return;
        }
        const size_t run = static_cast<size_t>(next - read);
        if (write != read)
            std::memmove(write, read, run);
        write += run;
        read = next;
    }
}

}  // namespace

// ---------------------------------------------------------------------------
// [SECTION] Creation and files
// ---------------------------------------------------------------------------

XmlReader::XmlReader()
{
    std::memset(&block, 0, sizeof block);
    tokenBuffer = AllocateText(kTokenBufferSize);
}

XmlReader::~XmlReader()
{
    FreeText(data);
    FreeText(tokenBuffer);
    FreeText(encoding);
    FreeText(path);
}

void XmlReader::ResetPath(const char* filePath)
{
    FreeText(path);
    path = nullptr;
    if (filePath == nullptr || filePath[0] == '\0')
        return;
    FreeText(data);
    data = nullptr;
    size = 0;
    path = DuplicateText(filePath);
    active = true;
}

bool XmlReader::Open(const char* filePath)
{
    ResetPath(filePath);
    if (filePath == nullptr || filePath[0] == '\0')
        return false;

    HostFileApi* files = hostServices != nullptr ? hostServices->files : nullptr;
    if (files == nullptr || files->FileOpen == nullptr || files->FileRead == nullptr ||
        files->FileClose == nullptr)
        return false;
    HostFile* file = files->FileOpen(filePath, "rb");
    if (file == nullptr)
        return false;

    // Positions are signed 32-bit: a file beyond that is not a data file.
    const int64_t fileSize = file->size;
    char* text =
        fileSize >= 0 && fileSize < INT32_MAX ? AllocateText(static_cast<size_t>(fileSize) + 1) : nullptr;
    if (text == nullptr) {
        files->FileClose(file);
        return false;
    }
    const int64_t got = files->FileRead(text, fileSize, file);
    files->FileClose(file);
    // A short read leaves zero bytes rather than whatever the heap held.
    const int64_t filled = std::min(std::max<int64_t>(got, 0), fileSize);
    std::memset(text + filled, 0, static_cast<size_t>(fileSize - filled) + 1);
    return AcceptText(text, fileSize);
}

bool XmlReader::OpenFromMemory(const char* filePath, const void* bytes, int64_t byteCount)
{
    ResetPath(filePath);
    if (filePath == nullptr || filePath[0] == '\0' || byteCount < 0 || byteCount >= INT32_MAX)
        return false;
    char* text = AllocateText(static_cast<size_t>(byteCount) + 1);
    if (text == nullptr)
        return false;
    if (byteCount > 0)
        std::memcpy(text, bytes, static_cast<size_t>(byteCount));
    text[byteCount] = '\0';
    return AcceptText(text, byteCount);
}

bool XmlReader::AcceptText(char* text, int64_t textSize)
{
    data = text;
    size = textSize;
    const unsigned char* bytes = reinterpret_cast<const unsigned char*>(data);
    if (envelope::HasMagic(bytes, size)) {
        const int32_t payloadLength = envelope::PayloadLength(bytes);
        const uint32_t checksum = envelope::PayloadChecksum(bytes);
        char* plain = nullptr;
        if (size == int64_t{envelope::kHeaderSize} + payloadLength)
            plain = AllocateText(static_cast<size_t>(payloadLength) + 1);
        if (plain != nullptr && envelope::Descramble(bytes + envelope::kHeaderSize, payloadLength,
                                                     reinterpret_cast<unsigned char*>(plain)) != checksum) {
            FreeText(plain);
            plain = nullptr;
        }
        // A broken envelope says nothing here: the caller's popup is all the user sees.
        FreeText(data);
        data = plain;
        if (plain == nullptr) {
            size = 0;
            return false;
        }
        plain[payloadLength] = '\0';
        size = payloadLength;
    }
    cursor = 0;
    return ReadDeclaration();
}

// ---------------------------------------------------------------------------
// [SECTION] Declaration
// ---------------------------------------------------------------------------

bool XmlReader::ReadDeclaration()
{
    FreeText(encoding);
    encoding = nullptr;
    if (data == nullptr)
        return false;

    const unsigned char* text = reinterpret_cast<const unsigned char*>(data);
    const int64_t end = size;
    int64_t position = 0;
    if (end >= 3 && text[0] == 0xEF && text[1] == 0xBB && text[2] == 0xBF)
        position = 3;

    // Running into the last byte while skipping whitespace counts as no declaration,
    // which is why an empty file gets that message and not the one about '<'.
    bool found = false;
    for (;;) {
        if (position >= end - 1)
            break;
        if (!Is(text[position], kWhite)) {
            found = true;
            break;
        }
        ++position;
    }

    int64_t question = -1;
    if (found) {
        const unsigned char first = text[position];
        if (first != '<') {
            Report(
                "First non-whitespace char in XML document needs to be '<'. First char in '%s' is #%d '%c'.",
                path, static_cast<int>(first), static_cast<int>(first));
            return false;
        }
        // The bytes between '<' and "?>" are not looked at: any first tag will do.
        for (int64_t i = position + 2; i < end - 1; ++i) {
            const void* hit = std::memchr(text + i, '?', static_cast<size_t>(end - 1 - i));
            if (hit == nullptr)
                break;
            i = static_cast<const unsigned char*>(hit) - text;
            if (text[i + 1] == '>') {
                question = i;
                break;
            }
        }
    }
    if (question < 0) {
        Report("XML document needs to start with line like <?xml versions=... ?>. File '%s' doesn't.", path);
        return false;
    }
    cursor = static_cast<int32_t>(question + 2);

    // The encoding: behind the first "encoding", behind its first '='. The
    // declaration is cut at the '?' for the search and mended afterwards.
    data[question] = '\0';
    char piece[kEncodingPieceSize];
    char value[kEncodingPieceSize];
    if (GetListToken(piece, kEncodingPieceSize, data + position, "encoding", 1) != nullptr &&
        GetListToken(value, kEncodingPieceSize, piece, "=", 1) != nullptr) {
        TrimEncoding(value);
        if (value[0] != '\0')
            encoding = DuplicateText(value);
    }
    data[question] = '?';
    return true;
}

// ---------------------------------------------------------------------------
// [SECTION] Tokens
// ---------------------------------------------------------------------------

// One pass takes one byte. Runs of bytes whose only effect is to be stored are
// taken by the tight loops at the top; everything else goes through the steps
// below them, in the order that decides between them.
char* XmlReader::ReadToken(XmlBlock& target)
{
    const int32_t end = static_cast<int32_t>(size);
    int32_t pos = cursor;
    if (pos >= end)
        return nullptr;

    const unsigned char* text = reinterpret_cast<const unsigned char*>(data);
    char* token = tokenBuffer;
    int32_t n = 0;
    bool inTag = false;
    bool inQuotes = false;

    for (;;) {
        // In a tag, the bytes whose pass is settled without the general steps
        // below: plain bytes, whitespace, '=', quotes opened and quotes closed
        // before an allowed byte. Each stores at most one byte, so runs are
        // bounded by the room left. The loop leaves at the first byte that
        // needs more, and behind a stored '-', which may complete "<!--".
        while (inTag) {
            const int32_t stop = std::min(end, pos + (kTokenLimit - n));
            const unsigned char mask = inQuotes ? kQuoteStop : kTagStop;
            if (!inQuotes && n > 0 && token[n - 1] == '-')
                break;
            const int32_t runEnd = CopyPlain(text, pos, stop, mask, token + n);
            n += runEnd - pos;
            pos = runEnd;
            if (pos >= end) {
                cursor = pos;
                return nullptr;
            }
            if (pos == stop)
                break;
            const unsigned char c = text[pos];
            if (inQuotes) {
                if (c != '"')
                    break;
                const bool escaped = n >= 1 && token[n - 1] == '\\' && !(n >= 2 && token[n - 2] == '\\');
                if (!escaped) {
                    if (!Is(text[pos + 1], kAfterValue))
                        break;
                    inQuotes = false;
                }
                token[n++] = '"';
            } else {
                const char last = n > 0 ? token[n - 1] : '\0';
                if (Is(c, kWhite)) {
                    if (!(n == 0 || last == ' ' || last == '<' || last == '='))
                        token[n++] = ' ';
                } else if (c == '=') {
                    if (last == ' ')
                        --n;
                    token[n++] = '=';
                } else if (c == '"') {
                    token[n++] = '"';
                    inQuotes = true;
                } else {
                    break;
                }
            }
            if (++pos >= end) {
                cursor = pos;
                return nullptr;
            }
        }

        // Fast paths. A byte dropped for want of room still ends its pass. The
        // copying loops are bounded by the room left, the dropping ones follow.
        const unsigned char mask = inQuotes ? kQuoteStop : inTag ? kTagStop : kTextStop;
        // A byte behind a stored '-' may complete "<!--": the slow path looks.
        if (!inTag || inQuotes || n == 0 || token[n - 1] != '-') {
            const int32_t stop = std::min(end, pos + (kTokenLimit - n));
            const int32_t runEnd = CopyPlain(text, pos, stop, mask, token + n);
            n += runEnd - pos;
            pos = runEnd;
            if (pos == stop && pos < end && !Is(text[pos], mask)) {
                if (!inTag && !inQuotes) {
                    cursor = pos + 1;
                    ReportParseError("buffer overrun", ' ');
                    return nullptr;
                }
                pos = ScanPlain(text, pos, end, mask);
            }
        }
        if (pos >= end) {
            cursor = pos;
            return nullptr;
        }

        unsigned char c = text[pos++];

        // CDATA, in every state: the section's content is given in place.
        if (c == '!' && std::strncmp(reinterpret_cast<const char*>(text + pos), "[CDATA[", 7) == 0) {
            char* content = data + pos + 7;
            char* close = std::strstr(content, "]]>");
            if (close == nullptr) {
                cursor = pos;
                ReportParseError("'![CDATA[' does not end with ']]>' pattern.", ' ');
                return nullptr;
            }
            *close = '\0';
            cursor = static_cast<int32_t>(close - data) + 3;
            target.attributeNames[0] = kCdataName;
            return content;
        }

        if (inQuotes) {
            // A quote is escaped by one backslash before it, not by two.
            const bool escaped = n >= 1 && token[n - 1] == '\\' && !(n >= 2 && token[n - 2] == '\\');
            if (c == '"' && !escaped) {
                inQuotes = false;
                const unsigned char next = text[pos];
                if (!(next == '>' || next == '?' || next == '/' || Is(next, kWhite))) {
                    cursor = pos;
                    ReportParseError("Unexpected character after value definition.", next);
                    return nullptr;
                }
            }
            if (n < kTokenLimit)
                token[n++] = static_cast<char>(c);
        } else if (c == '"') {
            if (n < kTokenLimit)
                token[n++] = static_cast<char>(c);
            inQuotes = true;
        } else if (!inTag) {
            if (c == '<') {
                bool content = false;
                for (int32_t i = 0; i < n && !content; ++i)
                    content = !Is(static_cast<unsigned char>(token[i]), kWhite);
                if (content) {
                    token[n] = '\0';
                    cursor = pos - 1;
                    return token;
                }
                n = 0;
                inTag = true;
                token[n++] = '<';
            } else if (c == '>') {
                cursor = pos;
                ReportParseError("not expecting '>'", '>');
                return nullptr;
            } else {
                if (n >= kTokenLimit) {
                    cursor = pos;
                    ReportParseError("buffer overrun", ' ');
                    return nullptr;
                }
                token[n++] = static_cast<char>(c);
            }
        } else {
            if (c == '\t' || c == '\n' || c == '\r')
                c = ' ';
            const char last = n > 0 ? token[n - 1] : '\0';
            if (c == ' ' && (n == 0 || last == ' ' || last == '<' || last == '=')) {
                // Runs of whitespace collapse; none behind '<' or '='.
            } else {
                if (n > 0 && last == '<') {
                    if (c == '<') {
                        cursor = pos;
                        ReportParseError("not expecting another '<'", '<');
                        return nullptr;
                    }
                    if (c == '>') {
                        cursor = pos;
                        ReportParseError("not expecting '<' yet", '>');
                        return nullptr;
                    }
                } else if (c == '>' && n > 0) {
                    if (n >= 2 && token[n - 2] == ' ' && last == '/') {
                        token[n - 2] = '/';
                        token[n - 1] = '>';
                        token[n] = '\0';
                        cursor = pos;
                        return token;
                    }
                    if (last == ' ') {
                        token[n - 1] = '>';
                        token[n] = '\0';
                        cursor = pos;
                        return token;
                    }
                }
                if (n > 3 && last == '-' && token[n - 2] == '-' && token[n - 3] == '!' &&
                    token[n - 4] == '<') {
                    // A comment: c is consumed, the "<!--" taken back, and the reader
                    // stays in the tag with what the token held before it.
                    n -= 4;
                    if (!SkipComment(std::max(pos - 2, 0)))
                        return nullptr;
                    pos = cursor;
                } else {
                    if (c == '=' && last == ' ')
                        --n;
                    if (n < kTokenLimit)
                        token[n++] = static_cast<char>(c);
                    if (c == '>') {
                        token[n] = '\0';
                        cursor = pos;
                        return token;
                    }
                }
            }
        }

        // Unfinished text or an unfinished tag at the end of the file is dropped.
        if (pos >= end) {
            cursor = pos;
            return nullptr;
        }
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

// ---------------------------------------------------------------------------
// [SECTION] Blocks
// ---------------------------------------------------------------------------

XmlBlock* XmlReader::ReadBlock()
{
    if (tokenBuffer == nullptr || !active || cursor >= static_cast<int32_t>(size))
        return nullptr;

    block.attributeNames[0] = nullptr;
    char* token = ReadToken(block);
    if (token == nullptr)
        return nullptr;

    block.count = 0;
    block.name = nullptr;
    block.closing = false;

    // A CDATA section stays text even when its content begins with '<'.
    const bool cdata = block.attributeNames[0] == kCdataName;
    if (cdata || token[0] != '<' || token[1] == '!') {
        block.count = 1;
        if (!cdata)
            block.attributeNames[0] = kDataName;
        block.attributeValues[0] = token;
        return &block;
    }

    char* name = token + 1;
    if (*name == '/') {
        block.closing = true;
        ++name;
    }
    block.name = name;

    char* stop = name;
    while (!Is(static_cast<unsigned char>(*stop), kNameEnd))
        ++stop;
    if (*stop == '>') {
        if (stop[-1] == '/') {
            block.closing = true;
            stop[-1] = '\0';
        } else {
            *stop = '\0';
        }
        return &block;
    }
    // A tag cut at the token limit may have neither '>' nor a space left.
    if (*stop == '\0')
        return &block;

    *stop = '\0';
    if (cursor >= static_cast<int32_t>(size))
        return nullptr;
    return ReadAttributes(stop + 1);
}

XmlBlock* XmlReader::ReadAttributes(char* start)
{
    for (;;) {
        // The name up to the next '=', tested on the way: a bad byte or no '='
        // at all is the same refusal, so the scan stops at the first byte that
        // may not stand in a name and wants it to be the '='.
        char* attributeName = start;
        char* equals = start;
        if (Is(static_cast<unsigned char>(*equals), kNameFirst)) {
            ++equals;
            while (Is(static_cast<unsigned char>(*equals), kNameNext))
                ++equals;
        }
        if (*equals != '=') {
            ReportParseError("Reading next block (case #1)", 0);
            return nullptr;
        }
        *equals = '\0';

        // The value runs to a space or '>' outside quotes ("/>": to the '/').
        // Between quotes only a quote or the terminator can end a run.
        char* const opening = equals + 1;
        char* end = opening;
        bool quoted = false;
        bool hasBackslash = false;
        bool hasAmpersand = false;
        for (;; ++end) {
            const unsigned char mask = quoted ? kValueQuoted : kValueOpen;
            end = SkipValueBytes(end, mask);
            const char c = *end;
            if (c == '\0')
                break;
            if (c == '\\') {
                hasBackslash = true;
            } else if (c == '&') {
                hasAmpersand = true;
            } else if (c == '"') {
                if (!(end[-1] == '\\' && end[-2] != '\\'))
                    quoted = !quoted;
            } else if (!quoted) {
                if (c == ' ')
                    break;
                if (c == '>') {
                    if (end[-1] == '/')
                        --end;
                    break;
                }
            }
        }

        if (*opening != '"') {
            ReportParseError("Expecting \" character to start value definition (all values must be defined "
                             "name=\"value\" with quotes).",
                             static_cast<unsigned char>(*opening));
            ReportParseError("Reading next block (case #2)", 0);
            return nullptr;
        }

        const char endByte = *end;
        if (endByte == '/')
            block.closing = true;
        *end = '\0';
        if (end[-1] == '"')
            end[-1] = '\0';
        char* value = opening + 1;
        if (hasBackslash)
            UndoEscapes(value);
        if (hasAmpersand)
            ReplaceEntities(value);

        // Beyond the limit the attributes are still read and checked, but the
        // tables are full: the further ones are dropped.
        if (block.count < XmlBlock::kMaxAttributes) {
            block.attributeNames[block.count] = attributeName;
            block.attributeValues[block.count] = value;
            ++block.count;
            if (block.count == XmlBlock::kMaxAttributes)
                Report("Too many blocks (%d limit) in object '%s' in xml '%s'.", XmlBlock::kMaxAttributes,
                       block.name, path);
        }

        if (endByte == '\0')
            return &block;
        char* next = end + 1;
        if (next[0] == '/' && next[1] == '>') {
            block.closing = true;
            return &block;
        }
        if (next[0] == '>' || next[0] == '\0')
            return &block;
        if (cursor >= static_cast<int32_t>(size))
            return nullptr;
        start = next;
    }
}

void XmlReader::ReplaceEntities(char* value)
{
    if (value == nullptr)
        return;
    // "&amp;quot;" ends as the text "&quot;", as if "&quot;" went first.
    ReplaceQuotAndAmp(value);
}

// ---------------------------------------------------------------------------
// [SECTION] Errors
// ---------------------------------------------------------------------------

void XmlReader::ReportParseError(const char* reason, int character)
{
    const int32_t from = cursor > 0 ? cursor - 1 : 0;
    char excerpt[kExcerptLimit + 1];
    size_t length = 0;
    if (data != nullptr) {
        const char* source = data + from;
        while (length < kExcerptLimit + 1 && source[length] != '\0')
            ++length;
        if (length > kExcerptLimit)
            length = kExcerptLimit;
        std::memcpy(excerpt, source, length);
    }
    excerpt[length] = '\0';

    int32_t line = 1;
    if (data != nullptr && cursor > 0)
        line += static_cast<int32_t>(std::count(data, data + cursor, '\n'));

    cursor = static_cast<int32_t>(size);
    active = false;
    // The character goes out as a plain (signed) char promoted to int, so a byte
    // above 127 prints in hex as a negative number would, e.g. ffffffe9.
    const int promoted = static_cast<signed char>(character);
    Report("Parsing error (%s) around line %d in XML '%s'. Unexpected character '%c' (%x) at:\n'%s'", reason,
           line, path, promoted, static_cast<unsigned>(promoted), excerpt);
}
