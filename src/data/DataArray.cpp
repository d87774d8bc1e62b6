#include "data/DataArray.h"

#include <cstring>

#include "foundation/BlockArena.h"
#include "foundation/TextFormat.h"
#include "foundation/TextHeap.h"

namespace {

char* CopyValue(const char* value, BlockArena* arena)
{
    if (value == nullptr)
        return nullptr;
    size_t length = 0;
    return arena != nullptr ? arena->CopyText(value, &length) : DuplicateText(value);
}

}  // namespace

DataArray::~DataArray()
{
    // Texts and nodes of an arena array go with the arena, unvisited.
    if (arena != nullptr)
        return;
    name.Free();
    for (DataNode* node : nodes)
        delete node;
    for (DataValue& pair : values)
        pair.Free();
}

void DataArray::SetValue(const char* pairName, const char* value)
{
    if (pairName == nullptr)
        return;
    if (std::strcmp(pairName, "id") == 0) {
        SetName(value);
        return;
    }

    // Compared by text alone: the pairs of an array are never looked up by hash.
    for (DataValue& pair : values) {
        if (pair.name.text == nullptr || std::strcmp(pair.name.text, pairName) != 0)
            continue;
        if (value != nullptr) {
            char* copy = CopyValue(value, arena);
            if (arena == nullptr)
                FreeText(pair.value);
            pair.value = copy;
        }
        return;
    }

    DataValue pair;
    pair.name.Set(pairName, arena);
    pair.value = CopyValue(value, arena);
    values.Add(pair);
}

DataNode* DataArray::AddNode()
{
    DataNode* node = arena != nullptr ? arena->Create<DataNode>() : new DataNode;
    node->array = this;
    node->arena = arena;
    nodes.Add(node);
    return node;
}

const DataNode* DataArray::FindNode(const char* id) const
{
    if (id == nullptr || nodes.count == 0)
        return nullptr;
    const uint32_t hash = HashText(id);
    for (const DataNode* node : nodes) {
        if (node == nullptr || node->id.hash != hash || node->id.text == nullptr)
            continue;
        if (std::strcmp(node->id.text, id) == 0)
            return node;
    }
    return nullptr;
}

const DataNode* DataArray::FindNode(const DataArray* array, const char* id)
{
    return array != nullptr ? array->FindNode(id) : nullptr;
}
