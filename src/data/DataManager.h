// The one door to the data files: a path gives a Database, loaded the first time
// the path is asked for and the same object for ever after. Never null, never an
// error: a failed load is a database with no arrays.
//
// Any thread may ask. "DATAMAN" guards the list only, never a load, so a slow
// file or a waiting popup blocks no other caller. A path must be asked for by one
// thread only: a second thread asking during the load gets the database at once,
// possibly with arrays still missing.
#pragma once

#include "data/Database.h"
#include "foundation/PtrArray.h"

class DataManager {
public:
    static Database* GetDatabase(const char* path);

    // Every database ever asked for, in order of first request. Owned; freed at
    // process end only.
    static PtrArray<Database>& Databases();
};
