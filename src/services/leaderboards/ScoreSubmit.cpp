#include "services/leaderboards/ScoreSubmit.h"

#include <cstring>

#include "host/HostReport.h"
#include "services/leaderboards/LeaderboardQueues.h"
#include "services/leaderboards/ScoreEntry.h"
#include "services/leaderboards/SteamScoreClient.h"

namespace {

// A retried entry waits a second per upload already made, on the one submit
// thread, so whatever queues behind it waits too.
uint32_t WaitBeforeUpload(const ScoreSubmit* entry)
{
    return static_cast<uint32_t>(entry->attempts) * 1000u;
}

void Upload(ScoreSubmit* entry)
{
    const SteamLeaderboard_t board = entry->client->Leaderboard();
    ++entry->attempts;
    const SteamAPICall_t call = SteamUserStats()->UploadLeaderboardScore(
        board, k_ELeaderboardUploadScoreMethodKeepBest, entry->scoreEntry->score, entry->scoreEntry->details,
        kScoreDetailsCount);
    if (call == k_uAPICallInvalid) {
        DestroyScoreSubmit(entry);  // no handler will ever run for it
        return;
    }
    // From here on the handler owns the entry, on the engine's thread.
    entry->callResult->result.Set(call, entry, &ScoreSubmit::OnUploadScore);
}

}  // namespace

void QueueScoreSubmit(SteamScoreClient* client, const ScoreEntry* record)
{
    auto* entry = new ScoreSubmit();
    entry->scoreEntry = new ScoreEntry();
    std::memcpy(entry->scoreEntry, record, sizeof(ScoreEntry));
    entry->attempts = 0;
    entry->client = client;
    entry->callResult = new HeapCallResult<ScoreSubmit, LeaderboardScoreUploaded_t>();
    WithMutex(submitMutex, [entry] {
        scoreSubmitQueue.Add(entry);
        liveScoreSubmits.Link(entry);
    });
}

void DeleteEntry(ScoreSubmit* entry)
{
    delete entry->scoreEntry;
    entry->callResult->result.Cancel();
    delete entry->callResult;
    delete entry;
}

void DestroyScoreSubmit(ScoreSubmit* entry)
{
    WithMutex(submitMutex, [entry] { liveScoreSubmits.Unlink(entry); });
    DeleteEntry(entry);
}

// An entry taken in the pass that sees the quit, also one asleep for a retry,
// stays live and is released at unload.
void SubmitScoreThread(void* /*unused*/)
{
    HostThreadApi* threads = hostServices->threads;
    for (;;) {
        if (hostServices->IsQuitting())
            return;
        ScoreSubmit* entry = nullptr;
        WithMutex(submitMutex, [&entry] { entry = TakeQueueHead(scoreSubmitQueue); });
        if (entry == nullptr)
            threads->ThreadSleep(1);
        else if (entry->attempts >= 1)
            threads->ThreadSleep(WaitBeforeUpload(entry));
        if (hostServices->IsQuitting())
            return;
        if (entry == nullptr)
            continue;
        Upload(entry);
        if (hostServices->IsQuitting())
            return;
    }
}

void ScoreSubmit::OnUploadScore(LeaderboardScoreUploaded_t* result, bool ioFailure)
{
    if (result->m_bSuccess == 0 || ioFailure) {
        if (attempts < kMaxUploads) {
            ScoreSubmit* self = this;
            WithMutex(submitMutex, [self] { scoreSubmitQueue.Add(self); });
            return;
        }
        if (ioFailure)
            HostLog(kHostLogError, "OnUploadScore: Score not send, %s", "IO failure detected.");
    }
    DestroyScoreSubmit(this);
}
