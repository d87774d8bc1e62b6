#include "frame/ExtensionModuleSteam.h"

#include <steam/steam_api.h>

#include "frame/CommandChannel.h"
#include "frame/SteamManager.h"
#include "host/HostServices.h"
#include "services/achievements/AchievementImplementationSteam.h"
#include "services/achievements/SteamAchievements.h"
#include "services/cloud/CloudImplementationSteam.h"
#include "services/leaderboards/SteamLeaderboardsImplementation.h"
#include "services/store/InAppPurchaseSteam.h"
#include "services/workshop/UGCImplementationSteam.h"

const char* ExtensionModuleSteam::GetName()
{
    return "Steam";
}

bool ExtensionModuleSteam::Initialize(HostServices* services)
{
    hostServices = services;  // first: the start-up logs and posts events
    if (!steamManager.Start())
        return false;
    CreateServices();
    return true;
}

void ExtensionModuleSteam::Shutdown()
{
    if (steamAchievements != nullptr) {
        steamAchievements->UnregisterCallbacks();
        delete steamAchievements;
        steamAchievements = nullptr;
    }
    if (steamManager.initialised)
        SteamAPI_Shutdown();
    steamManager.initialised = false;
}

bool ExtensionModuleSteam::IsOverlayActive()
{
    return steamManager.overlayActive;
}

void ExtensionModuleSteam::Update()
{
    if (steamManager.initialised)
        SteamAPI_RunCallbacks();
    // Behind the pump: an overlay that closed in it has been seen first.
    if (inAppPurchase != nullptr)
        inAppPurchase->CheckPurchases();
}

const char* ExtensionModuleSteam::Command(const char* name, const char* argument)
{
    return DispatchCommand(name, argument);
}

BaseImplementation* ExtensionModuleSteam::GetImplementation(int32_t serviceNumber)
{
    switch (serviceNumber) {
    case kServiceCloud:
        return cloud;
    case kServiceLeaderboards:
        return leaderboards;
    case kServiceAchievements:
        return achievements;
    case kServiceStore:
        return inAppPurchase;
    case kServiceWorkshop:
        return ugc;
    default:
        return nullptr;
    }
}

void ExtensionModuleSteam::CreateServices()
{
    // Strictly in the order store, leaderboards, cloud, achievements, workshop,
    // each pointer stored as soon as its object exists.
    inAppPurchase = new InAppPurchaseSteam();
    leaderboards = new SteamLeaderboardsImplementation();
    cloud = new CloudImplementationSteam();
    achievements = new AchievementImplementationSteam();
    ugc = new UGCImplementationSteam();
}
