#include "data/Database.h"

#include <cstring>

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
