// Control API of the simulated Steam client: tests and the scenario runner set up the
// world, post callbacks, inject faults and read back what the code under test did.
//
// There is one world per process, shared by everything linked to libsteam_api.so (a
// runner and the module it dlopens see the same one). All members are thread-safe.
#ifndef SIMCLIENT_WORLD_H
#define SIMCLIENT_WORLD_H

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include <steam/steam_api.h>

#include "simclient/CallNames.h"
#include "simclient/Fault.h"
#include "simclient/Journal.h"
#include "simclient/Schedule.h"

namespace simclient {

// The world's data (src/WorldState.h), handed to scheduled actions.
struct WorldData;
using WorldAction = std::function<void(WorldData&)>;

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

// What the user does in the store overlay that ActivateGameOverlayToStore opens. The
// overlay opens at the next pump (GameOverlayActivated_t, m_bActive 1); from then on,
// after `buyAfter` the user buys the product shown (never without one), after
// `closeAfter` the overlay closes (m_bActive 0), and `installAfter` from the purchase
// the product shows as installed, which may fall before or after the closing. Changes
// due at one pump happen before that pump's deliveries, so a product installed at the
// pump of the closing is installed when the closing is delivered.
struct StoreVisit {
    std::optional<Delay> buyAfter;
    Delay closeAfter = Delay::Pumps(1);
    Delay installAfter = Delay::Pumps(0);
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
    bool installInfoFails = false;  // GetItemInstallInfo answers false even when installed
};

// A download that the platform runs by itself: the item waits (DownloadPending), then
// downloads (NeedsUpdate | Downloading) `bytesPerStep` more every `step`, and ends
// installed in `folder` with every byte there.
struct WorkshopDownload {
    uint64 bytesTotal = 0;
    uint64 bytesPerStep = 0;
    Delay step = Delay::Pumps(1);
    std::string folder;
};

// How a SubmitItemUpdate goes on: every `step` the update moves on, through
// PreparingConfig, PreparingContent, UploadingContent (`bytesPerStep` more each step
// until `contentBytes`), UploadingPreviewFile and CommittingChanges, reporting
// `contentBytes` as the total throughout; then its result arrives (`result`, unless a
// fault says otherwise) and the handle reports Invalid.
struct WorkshopUpload {
    uint64 contentBytes = 0;
    uint64 bytesPerStep = 0;
    Delay step = Delay::Pumps(1);
    EResult result = k_EResultOK;
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
    // available, default user/app, no data, no faults, empty journal and queue, latency 1,
    // nothing scheduled, no time source, pump count 0.
    // Kept: callback registrations (they belong to objects still alive, e.g. a module's
    // static overlay callback) and call-result bindings, whose handles simply never
    // complete; handle counters (an old handle never names a new object); and every text
    // the client handed out (a module may still hold the pointer).
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
    // Played by every later store request while the overlay is enabled. Without one (the
    // default) the overlay opens and stays open until SetOverlayActive(false). A request
    // while the overlay is open shows the page there: no second opening, the visit plays
    // from the request's next pump. With the overlay disabled a request only is recorded.
    void SetStoreVisit(std::optional<StoreVisit> visit);

    // --- Callbacks --------------------------------------------------------------------------
    // Pumps a posted callback or call result waits (1 = the next RunCallbacks).
    void SetLatency(int pumps);
    // On: a call result that falls due before any object is bound to its handle waits
    // for the binding, as on the real platform, where no answer comes back within the
    // moment between a call and its CCallResult::Set. Off (the default, and after
    // Reset): it is released unseen at its pump. For soaks that pump without pause.
    void SetHoldUnboundResults(bool hold);
    // Queue a broadcast callback for every registered object of number `callbackId`.
    void PostCallback(int callbackId, const void* data, std::size_t size);
    template <class T> void Post(const T& data) { PostCallback(T::k_iCallback, &data, sizeof(T)); }
    // Overlay opening/closing: posts GameOverlayActivated_t.
    void SetOverlayActive(bool active);
    std::size_t PendingCount() const;  // callbacks and results not yet delivered
    uint64 PumpCount() const;          // RunCallbacks calls that dispatched
    int RegisteredCallbackCount(int callbackId) const;
    std::size_t BoundCallResultCount() const;

    // --- Changes that happen by themselves -----------------------------------------------------
    // Runs `action` on the world's data at `due`, inside SteamAPI_RunCallbacks, under the
    // world's lock and before that pump's deliveries (a callback it posts with
    // WorldData::PostNow arrives in that same pump). Actions due at one pump run
    // pump-clocked first, then engine-clocked, each by due point, then in the order they
    // were scheduled. An action must not call the World or the SDK (the lock is held).
    // A due point already passed fires at the next pump; Reset drops what is scheduled.
    // WorldData is declared in the library's src/WorldState.h (include it to write an
    // action; the library's own timed behaviours are built the same way). Example:
    //   world.Schedule(Due::Pump(5), [](WorldData& d) { d.serverTime += 60; });
    void Schedule(Due due, WorldAction action);
    // The same, `delay` from now: After(Delay::Pumps(2), a) fires at PumpCount() + 2.
    void After(Delay delay, WorldAction action);
    std::size_t ScheduledCount() const;  // actions not run yet
    // Where engine time comes from: called once per pump, outside the world's lock, by
    // the thread that pumps (so it must be safe to call from there). Installed by whoever
    // owns the clock (the scenario runner, a module test's engine); an empty function
    // removes it. Without one, engine-clocked actions never fire and engine time reads 0.
    void SetTimeSource(std::function<uint64_t()> nowMs);
    // Told of every platform call as it is made, repeats folded in the journal included:
    // called on the calling thread before the call takes the world's lock, so it may do
    // anything but call the platform. For a runner that watches which threads only poll.
    // An empty function removes it; Reset removes it too.
    void SetCallObserver(std::function<void(const char* name, const std::string& args)> observer);

    // --- Faults ------------------------------------------------------------------------------
    // `call` is the method name as journaled, e.g. "FileRead", "SteamAPI_Init" (the names
    // are in CallNames.h). An unknown name throws std::invalid_argument naming it and
    // listing the known names.
    void InjectFault(const std::string& call, Fault fault);
    void ClearFaults();
    // Seed of the choices that faults with a chance or a random latency make (default 1;
    // Reset puts it back): the same seed and the same calls give the same faults.
    void SetFaultSeed(uint64 seed);

    // --- Journal and warnings ----------------------------------------------------------------
    // The whole journal (a copy).
    Journal GetJournal() const;
    // A cursor for reading the journal as it grows without copying it all each time:
    //   JournalMark mark = world.JournalMark();
    //   ... calls happen ...
    //   Journal fresh = world.JournalSince(mark);  // entries after the mark; mark moves to the end
    // Folding may add repeats to the last entry after it was read: JournalSince then
    // gives that entry again first, with `count` set to the repeats made since (so adding
    // up the counts of everything read gives every call exactly once). A mark taken
    // before ClearJournal or Reset reads the new journal from its start.
    simclient::JournalMark JournalMark() const;
    Journal JournalSince(simclient::JournalMark& mark) const;
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
    // How another user's name becomes known, as the platform looks it up:
    // - known now: GetFriendPersonaName gives it, RequestUserInformation answers false.
    // - arrives: until known, GetFriendPersonaName gives "[unknown]" and
    //   RequestUserInformation answers true; the first such request starts one lookup
    //   that ends `delay` later (pumps or engine ms, plus any ExtraLatency fault of that
    //   request): the name becomes known and one PersonaStateChange_t (k_EPersonaChangeName)
    //   is delivered in that pump. Requests while the lookup runs add nothing.
    // - never: "[unknown]" and true forever, and nothing is ever queued.
    // An id the world has no entry for behaves as SetPersonaNameArrives(id, "[unknown]",
    // the latency): one callback, then the request answers false and the name stays
    // "[unknown]". The local user's name is SetLocalUser's.
    // `known` false is SetPersonaNameArrives with Delay::Pumps(latency).
    void SetPersonaName(uint64 steamId, const std::string& name, bool known = true);
    void SetPersonaNameArrives(uint64 steamId, const std::string& name, Delay delay);
    void SetPersonaNameNever(uint64 steamId);
    // The same for every other player the world holds a name for at this moment (players
    // of generated boards included): each keeps its name, which arrives `delay` after its
    // first request, or never. Players set afterwards are not affected.
    void SetAllPersonaNamesArrive(Delay delay);
    void SetAllPersonaNamesNever();
    void SetFriends(std::vector<uint64> steamIds);
    std::vector<std::pair<AppId_t, EOverlayToStoreFlag>> StoreOverlayRequests() const;
    std::vector<std::pair<std::string, EActivateGameOverlayToWebPageMode>> WebPageRequests() const;

    // --- Leaderboards --------------------------------------------------------------------------
    void AddLeaderboard(const std::string& name, ELeaderboardSortMethod sort, ELeaderboardDisplayType display,
                        std::vector<LeaderboardRow> rows = {});
    // A board of `rows` and `count` generated players (GeneratedPlayers.h, with `seed`).
    // A generated player's name is known from now on, unless the world already has a
    // setting for that player (set late or missing names before or after, as wanted).
    void AddGeneratedLeaderboard(const std::string& name, ELeaderboardSortMethod sort,
                                 ELeaderboardDisplayType display, int count, uint64 seed,
                                 std::vector<LeaderboardRow> rows = {});
    bool HasLeaderboard(const std::string& name) const;
    // Rows in rank order: best first, equal scores in the order they were set (rows given
    // to AddLeaderboard keep their order among equals; an upload goes after its equals).
    std::vector<LeaderboardRow> LeaderboardRows(const std::string& name) const;
    // Downloaded entry sets still held: a set lives from the download call until its
    // result has been dispatched (the handler is the one place to read it).
    std::size_t DownloadedEntrySets() const;

    // --- Workshop ------------------------------------------------------------------------------
    void AddWorkshopItem(WorkshopItem item);
    std::optional<WorkshopItem> GetWorkshopItem(PublishedFileId_t id) const;
    // What GetItemUpdateProgress reports for any live update handle with no upload running.
    void SetUpdateProgress(EItemUpdateStatus status, uint64 processed, uint64 total);
    // Starts `download` of item `id` from the next step on; false for an unknown item.
    bool StartWorkshopDownload(PublishedFileId_t id, const WorkshopDownload& download);
    // How the next submissions upload (nullopt: their result comes at the latency, as before).
    void SetWorkshopUpload(const std::optional<WorkshopUpload>& upload);
    // The ids GetSubscribedItems gives, in this order and repeats included (nullopt: every
    // subscribed item once, by id); GetNumSubscribedItems counts them.
    void SetSubscribedList(std::optional<std::vector<PublishedFileId_t>> ids);
    // Most ids one detail query takes (the platform's page, 50, by default).
    void SetDetailQueryLimit(uint32 limit);
    // Whether CreateItem / SubmitItemUpdate report that the legal agreement is pending.
    void SetNeedsLegalAgreement(bool needs);
    std::vector<WorkshopSubmission> Submissions() const;
};

// The process's world.
World& GetWorld();

}  // namespace simclient

#endif  // SIMCLIENT_WORLD_H
