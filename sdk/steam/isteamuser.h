// The logged-on user.
#ifndef ISTEAMUSER_H
#define ISTEAMUSER_H

#include "steam_api_common.h"

class ISteamUser {
public:
    virtual bool BLoggedOn() = 0;
    virtual CSteamID GetSteamID() = 0;
};

#define STEAMUSER_INTERFACE_VERSION "SteamUser021"

STEAM_DEFINE_USER_INTERFACE_ACCESSOR(ISteamUser*, SteamUser, STEAMUSER_INTERFACE_VERSION)

#endif  // ISTEAMUSER_H
