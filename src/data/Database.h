// One loaded data file: its arrays in file order. Built once by a loader, then
// only read, by any thread and with no lock.
//
// Ownership: the database owns its arrays (heap objects) and its arena, which
// holds every text, node and pair block of the tree: building takes no heap call
// per text or node, and the tree is released in one sweep by Clear or the
// destructor. The path stays on the heap, since it outlives a Clear.
#pragma once

#include "data/DataArray.h"
#include "data/HashedName.h"
#include "foundation/BlockArena.h"
#include "foundation/PtrArray.h"

class XmlReader;

class Database {
public:
    Database() = default;
    // Destroys every array and frees the path (only the cache does this, at exit).
    ~Database();

    Database(const Database&) = delete;
    Database& operator=(const Database&) = delete;

    // Building (loaders only).
    // As HashedName::Set, but a null path is stored as the empty text.
    void SetPath(const char* text);
    // Destroys every array, gives the arena's chunks back, and keeps the block
    // and the path, so that a failed load leaves an empty database and a retry
    // starts clean.
    void Clear();
    // Creates an array with no name, owned by this database and building in its
    // arena, and appends it.
    DataArray* AddArray();

    // The first array named `name`, compared by text; arrays with no name are
    // skipped. Null if there is none, or if `name` is null.
    const DataArray* FindArray(const char* name) const;

    // Loading. Load chooses the reader by the path's ending; the XML loader
    // (DatabaseXml.cpp) retries through the engine's popup; the CSV loader is in
    // DatabaseCsv.cpp.
    bool Load(const char* newPath);
    bool LoadXmlWithRetry(const char* newPath);
    bool LoadXml(const char* newPath);
    bool ReadXmlBlocks(XmlReader& reader);
    bool LoadCsv(const char* newPath);

    HashedName path;             // never null once set: the key of the cache
    PtrArray<DataArray> arrays;  // owned
    BlockArena arena;            // the tree's texts, nodes and pair blocks
};
