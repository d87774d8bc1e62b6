// Statistics and achievements. Only names defined in the world exist, as on the platform
// where they are configured per app; float accessors share the int32 values.
#include <cstring>

#include "Args.h"
#include "SimInterfaces.h"
#include "SimUserStats.h"
#include "WorldState.h"

namespace simclient {
namespace {

uint64 GameIdOr(uint64 configured, AppId_t appId)
{
    return configured ? configured : appId;
}

// The statistic a call names, or null when the call fails or the world has no such name.
int32* FindStat(CallScope& call, const char* name)
{
    if (call.faults.fail || !name)
        return nullptr;
    auto found = call.state.stats.find(name);
    return found == call.state.stats.end() ? nullptr : &found->second;
}

}  // namespace

bool SimSteamUserStats::RequestCurrentStats()
{
    CallScope call(SIM_CALL("RequestCurrentStats"), "");
    WorldState& s = call.state;
    if (call.faults.fail || !s.loggedOn)
        return false;
    UserStatsReceived_t received{};
    received.m_nGameID = GameIdOr(s.statsReceivedGameId, s.appId);
    received.m_eResult = call.faults.result.value_or(s.statsReceivedResult);
    received.m_steamIDUser = CSteamID(s.userId);
    s.QueueCallback(UserStatsReceived_t::k_iCallback, &received, sizeof received, call.faults.extraLatency);
    return true;
}

bool SimSteamUserStats::GetStat(const char* pchName, int32* pData)
{
    CallScope call(SIM_CALL("GetStat"), Args(pchName));
    int32* stat = FindStat(call, pchName);
    if (!stat || !pData)
        return false;
    *pData = *stat;
    return true;
}

bool SimSteamUserStats::GetStat(const char* pchName, float* pData)
{
    CallScope call(SIM_CALL("GetStatFloat"), Args(pchName));
    int32* stat = FindStat(call, pchName);
    if (!stat || !pData)
        return false;
    *pData = static_cast<float>(*stat);
    return true;
}

bool SimSteamUserStats::SetStat(const char* pchName, int32 nData)
{
    CallScope call(SIM_CALL("SetStat"), Args(pchName, nData));
    int32* stat = FindStat(call, pchName);
    if (!stat)
        return false;
    *stat = nData;
    return true;
}

bool SimSteamUserStats::SetStat(const char* pchName, float fData)
{
    CallScope call(SIM_CALL("SetStatFloat"), Args(pchName, fData));
    int32* stat = FindStat(call, pchName);
    if (!stat)
        return false;
    *stat = static_cast<int32>(fData);
    return true;
}

bool SimSteamUserStats::SetAchievement(const char* pchName)
{
    CallScope call(SIM_CALL("SetAchievement"), Args(pchName));
    if (call.faults.fail || !pchName)
        return false;
    auto found = call.state.achievements.find(pchName);
    if (found == call.state.achievements.end())
        return false;
    if (!found->second)
        call.state.unlockedSinceStore.insert(pchName);
    found->second = true;
    return true;
}

bool SimSteamUserStats::StoreStats()
{
    CallScope call(SIM_CALL("StoreStats"), "");
    WorldState& s = call.state;
    if (call.faults.fail || !s.loggedOn)
        return false;
    UserStatsStored_t stored{};
    stored.m_nGameID = GameIdOr(s.statsStoredGameId, s.appId);
    stored.m_eResult = call.faults.result.value_or(s.statsStoredResult);
    s.QueueCallback(UserStatsStored_t::k_iCallback, &stored, sizeof stored, call.faults.extraLatency);
    if (stored.m_eResult != k_EResultOK)
        return true;  // unlocks stay pending for the next store
    for (const std::string& name : s.unlockedSinceStore) {
        UserAchievementStored_t achievement{};
        achievement.m_nGameID = stored.m_nGameID;
        std::strncpy(achievement.m_rgchAchievementName, name.c_str(),
                     sizeof achievement.m_rgchAchievementName - 1);
        s.QueueCallback(UserAchievementStored_t::k_iCallback, &achievement, sizeof achievement,
                        call.faults.extraLatency);
    }
    s.unlockedSinceStore.clear();
    return true;
}

ISteamUserStats* SimUserStats()
{
    static SimSteamUserStats instance;
    return &instance;
}

}  // namespace simclient
