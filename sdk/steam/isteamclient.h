// The root client interface; used here only to install the warning hook.
#ifndef ISTEAMCLIENT_H
#define ISTEAMCLIENT_H

#include "steam_api_common.h"

class ISteamClient {
public:
    virtual void SetWarningMessageHook(SteamAPIWarningMessageHook_t pFunction) = 0;
};

#define STEAMCLIENT_INTERFACE_VERSION "SteamClient020"

STEAM_DEFINE_INTERFACE_ACCESSOR(ISteamClient*, SteamClient,
                                SteamInternal_CreateInterface(STEAMCLIENT_INTERFACE_VERSION), "global",
                                STEAMCLIENT_INTERFACE_VERSION)

#endif  // ISTEAMCLIENT_H
