#include "services/achievements/AchievementImplementationSteam.h"

#include <steam/steam_api.h>

#include "frame/SteamManager.h"
#include "services/achievements/SteamAchievements.h"

int32_t AchievementImplementationSteam::GetServiceType()
{
    return kServiceAchievements;
}

const char* AchievementImplementationSteam::GetPlatformName()
{
    return "Steam";
}

void AchievementImplementationSteam::UnlockAchievement(int32_t /*reserved*/, const char* name)
{
    UnlockAchievementIfConnected(name);
}

void AchievementImplementationSteam::ReservedAction1() {}

bool AchievementImplementationSteam::ReservedQuery()
{
    return false;
}

void AchievementImplementationSteam::ReservedAction2() {}

void AchievementImplementationSteam::SetStatistic(const char* name, int32_t value)
{
    // Tests no flag: only for use between Initialize and Shutdown.
    if (SteamUserStats() != nullptr)
        SteamUserStats()->SetStat(name, value);
}

int32_t AchievementImplementationSteam::GetStatistic(const char* name)
{
    if (!steamManager.initialised)
        return 0;
    int32 value = 0;
    if (SteamUserStats() != nullptr)
        SteamUserStats()->GetStat(name, &value);  // a missing statistic reads as 0
    return value;
}
