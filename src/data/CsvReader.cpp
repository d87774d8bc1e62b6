#include "data/CsvReader.h"

#include "foundation/TextFormat.h"
#include "foundation/TextHeap.h"
#include "host/HostReport.h"

void CsvReader::Close()
{
    HostFileApi* files = HostFiles();
    if (file != nullptr && files != nullptr && files->FileClose != nullptr)
        files->FileClose(file);
    file = nullptr;
    for (int32_t i = 0; i < columnCount; ++i)
        FreeText(columnNames[i]);
    delete[] columnNames;
    columnNames = nullptr;
    columnCount = 0;
}

unsigned char CsvReader::ReadByte()
{
    // A read that gives nothing leaves a zero byte; the position moves on anyway,
    // so a short file still comes to its end.
    unsigned char byte = 0;
    HostFiles()->FileRead(&byte, 1, file);
    ++position;
    return byte;
}

CsvReader::Field CsvReader::ReadField(char* buffer, int32_t limit)
{
    int32_t length = 0;
    for (;;) {
        if (position >= fileSize) {
            buffer[length] = '\0';
            return length >= 2 ? Field::Complete : Field::Absent;
        }
        const unsigned char byte = ReadByte();
        if (byte == '\r')
            continue;
        if (byte == fieldSeparator || byte == rowSeparator) {
            buffer[length] = '\0';
            return Field::Complete;
        }
        if (length < limit)
            buffer[length++] = static_cast<char>(byte);
    }
}

bool CsvReader::Open(const char* path)
{
    if (file != nullptr)
        Close();
    HostFileApi* files = HostFiles();
    if (files == nullptr || files->FileOpen == nullptr || files->FileRead == nullptr ||
        files->FileClose == nullptr || files->FileTell == nullptr || files->FileSeek == nullptr)
        return false;
    file = files->FileOpen(path, "r");
    if (file == nullptr)
        return false;

    fileSize = file->size;
    position = 0;
    const int64_t start = files->FileTell(file);

    // Each ';' of the first line counts a column, and so does its line feed: a
    // last name with no line feed behind it is not counted.
    int32_t columns = 0;
    while (position < fileSize) {
        const unsigned char byte = ReadByte();
        if (byte == fieldSeparator)
            ++columns;
        if (byte == rowSeparator) {
            ++columns;
            break;
        }
    }
    files->FileSeek(file, start, 0);
    position = 0;

    columnNames = new char*[static_cast<size_t>(columns)];
    columnCount = columns;
    char name[kHeaderFieldLimit + 1];
    for (int32_t i = 0; i < columns; ++i) {
        const bool present = !AtEnd() && ReadField(name, kHeaderFieldLimit) == Field::Complete;
        columnNames[i] = DuplicateText(present ? name : "");
    }
    return true;
}
