// One record of a DataArray: an optional id and its name/value pairs in file order.
#pragma once

#include "data/DataValue.h"
#include "data/HashedName.h"
#include "foundation/ValueArray.h"

class DataArray;

class DataNode {
public:
    DataNode() = default;
    // Frees the id, then every pair's texts, then the pair block.
    ~DataNode();

    DataNode(const DataNode&) = delete;
    DataNode& operator=(const DataNode&) = delete;

    // Building (loaders only).
    void SetId(const char* text) { id.Set(text); }
    // Always appends, so a repeated attribute gives two pairs. Null name or value
    // leave that part of the pair null.
    void AddValue(const char* name, const char* value);

    // The value of the first pair named `name`, or null (also for a pair without
    // a value). Pairs with no name never match.
    const char* GetValue(const char* name) const;

    HashedName id;                  // no text: reachable only by walking `nodes`
    ValueArray<DataValue> values;
    DataArray* array = nullptr;     // the array holding this node, not owned
};
