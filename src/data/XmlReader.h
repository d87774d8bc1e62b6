// A pull reader for the restricted XML dialect of the game's data files.
//
// This is deliberately not a conforming XML parser: the data files were written
// against this reader, so what it accepts, what it refuses and the words it
// refuses with are its contract. Each ReadBlock gives the next block: one tag or
// one piece of text. The reader knows no nesting; the loader matches tags.
//
// [SECTION] Lifecycle
//   XmlReader reader;             // token buffer allocated here
//   reader.Open(path)             // file into memory, envelope undone, declaration read
//   while (XmlBlock* b = reader.ReadBlock()) ...   // null: end of file or parse error
//
// Everything a block points at lives in the token buffer (or, for a CDATA
// section, in the file text) and is overwritten by the next ReadBlock: callers
// copy what they keep. Parsing is destructive: pieces of a tag are cut by
// writing terminators into the token buffer.
//
// Files: XmlReader.cpp (opening, declaration, errors), XmlTokeniser.cpp (tokens),
// XmlBlocks.cpp (blocks and attributes), XmlEscapes.cpp (value rewrites),
// XmlCharClasses.h and XmlTokenRules.h (the byte classes and tag rules they share).
#pragma once

#include <cstdint>

struct XmlBlock {
    static constexpr int32_t kMaxAttributes = 512;

    char* name;                             // element name; null for a text block
    int32_t count;                          // attributes; 1 for a text block
    char* attributeNames[kMaxAttributes];   // text block: "DATA" or "CDATA"
    char* attributeValues[kMaxAttributes];  // text block: the text
    bool closing;                           // close tag or self-closing tag
};

class XmlReader {
public:
    // A token holds at most this many bytes, plus its terminator.
    static constexpr int32_t kTokenLimit = 16383;
    static constexpr int32_t kTokenBufferSize = kTokenLimit + 1;

    XmlReader();
    ~XmlReader();

    XmlReader(const XmlReader&) = delete;
    XmlReader& operator=(const XmlReader&) = delete;

    // Reads the file through the engine's file table, plain or scrambled as its
    // content says, and reads the declaration. True when blocks can be read.
    bool Open(const char* filePath);
    // As Open, from bytes already in memory (copied); for the tools and tests that
    // have no engine. `filePath` is only used in messages.
    bool OpenFromMemory(const char* filePath, const void* bytes, int64_t byteCount);

    // Checks the start of the text and leaves `cursor` behind the declaration.
    bool ReadDeclaration();
    // The next block, or null at the end of the file and after a parse error.
    XmlBlock* ReadBlock();

    // The file's path, for messages (owned copy).
    const char* Path() const { return path; }
    // The encoding named by the declaration, or null. Nothing depends on it.
    const char* Encoding() const { return encoding; }

    // Replaces "&quot;" and then "&amp;" in place; no other entity is known.
    static void ReplaceEntities(char* value);

    // Internal to ReadBlock; public for the tests of single tokens.
    char* ReadToken(XmlBlock& target);

    char* path = nullptr;
    char* encoding = nullptr;
    int64_t size = 0;
    int32_t cursor = 0;
    XmlBlock block;
    char* tokenBuffer = nullptr;
    char* data = nullptr;
    bool active = false;

private:
    // The state of one ReadToken and its steps, defined and inlined in
    // XmlTokeniser.cpp and used nowhere else.
    struct TokenScan;
    static inline int32_t CopyRun(TokenScan& s, unsigned char mask);
    inline bool EndOfText(TokenScan& s);
    inline bool TakeTagRun(TokenScan& s);
    inline bool TakePlainRun(TokenScan& s);
    inline bool TakeCdata(TokenScan& s, XmlBlock& target);
    inline bool TakeQuotedByte(TokenScan& s, unsigned char c);
    inline bool TakeTextByte(TokenScan& s, unsigned char c);
    inline bool TakeTagByte(TokenScan& s, unsigned char c);

    // Takes ownership of `text` (size + 1 bytes, terminated): undoes an envelope,
    // then reads the declaration.
    bool AcceptText(char* text, int64_t textSize);
    void ReportParseError(const char* reason, int character);
    bool SkipComment(int32_t lastDash);
    XmlBlock* ReadAttributes(char* start);
    void ResetPath(const char* filePath);
};
