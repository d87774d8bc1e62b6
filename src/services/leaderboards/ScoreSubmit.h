// Score submission: the queued upload, its thread and its handler with retries.
#pragma once

#include <cstdint>

#include <steam/steam_api.h>

#include "services/leaderboards/HeapCallResult.h"

struct ScoreEntry;
class SteamScoreClient;

// Uploads of one submission before it is given up.
constexpr int32_t kMaxUploads = 10;

struct ScoreSubmit {
    void OnUploadScore(LeaderboardScoreUploaded_t* result, bool ioFailure);

    ScoreEntry* scoreEntry = nullptr;  // a private copy of the caller's record
    int32_t attempts = 0;              // uploads started so far
    SteamScoreClient* client = nullptr;
    HeapCallResult<ScoreSubmit, LeaderboardScoreUploaded_t>* callResult = nullptr;
    ScoreSubmit* livePrev = nullptr;
    ScoreSubmit* liveNext = nullptr;
};

// Copies `record`, queues the submission and links it live. Engine's thread.
void QueueScoreSubmit(SteamScoreClient* client, const ScoreEntry* record);

void DestroyScoreSubmit(ScoreSubmit* entry);
void DeleteEntry(ScoreSubmit* entry);

// "Steam_Leaderboards_SubmitScore".
void SubmitScoreThread(void* unused);
