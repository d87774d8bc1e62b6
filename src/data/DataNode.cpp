#include "data/DataNode.h"

#include <cstring>

#include "foundation/TextFormat.h"

DataNode::~DataNode()
{
    id.Free();
    for (DataValue& pair : values)
        pair.Free();
}

void DataNode::AddValue(const char* name, const char* value)
{
    DataValue pair;
    pair.name.Set(name);
    pair.value = value != nullptr ? DuplicateText(value) : nullptr;
    values.Add(pair);
}

const char* DataNode::GetValue(const char* name) const
{
    if (name == nullptr)
        return nullptr;
    const uint32_t hash = HashText(name);
    for (const DataValue& pair : values) {
        if (pair.name.hash != hash || pair.name.text == nullptr)
            continue;
        if (std::strcmp(pair.name.text, name) == 0)
            return pair.value;
    }
    return nullptr;
}
