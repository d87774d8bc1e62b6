// Loads arbitrary bytes as a CSV database.
#include "FuzzHost.h"
#include "data/Database.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    fuzzhost::Install(data, size);
    Database database;
    database.Load("fuzz.csv");
    return 0;
}
