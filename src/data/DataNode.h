// One record of a DataArray: an optional id and its name/value pairs in file order.
#pragma once

#include "data/DataValue.h"
#include "data/HashedName.h"
#include "foundation/ValueArray.h"

class BlockArena;
class DataArray;

// Ownership: a node made on its own owns its id, its pair block and each pair's
// texts on the heap, and frees them when destroyed. A node made by an array of a
// Database (DataArray::AddNode) lives in the database's arena with all of those:
// nothing of it is freed one by one, and the arena releases it with the rest of
// the tree (Database::Clear or the database's end).
class DataNode {
public:
    DataNode() = default;
    // Frees the id, then every pair's texts, then the pair block (heap nodes only).
    ~DataNode();

    DataNode(const DataNode&) = delete;
    DataNode& operator=(const DataNode&) = delete;

    // Building (loaders only).
    void SetId(const char* text) { id.Set(text, arena); }
    // Always appends, so a repeated attribute gives two pairs. Null name or value
    // leave that part of the pair null.
    void AddValue(const char* name, const char* value);
    // ValueArray::Reserve of the pairs, from the node's arena if it has one. The
    // pairs of an arena node grow through this and AddValue only.
    void ReserveValues(int32_t n);

    // The value of the first pair named `name`, or null (also for a pair without
    // a value). Pairs with no name never match.
    const char* GetValue(const char* name) const;

    HashedName id;  // no text: reachable only by walking `nodes`
    ValueArray<DataValue> values;
    DataArray* array = nullptr;   // the array holding this node, not owned
    BlockArena* arena = nullptr;  // where its texts and pair block live; null: the heap
};
