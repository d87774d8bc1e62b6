// Compiled for the engine's Windows target only to have the compiler lay out
// and print the tables of virtual operations the engine calls by position; it
// is never linked or run. Deleting through a pointer is a virtual call, which
// makes the compiler compute the table of the pointer's class.
#include "frame/ExtensionModule.h"
#include "frame/ExtensionModuleSteam.h"
#include "services/achievements/AchievementImplementation.h"
#include "services/achievements/AchievementImplementationSteam.h"
#include "services/cloud/CloudImplementation.h"
#include "services/cloud/CloudImplementationSteam.h"
#include "services/leaderboards/LeaderboardsImplementation.h"
#include "services/leaderboards/SteamLeaderboardsImplementation.h"
#include "services/store/InAppPurchaseImplementation.h"
#include "services/store/InAppPurchaseSteam.h"
#include "services/workshop/UGCImplementation.h"
#include "services/workshop/UGCImplementationSteam.h"

template <typename Interface> void LayOutTable(Interface* object)
{
    delete object;
}

template void LayOutTable(ExtensionModule*);
template void LayOutTable(ExtensionModuleSteam*);
template void LayOutTable(BaseImplementation*);
template void LayOutTable(CloudImplementation*);
template void LayOutTable(CloudImplementationSteam*);
template void LayOutTable(LeaderboardsImplementation*);
template void LayOutTable(SteamLeaderboardsImplementation*);
template void LayOutTable(AchievementImplementation*);
template void LayOutTable(AchievementImplementationSteam*);
template void LayOutTable(InAppPurchaseImplementation*);
template void LayOutTable(InAppPurchaseSteam*);
template void LayOutTable(UGCImplementation*);
template void LayOutTable(UGCImplementationSteam*);
