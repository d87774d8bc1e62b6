#include "data/DataNode.h"

#include <cstring>

#include "foundation/BlockArena.h"
#include "foundation/TextFormat.h"

DataNode::~DataNode()
{
    if (arena != nullptr) {
        // The arena releases the texts and the block.
        values.ForgetBlock();
        return;
    }
    id.Free();
    for (DataValue& pair : values)
        pair.Free();
}

void DataNode::AddValue(const char* name, const char* value)
{
    DataValue pair;
    if (arena == nullptr) {
        pair.name.Set(name);
        pair.value = value != nullptr ? DuplicateText(value) : nullptr;
        values.Add(pair);
        return;
    }
    pair.name.Set(name, arena);
    size_t length = 0;
    pair.value = value != nullptr ? arena->CopyText(value, &length) : nullptr;
    values.Add(pair, *arena);
}

void DataNode::ReserveValues(int32_t n)
{
    if (arena != nullptr)
        values.Reserve(n, *arena);
    else
        values.Reserve(n);
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
