// The module object the engine talks to: lifecycle, commands and the services.
#pragma once

#include "frame/ExtensionModule.h"

class InAppPurchaseSteam;
class SteamLeaderboardsImplementation;
class CloudImplementationSteam;
class AchievementImplementationSteam;
class UGCImplementationSteam;

class ExtensionModuleSteam : public ExtensionModule {
public:
    const char* GetName() override;
    bool Initialize(HostServices* services) override;
    void Shutdown() override;
    bool IsOverlayActive() override;
    void Update() override;
    const char* Command(const char* name, const char* argument) override;
    BaseImplementation* GetImplementation(int32_t serviceNumber) override;

    // Null until Initialize has succeeded; never cleared.
    InAppPurchaseSteam* inAppPurchase = nullptr;
    SteamLeaderboardsImplementation* leaderboards = nullptr;
    CloudImplementationSteam* cloud = nullptr;
    AchievementImplementationSteam* achievements = nullptr;
    UGCImplementationSteam* ugc = nullptr;

private:
    void CreateServices();
};
