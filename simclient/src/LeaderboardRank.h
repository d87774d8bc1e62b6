// Ordering rules of a leaderboard, shared by uploads and the world's set-up.
#ifndef SIMCLIENT_LEADERBOARD_RANK_H
#define SIMCLIENT_LEADERBOARD_RANK_H

#include <algorithm>

#include "WorldState.h"

namespace simclient {

// True when `a` ranks ahead of `b`. Unsorted boards behave as descending ones.
inline bool Better(ELeaderboardSortMethod sort, int32 a, int32 b)
{
    return sort == k_ELeaderboardSortMethodAscending ? a < b : a > b;
}

// Stable, so equal scores keep the order in which they were set.
inline void SortRows(Leaderboard& board)
{
    std::stable_sort(board.rows.begin(), board.rows.end(),
                     [&](const LeaderboardRow& a, const LeaderboardRow& b) {
                         return Better(board.sort, a.score, b.score);
                     });
}

// 1-based rank of `user`, or 0 when not on the board.
inline int RankOf(const Leaderboard& board, uint64 user)
{
    for (std::size_t i = 0; i < board.rows.size(); ++i)
        if (board.rows[i].steamId == user)
            return static_cast<int>(i) + 1;
    return 0;
}

}  // namespace simclient

#endif  // SIMCLIENT_LEADERBOARD_RANK_H
