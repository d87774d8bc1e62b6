// The simulated client's whole state behind one mutex. Internal to the library.
//
// Rule: the mutex is never held while code under test runs (callback handlers, init
// helpers of accessors, the warning hook), because that code calls back into the SDK.
#ifndef SIMCLIENT_WORLD_STATE_H
#define SIMCLIENT_WORLD_STATE_H

#include <atomic>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <mutex>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "simclient/World.h"

namespace simclient {

// A callback or call result waiting for its pump.
struct Pending {
    uint64 dueAtPump = 0;
    int callbackId = 0;
    SteamAPICall_t handle = k_uAPICallInvalid;  // 0: broadcast callback
    bool ioFailure = false;
    std::vector<uint8> payload;
    std::function<void()> onDeliver;  // runs under the world lock just before delivery
};

// Faults that apply to one call, merged from everything queued for its kind.
struct AppliedFaults {
    bool fail = false;
    bool zeroHandle = false;
    bool ioFailure = false;
    bool drop = false;
    std::optional<EResult> result;
    int extraLatency = 0;
    std::optional<int> shortRead;
};

struct Leaderboard {
    SteamLeaderboard_t handle = 0;
    std::string name;
    ELeaderboardSortMethod sort = k_ELeaderboardSortMethodDescending;
    ELeaderboardDisplayType display = k_ELeaderboardDisplayTypeNumeric;
    std::vector<LeaderboardRow> rows;  // kept in rank order
};

struct DownloadedEntries {
    std::vector<LeaderboardEntry_t> entries;
    std::vector<std::vector<int32>> details;
};

struct UgcQuery {
    std::vector<PublishedFileId_t> ids;
    bool sent = false;
    bool completed = false;
};

struct ItemUpdate {
    WorkshopSubmission pending;
};

struct WorldState {
    mutable std::mutex mutex;

    // Process
    bool steamRunning = true;
    bool initSucceeds = true;
    bool initialised = false;
    bool available[kInterfaceCount] = {true, true, true, true, true, true, true, true};
    std::atomic<uintptr_t> generation{0};

    // User, app, utilities
    uint64 userId = 76561197960265728ull + 1234;
    bool loggedOn = true;
    std::string personaName = "Player";
    AppId_t appId = 480;
    bool overlayEnabled = true;
    uint32 serverTime = 1700000000;
    std::optional<ENotificationPosition> notificationPosition;
    std::optional<std::string> language = std::string("english");
    std::optional<std::string> beta;
    std::vector<Dlc> dlcs;
    SteamAPIWarningMessageHook_t warningHook = nullptr;

    // Dispatch
    int latency = 1;
    uint64 pump = 0;
    SteamAPICall_t nextHandle = 0x100;
    std::deque<Pending> queue;
    std::map<int, std::vector<CCallbackBase*>> callbacks;  // by number, in registration order
    std::map<SteamAPICall_t, CCallbackBase*> callResults;

    // Faults and journal
    std::map<std::string, std::vector<Fault>> faults;
    std::vector<JournalEntry> journal;

    // Statistics
    std::map<std::string, int32> stats;
    std::map<std::string, bool> achievements;
    std::set<std::string> unlockedSinceStore;
    EResult statsReceivedResult = k_EResultOK;
    uint64 statsReceivedGameId = 0;
    EResult statsStoredResult = k_EResultOK;
    uint64 statsStoredGameId = 0;

    // Cloud
    std::map<std::string, std::vector<uint8>> files;
    std::optional<bool> cloudEnabledForApp;

    // Friends
    std::map<uint64, std::pair<std::string, bool>> personas;  // id -> (name, known)
    std::vector<uint64> friends;
    std::vector<std::pair<AppId_t, EOverlayToStoreFlag>> storeRequests;
    std::vector<std::pair<std::string, EActivateGameOverlayToWebPageMode>> webRequests;

    // Leaderboards
    std::vector<Leaderboard> leaderboards;  // handle = index + 1
    std::map<SteamLeaderboardEntries_t, DownloadedEntries> downloads;
    SteamLeaderboardEntries_t nextEntriesHandle = 1;

    // Workshop
    std::map<PublishedFileId_t, WorkshopItem> items;
    std::map<UGCQueryHandle_t, UgcQuery> queries;
    UGCQueryHandle_t nextQueryHandle = 1;
    std::map<UGCUpdateHandle_t, ItemUpdate> updates;
    UGCUpdateHandle_t nextUpdateHandle = 1;
    PublishedFileId_t nextItemId = 1000000;
    EItemUpdateStatus updateStatus = k_EItemUpdateStatusInvalid;
    uint64 updateProcessed = 0, updateTotal = 0;
    bool needsLegalAgreement = false;
    std::vector<WorkshopSubmission> submissions;

    // --- helpers; all expect the mutex held ---
    void BumpGeneration() { generation.fetch_add(1, std::memory_order_acq_rel); }
    void Record(const char* name, std::string args);
    // Mirrors of state read without the lock by the idle pump's fast path.
    std::atomic<bool> journalEnabled{true};
    std::atomic<std::size_t> queuedCount{0};
    void SyncQueuedCount() { queuedCount.store(queue.size(), std::memory_order_release); }
    AppliedFaults TakeFaults(const std::string& call);
    // Queues a broadcast callback after the configured latency.
    void QueueCallback(int callbackId, const void* data, std::size_t size, int extraLatency = 0,
                       std::function<void()> onDeliver = {});
    // Allocates a handle and queues the result, honouring the faults; returns the handle
    // (k_uAPICallInvalid under ZeroHandle).
    SteamAPICall_t QueueCallResult(int callbackId, const void* data, std::size_t size,
                                   const AppliedFaults& faults);
    bool Usable(Interface which) const { return initialised && available[int(which)]; }
    void ResetData();
};

WorldState& State();

// Locks the world, journals the call and collects its faults: the preamble of every
// simulated SDK method.
struct CallScope {
    CallScope(const char* name, std::string args)
        : state(State()), lock(state.mutex),
          faults((state.Record(name, std::move(args)), state.TakeFaults(name)))
    {
    }
    WorldState& state;
    std::unique_lock<std::mutex> lock;
    AppliedFaults faults;
};

template <class T> SteamAPICall_t QueueResult(WorldState& s, const T& result, const AppliedFaults& f)
{
    return s.QueueCallResult(T::k_iCallback, &result, sizeof(T), f);
}

}  // namespace simclient

#endif  // SIMCLIENT_WORLD_STATE_H
