#include "WorldState.h"

#include <algorithm>
#include <cstring>
#include <thread>

namespace simclient {

WorldState& State()
{
    // Never destroyed: modules unregister their static callbacks from exit handlers, which
    // may run after this library's own static destructors.
    static WorldState* state = new WorldState();
    return *state;
}

void WorldState::Record(const char* name, std::string args)
{
    if (!journalEnabled.load(std::memory_order_relaxed))
        return;
    journal.push_back(JournalEntry{name, std::move(args), std::this_thread::get_id()});
}

AppliedFaults WorldState::TakeFaults(const std::string& call)
{
    AppliedFaults applied;
    auto found = faults.find(call);
    if (found == faults.end())
        return applied;
    std::vector<Fault>& list = found->second;
    for (auto it = list.begin(); it != list.end();) {
        if (it->skip > 0) {
            --it->skip;
            ++it;
            continue;
        }
        switch (it->kind) {
        case Fault::Kind::Fail:
            applied.fail = true;
            break;
        case Fault::Kind::ZeroHandle:
            applied.zeroHandle = true;
            break;
        case Fault::Kind::IoFailure:
            applied.ioFailure = true;
            break;
        case Fault::Kind::Result:
            applied.result = static_cast<EResult>(it->value);
            break;
        case Fault::Kind::ExtraLatency:
            applied.extraLatency += it->value;
            break;
        case Fault::Kind::ShortRead:
            applied.shortRead = it->value;
            break;
        case Fault::Kind::Drop:
            applied.drop = true;
            break;
        }
        if (it->times == 1) {
            it = list.erase(it);
        } else {
            if (it->times > 1)
                --it->times;
            ++it;
        }
    }
    if (list.empty())
        faults.erase(found);
    return applied;
}

void WorldState::QueueCallback(int callbackId, const void* data, std::size_t size, int extraLatency,
                               std::function<void()> onDeliver)
{
    Pending p;
    p.dueAtPump = pump + static_cast<uint64>(std::max(1, latency + extraLatency));
    p.callbackId = callbackId;
    p.payload.assign(static_cast<const uint8*>(data), static_cast<const uint8*>(data) + size);
    p.onDeliver = std::move(onDeliver);
    queue.push_back(std::move(p));
    SyncQueuedCount();
}

SteamAPICall_t WorldState::QueueCallResult(int callbackId, const void* data, std::size_t size,
                                           const AppliedFaults& f)
{
    if (f.zeroHandle)
        return k_uAPICallInvalid;
    SteamAPICall_t handle = nextHandle++;
    if (f.drop)
        return handle;
    Pending p;
    p.dueAtPump = pump + static_cast<uint64>(std::max(1, latency + f.extraLatency));
    p.callbackId = callbackId;
    p.handle = handle;
    p.ioFailure = f.ioFailure;
    p.payload.assign(static_cast<const uint8*>(data), static_cast<const uint8*>(data) + size);
    queue.push_back(std::move(p));
    SyncQueuedCount();
    return handle;
}

void WorldState::ResetData()
{
    journalEnabled.store(true);
    steamRunning = true;
    initSucceeds = true;
    initialised = false;
    for (bool& a : available)
        a = true;
    userId = 76561197960265728ull + 1234;
    loggedOn = true;
    personaName = "Player";
    appId = 480;
    overlayEnabled = true;
    serverTime = 1700000000;
    notificationPosition.reset();
    language = std::string("english");
    beta.reset();
    dlcs.clear();
    warningHook = nullptr;
    latency = 1;
    pump = 0;
    queue.clear();
    SyncQueuedCount();
    faults.clear();
    journal.clear();
    stats.clear();
    achievements.clear();
    unlockedSinceStore.clear();
    statsReceivedResult = statsStoredResult = k_EResultOK;
    statsReceivedGameId = statsStoredGameId = 0;
    files.clear();
    cloudEnabledForApp.reset();
    personas.clear();
    friends.clear();
    storeRequests.clear();
    webRequests.clear();
    leaderboards.clear();
    downloads.clear();
    items.clear();
    queries.clear();
    updates.clear();
    updateStatus = k_EItemUpdateStatusInvalid;
    updateProcessed = updateTotal = 0;
    needsLegalAgreement = false;
    submissions.clear();
    BumpGeneration();
}

}  // namespace simclient
