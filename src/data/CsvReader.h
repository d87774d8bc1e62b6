// The state of one CSV load: ';' between fields, a line feed between rows, a
// header line naming the columns. There is no quoting and no escaping, and a
// carriage return is ignored wherever it stands.
//
// The file is read one byte per FileRead call, and `position` counts the bytes
// taken; the end of the file is `position` reaching `fileSize`, whatever the
// reads gave.
#pragma once

#include <cstdint>

#include "host/HostServices.h"

class CsvReader {
public:
    static constexpr int32_t kHeaderFieldLimit = 511;
    static constexpr int32_t kDataFieldLimit = 4095;

    enum class Field {
        Complete,  // ended by a separator, or at the end with 2 bytes or more
        Absent,    // 0 or 1 byte at the end of the file with no separator behind
    };

    CsvReader() = default;
    ~CsvReader() { Close(); }

    CsvReader(const CsvReader&) = delete;
    CsvReader& operator=(const CsvReader&) = delete;

    // Opens the file and reads the header. False if the file can't be opened.
    bool Open(const char* path);
    // Closes the file, frees the column names, and sets columnCount to 0.
    void Close();

    // Reads one field into `buffer` (room for `limit` bytes and a terminator).
    Field ReadField(char* buffer, int32_t limit);
    bool AtEnd() const { return position >= fileSize; }

    int32_t columnCount = 0;
    char** columnNames = nullptr;
    HostFile* file = nullptr;
    uint32_t fieldSeparator = ';';
    uint32_t rowSeparator = '\n';
    int64_t fileSize = 0;
    int64_t position = 0;

private:
    unsigned char ReadByte();
};
