// One leaderboard row as the engine and the service exchange it: the record
// SubmitScore reads and the array the scores event carries. A wire format.
#pragma once

#include <cstddef>
#include <cstdint>

constexpr int32_t kScoreDetailsCount = 47;
constexpr int32_t kScoreDetailsBytes = kScoreDetailsCount * 4;

struct ScoreEntry {
    char userId[64];    // low 32 bits of the user's id, as "%d"
    char userName[64];  // display name, at most 63 characters
    int32_t score;
    int32_t rank;  // global rank from 1; 0 for none
    int32_t details[kScoreDetailsCount];
    int32_t detailsSize;  // 188 when details were filled, else 0
    int32_t reserved;
};
static_assert(sizeof(ScoreEntry) == 332, "records follow each other at 332 bytes");
static_assert(offsetof(ScoreEntry, userId) == 0, "userId at 0");
static_assert(offsetof(ScoreEntry, userName) == 64, "userName at 64");
static_assert(offsetof(ScoreEntry, score) == 128, "score at 128");
static_assert(offsetof(ScoreEntry, rank) == 132, "rank at 132");
static_assert(offsetof(ScoreEntry, details) == 136, "details at 136");
static_assert(sizeof(ScoreEntry::details) == 188, "details are 188 bytes");
static_assert(offsetof(ScoreEntry, detailsSize) == 324, "detailsSize at 324");
static_assert(offsetof(ScoreEntry, reserved) == 328, "reserved at 328");
