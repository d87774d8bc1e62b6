#include "services/leaderboards/ScoreRequest.h"

#include <cstring>

#include "foundation/TextFormat.h"
#include "host/HostReport.h"
#include "services/leaderboards/DownloadResults.h"
#include "services/leaderboards/LeaderboardQueues.h"
#include "services/leaderboards/LeaderboardsImplementation.h"
#include "services/leaderboards/ScoreEntry.h"
#include "services/leaderboards/SteamScoreClient.h"

namespace {

constexpr int32_t kMaxDownloadedRows = 100;

// start + max(count - 1, 0), kept inside 32 bits.
int32_t RangeEnd(int32_t start, int32_t count)
{
    const int64_t end = int64_t{start} + (count > 1 ? int64_t{count} - 1 : 0);
    return end > INT32_MAX ? INT32_MAX : static_cast<int32_t>(end);
}

void ServeScoreRequest(ScoreRequest* entry)
{
    const SteamLeaderboard_t board = entry->client->Leaderboard();
    if (board == 0) {
        DestroyScoreRequest(entry);
        return;
    }
    const DownloadRange range = ScoreDownloadRange(entry->start, entry->count, entry->filter);
    const SteamAPICall_t call =
        SteamUserStats()->DownloadLeaderboardEntries(board, range.kind, range.first, range.last);
    if (call == k_uAPICallInvalid) {
        DestroyScoreRequest(entry);  // no handler will ever run for it
        return;
    }
    // From here on the handler owns the entry, on the engine's thread.
    entry->callResult->result.Set(call, entry, &ScoreRequest::OnDownloadScore);
}

void ServeUserRequest(UserRequest* entry)
{
    const SteamLeaderboard_t board = entry->client->Leaderboard();
    if (board == 0) {
        DestroyUserRequest(entry);
        return;
    }
    const SteamAPICall_t call = SteamUserStats()->DownloadLeaderboardEntriesForUsers(board, &entry->user, 1);
    if (call == k_uAPICallInvalid) {
        DestroyUserRequest(entry);
        return;
    }
    entry->callResult->result.Set(call, entry, &UserRequest::OnDownloadUser);
}

// The loop of both request threads. An entry taken in the pass that sees the
// quit stays live and is released at unload.
template <class Entry, class Serve> void DrainRequestQueue(PtrArray<Entry>& queue, Serve serve)
{
    HostThreadApi* threads = hostServices->threads;
    for (;;) {
        if (hostServices->IsQuitting())
            return;
        Entry* entry = nullptr;
        WithMutex(requestMutex, [&] { entry = TakeQueueHead(queue); });
        if (entry == nullptr)
            threads->ThreadSleep(1);
        if (hostServices->IsQuitting())
            return;
        if (entry == nullptr)
            continue;
        serve(entry);
        if (hostServices->IsQuitting())
            return;
    }
}

int32_t LowAccountBits(CSteamID user)
{
    return static_cast<int32_t>(static_cast<uint32_t>(user.ConvertToUint64()));
}

}  // namespace

DownloadRange ScoreDownloadRange(int32_t start, int32_t count, int32_t filter)
{
    if (filter != 0)
        return {k_ELeaderboardDataRequestFriends, start, RangeEnd(start, count)};
    if (start == 0)
        return {k_ELeaderboardDataRequestGlobalAroundUser, -(count / 2), count - count / 2 - 1};
    return {k_ELeaderboardDataRequestGlobal, start, RangeEnd(start, count)};
}

void QueueScoreRequest(SteamScoreClient* client, int32_t start, int32_t count, int32_t filter)
{
    auto* entry = new ScoreRequest();
    entry->start = start;
    entry->count = count;
    entry->filter = filter;
    entry->client = client;
    entry->callResult = new HeapCallResult<ScoreRequest, LeaderboardScoresDownloaded_t>();
    WithMutex(requestMutex, [entry] {
        scoreRequestQueue.Add(entry);
        liveScoreRequests.Link(entry);
    });
}

void QueueUserRequest(SteamScoreClient* client, CSteamID user)
{
    auto* entry = new UserRequest();
    entry->user = user;
    entry->client = client;
    entry->callResult = new HeapCallResult<UserRequest, LeaderboardScoresDownloaded_t>();
    WithMutex(requestMutex, [entry] {
        userRequestQueue.Add(entry);
        liveUserRequests.Link(entry);
    });
}

void DeleteEntry(ScoreRequest* entry)
{
    entry->callResult->result.Cancel();
    delete entry->callResult;
    delete entry;
}

void DeleteEntry(UserRequest* entry)
{
    entry->callResult->result.Cancel();
    delete entry->callResult;
    delete entry;
}

void DestroyScoreRequest(ScoreRequest* entry)
{
    WithMutex(requestMutex, [entry] { liveScoreRequests.Unlink(entry); });
    DeleteEntry(entry);
}

void DestroyUserRequest(UserRequest* entry)
{
    WithMutex(requestMutex, [entry] { liveUserRequests.Unlink(entry); });
    DeleteEntry(entry);
}

void RequestScoreThread(void* /*unused*/)
{
    DrainRequestQueue(scoreRequestQueue, &ServeScoreRequest);
}

void RequestUserThread(void* /*unused*/)
{
    DrainRequestQueue(userRequestQueue, &ServeUserRequest);
}

void ScoreRequest::OnDownloadScore(LeaderboardScoresDownloaded_t* result, bool /*ioFailure*/)
{
    int32_t rows = result->m_cEntryCount;
    if (rows > kMaxDownloadedRows)
        rows = kMaxDownloadedRows;
    if (rows < 0)
        rows = 0;
    if (result->m_cEntryCount == 0)
        HostLog(kHostLogInfo, "OnDownloadScore: Downloaded %d scores", 0);

    auto* results = new DownloadResults();
    results->details = new int32_t*[rows];
    results->count = rows;
    results->filter = client->filter;
    FormatToBuffer(results->category, sizeof results->category, "%s", client->name);
    results->total =
        client->filter == 0 ? SteamUserStats()->GetLeaderboardEntryCount(result->m_hSteamLeaderboard) : rows;
    for (int32_t i = 0; i < rows; ++i) {
        results->details[i] = new int32_t[kScoreDetailsCount]();
        SteamUserStats()->GetDownloadedLeaderboardEntry(result->m_hSteamLeaderboardEntries, i,
                                                        &results->entries[i], results->details[i],
                                                        kScoreDetailsCount);
        SteamFriends()->RequestUserInformation(results->entries[i].m_steamIDUser, true);
    }
    hostServices->threads->StartThread(kResultsThreadName, &ProcessResultsThread, results, 0);
    DestroyScoreRequest(this);
}

void UserRequest::OnDownloadUser(LeaderboardScoresDownloaded_t* result, bool /*ioFailure*/)
{
    auto* record = static_cast<ScoreEntry*>(hostServices->Allocate(sizeof(ScoreEntry)));
    int32_t start = 1;
    int32_t count = 1;
    if (record != nullptr)
        std::memset(record, 0, sizeof(ScoreEntry));
    if (result->m_cEntryCount == 0) {
        if (record != nullptr) {
            FormatToBuffer(record->userName, 63, "%s", SteamFriends()->GetFriendPersonaName(user));
            FormatToBuffer(record->userId, 63, "%d", LowAccountBits(user));
        }
    } else {
        LeaderboardEntry_t row{};
        auto* block = new int32_t[kScoreDetailsCount]();
        SteamUserStats()->GetDownloadedLeaderboardEntry(result->m_hSteamLeaderboardEntries, 0, &row, block,
                                                        kScoreDetailsCount);
        if (record != nullptr) {
            FormatToBuffer(record->userName, 63, "%s",
                           SteamFriends()->GetFriendPersonaName(row.m_steamIDUser));
            FormatToBuffer(record->userId, 63, "%d", LowAccountBits(row.m_steamIDUser));
            record->score = row.m_nScore;
            record->rank = row.m_nGlobalRank;
            std::memcpy(record->details, block, kScoreDetailsBytes);
            record->detailsSize = kScoreDetailsBytes;
        }
        delete[] block;
        count = result->m_cEntryCount;
        start = client->filter == FilterFriends ? 1 : row.m_nGlobalRank;
    }
    if (record == nullptr)
        count = 0;  // nothing to hand over: the engine still hears of the download
    SendScoresEvent(client->name, client->filter == FilterFriends ? 1 : 0, count > 0 ? start : 0, count,
                    record, SteamUserStats()->GetLeaderboardEntryCount(result->m_hSteamLeaderboard));
    DestroyUserRequest(this);
}
