// Service number 2 as the engine sees it: leaderboards.
//
// The engine calls the operations by position: the seven of BaseImplementation,
// then these eleven, in this order.
#pragma once

#include <cstdint>

#include "frame/ExtensionModule.h"

struct ScoreEntry;

class LeaderboardsImplementation : public BaseImplementation {
public:
    // The first argument is the engine's and is not read. `record` stays the caller's.
    virtual void SubmitScore(int32_t reserved, const ScoreEntry* record, const char* category) = 0;
    // True when queued; false when the category has no client.
    virtual bool RequestScores(int32_t start, int32_t count, int32_t filter, const char* category) = 0;
    // The first argument is the engine's and is not read.
    virtual bool RequestScoresAroundUser(int32_t reserved, int32_t count, const char* category) = 0;
    // The current user's id as decimal text, kept by the service; null before Initialize.
    virtual const char* GetUserId() = 0;
    virtual bool ReservedQueryA() = 0;
    virtual void ReservedCommandA() = 0;
    virtual void ReservedCommandB() = 0;
    virtual int32_t GetServiceState() = 0;
    virtual bool ReservedQueryB() = 0;
    virtual void ReservedCommandC() = 0;
    virtual int32_t GetFixedLimit() = 0;
};

// The engine's filter numbers; any other value reads as global.
enum LeaderboardFilter : int32_t {
    FilterGlobal = 0,
    FilterFriends = 1,
    FilterThird = 2,
};
