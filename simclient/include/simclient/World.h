// Control API of the simulated Steam client: tests and the scenario runner set up the
// world, post callbacks, inject faults and read back what the code under test did.
//
// There is one world per process, shared by everything linked to libsteam_api.so (a
// runner and the module it dlopens see the same one). All members are thread-safe.
#ifndef SIMCLIENT_WORLD_H
#define SIMCLIENT_WORLD_H

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include <steam/steam_api.h>

#include "simclient/Fault.h"
#include "simclient/Journal.h"

namespace simclient {

enum class Interface {
    Client,
    User,
    Utils,
    Apps,
    Friends,
    UserStats,
    RemoteStorage,
    UGC
};
constexpr int kInterfaceCount = 8;

struct Dlc {
    AppId_t appId = 0;
    bool available = true;
    bool installed = false;
    std::string name;
};

struct LeaderboardRow {
    uint64 steamId = 0;
    int32 score = 0;
    std::vector<int32> details;
    UGCHandle_t ugc = k_UGCHandleInvalid;
};

struct WorkshopItem {
    PublishedFileId_t id = 0;
    EResult result = k_EResultOK;  // what a detail query reports for this item
    std::string title;
    std::string description;
    std::string tags;  // comma-separated
    uint64 owner = 0;
    ERemoteStoragePublishedFileVisibility visibility = k_ERemoteStoragePublishedFileVisibilityPublic;
    uint32 timeCreated = 0;
    uint32 timeUpdated = 0;
    bool subscribed = false;
    uint32 state = k_EItemStateNone;  // EItemState bits; Subscribed is kept in step with `subscribed`
    std::string folder;               // install folder, when installed
    uint64 sizeOnDisk = 0;
    uint32 installTimestamp = 0;
    uint64 bytesDownloaded = 0;
    uint64 bytesTotal = 0;
};

// What one SubmitItemUpdate carried.
struct WorkshopSubmission {
    PublishedFileId_t id = 0;
    AppId_t appId = 0;
    std::optional<std::string> title, description, content, preview;
    std::optional<ERemoteStoragePublishedFileVisibility> visibility;
    std::optional<std::vector<std::string>> tags;
    std::string changeNote;
};

class World {
public:
    // Back to a fresh world: not initialised, Steam running, Init succeeding, every interface
    // available, default user/app, no data, no faults, empty journal and queue, latency 1.
    // Kept: callback registrations (they belong to objects still alive, e.g. a module's
    // static overlay callback) and call-result bindings, whose handles simply never complete.
    void Reset();

    // --- Process and interfaces ------------------------------------------------------------
    void SetSteamRunning(bool running);
    void SetInitSucceeds(bool succeeds);
    bool IsInitialised() const;
    // Changing availability moves the interface generation so cached accessors refetch.
    void SetInterfaceAvailable(Interface which, bool available);
    bool IsInterfaceAvailable(Interface which) const;
    uintptr_t InterfaceGeneration() const;

    // --- User, app, utilities ---------------------------------------------------------------
    void SetLocalUser(uint64 steamId, bool loggedOn, const std::string& personaName);
    uint64 LocalUserId() const;
    void SetAppId(AppId_t appId);
    void SetOverlayEnabled(bool enabled);
    void SetServerTime(uint32 unixSeconds);
    std::optional<ENotificationPosition> NotificationPosition() const;  // last one set
    void SetGameLanguage(std::optional<std::string> language);          // nullopt: the call gives null
    void SetBetaName(std::optional<std::string> branch);                // nullopt: not on a beta
    void SetDlcs(std::vector<Dlc> dlcs);
    void SetDlcInstalled(AppId_t appId, bool installed);

    // --- Callbacks --------------------------------------------------------------------------
    // Pumps a posted callback or call result waits (1 = the next RunCallbacks).
    void SetLatency(int pumps);
    // Queue a broadcast callback for every registered object of number `callbackId`.
    void PostCallback(int callbackId, const void* data, std::size_t size);
    template <class T> void Post(const T& data) { PostCallback(T::k_iCallback, &data, sizeof(T)); }
    // Overlay opening/closing: posts GameOverlayActivated_t.
    void SetOverlayActive(bool active);
    std::size_t PendingCount() const;  // callbacks and results not yet delivered
    uint64 PumpCount() const;          // RunCallbacks calls that dispatched
    int RegisteredCallbackCount(int callbackId) const;
    std::size_t BoundCallResultCount() const;

    // --- Faults ------------------------------------------------------------------------------
    // `call` is the method name as journaled, e.g. "FileRead", "SteamAPI_Init".
    void InjectFault(const std::string& call, Fault fault);
    void ClearFaults();

    // --- Journal and warnings ----------------------------------------------------------------
    Journal GetJournal() const;
    void ClearJournal();
    // Off: calls are not journaled, and an idle pump returns without taking the world's
    // lock (for benchmarks of the module's own overhead). Reset turns it back on.
    void SetJournalEnabled(bool enabled);
    // Sends text through the hook installed with SetWarningMessageHook; false if none.
    bool EmitWarning(int severity, const char* text);
    bool HasWarningHook() const;

    // --- Statistics and achievements -----------------------------------------------------------
    void DefineStat(const std::string& name, int32 value = 0);
    std::optional<int32> Stat(const std::string& name) const;
    void DefineAchievement(const std::string& name, bool unlocked = false);
    std::optional<bool> AchievementUnlocked(const std::string& name) const;
    // What RequestCurrentStats / StoreStats report; game id 0 means "the app id".
    void SetStatsReceivedResult(EResult result, uint64 gameId = 0);
    void SetStatsStoredResult(EResult result, uint64 gameId = 0);

    // --- Cloud files ---------------------------------------------------------------------------
    void PutFile(const std::string& name, std::vector<uint8> bytes);
    std::optional<std::vector<uint8>> File(const std::string& name) const;
    std::optional<bool> CloudEnabledForApp() const;  // last SetCloudEnabledForApp, if any

    // --- Friends and overlay requests --------------------------------------------------------
    // `known` false: RequestUserInformation returns true and the name arrives later.
    void SetPersonaName(uint64 steamId, const std::string& name, bool known = true);
    void SetFriends(std::vector<uint64> steamIds);
    std::vector<std::pair<AppId_t, EOverlayToStoreFlag>> StoreOverlayRequests() const;
    std::vector<std::pair<std::string, EActivateGameOverlayToWebPageMode>> WebPageRequests() const;

    // --- Leaderboards --------------------------------------------------------------------------
    void AddLeaderboard(const std::string& name, ELeaderboardSortMethod sort, ELeaderboardDisplayType display,
                        std::vector<LeaderboardRow> rows = {});
    bool HasLeaderboard(const std::string& name) const;
    // Rows in rank order (best first).
    std::vector<LeaderboardRow> LeaderboardRows(const std::string& name) const;

    // --- Workshop ------------------------------------------------------------------------------
    void AddWorkshopItem(WorkshopItem item);
    std::optional<WorkshopItem> GetWorkshopItem(PublishedFileId_t id) const;
    // What GetItemUpdateProgress reports for any live update handle.
    void SetUpdateProgress(EItemUpdateStatus status, uint64 processed, uint64 total);
    // Whether CreateItem / SubmitItemUpdate report that the legal agreement is pending.
    void SetNeedsLegalAgreement(bool needs);
    std::vector<WorkshopSubmission> Submissions() const;
};

// The process's world.
World& GetWorld();

}  // namespace simclient

#endif  // SIMCLIENT_WORLD_H
