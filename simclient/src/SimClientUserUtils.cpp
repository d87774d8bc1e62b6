// ISteamClient, ISteamUser and ISteamUtils: identity, clock, overlay, warning hook.
#include "Args.h"
#include "SimInterfaces.h"
#include "WorldState.h"

namespace simclient {
namespace {

class SimSteamClient final : public ISteamClient {
public:
    void SetWarningMessageHook(SteamAPIWarningMessageHook_t pFunction) override
    {
        CallScope call(SIM_CALL("SetWarningMessageHook"), Args(pFunction ? "hook" : "null"));
        call.state.warningHook = pFunction;
    }
};

class SimSteamUser final : public ISteamUser {
public:
    bool BLoggedOn() override
    {
        CallScope call(SIM_CALL("BLoggedOn"), "");
        return call.state.loggedOn && !call.faults.fail;
    }
    CSteamID GetSteamID() override
    {
        CallScope call(SIM_CALL("GetSteamID"), "");
        return call.faults.fail ? CSteamID() : CSteamID(call.state.userId);
    }
};

class SimSteamUtils final : public ISteamUtils {
public:
    uint32 GetServerRealTime() override
    {
        CallScope call(SIM_CALL("GetServerRealTime"), "");
        return call.faults.fail ? 0 : call.state.serverTime;
    }
    uint32 GetAppID() override
    {
        CallScope call(SIM_CALL("GetAppID"), "");
        return call.faults.fail ? 0 : call.state.appId;
    }
    void SetOverlayNotificationPosition(ENotificationPosition position) override
    {
        CallScope call(SIM_CALL("SetOverlayNotificationPosition"), Args(position));
        call.state.notificationPosition = position;
    }
    void SetWarningMessageHook(SteamAPIWarningMessageHook_t pFunction) override
    {
        CallScope call(SIM_CALL("SetWarningMessageHook"), Args(pFunction ? "hook" : "null"));
        call.state.warningHook = pFunction;
    }
    bool IsOverlayEnabled() override
    {
        CallScope call(SIM_CALL("IsOverlayEnabled"), "");
        return call.state.overlayEnabled && !call.faults.fail;
    }
};

}  // namespace

ISteamClient* SimClient()
{
    static SimSteamClient instance;
    return &instance;
}
ISteamUser* SimUser()
{
    static SimSteamUser instance;
    return &instance;
}
ISteamUtils* SimUtils()
{
    static SimSteamUtils instance;
    return &instance;
}

}  // namespace simclient
