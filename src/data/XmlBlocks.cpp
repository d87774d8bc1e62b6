// Turning a token into a block: a text block as it is, a tag split in place
// into its name and attributes, with the values' escapes and entities undone.
#include "data/XmlCharClasses.h"
#include "data/XmlEscapes.h"
#include "data/XmlReader.h"
#include "data/XmlTokenRules.h"
#include "host/HostReport.h"

using namespace xml;

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
                if (!EndsWithEscape(end - 2, 2))
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
                HostReportError(1, "Too many blocks (%d limit) in object '%s' in xml '%s'.",
                                XmlBlock::kMaxAttributes, block.name, path);
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
