// A named list of DataNodes, with name/value pairs of its own.
#pragma once

#include "data/DataNode.h"
#include "data/DataValue.h"
#include "data/HashedName.h"
#include "foundation/PtrArray.h"
#include "foundation/ValueArray.h"

class BlockArena;
class Database;

// Ownership: an array made on its own owns its name, its pairs' texts and its
// nodes on the heap. An array made by Database::AddArray is itself a heap object
// of the database, but its texts and nodes live in the database's arena and go
// with it; only its two blocks are freed here.
class DataArray {
public:
    DataArray() = default;
    // Frees the name, destroys every node, frees its own pairs' texts, then the
    // blocks; for an arena array the blocks only.
    ~DataArray();

    DataArray(const DataArray&) = delete;
    DataArray& operator=(const DataArray&) = delete;

    // Building (loaders only).
    void SetName(const char* text) { name.Set(text, arena); }
    // Sets a pair of the array: "id" is the array's name, not a pair. An existing
    // pair of that name gets a non-null value; otherwise a pair is appended, so a
    // repeated attribute ends as one pair with the last value. Null name: nothing.
    void SetValue(const char* pairName, const char* value);
    // Creates a node with no id, owned by this array (made in its arena if it has
    // one), and appends it.
    DataNode* AddNode();

    // The first node with id `id`, or null. Null `id` gives null.
    const DataNode* FindNode(const char* id) const;
    // The same behind Database::FindArray, whose null result counts as an array
    // without nodes: FindNode(database.FindArray("a"), "x").
    static const DataNode* FindNode(const DataArray* array, const char* id);

    HashedName name;               // no text: no lookup finds the array
    ValueArray<DataValue> values;  // filled from the file, read by nobody here
    PtrArray<DataNode> nodes;      // owned
    Database* database = nullptr;  // the database holding this array, not owned
    BlockArena* arena = nullptr;   // where its texts and nodes live; null: the heap
};
