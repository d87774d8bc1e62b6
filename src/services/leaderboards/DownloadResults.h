// One finished download on its way from the handler to the engine's event.
//
// The handler (engine's thread) copies at most 100 rows out of the platform and
// hands the block to a results thread of its own, which waits for the players'
// names, builds the records and posts the scores event.
#pragma once

#include <cstdint>

#include <steam/steam_api.h>

struct ScoreEntry;

constexpr const char* kResultsThreadName = "STEAM_ProcessResultsDownloadResults";

// One zeroed heap block; the results thread owns and frees it with its details.
struct DownloadResults {
    int32_t count = 0;
    int32_t total = 0;
    LeaderboardEntry_t entries[100];
    int32_t** details = nullptr;  // `count` blocks of 47 values
    int32_t filter = 0;
    char category[32] = {};
};

// Longest wait for players' names per download, in engine milliseconds; a name
// still missing then is written as the platform gives it at that moment.
constexpr uint32_t kNameWaitMs = 5000;

// The results thread; `argument` is the DownloadResults, freed at the end.
void ProcessResultsThread(void* argument);

// The name as plain text into `buffer`: each multi-byte UTF-8 sequence becomes one
// space, other bytes are copied. Stops at 255 bytes of output and never reads
// past the name's terminator. A null name gives "".
constexpr int32_t kPlainNameSize = 256;
void PlainTextName(const char* name, char (&buffer)[kPlainNameSize]);

// The event's `start`: 0 without rows, 1 for the friends filter, else the first
// row's rank as the platform gave it.
int32_t ScoresEventStart(int32_t filter, int32_t count, int32_t firstRank);

// Builds and posts the event of type 19; `entries` passes to the engine.
void SendScoresEvent(const char* category, int32_t friends, int32_t start, int32_t count, ScoreEntry* entries,
                     int32_t total);
