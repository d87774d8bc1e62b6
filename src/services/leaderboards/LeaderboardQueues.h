// The service's three module-wide queues and their two mutexes.
//
// The threads that drain the queues get no object, so the queues are statics:
// "STEAM_LEADERBOARDS_REQUEST" guards the two request queues, and
// "STEAM_LEADERBOARDS_SUBMIT" the submit queue. Each lock is held for one queue
// operation only, never across a platform call, a sleep or an allocation.
//
// Besides its queue, every entry alive (queued, taken, or in flight with its call
// result) is linked into a list of live entries under the same mutex, so that an
// unload of the library releases what no handler will ever reach.
#pragma once

#include "foundation/PtrArray.h"
#include "host/HostServices.h"

struct ScoreRequest;
struct UserRequest;
struct ScoreSubmit;

// An intrusive list of live entries; `Entry` has `livePrev` and `liveNext`.
template <class Entry> struct LiveEntries {
    void Link(Entry* entry)
    {
        entry->livePrev = nullptr;
        entry->liveNext = head;
        if (head != nullptr)
            head->livePrev = entry;
        head = entry;
    }

    void Unlink(Entry* entry)
    {
        if (entry->livePrev != nullptr)
            entry->livePrev->liveNext = entry->liveNext;
        else if (head == entry)
            head = entry->liveNext;
        if (entry->liveNext != nullptr)
            entry->liveNext->livePrev = entry->livePrev;
        entry->livePrev = nullptr;
        entry->liveNext = nullptr;
    }

    Entry* head = nullptr;
};

extern HostMutex* requestMutex;
extern HostMutex* submitMutex;
extern PtrArray<ScoreRequest> scoreRequestQueue;
extern PtrArray<UserRequest> userRequestQueue;
extern PtrArray<ScoreSubmit> scoreSubmitQueue;

extern LiveEntries<ScoreRequest> liveScoreRequests;
extern LiveEntries<UserRequest> liveUserRequests;
extern LiveEntries<ScoreSubmit> liveScoreSubmits;

// Takes the head of `queue`, moving the others down one place; null when empty.
// The caller holds the queue's mutex.
template <class Entry> Entry* TakeQueueHead(PtrArray<Entry>& queue)
{
    if (queue.count <= 0)
        return nullptr;
    Entry* head = queue[0];
    queue.RemoveAt(0);
    return head;
}

// Runs `body` with `mutex` held: for the short queue operations only.
template <class Body> void WithMutex(HostMutex* mutex, Body body)
{
    hostServices->threads->LockMutex(mutex);
    body();
    hostServices->threads->UnlockMutex(mutex);
}
