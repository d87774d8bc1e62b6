#include "data/DataManager.h"

#include <cstring>

#include "host/HostServices.h"

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

HostThreadApi* Threads()
{
    return hostServices != nullptr ? hostServices->threads : nullptr;
}

// The last four characters, ASCII letters compared without regard to case.
bool EndsWith(const char* text, size_t length, const char* ending)
{
    const char* tail = text + length - 4;
    for (int i = 0; i < 4; ++i) {
        char c = tail[i];
        if (c >= 'A' && c <= 'Z')
            c = static_cast<char>(c - 'A' + 'a');
        if (c != ending[i])
            return false;
    }
    return true;
}

}  // namespace

PtrArray<Database>& DataManager::Databases()
{
    return databaseList.databases;
}

Database* DataManager::GetDatabase(const char* path)
{
    // A new handle per request: the mutual exclusion rests on the engine giving
    // the same mutex for the same name.
    HostThreadApi* threads = Threads();
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

bool Database::Load(const char* newPath)
{
    if (newPath == nullptr || path.text == nullptr || std::strcmp(path.text, newPath) != 0)
        SetPath(newPath);
    const char* file = path.text;
    if (file == nullptr)
        return false;

    const size_t length = std::strlen(file);
    if (length < 4)
        return false;
    if (EndsWith(file, length, ".xml"))
        return LoadXmlWithRetry(file);
    if (EndsWith(file, length, ".csv"))
        return LoadCsv(file);
    if (EndsWith(file, length, ".dat"))
        return LoadXmlWithRetry(file);

    if (hostServices != nullptr && hostServices->ReportError != nullptr)
        hostServices->ReportError(1, "Unknown database file type '%s'. Supported formats are: .csv .xml",
                                  file);
    return false;
}
