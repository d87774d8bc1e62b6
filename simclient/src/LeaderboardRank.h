// Ordering rules of a leaderboard, shared by uploads and the world's set-up.
//
// Rows are kept in rank order: better scores first, and among equal scores the row set
// earlier first (a new row goes after every row of its score). `scoreOf` indexes rows by
// user, so a user's rank is a binary search for the score plus a walk over its ties.
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

// Orders rows set in bulk (stable: equal scores keep their order) and rebuilds the index.
// A user with several rows is indexed by the best-ranked one.
inline void SortRows(Leaderboard& board)
{
    std::stable_sort(board.rows.begin(), board.rows.end(),
                     [&](const LeaderboardRow& a, const LeaderboardRow& b) {
                         return Better(board.sort, a.score, b.score);
                     });
    board.scoreOf.clear();
    for (const LeaderboardRow& row : board.rows)
        board.scoreOf.emplace(row.steamId, row.score);
}

// First row whose score does not rank ahead of `score`.
inline std::vector<LeaderboardRow>::const_iterator FirstOfScore(const Leaderboard& board, int32 score)
{
    return std::partition_point(board.rows.begin(), board.rows.end(),
                                [&](const LeaderboardRow& r) { return Better(board.sort, r.score, score); });
}

// 1-based rank of `user`, or 0 when not on the board.
inline int RankOf(const Leaderboard& board, uint64 user)
{
    auto found = board.scoreOf.find(user);
    if (found == board.scoreOf.end())
        return 0;
    for (auto it = FirstOfScore(board, found->second); it != board.rows.end() && it->score == found->second;
         ++it)
        if (it->steamId == user)
            return static_cast<int>(it - board.rows.begin()) + 1;
    return 0;
}

// Removes the row of `user` (on a board set up with several rows for one user, the
// indexed one; the others are left unindexed).
inline void EraseRow(Leaderboard& board, uint64 user)
{
    if (int rank = RankOf(board, user)) {
        board.rows.erase(board.rows.begin() + (rank - 1));
        board.scoreOf.erase(user);
    }
}

// Places a new row after every row ranked ahead of it or tied with it.
inline void InsertRow(Leaderboard& board, LeaderboardRow row)
{
    auto at = std::partition_point(board.rows.begin(), board.rows.end(), [&](const LeaderboardRow& r) {
        return !Better(board.sort, row.score, r.score);
    });
    board.scoreOf[row.steamId] = row.score;
    board.rows.insert(at, std::move(row));
}

}  // namespace simclient

#endif  // SIMCLIENT_LEADERBOARD_RANK_H
