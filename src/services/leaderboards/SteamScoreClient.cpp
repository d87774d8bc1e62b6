#include "services/leaderboards/SteamScoreClient.h"

#include <cstring>
#include <initializer_list>

#include "data/HashedName.h"
#include "foundation/TextFormat.h"
#include "host/HostReport.h"
#include "services/leaderboards/ClientList.h"
#include "services/leaderboards/LeaderboardsImplementation.h"

namespace {

// Clients live as long as the library. When it is unloaded, a find still pending
// is cancelled, so the platform never calls into the unloaded code, and the
// clients are freed. The configuration thread has long ended by then.
struct MadeClients {
    ~MadeClients()
    {
        SteamScoreClient* client = newest.exchange(nullptr);
        while (client != nullptr) {
            SteamScoreClient* next = client->nextMade;
            client->findResult.Cancel();
            delete client;
            client = next;
        }
    }

    void Add(SteamScoreClient* client)
    {
        client->nextMade = newest.load(std::memory_order_relaxed);
        newest.store(client, std::memory_order_release);
    }

    std::atomic<SteamScoreClient*> newest{nullptr};
} madeClients;

}  // namespace

void SteamScoreClient::OnCreateLeaderboard(LeaderboardFindResult_t* result, bool ioFailure)
{
    const SteamLeaderboard_t handle = result->m_hSteamLeaderboard;
    if (result->m_bLeaderboardFound != 0 && !ioFailure) {
        const char* boardName = SteamUserStats()->GetLeaderboardName(handle);
        HostLog(kHostLogInfo, "OnCreateLeaderboard: Found leaderboard (handle = %d, name = %s), %s",
                static_cast<int32_t>(handle), boardName, "no errors detected");
        leaderboard.store(handle, std::memory_order_release);
        return;
    }
    HostLog(kHostLogError, "OnCreateLeaderboard: Did not found leaderboard (handle = %d), %s",
            static_cast<int32_t>(handle), ioFailure ? "IO failure detected" : "no errors detected");
}

void CreateCategoryClients(const ScoreClientLists& lists, const char* id, ELeaderboardSortMethod sort,
                           ELeaderboardDisplayType display)
{
    auto* global = new SteamScoreClient();
    auto* third = new SteamScoreClient();
    auto* friends = new SteamScoreClient();
    const SteamAPICall_t call = SteamUserStats()->FindOrCreateLeaderboard(id, sort, display);
    for (SteamScoreClient* client : {global, third, friends}) {
        madeClients.Add(client);
        FormatToBuffer(client->name, sizeof client->name, "%s", id);
        client->nameHash = HashText(client->name);
    }
    global->filter = FilterGlobal;
    lists.global->Add(global);
    third->filter = FilterThird;
    lists.third->Add(third);
    friends->filter = FilterFriends;
    lists.friends->Add(friends);
    for (SteamScoreClient* client : {global, friends, third})
        client->findResult.Set(call, client, &SteamScoreClient::OnCreateLeaderboard);
}

SteamScoreClient* FindClientIn(const ClientList& list, const char* category)
{
    if (category == nullptr)
        return nullptr;
    return list.FindFirst(
        [category](const SteamScoreClient* client) { return std::strcmp(client->name, category) == 0; });
}
