// The leaderboard service. The road of a score download, and the thread of each step:
//
//   RequestScores / RequestScoresAroundUser          engine's thread
//     FindClient, new ScoreRequest, scoreRequestQueue (under "STEAM_LEADERBOARDS_REQUEST")
//   take the head, work out kind and range,           "Steam_Leaderboards_RequestScore"
//     DownloadLeaderboardEntries, register the call result
//   ScoreRequest::OnDownloadScore                     engine's thread, in SteamAPI_RunCallbacks
//     copy at most 100 rows and details, ask for names, start a results thread, destroy the entry
//   wait for the names, build the ScoreEntry records  "STEAM_ProcessResultsDownloadResults"
//     SendScoresEvent: the event of type 19 through PostEvent
//
// A submission: SubmitScore (engine's thread) copies the record into a ScoreSubmit on
// scoreSubmitQueue (under "STEAM_LEADERBOARDS_SUBMIT"); "Steam_Leaderboards_SubmitScore"
// waits a second per upload already made, then UploadLeaderboardScore; the handler
// ScoreSubmit::OnUploadScore (engine's thread) queues a failure again, up to ten
// uploads, or destroys the entry. No event.
//
// Categories: "Steam_Leaderboards_Initialize" reads "leaderboards/leaderboards.xml" once
// and publishes three clients per category; each learns its leaderboard handle in
// SteamScoreClient::OnCreateLeaderboard (engine's thread). "Steam_Leaderboards_RequestUser"
// drains userRequestQueue the same way, with UserRequest::OnDownloadUser.
#include "services/leaderboards/SteamLeaderboardsImplementation.h"

#include <cstring>

#include <steam/steam_api.h>

#include "data/DataArray.h"
#include "data/DataManager.h"
#include "data/DataNode.h"
#include "foundation/TextFormat.h"
#include "frame/SteamManager.h"
#include "host/HostReport.h"
#include "services/leaderboards/LeaderboardQueues.h"
#include "services/leaderboards/ScoreRequest.h"
#include "services/leaderboards/ScoreSubmit.h"
#include "services/leaderboards/SteamScoreClient.h"

namespace {

constexpr int32_t kServiceStateRunning = 2;
constexpr int32_t kFixedLimit = 30;

void ReportCategoryNotFound(const char* category)
{
    HostReportError(kHostLogWarning, "RequestScore - client for category %s not found.", category);
}

}  // namespace

ELeaderboardSortMethod SortMethodOf(const char* value)
{
    if (value != nullptr &&
        (std::strcmp(value, "ASCENDING") == 0 || std::strcmp(value, "LOWEST_SCORE_FIRST") == 0))
        return k_ELeaderboardSortMethodAscending;
    return k_ELeaderboardSortMethodDescending;
}

ELeaderboardDisplayType DisplayTypeOf(const char* value)
{
    if (value != nullptr && std::strcmp(value, "SECONDS") == 0)
        return k_ELeaderboardDisplayTypeTimeSeconds;
    if (value != nullptr && std::strcmp(value, "MILLISECONDS") == 0)
        return k_ELeaderboardDisplayTypeTimeMilliSeconds;
    return k_ELeaderboardDisplayTypeNumeric;
}

void LeaderboardsConfigurationThread(void* service)
{
    if (!hostServices->IsFeatureEnabled("LEADERBOARDS"))
        return;
    Database* database = DataManager::GetDatabase("leaderboards/leaderboards.xml");
    const DataArray* categories = database->FindArray("CATEGORIES");
    if (categories == nullptr) {
        HostReportError(kHostLogError, "Unable to locate leaderboards.xml! Leaderboards will not work.");
        return;
    }
    const ScoreClientLists lists = static_cast<SteamLeaderboardsImplementation*>(service)->Lists();
    for (const DataNode* node : categories->nodes) {
        if (node->id.text == nullptr)
            continue;  // no name to find it by, nor to give the platform
        CreateCategoryClients(lists, node->id.text, SortMethodOf(node->GetValue("sort")),
                              DisplayTypeOf(node->GetValue("display_type")));
    }
}

int32_t SteamLeaderboardsImplementation::GetServiceType()
{
    return kServiceLeaderboards;
}

const char* SteamLeaderboardsImplementation::GetPlatformName()
{
    return "Steam";
}

bool SteamLeaderboardsImplementation::Initialize()
{
    if (threadsStarted)
        return true;  // one set of threads per process
    threadsStarted = true;
    HostThreadApi* threads = hostServices->threads;
    requestMutex = threads->CreateMutex("STEAM_LEADERBOARDS_REQUEST");
    submitMutex = threads->CreateMutex("STEAM_LEADERBOARDS_SUBMIT");
    const uint64 steamId = SteamUser()->GetSteamID().ConvertToUint64();
    const InlineString text = FormatString("%d", static_cast<int32_t>(static_cast<uint32_t>(steamId)));
    userId.Assign(text.Text());
    threads->StartThread("Steam_Leaderboards_Initialize", &LeaderboardsConfigurationThread, this, 0);
    threads->StartThread("Steam_Leaderboards_RequestScore", &RequestScoreThread, nullptr, 0);
    threads->StartThread("Steam_Leaderboards_SubmitScore", &SubmitScoreThread, nullptr, 0);
    threads->StartThread("Steam_Leaderboards_RequestUser", &RequestUserThread, nullptr, 0);
    return true;
}

// Nothing to release early: queued and in-flight entries are released when the
// library is unloaded, and the threads end by themselves on IsQuitting.
void SteamLeaderboardsImplementation::Shutdown() {}

void SteamLeaderboardsImplementation::Update() {}

bool SteamLeaderboardsImplementation::IsAvailable()
{
    return true;
}

void SteamLeaderboardsImplementation::SubmitScore(int32_t /*reserved*/, const ScoreEntry* record,
                                                  const char* category)
{
    if (!steamManager.initialised || record == nullptr)
        return;
    SteamScoreClient* client = FindClientIn(globalClients, category);
    if (client == nullptr)
        return;
    QueueScoreSubmit(client, record);
}

bool SteamLeaderboardsImplementation::RequestScores(int32_t start, int32_t count, int32_t filter,
                                                    const char* category)
{
    SteamScoreClient* client = FindClient(category, filter);
    if (client == nullptr) {
        ReportCategoryNotFound(category);
        return false;
    }
    QueueScoreRequest(client, start < 1 ? 1 : start, count, filter);
    return true;
}

bool SteamLeaderboardsImplementation::RequestScoresAroundUser(int32_t /*reserved*/, int32_t count,
                                                              const char* category)
{
    SteamScoreClient* client = FindClientIn(globalClients, category);
    if (client == nullptr) {
        ReportCategoryNotFound(category);
        return false;
    }
    QueueScoreRequest(client, 0, count, FilterGlobal);
    return true;
}

const char* SteamLeaderboardsImplementation::GetUserId()
{
    return userId.Text();
}

bool SteamLeaderboardsImplementation::ReservedQueryA()
{
    return false;
}

void SteamLeaderboardsImplementation::ReservedCommandA() {}

void SteamLeaderboardsImplementation::ReservedCommandB() {}

int32_t SteamLeaderboardsImplementation::GetServiceState()
{
    return SteamAPI_IsSteamRunning() ? kServiceStateRunning : 0;
}

bool SteamLeaderboardsImplementation::ReservedQueryB()
{
    return false;
}

void SteamLeaderboardsImplementation::ReservedCommandC() {}

int32_t SteamLeaderboardsImplementation::GetFixedLimit()
{
    return kFixedLimit;
}

SteamScoreClient* SteamLeaderboardsImplementation::FindClient(const char* category, int32_t filter) const
{
    const ClientList& list = filter == FilterFriends ? friendsClients
                             : filter == FilterThird ? thirdClients
                                                     : globalClients;
    return FindClientIn(list, category);
}

ScoreClientLists SteamLeaderboardsImplementation::Lists()
{
    return {&globalClients, &friendsClients, &thirdClients};
}
