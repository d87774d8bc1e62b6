// Ownership and installation of the app and its downloadable content.
#ifndef ISTEAMAPPS_H
#define ISTEAMAPPS_H

#include "steam_api_common.h"

class ISteamApps {
public:
    virtual const char* GetCurrentGameLanguage() = 0;
    virtual bool BIsDlcInstalled(AppId_t appID) = 0;
    virtual int GetDLCCount() = 0;
    virtual bool BGetDLCDataByIndex(int iDLC, AppId_t* pAppID, bool* pbAvailable, char* pchName,
                                    int cchNameBufferSize) = 0;
    virtual bool GetCurrentBetaName(char* pchName, int cchNameBufferSize) = 0;
};

#define STEAMAPPS_INTERFACE_VERSION "STEAMAPPS_INTERFACE_VERSION008"

STEAM_DEFINE_USER_INTERFACE_ACCESSOR(ISteamApps*, SteamApps, STEAMAPPS_INTERFACE_VERSION)

#endif  // ISTEAMAPPS_H
