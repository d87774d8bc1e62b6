// Statistics, achievements and leaderboards of the local user.
#ifndef ISTEAMUSERSTATS_H
#define ISTEAMUSERSTATS_H

#include "isteamremotestorage.h"
#include "steam_api_common.h"

typedef uint64 SteamLeaderboard_t;
typedef uint64 SteamLeaderboardEntries_t;

const int k_cchStatNameMax = 128;
const int k_cchLeaderboardNameMax = 128;
const int k_cLeaderboardDetailsMax = 64;

enum ELeaderboardDataRequest {
    k_ELeaderboardDataRequestGlobal = 0,
    k_ELeaderboardDataRequestGlobalAroundUser = 1,
    k_ELeaderboardDataRequestFriends = 2,
    k_ELeaderboardDataRequestUsers = 3
};

enum ELeaderboardSortMethod {
    k_ELeaderboardSortMethodNone = 0,
    k_ELeaderboardSortMethodAscending = 1,
    k_ELeaderboardSortMethodDescending = 2,
};

enum ELeaderboardDisplayType {
    k_ELeaderboardDisplayTypeNone = 0,
    k_ELeaderboardDisplayTypeNumeric = 1,
    k_ELeaderboardDisplayTypeTimeSeconds = 2,
    k_ELeaderboardDisplayTypeTimeMilliSeconds = 3,
};

enum ELeaderboardUploadScoreMethod {
    k_ELeaderboardUploadScoreMethodNone = 0,
    k_ELeaderboardUploadScoreMethodKeepBest = 1,
    k_ELeaderboardUploadScoreMethodForceUpdate = 2,
};

#if defined(VALVE_CALLBACK_PACK_SMALL)
#pragma pack(push, 4)
#else
#pragma pack(push, 8)
#endif

struct LeaderboardEntry_t {
    CSteamID m_steamIDUser;
    int32 m_nGlobalRank;  // 1-based
    int32 m_nScore;
    int32 m_cDetails;
    UGCHandle_t m_hUGC;
};

#pragma pack(pop)

class ISteamUserStats {
public:
    virtual bool RequestCurrentStats() = 0;
    virtual bool GetStat(const char* pchName, int32* pData) = 0;
    virtual bool GetStat(const char* pchName, float* pData) = 0;
    virtual bool SetStat(const char* pchName, int32 nData) = 0;
    virtual bool SetStat(const char* pchName, float fData) = 0;
    virtual bool SetAchievement(const char* pchName) = 0;
    virtual bool StoreStats() = 0;

    virtual SteamAPICall_t FindOrCreateLeaderboard(const char* pchLeaderboardName,
                                                   ELeaderboardSortMethod eLeaderboardSortMethod,
                                                   ELeaderboardDisplayType eLeaderboardDisplayType) = 0;
    virtual const char* GetLeaderboardName(SteamLeaderboard_t hSteamLeaderboard) = 0;
    virtual int GetLeaderboardEntryCount(SteamLeaderboard_t hSteamLeaderboard) = 0;
    virtual SteamAPICall_t DownloadLeaderboardEntries(SteamLeaderboard_t hSteamLeaderboard,
                                                      ELeaderboardDataRequest eLeaderboardDataRequest,
                                                      int nRangeStart, int nRangeEnd) = 0;
    virtual SteamAPICall_t DownloadLeaderboardEntriesForUsers(SteamLeaderboard_t hSteamLeaderboard,
                                                              CSteamID* prgUsers, int cUsers) = 0;
    virtual bool GetDownloadedLeaderboardEntry(SteamLeaderboardEntries_t hSteamLeaderboardEntries, int index,
                                               LeaderboardEntry_t* pLeaderboardEntry, int32* pDetails,
                                               int cDetailsMax) = 0;
    virtual SteamAPICall_t UploadLeaderboardScore(SteamLeaderboard_t hSteamLeaderboard,
                                                  ELeaderboardUploadScoreMethod eLeaderboardUploadScoreMethod,
                                                  int32 nScore, const int32* pScoreDetails,
                                                  int cScoreDetailsCount) = 0;
};

#define STEAMUSERSTATS_INTERFACE_VERSION "STEAMUSERSTATS_INTERFACE_VERSION012"

STEAM_DEFINE_USER_INTERFACE_ACCESSOR(ISteamUserStats*, SteamUserStats, STEAMUSERSTATS_INTERFACE_VERSION)

#if defined(VALVE_CALLBACK_PACK_SMALL)
#pragma pack(push, 4)
#else
#pragma pack(push, 8)
#endif

struct UserStatsReceived_t {
    enum {
        k_iCallback = k_iSteamUserStatsCallbacks + 1
    };
    uint64 m_nGameID;
    EResult m_eResult;
    CSteamID m_steamIDUser;
};

struct UserStatsStored_t {
    enum {
        k_iCallback = k_iSteamUserStatsCallbacks + 2
    };
    uint64 m_nGameID;
    EResult m_eResult;
};

// Both progress values 0 means the achievement is fully unlocked.
struct UserAchievementStored_t {
    enum {
        k_iCallback = k_iSteamUserStatsCallbacks + 3
    };
    uint64 m_nGameID;
    bool m_bGroupAchievement;
    char m_rgchAchievementName[k_cchStatNameMax];
    uint32 m_nCurProgress;
    uint32 m_nMaxProgress;
};

struct LeaderboardFindResult_t {
    enum {
        k_iCallback = k_iSteamUserStatsCallbacks + 4
    };
    SteamLeaderboard_t m_hSteamLeaderboard;
    uint8 m_bLeaderboardFound;
};

struct LeaderboardScoresDownloaded_t {
    enum {
        k_iCallback = k_iSteamUserStatsCallbacks + 5
    };
    SteamLeaderboard_t m_hSteamLeaderboard;
    SteamLeaderboardEntries_t m_hSteamLeaderboardEntries;
    int m_cEntryCount;
};

struct LeaderboardScoreUploaded_t {
    enum {
        k_iCallback = k_iSteamUserStatsCallbacks + 6
    };
    uint8 m_bSuccess;
    SteamLeaderboard_t m_hSteamLeaderboard;
    int32 m_nScore;
    uint8 m_bScoreChanged;
    int m_nGlobalRankNew;
    int m_nGlobalRankPrevious;
};

#pragma pack(pop)

#endif  // ISTEAMUSERSTATS_H
