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
#include <memory>
#include <mutex>
#include <optional>
#include <random>
#include <set>
#include <string>
#include <unordered_map>
#include <unordered_set>
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
    std::function<void()> afterDelivery;  // runs under the world lock after delivery
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
    std::vector<LeaderboardRow> rows;           // kept in rank order
    std::unordered_map<uint64, int32> scoreOf;  // user -> score of the user's row
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
    bool uploading = false;  // a planned upload runs: the fields below are what it reports
    bool ended = false;      // its result has been queued: the handle reports Invalid
    EItemUpdateStatus status = k_EItemUpdateStatusInvalid;
    uint64 processed = 0, total = 0;
};

// The name of a journaled call, checked against kCallNames when compiled:
//   CallScope call(SIM_CALL("FileRead"), Args(...));
struct CallName {
    const char* text;
};
template <int Index> constexpr CallName CheckedCallName()
{
    static_assert(Index >= 0, "a journaled call name is missing from kCallNames (CallNames.h)");
    return CallName{kCallNames[Index].data()};
}
#define SIM_CALL(name) ::simclient::CheckedCallName<::simclient::CallIndex(name)>()

// One scheduled change of the world (World::Schedule).
struct Scheduled {
    Due due;
    uint64 order = 0;  // scheduling order, breaks ties between equal due points
    WorldAction action;
};

// Another user's name and how it becomes known (World::SetPersonaName*).
struct Persona {
    enum class Arrival {
        Known,
        OnRequest,
        Never
    };
    std::string name;
    Arrival arrival = Arrival::Known;
    Delay delay;             // OnRequest: from the first request to the name
    bool lookingUp = false;  // OnRequest: a lookup is under way
};

// Everything Reset puts back, each default written once here: Reset assigns a fresh
// WorldData. Scheduled actions receive it.
struct WorldData {
    // Process
    bool steamRunning = true;
    bool initSucceeds = true;
    bool initialised = false;
    bool available[kInterfaceCount] = {true, true, true, true, true, true, true, true};

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
    bool overlayShown = false;  // opened by a store request or SetOverlayActive, not closed since
    std::optional<StoreVisit> storeVisit;
    SteamAPIWarningMessageHook_t warningHook = nullptr;

    // Dispatch and schedule
    int latency = 1;
    bool holdUnboundResults = false;  // World::SetHoldUnboundResults
    uint64 pump = 0;
    uint64 engineMs = 0;  // engine time read at the latest pump
    std::deque<Pending> queue;
    std::vector<Scheduled> scheduled;
    uint64 nextScheduleOrder = 0;

    // Faults and journal
    std::map<std::string, std::vector<Fault>> faults;
    std::mt19937_64 faultRandom{1};  // Fault::Chance and RandomLatency draw from it
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
    std::map<uint64, Persona> personas;
    std::vector<uint64> friends;
    std::vector<std::pair<AppId_t, EOverlayToStoreFlag>> storeRequests;
    std::vector<std::pair<std::string, EActivateGameOverlayToWebPageMode>> webRequests;

    // Leaderboards
    std::vector<Leaderboard> leaderboards;  // handle = index + 1
    // Entry sets of downloads whose result has not been handled yet; each is released
    // once its call result has been dispatched.
    std::map<SteamLeaderboardEntries_t, DownloadedEntries> downloads;

    // Workshop
    std::map<PublishedFileId_t, WorkshopItem> items;
    std::map<UGCQueryHandle_t, UgcQuery> queries;
    std::map<UGCUpdateHandle_t, ItemUpdate> updates;
    EItemUpdateStatus updateStatus = k_EItemUpdateStatusInvalid;
    uint64 updateProcessed = 0, updateTotal = 0;
    bool needsLegalAgreement = false;
    std::vector<WorkshopSubmission> submissions;
    std::optional<WorkshopUpload> upload;
    uint32 detailQueryLimit = kNumUGCResultsPerPage;
    std::optional<std::vector<PublishedFileId_t>> subscribedList;

    // --- helpers for scheduled actions and the simulated methods ---
    // The absolute point `delay` from now.
    Due DueAfter(Delay delay) const
    {
        return delay.clock == Clock::Pump ? Due::Pump(pump + delay.amount)
                                          : Due::EngineMs(engineMs + delay.amount);
    }
    void ScheduleAt(Due due, WorldAction action)
    {
        scheduled.push_back(Scheduled{due, nextScheduleOrder++, std::move(action)});
    }
    // From a scheduled action: `action` now when `delay` is nothing, else `delay` later.
    void RunAfter(Delay delay, const WorldAction& action)
    {
        if (delay.amount == 0)
            action(*this);
        else
            ScheduleAt(DueAfter(delay), action);
    }
    // Queues a broadcast callback for the current pump: from a scheduled action, it is
    // delivered by the pump that ran the action.
    template <class T> void PostNow(const T& data) { PostAt(pump, T::k_iCallback, &data, sizeof(T)); }
    // Queues a broadcast callback for the pump `dueAtPump`.
    void PostAt(uint64 dueAtPump, int callbackId, const void* data, std::size_t size);
    // Queues the result of call `handle` for the pump `dueAtPump`.
    void PostResultAt(uint64 dueAtPump, SteamAPICall_t handle, int callbackId, bool ioFailure,
                      const void* data, std::size_t size);
};

// The world: its data, plus what outlives a Reset.
struct WorldState : WorldData {
    mutable std::mutex mutex;
    std::atomic<uintptr_t> generation{0};
    // Mirrors of state read without the lock by the idle pump's fast path.
    std::atomic<bool> journalEnabled{true};
    std::atomic<std::size_t> queuedCount{0};  // queued deliveries plus scheduled actions
    // Read by each pump before it takes the lock (std::atomic_load/atomic_store).
    std::shared_ptr<const std::function<uint64_t()>> timeSource;
    std::shared_ptr<const std::function<void(const char*, const std::string&)>> callObserver;
    // Tells the observer of a call, then gives the mutex the call goes on to take.
    std::mutex& Announce(CallName name, const std::string& args)
    {
        if (auto observer = std::atomic_load(&callObserver))
            (*observer)(name.text, args);
        return mutex;
    }

    // Kept by Reset (see World::Reset).
    std::map<int, std::vector<CCallbackBase*>> callbacks;  // by number, in registration order
    // One call may be bound to several objects; they run in the order they were bound.
    std::multimap<SteamAPICall_t, CCallbackBase*> callResults;
    SteamAPICall_t nextHandle = 0x100;
    SteamLeaderboardEntries_t nextEntriesHandle = 1;
    UGCQueryHandle_t nextQueryHandle = 1;
    UGCUpdateHandle_t nextUpdateHandle = 1;
    PublishedFileId_t nextItemId = 1000000;
    uint64 journalEpoch = 1;  // moves when the journal restarts, invalidating marks
    // Every text handed to the code under test (names, language): pointers into it stay
    // valid for the life of the process, as the platform's do, whatever later changes or
    // resets the world. Never shrinks; holds each distinct text once.
    std::unordered_set<std::string> texts;

    // --- helpers; all expect the mutex held ---
    void BumpGeneration() { generation.fetch_add(1, std::memory_order_acq_rel); }
    // Journals a call, folding it into the previous entry when identical.
    void Record(CallName name, std::string args);
    void SyncQueuedCount() { queuedCount.store(queue.size() + scheduled.size(), std::memory_order_release); }
    const char* Intern(const std::string& text) { return texts.insert(text).first->c_str(); }
    AppliedFaults TakeFaults(const std::string& call);
    // Queues a broadcast callback after the configured latency.
    void QueueCallback(int callbackId, const void* data, std::size_t size, int extraLatency = 0);
    // Allocates a handle and queues the result, honouring the faults; returns the handle
    // (k_uAPICallInvalid under ZeroHandle). `afterDelivery` runs under the lock once the
    // result has been dispatched (its handler returned), or was found unbound.
    SteamAPICall_t QueueCallResult(int callbackId, const void* data, std::size_t size,
                                   const AppliedFaults& faults, std::function<void()> afterDelivery = {});
    // Takes out the actions due at this pump, in running order.
    std::vector<Scheduled> TakeDueActions(bool haveTime);
    bool Usable(Interface which) const { return initialised && available[int(which)]; }
    void ResetData();
};

WorldState& State();

// Locks the world, journals the call and collects its faults: the preamble of every
// simulated SDK method.
struct CallScope {
    CallScope(CallName name, std::string args)
        : state(State()), lock(state.Announce(name, args)),
          faults((state.Record(name, std::move(args)), state.TakeFaults(name.text)))
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
