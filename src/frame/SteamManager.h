// The one static object that records whether the platform connection is up
// and whether the overlay is open.
#pragma once

#include "host/SteamCallback.h"

class SteamManager {
public:
    SteamManager();

    // The start-up: connects to the client, posts the outcome as event 17.
    bool Start();

    bool initialised;
    bool overlayActive;
    SteamCallback<SteamManager, GameOverlayActivated_t> overlayCallback;

private:
    void OnOverlayActivated(GameOverlayActivated_t* param);
    void PostStartupEvent(bool succeeded);
};

extern SteamManager steamManager;

// The low 32 bits of the local user's id; 0 without ISteamUser.
uint32 LocalAccountId();
