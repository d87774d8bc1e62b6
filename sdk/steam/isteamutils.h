// Process-wide utilities: app id, server clock, overlay state.
#ifndef ISTEAMUTILS_H
#define ISTEAMUTILS_H

#include "steam_api_common.h"

extern "C" typedef void(S_CALLTYPE* SteamAPIWarningMessageHook_t)(int, const char*);

class ISteamUtils {
public:
    virtual uint32 GetServerRealTime() = 0;
    virtual uint32 GetAppID() = 0;
    virtual void SetOverlayNotificationPosition(ENotificationPosition eNotificationPosition) = 0;
    virtual void SetWarningMessageHook(SteamAPIWarningMessageHook_t pFunction) = 0;
    virtual bool IsOverlayEnabled() = 0;
};

#define STEAMUTILS_INTERFACE_VERSION "SteamUtils010"

// Utilities are not tied to a user, hence the literal user handle 0.
STEAM_DEFINE_INTERFACE_ACCESSOR(ISteamUtils*, SteamUtils,
                                SteamInternal_FindOrCreateUserInterface(0, STEAMUTILS_INTERFACE_VERSION),
                                "user", STEAMUTILS_INTERFACE_VERSION)

#endif  // ISTEAMUTILS_H
