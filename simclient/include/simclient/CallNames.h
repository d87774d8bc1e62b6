// Every SDK call the simulated client journals, by the name the journal shows and
// faults are injected under. The simulated methods name themselves through SIM_CALL,
// which refuses at compile time a name missing here, so this list cannot fall behind.
#ifndef SIMCLIENT_CALL_NAMES_H
#define SIMCLIENT_CALL_NAMES_H

#include <cstddef>
#include <string>
#include <string_view>

namespace simclient {

// Sorted (checked below), so a lookup can bisect and a listing reads in order.
inline constexpr std::string_view kCallNames[] = {
    "ActivateGameOverlayToStore",
    "ActivateGameOverlayToWebPage",
    "BGetDLCDataByIndex",
    "BIsDlcInstalled",
    "BLoggedOn",
    "CreateItem",
    "CreateQueryUGCDetailsRequest",
    "DownloadLeaderboardEntries",
    "DownloadLeaderboardEntriesForUsers",
    "FileDelete",
    "FileExists",
    "FileRead",
    "FileWrite",
    "FindOrCreateLeaderboard",
    "GetAppID",
    "GetCurrentBetaName",
    "GetCurrentGameLanguage",
    "GetDLCCount",
    "GetDownloadedLeaderboardEntry",
    "GetFileSize",
    "GetFriendPersonaName",
    "GetItemDownloadInfo",
    "GetItemInstallInfo",
    "GetItemState",
    "GetItemUpdateProgress",
    "GetLeaderboardEntryCount",
    "GetLeaderboardName",
    "GetNumSubscribedItems",
    "GetQueryUGCResult",
    "GetServerRealTime",
    "GetStat",
    "GetStatFloat",
    "GetSteamID",
    "GetSubscribedItems",
    "IsOverlayEnabled",
    "ReleaseQueryUGCRequest",
    "RequestCurrentStats",
    "RequestUserInformation",
    "SendQueryUGCRequest",
    "SetAchievement",
    "SetCloudEnabledForApp",
    "SetItemContent",
    "SetItemDescription",
    "SetItemPreview",
    "SetItemTags",
    "SetItemTitle",
    "SetItemVisibility",
    "SetOverlayNotificationPosition",
    "SetStat",
    "SetStatFloat",
    "SetWarningMessageHook",
    "StartItemUpdate",
    "SteamAPI_Init",
    "SteamAPI_IsSteamRunning",
    "SteamAPI_RegisterCallResult",
    "SteamAPI_RegisterCallback",
    "SteamAPI_RunCallbacks",
    "SteamAPI_Shutdown",
    "SteamAPI_UnregisterCallResult",
    "SteamAPI_UnregisterCallback",
    "StoreStats",
    "SubmitItemUpdate",
    "SubscribeItem",
    "UnsubscribeItem",
    "UploadLeaderboardScore",
};
inline constexpr std::size_t kCallNameCount = sizeof kCallNames / sizeof kCallNames[0];

// Index of `name` in kCallNames, or -1.
constexpr int CallIndex(std::string_view name)
{
    std::size_t low = 0, high = kCallNameCount;
    while (low < high) {
        std::size_t mid = (low + high) / 2;
        if (kCallNames[mid] < name)
            low = mid + 1;
        else
            high = mid;
    }
    return low < kCallNameCount && kCallNames[low] == name ? static_cast<int>(low) : -1;
}

constexpr bool CallNamesSorted()
{
    for (std::size_t i = 1; i < kCallNameCount; ++i)
        if (!(kCallNames[i - 1] < kCallNames[i]))
            return false;
    return true;
}
static_assert(CallNamesSorted(), "kCallNames must be sorted and free of duplicates");

// "A, B, C": the known names, for error messages.
std::string KnownCallList();

}  // namespace simclient

#endif  // SIMCLIENT_CALL_NAMES_H
