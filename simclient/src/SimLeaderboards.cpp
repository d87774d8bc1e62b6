// Leaderboards: find/create, downloads (global, around the user, friends, given users),
// uploads with keep-best or forced replacement. Board handles are index + 1.
#include <algorithm>
#include <cstring>

#include "Args.h"
#include "LeaderboardRank.h"
#include "SimUserStats.h"
#include "WorldState.h"

namespace simclient {
namespace {

Leaderboard* BoardOf(WorldState& s, SteamLeaderboard_t handle)
{
    if (handle == 0 || handle > s.leaderboards.size())
        return nullptr;
    return &s.leaderboards[handle - 1];
}

// Row indices of the given users on the board, best first, each user once.
std::vector<std::size_t> RowsOfUsers(const Leaderboard& board, std::vector<uint64> users)
{
    std::vector<std::size_t> indices;
    std::sort(users.begin(), users.end());
    users.erase(std::unique(users.begin(), users.end()), users.end());
    for (uint64 user : users)
        if (int rank = RankOf(board, user))
            indices.push_back(static_cast<std::size_t>(rank - 1));
    std::sort(indices.begin(), indices.end());
    return indices;
}

// Stores a snapshot of the rows at `indices` as a downloaded-entries set, posts the result.
// The set lives until the result has been dispatched: the handler is where it is read.
SteamAPICall_t PostDownload(WorldState& s, const AppliedFaults& faults, Leaderboard* board,
                            SteamLeaderboard_t handle, const std::vector<std::size_t>& indices)
{
    LeaderboardScoresDownloaded_t result{};
    result.m_hSteamLeaderboard = handle;
    bool failed = faults.fail || !board || (faults.result && *faults.result != k_EResultOK);
    bool delivered = !faults.zeroHandle && !faults.drop;
    std::function<void()> release;
    if (!failed) {
        DownloadedEntries entries;
        for (std::size_t i : indices) {
            const LeaderboardRow& row = board->rows[i];
            LeaderboardEntry_t entry{};
            entry.m_steamIDUser = CSteamID(row.steamId);
            entry.m_nGlobalRank = static_cast<int32>(i) + 1;
            entry.m_nScore = row.score;
            entry.m_cDetails = static_cast<int32>(row.details.size());
            entry.m_hUGC = row.ugc;
            entries.entries.push_back(entry);
            entries.details.push_back(row.details);
        }
        const SteamLeaderboardEntries_t set = s.nextEntriesHandle++;
        result.m_hSteamLeaderboardEntries = set;
        result.m_cEntryCount = static_cast<int>(entries.entries.size());
        if (delivered) {
            s.downloads[set] = std::move(entries);
            release = [&s, set] { s.downloads.erase(set); };
        }
    }
    return s.QueueCallResult(LeaderboardScoresDownloaded_t::k_iCallback, &result, sizeof result, faults,
                             std::move(release));
}

}  // namespace

SteamAPICall_t SimSteamUserStats::FindOrCreateLeaderboard(const char* pchLeaderboardName,
                                                          ELeaderboardSortMethod sort,
                                                          ELeaderboardDisplayType display)
{
    CallScope call(SIM_CALL("FindOrCreateLeaderboard"), Args(pchLeaderboardName, sort, display));
    WorldState& s = call.state;
    if (!pchLeaderboardName || std::strlen(pchLeaderboardName) >= k_cchLeaderboardNameMax)
        return k_uAPICallInvalid;
    LeaderboardFindResult_t result{};
    bool failed = call.faults.fail || (call.faults.result && *call.faults.result != k_EResultOK);
    if (!failed) {
        for (std::size_t i = 0; i < s.leaderboards.size(); ++i)
            if (s.leaderboards[i].name == pchLeaderboardName)
                result.m_hSteamLeaderboard = i + 1;
        // Creation needs a sort and a display type, as on the platform.
        if (!result.m_hSteamLeaderboard && sort != k_ELeaderboardSortMethodNone &&
            display != k_ELeaderboardDisplayTypeNone) {
            Leaderboard board;
            board.name = pchLeaderboardName;
            board.sort = sort;
            board.display = display;
            s.leaderboards.push_back(board);
            result.m_hSteamLeaderboard = s.leaderboards.size();
        }
        result.m_bLeaderboardFound = result.m_hSteamLeaderboard != 0;
    }
    return QueueResult(s, result, call.faults);
}

const char* SimSteamUserStats::GetLeaderboardName(SteamLeaderboard_t hSteamLeaderboard)
{
    CallScope call(SIM_CALL("GetLeaderboardName"), Args(hSteamLeaderboard));
    Leaderboard* board = BoardOf(call.state, hSteamLeaderboard);
    return board && !call.faults.fail ? call.state.Intern(board->name) : "";
}

int SimSteamUserStats::GetLeaderboardEntryCount(SteamLeaderboard_t hSteamLeaderboard)
{
    CallScope call(SIM_CALL("GetLeaderboardEntryCount"), Args(hSteamLeaderboard));
    Leaderboard* board = BoardOf(call.state, hSteamLeaderboard);
    return board && !call.faults.fail ? static_cast<int>(board->rows.size()) : 0;
}

SteamAPICall_t SimSteamUserStats::DownloadLeaderboardEntries(SteamLeaderboard_t handle,
                                                             ELeaderboardDataRequest request, int start,
                                                             int end)
{
    CallScope call(SIM_CALL("DownloadLeaderboardEntries"), Args(handle, request, start, end));
    WorldState& s = call.state;
    Leaderboard* board = BoardOf(s, handle);
    if (!board || request == k_ELeaderboardDataRequestUsers)
        return k_uAPICallInvalid;
    std::vector<std::size_t> indices;
    const int count = static_cast<int>(board->rows.size());
    int first = 0, last = -1;  // 1-based, inclusive
    if (request == k_ELeaderboardDataRequestGlobal) {
        first = std::max(start, 1);
        last = std::min(end, count);
    } else if (request == k_ELeaderboardDataRequestGlobalAroundUser) {
        int rank = RankOf(*board, s.userId);
        if (rank > 0) {
            first = std::max(rank + start, 1);
            last = std::min(rank + end, count);
        }
    } else if (request == k_ELeaderboardDataRequestFriends) {
        std::vector<uint64> users = s.friends;
        users.push_back(s.userId);
        indices = RowsOfUsers(*board, std::move(users));
    }
    for (int rank = first; rank >= 1 && rank <= last; ++rank)
        indices.push_back(static_cast<std::size_t>(rank - 1));
    return PostDownload(s, call.faults, board, handle, indices);
}

SteamAPICall_t SimSteamUserStats::DownloadLeaderboardEntriesForUsers(SteamLeaderboard_t handle,
                                                                     CSteamID* prgUsers, int cUsers)
{
    CallScope call(SIM_CALL("DownloadLeaderboardEntriesForUsers"), Args(handle, cUsers));
    WorldState& s = call.state;
    Leaderboard* board = BoardOf(s, handle);
    if (!board || cUsers < 0 || cUsers > 100 || (cUsers > 0 && !prgUsers))
        return k_uAPICallInvalid;
    std::vector<uint64> users;
    users.reserve(static_cast<std::size_t>(cUsers));
    for (int u = 0; u < cUsers; ++u)
        users.push_back(prgUsers[u].ConvertToUint64());
    return PostDownload(s, call.faults, board, handle, RowsOfUsers(*board, std::move(users)));
}

bool SimSteamUserStats::GetDownloadedLeaderboardEntry(SteamLeaderboardEntries_t handle, int index,
                                                      LeaderboardEntry_t* pEntry, int32* pDetails,
                                                      int cDetailsMax)
{
    CallScope call(SIM_CALL("GetDownloadedLeaderboardEntry"), Args(handle, index, cDetailsMax));
    auto found = call.state.downloads.find(handle);
    if (call.faults.fail || found == call.state.downloads.end() || index < 0 ||
        index >= static_cast<int>(found->second.entries.size()))
        return false;
    const auto i = static_cast<std::size_t>(index);
    if (pEntry)
        *pEntry = found->second.entries[i];
    const std::vector<int32>& details = found->second.details[i];
    if (pDetails)
        for (int d = 0; d < cDetailsMax && d < static_cast<int>(details.size()); ++d)
            pDetails[d] = details[static_cast<std::size_t>(d)];
    return true;
}

SteamAPICall_t SimSteamUserStats::UploadLeaderboardScore(SteamLeaderboard_t handle,
                                                         ELeaderboardUploadScoreMethod method, int32 nScore,
                                                         const int32* pScoreDetails, int cScoreDetailsCount)
{
    CallScope call(SIM_CALL("UploadLeaderboardScore"),
                   Args(handle, method, nScore, pScoreDetails, cScoreDetailsCount));
    WorldState& s = call.state;
    Leaderboard* board = BoardOf(s, handle);
    if (!board || cScoreDetailsCount < 0 || cScoreDetailsCount > k_cLeaderboardDetailsMax)
        return k_uAPICallInvalid;
    LeaderboardScoreUploaded_t result{};
    result.m_hSteamLeaderboard = handle;
    result.m_nScore = nScore;
    bool failed = call.faults.fail || (call.faults.result && *call.faults.result != k_EResultOK);
    if (!failed) {
        result.m_bSuccess = 1;
        int previous = RankOf(*board, s.userId);
        result.m_nGlobalRankPrevious = previous;
        bool replace = previous == 0 || method == k_ELeaderboardUploadScoreMethodForceUpdate ||
                       Better(board->sort, nScore, board->rows[previous - 1].score);
        if (replace) {
            EraseRow(*board, s.userId);
            LeaderboardRow row;
            row.steamId = s.userId;
            row.score = nScore;
            if (pScoreDetails)
                row.details.assign(pScoreDetails, pScoreDetails + cScoreDetailsCount);
            InsertRow(*board, std::move(row));
            result.m_bScoreChanged = 1;
        }
        result.m_nGlobalRankNew = RankOf(*board, s.userId);
    }
    return QueueResult(s, result, call.faults);
}

}  // namespace simclient
