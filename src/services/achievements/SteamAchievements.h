// Listens to the three statistics callbacks and runs the thread that stores
// statistics on the platform every 20 seconds.
//
//   start-up ──> SteamAchievements (callbacks 1101..1103 registered)
//            └─> "SteamStats_Updater": StoreStats every >20000 ms of engine time,
//                one last StoreStats when the engine quits
//   SteamAPI_RunCallbacks (engine thread) ──> On* handlers ──> log lines
#pragma once

#include <cstdint>

#include "host/SteamCallback.h"

class SteamAchievements {
public:
    // Registers the callbacks, asks for the user's statistics and starts the
    // updater thread, when the platform's utilities are there.
    SteamAchievements();

    // Unregisters the three callbacks, the reverse of their registration.
    void UnregisterCallbacks();

    uint64_t appId = 0;
    bool statsReceived = false;
    int32_t unlockCounter = 0;
    SteamCallback<SteamAchievements, UserStatsReceived_t> receivedCallback;
    SteamCallback<SteamAchievements, UserStatsStored_t> storedCallback;
    SteamCallback<SteamAchievements, UserAchievementStored_t> achievementCallback;

private:
    void OnUserStatsReceived(UserStatsReceived_t* param);
    void OnUserStatsStored(UserStatsStored_t* param);
    void OnUserAchievementStored(UserAchievementStored_t* param);
};

// The one instance while the connection is up; null otherwise.
extern SteamAchievements* steamAchievements;

// Sets an achievement on the platform while connected; null names are ignored.
// Nothing is stored here: the updater thread stores.
void UnlockAchievementIfConnected(const char* name);
