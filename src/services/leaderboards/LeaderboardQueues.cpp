#include "services/leaderboards/LeaderboardQueues.h"

#include "services/leaderboards/ScoreRequest.h"
#include "services/leaderboards/ScoreSubmit.h"

HostMutex* requestMutex = nullptr;
HostMutex* submitMutex = nullptr;
PtrArray<ScoreRequest> scoreRequestQueue;
PtrArray<UserRequest> userRequestQueue;
PtrArray<ScoreSubmit> scoreSubmitQueue;

LiveEntries<ScoreRequest> liveScoreRequests;
LiveEntries<UserRequest> liveUserRequests;
LiveEntries<ScoreSubmit> liveScoreSubmits;

namespace {

template <class Entry> void ReleaseAll(LiveEntries<Entry>& live)
{
    Entry* entry = live.head;
    live.head = nullptr;
    while (entry != nullptr) {
        Entry* next = entry->liveNext;
        DeleteEntry(entry);
        entry = next;
    }
}

// When the library is unloaded the engine's threads have ended: what is still
// queued, asleep for a retry or in flight is released here, its pending call
// result cancelled first. The queues' blocks go with their statics.
struct ReleaseAtUnload {
    ~ReleaseAtUnload()
    {
        ReleaseAll(liveScoreRequests);
        ReleaseAll(liveUserRequests);
        ReleaseAll(liveScoreSubmits);
    }
} releaseAtUnload;

}  // namespace
