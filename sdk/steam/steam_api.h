// Start-up and shut-down of the client connection; includes every interface header.
#ifndef STEAM_API_H
#define STEAM_API_H

#include "steam_api_common.h"

#include "isteamapps.h"
#include "isteamclient.h"
#include "isteamfriends.h"
#include "isteamremotestorage.h"
#include "isteamugc.h"
#include "isteamuser.h"
#include "isteamuserstats.h"
#include "isteamutils.h"

// True when the client is running and every interface could be created.
S_API bool S_CALLTYPE SteamAPI_Init();
S_API void S_CALLTYPE SteamAPI_Shutdown();
S_API bool S_CALLTYPE SteamAPI_IsSteamRunning();

#endif  // STEAM_API_H
