// Service number 3 as the engine sees it: achievements and statistics.
#pragma once

#include <cstdint>

#include "frame/ExtensionModule.h"

class AchievementImplementation : public BaseImplementation {
public:
    // The first argument is the engine's and is not used by this platform.
    virtual void UnlockAchievement(int32_t reserved, const char* name) = 0;
    virtual void ReservedAction1() = 0;
    virtual bool ReservedQuery() = 0;
    virtual void ReservedAction2() = 0;
    virtual void SetStatistic(const char* name, int32_t value) = 0;
    virtual int32_t GetStatistic(const char* name) = 0;
};
