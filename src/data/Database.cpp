#include "data/Database.h"

#include <cstring>

#include "host/HostReport.h"

namespace {

// The last four characters, ASCII letters compared without regard to case.
bool EndsWith(const char* text, size_t length, const char* ending)
{
    const char* tail = text + length - 4;
    for (int i = 0; i < 4; ++i) {
        char c = tail[i];
        if (c >= 'A' && c <= 'Z')
            c = static_cast<char>(c - 'A' + 'a');
        if (c != ending[i])
            return false;
    }
    return true;
}

}  // namespace

Database::~Database()
{
    Clear();
    path.Free();
}

void Database::SetPath(const char* text)
{
    path.Set(text != nullptr ? text : "");
}

void Database::Clear()
{
    for (DataArray* array : arrays)
        delete array;
    arrays.count = 0;
    arena.Release();
}

DataArray* Database::AddArray()
{
    DataArray* array = new DataArray;
    array->database = this;
    array->arena = &arena;
    arrays.Add(array);
    return array;
}

const DataArray* Database::FindArray(const char* name) const
{
    if (name == nullptr)
        return nullptr;
    // The hash of an array's name takes no part: arrays are few.
    for (const DataArray* array : arrays) {
        if (array == nullptr || array->name.text == nullptr)
            continue;
        if (std::strcmp(array->name.text, name) == 0)
            return array;
    }
    return nullptr;
}

bool Database::Load(const char* newPath)
{
    if (newPath == nullptr || path.text == nullptr || std::strcmp(path.text, newPath) != 0)
        SetPath(newPath);
    const char* file = path.text;
    if (file == nullptr)
        return false;

    const size_t length = std::strlen(file);
    if (length < 4)
        return false;
    if (EndsWith(file, length, ".xml"))
        return LoadXmlWithRetry(file);
    if (EndsWith(file, length, ".csv"))
        return LoadCsv(file);
    if (EndsWith(file, length, ".dat"))
        return LoadXmlWithRetry(file);

    HostReportError(1, "Unknown database file type '%s'. Supported formats are: .csv .xml", file);
    return false;
}
