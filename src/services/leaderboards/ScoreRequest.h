// Score downloads: the two request records, their threads and their handlers.
#pragma once

#include <cstdint>

#include <steam/steam_api.h>

#include "services/leaderboards/HeapCallResult.h"

class SteamScoreClient;

// A download of rows by position, of friends, or round the user (start 0).
struct ScoreRequest {
    void OnDownloadScore(LeaderboardScoresDownloaded_t* result, bool ioFailure);

    int32_t start = 0;
    int32_t count = 0;
    int32_t filter = 0;
    SteamScoreClient* client = nullptr;
    HeapCallResult<ScoreRequest, LeaderboardScoresDownloaded_t>* callResult = nullptr;
    ScoreRequest* livePrev = nullptr;
    ScoreRequest* liveNext = nullptr;
};

// A download of one named user's row. `user` stands first: the record's address
// is the list of one user handed to the platform.
struct UserRequest {
    void OnDownloadUser(LeaderboardScoresDownloaded_t* result, bool ioFailure);

    CSteamID user;
    SteamScoreClient* client = nullptr;
    HeapCallResult<UserRequest, LeaderboardScoresDownloaded_t>* callResult = nullptr;
    UserRequest* livePrev = nullptr;
    UserRequest* liveNext = nullptr;
};

// Kind and rows of the download that serves a request.
struct DownloadRange {
    ELeaderboardDataRequest kind;
    int32_t first;
    int32_t last;
};
DownloadRange ScoreDownloadRange(int32_t start, int32_t count, int32_t filter);

// Creates an entry with its call-result object, queues it and links it live.
// On the engine's thread.
void QueueScoreRequest(SteamScoreClient* client, int32_t start, int32_t count, int32_t filter);
void QueueUserRequest(SteamScoreClient* client, CSteamID user);

// The entry leaves the live list, its pending call is cancelled, and it is freed.
void DestroyScoreRequest(ScoreRequest* entry);
void DestroyUserRequest(UserRequest* entry);
// The same without the live list, for the release at unload.
void DeleteEntry(ScoreRequest* entry);
void DeleteEntry(UserRequest* entry);

// "Steam_Leaderboards_RequestScore" and "Steam_Leaderboards_RequestUser".
void RequestScoreThread(void* unused);
void RequestUserThread(void* unused);
