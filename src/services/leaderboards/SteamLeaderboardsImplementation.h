// Leaderboards over the platform's user statistics: per-category score clients,
// queued downloads and uploads on worker threads, scores delivered as events.
#pragma once

#include <steam/steam_api.h>

#include "foundation/InlineString.h"
#include "services/leaderboards/ClientList.h"
#include "services/leaderboards/LeaderboardsImplementation.h"

class SteamScoreClient;
struct ScoreClientLists;

class SteamLeaderboardsImplementation : public LeaderboardsImplementation {
public:
    int32_t GetServiceType() override;
    const char* GetPlatformName() override;
    bool Initialize() override;
    void Shutdown() override;
    void Update() override;
    bool IsAvailable() override;
    void SubmitScore(int32_t reserved, const ScoreEntry* record, const char* category) override;
    bool RequestScores(int32_t start, int32_t count, int32_t filter, const char* category) override;
    bool RequestScoresAroundUser(int32_t reserved, int32_t count, const char* category) override;
    const char* GetUserId() override;
    bool ReservedQueryA() override;
    void ReservedCommandA() override;
    void ReservedCommandB() override;
    int32_t GetServiceState() override;
    bool ReservedQueryB() override;
    void ReservedCommandC() override;
    int32_t GetFixedLimit() override;

    // The client of `category` in the list of `filter` (1 friends, 2 third, any
    // other global); null if none is published yet.
    SteamScoreClient* FindClient(const char* category, int32_t filter) const;

    ScoreClientLists Lists();

    // Filled by the configuration thread, scanned by the engine's thread.
    ClientList globalClients;
    ClientList friendsClients;
    ClientList thirdClients;
    InlineString userId;

private:
    bool threadsStarted = false;
};

// "Steam_Leaderboards_Initialize": reads the categories and makes their clients.
void LeaderboardsConfigurationThread(void* service);

// The exact words of the configuration file; anything else is the default.
ELeaderboardSortMethod SortMethodOf(const char* value);
ELeaderboardDisplayType DisplayTypeOf(const char* value);
