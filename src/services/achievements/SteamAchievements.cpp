#include "services/achievements/SteamAchievements.h"

#include "foundation/TextFormat.h"
#include "frame/SteamManager.h"
#include "host/HostServices.h"

SteamAchievements* steamAchievements = nullptr;

namespace {

constexpr int32_t kStoreIntervalMs = 20000;
constexpr uint32_t kUpdaterSleepMs = 400;

// Stores statistics at every interval whether or not anything changed, and
// once more when the engine quits. It touches no member of SteamAchievements,
// so the object may go away while the thread runs.
void StatsUpdaterThread(void* /*unused*/)
{
    uint32_t lastStore = hostServices->GetTimeMs();
    while (!hostServices->IsQuitting()) {
        int32_t elapsed = static_cast<int32_t>(hostServices->GetTimeMs() - lastStore);
        if (elapsed > kStoreIntervalMs) {
            if (SteamUserStats() != nullptr)
                SteamUserStats()->StoreStats();
            lastStore = hostServices->GetTimeMs();
        }
        hostServices->threads->ThreadSleep(kUpdaterSleepMs);
    }
    if (SteamUserStats() != nullptr)
        SteamUserStats()->StoreStats();
}

void LogResult(const char* format, int32_t result)
{
    char message[128];
    FormatToBufferRaw(message, sizeof message, format, result);
    hostServices->Log(kHostLogWarning, message);
}

}  // namespace

SteamAchievements::SteamAchievements()
    : receivedCallback(this, &SteamAchievements::OnUserStatsReceived),
      storedCallback(this, &SteamAchievements::OnUserStatsStored),
      achievementCallback(this, &SteamAchievements::OnUserAchievementStored)
{
    if (SteamUtils() == nullptr) {
        hostServices->LogInfo("SteamAchievements failed to initialize. SteamUtils not available.");
        return;
    }
    appId = SteamUtils()->GetAppID();
    if (SteamUserStats() != nullptr && SteamUser() != nullptr && SteamUser()->BLoggedOn())
        SteamUserStats()->RequestCurrentStats();
    unlockCounter = 0;
    hostServices->threads->StartThread("SteamStats_Updater", &StatsUpdaterThread, nullptr, 0);
}

void SteamAchievements::UnregisterCallbacks()
{
    if (achievementCallback.IsRegistered())
        achievementCallback.Unregister();
    if (storedCallback.IsRegistered())
        storedCallback.Unregister();
    if (receivedCallback.IsRegistered())
        receivedCallback.Unregister();
}

void SteamAchievements::OnUserStatsReceived(UserStatsReceived_t* param)
{
    if (param->m_nGameID != appId)
        return;
    if (param->m_eResult != k_EResultOK)
        LogResult("RequestStats - failed, %d", param->m_eResult);
    statsReceived = true;
}

void SteamAchievements::OnUserStatsStored(UserStatsStored_t* param)
{
    if (param->m_nGameID != appId || param->m_eResult == k_EResultOK)
        return;
    if (param->m_eResult == k_EResultInvalidParam) {
        hostServices->Log(kHostLogWarning, "StoreStats - some failed to validate");
        statsReceived = true;
        return;
    }
    LogResult("StatsStored - failed, %d", param->m_eResult);
}

void SteamAchievements::OnUserAchievementStored(UserAchievementStored_t* param)
{
    if (param->m_nGameID == appId)
        hostServices->Log(kHostLogInfo, "Stored Achievement for Steam");
}

void UnlockAchievementIfConnected(const char* name)
{
    if (name == nullptr || !steamManager.initialised)
        return;
    if (SteamUserStats() != nullptr)
        SteamUserStats()->SetAchievement(name);
    if (steamAchievements != nullptr)
        steamAchievements->unlockCounter = 0;
}
