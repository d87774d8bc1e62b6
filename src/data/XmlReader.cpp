// The reader's life: the file into memory, the envelope undone, the
// declaration read, and the parse errors reported. Tokens are cut in
// XmlTokeniser.cpp, blocks made of them in XmlBlocks.cpp.
#include "data/XmlReader.h"

#include <algorithm>
#include <cstring>

#include "data/ScrambledEnvelope.h"
#include "data/XmlCharClasses.h"
#include "foundation/ListToken.h"
#include "foundation/TextFormat.h"
#include "foundation/TextHeap.h"
#include "host/HostReport.h"

using namespace xml;

namespace {

constexpr int32_t kExcerptLimit = 254;
constexpr int32_t kEncodingPieceSize = 512;

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

    HostFileApi* files = HostFiles();
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
            HostReportError(
                1,
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
        HostReportError(
            1, "XML document needs to start with line like <?xml versions=... ?>. File '%s' doesn't.", path);
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
    const int promoted = static_cast<signed char>(character);  // NOLINT(bugprone-signed-char-misuse)
    HostReportError(1,
                    "Parsing error (%s) around line %d in XML '%s'. Unexpected character '%c' (%x) at:\n'%s'",
                    reason, line, path, promoted, static_cast<unsigned>(promoted), excerpt);
}
