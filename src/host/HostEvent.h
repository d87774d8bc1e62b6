// The 72-byte record the module fills and posts to the engine.
//
// Every event starts with `type` and `status`; the other 64 bytes are laid out
// per type. Each poster declares a view of its own type below and checks its
// offsets here, since the engine reads them by position.
#pragma once

#include <cstddef>
#include <cstdint>

struct ScoreEntry;

struct HostEvent {
    int32_t type;
    int32_t status;
    alignas(8) unsigned char payload[64];
};
static_assert(sizeof(HostEvent) == 72, "the engine reads 72-byte events");
static_assert(offsetof(HostEvent, payload) == 8, "payload follows type and status");

// Event types the module posts.
enum HostEventType : int32_t {
    kEventSteamStartup = 17,
    kEventLeaderboardScores = 19,
    kEventStoreStarted = 32,
    kEventStoreItemState = 33,
    kEventStorePurchaseOutcome = 34,
    kEventWorkshopPublished = 42,
};

// Type 17: the outcome of the start-up.
struct StartupEvent {
    int32_t type;
    int32_t status;
    const char* PlayerId;
    const char* ErrorText;
    unsigned char reserved[48];
};
static_assert(sizeof(StartupEvent) == sizeof(HostEvent), "a view covers the whole event");
static_assert(offsetof(StartupEvent, PlayerId) == 8, "PlayerId at 8");
static_assert(offsetof(StartupEvent, ErrorText) == 16, "ErrorText at 16");

// Type 19: the rows of one score download.
struct ScoresEvent {
    int32_t type;
    int32_t status;  // always 1
    int64_t unused1;
    char* category;  // from Allocate; null if that failed
    int32_t total;   // rows of the whole board for the global filter, else of this result
    int32_t filter;  // 1 for the friends filter, 0 for every other
    int32_t start;   // rank of the first row; 0 when there are no rows
    int32_t count;
    ScoreEntry* entries;  // `count` records from Allocate; null when count is 0
    unsigned char unused2[24];
};
static_assert(sizeof(ScoresEvent) == sizeof(HostEvent), "a view covers the whole event");
static_assert(offsetof(ScoresEvent, status) == 4, "status at 4");
static_assert(offsetof(ScoresEvent, unused1) == 8, "eight zero bytes at 8");
static_assert(offsetof(ScoresEvent, category) == 16, "category at 16");
static_assert(offsetof(ScoresEvent, total) == 24, "total at 24");
static_assert(offsetof(ScoresEvent, filter) == 28, "filter at 28");
static_assert(offsetof(ScoresEvent, start) == 32, "start at 32");
static_assert(offsetof(ScoresEvent, count) == 36, "count at 36");
static_assert(offsetof(ScoresEvent, entries) == 40, "entries at 40");
static_assert(offsetof(ScoresEvent, unused2) == 48, "24 zero bytes at 48");
