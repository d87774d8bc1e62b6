// Achievements and statistics over the platform's user statistics. Nothing
// here stores: the updater thread of SteamAchievements does.
#pragma once

#include "services/achievements/AchievementImplementation.h"

class AchievementImplementationSteam : public AchievementImplementation {
public:
    int32_t GetServiceType() override;
    const char* GetPlatformName() override;
    void UnlockAchievement(int32_t reserved, const char* name) override;
    void ReservedAction1() override;
    bool ReservedQuery() override;
    void ReservedAction2() override;
    void SetStatistic(const char* name, int32_t value) override;
    int32_t GetStatistic(const char* name) override;
};
