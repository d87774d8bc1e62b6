// The dispatcher: registrations by callback number and by call handle, and the pump.
// Named CCallbackMgr because CCallbackBase grants that class access to its flags and id.
#ifndef SIMCLIENT_CALLBACK_MGR_H
#define SIMCLIENT_CALLBACK_MGR_H

#include <steam/steam_api.h>

class CCallbackMgr {
public:
    static void Register(CCallbackBase* cb, int callbackId);
    static void Unregister(CCallbackBase* cb);
    static void RegisterCallResult(CCallbackBase* cb, SteamAPICall_t handle);
    static void UnregisterCallResult(CCallbackBase* cb, SteamAPICall_t handle);
    static void RunCallbacks();
};

#endif  // SIMCLIENT_CALLBACK_MGR_H
