// One category and one filter bound to one platform leaderboard handle.
//
// Three clients per category (filters 0, 1, 2) learn the same handle from one
// find call, registered on each of them. Queued work points at a client and reads
// `leaderboard` afresh when it is served: 0 means "not usable (yet)".
#pragma once

#include <atomic>
#include <cstdint>

#include <steam/steam_api.h>

class ClientList;

class SteamScoreClient {
public:
    void OnCreateLeaderboard(LeaderboardFindResult_t* result, bool ioFailure);

    SteamLeaderboard_t Leaderboard() const { return leaderboard.load(std::memory_order_acquire); }

    CCallResult<SteamScoreClient, LeaderboardFindResult_t> findResult;
    int32_t filter = 0;
    char name[32] = {};
    uint32_t nameHash = 0;  // HashText(name): lookups compare it before the bytes
    // Written once on the engine's thread, read by the queue threads.
    std::atomic<SteamLeaderboard_t> leaderboard{0};
    // Every client made, newest first, so that an unload can release them all.
    SteamScoreClient* nextMade = nullptr;
};

// The three client lists of the service, in filter order 0, 1, 2.
struct ScoreClientLists {
    ClientList* global;
    ClientList* friends;
    ClientList* third;
};

// Makes the category's three clients, starts the one find call and registers it on
// each client (filter 0, then 1, then 2). On the configuration thread.
void CreateCategoryClients(const ScoreClientLists& lists, const char* id, ELeaderboardSortMethod sort,
                           ELeaderboardDisplayType display);

// The first client of `list` whose name is `category`, byte for byte; null for a
// null category or none.
SteamScoreClient* FindClientIn(const ClientList& list, const char* category);
