#include "data/DataManager.h"

#include <cstring>

#include "host/HostReport.h"

namespace {

// Destroys the cache when the module's statics go: there is no other way out.
struct DatabaseList {
    PtrArray<Database> databases;

    ~DatabaseList()
    {
        for (Database* database : databases)
            delete database;
    }
};

DatabaseList databaseList;

}  // namespace

PtrArray<Database>& DataManager::Databases()
{
    return databaseList.databases;
}

Database* DataManager::GetDatabase(const char* path)
{
    // A new handle per request: the mutual exclusion rests on the engine giving
    // the same mutex for the same name.
    HostThreadApi* threads = HostThreads();
    HostMutex* mutex =
        threads != nullptr && threads->CreateMutex != nullptr ? threads->CreateMutex("DATAMAN") : nullptr;
    const uint32_t hash = HashText(path);
    const bool locking = mutex != nullptr && threads->LockMutex != nullptr && threads->UnlockMutex != nullptr;
    if (locking)
        threads->LockMutex(mutex);

    PtrArray<Database>& databases = Databases();
    for (Database* database : databases) {
        if (database->path.hash == hash && database->path.text != nullptr && path != nullptr &&
            std::strcmp(database->path.text, path) == 0) {
            if (locking)
                threads->UnlockMutex(mutex);
            return database;
        }
    }

    Database* database = new Database;
    database->SetPath(path);
    databases.Add(database);
    if (locking)
        threads->UnlockMutex(mutex);

    database->Load(path);
    return database;
}
