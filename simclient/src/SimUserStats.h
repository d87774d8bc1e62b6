// ISteamUserStats, split over two files: statistics/achievements and leaderboards.
#ifndef SIMCLIENT_SIM_USER_STATS_H
#define SIMCLIENT_SIM_USER_STATS_H

#include <steam/steam_api.h>

namespace simclient {

class SimSteamUserStats final : public ISteamUserStats {
public:
    // SimUserStats.cpp
    bool RequestCurrentStats() override;
    bool GetStat(const char* pchName, int32* pData) override;
    bool GetStat(const char* pchName, float* pData) override;
    bool SetStat(const char* pchName, int32 nData) override;
    bool SetStat(const char* pchName, float fData) override;
    bool SetAchievement(const char* pchName) override;
    bool StoreStats() override;

    // SimLeaderboards.cpp
    SteamAPICall_t FindOrCreateLeaderboard(const char* pchLeaderboardName,
                                           ELeaderboardSortMethod eLeaderboardSortMethod,
                                           ELeaderboardDisplayType eLeaderboardDisplayType) override;
    const char* GetLeaderboardName(SteamLeaderboard_t hSteamLeaderboard) override;
    int GetLeaderboardEntryCount(SteamLeaderboard_t hSteamLeaderboard) override;
    SteamAPICall_t DownloadLeaderboardEntries(SteamLeaderboard_t hSteamLeaderboard,
                                              ELeaderboardDataRequest eLeaderboardDataRequest,
                                              int nRangeStart, int nRangeEnd) override;
    SteamAPICall_t DownloadLeaderboardEntriesForUsers(SteamLeaderboard_t hSteamLeaderboard,
                                                      CSteamID* prgUsers, int cUsers) override;
    bool GetDownloadedLeaderboardEntry(SteamLeaderboardEntries_t hSteamLeaderboardEntries, int index,
                                       LeaderboardEntry_t* pLeaderboardEntry, int32* pDetails,
                                       int cDetailsMax) override;
    SteamAPICall_t UploadLeaderboardScore(SteamLeaderboard_t hSteamLeaderboard,
                                          ELeaderboardUploadScoreMethod eLeaderboardUploadScoreMethod,
                                          int32 nScore, const int32* pScoreDetails,
                                          int cScoreDetailsCount) override;
};

}  // namespace simclient

#endif  // SIMCLIENT_SIM_USER_STATS_H
