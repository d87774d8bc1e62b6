#include "frame/SteamManager.h"

#include <cstring>

#include "foundation/TextFormat.h"
#include "frame/InputReset.h"
#include "host/HostEvent.h"
#include "host/HostReport.h"
#include "host/HostServices.h"
#include "services/achievements/SteamAchievements.h"

namespace {

const char kInitFailedText[] = "Steam Init failed.";

// Text of the local player's id in the start-up event; used for nothing else.
char startupPlayerId[64];

extern "C" void S_CALLTYPE SteamWarningHook(int severity, const char* text)
{
    (void)severity;
    HostLog(kHostLogInfo, "STEAM: %s", text);
}

}  // namespace

// Constructed at library load, before the engine has called anything: the
// overlay callback registers first (as a member), then the flags are cleared.
// The destructor, run at exit, unregisters the callback if it is still registered.
SteamManager steamManager;

SteamManager::SteamManager() : overlayCallback(this, &SteamManager::OnOverlayActivated)
{
    initialised = false;
    overlayActive = false;
}

bool SteamManager::Start()
{
    hostServices->LogInfo("Initializing Steam..");
    if (!SteamAPI_IsSteamRunning())
        hostServices->Log(kHostLogWarning, "Steam still not running.");

    if (!SteamAPI_Init()) {
        hostServices->Log(kHostLogError, kInitFailedText);
        PostStartupEvent(false);
        return false;
    }

    if (SteamUtils() != nullptr)
        SteamUtils()->SetOverlayNotificationPosition(k_EPositionTopRight);
    if (SteamClient() != nullptr)
        SteamClient()->SetWarningMessageHook(&SteamWarningHook);

    steamAchievements = new SteamAchievements();
    initialised = true;
    hostServices->LogInfo("Steam OK.");

    // The statistics object asked already when the utilities were there; the
    // second request is harmless and kept as the connection has always made it.
    if (SteamUserStats() != nullptr && SteamUser() != nullptr && SteamUser()->BLoggedOn())
        SteamUserStats()->RequestCurrentStats();

    uint32 accountId = LocalAccountId();
    FormatToBuffer(startupPlayerId, sizeof startupPlayerId, "%d", static_cast<int32_t>(accountId));
    PostStartupEvent(true);
    return true;
}

void SteamManager::PostStartupEvent(bool succeeded)
{
    HostEvent record;
    std::memset(&record, 0, sizeof record);
    hostServices->InitEvent(&record, kEventSteamStartup);
    StartupEvent* event = reinterpret_cast<StartupEvent*>(&record);
    // The engine reads the status as one byte.
    *reinterpret_cast<uint8_t*>(&event->status) = succeeded ? 1 : 0;
    event->PlayerId = succeeded ? startupPlayerId : nullptr;
    event->ErrorText = succeeded ? nullptr : kInitFailedText;
    hostServices->PostEvent(&record);
}

uint32 LocalAccountId()
{
    return SteamUser() != nullptr ? SteamUser()->GetSteamID().GetAccountID() : 0;
}

void SteamManager::OnOverlayActivated(GameOverlayActivated_t* param)
{
    overlayActive = param->m_bActive != 0;
    ResetEngineInput();
}
