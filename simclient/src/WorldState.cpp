#include "WorldState.h"

#include <algorithm>
#include <cstring>
#include <iterator>
#include <thread>

namespace simclient {

WorldState& State()
{
    // Never destroyed: modules unregister their static callbacks from exit handlers, which
    // may run after this library's own static destructors.
    static WorldState* state = new WorldState();
    return *state;
}

void WorldState::Record(CallName name, std::string args)
{
    if (!journalEnabled.load(std::memory_order_relaxed))
        return;
    const ThreadSerial thread = ThisThreadSerial();
    if (!journal.empty()) {
        JournalEntry& last = journal.back();
        if (last.thread == thread && last.name == name.text && last.args == args) {
            ++last.count;
            return;
        }
    }
    journal.push_back(JournalEntry{name.text, std::move(args), thread});
}

void WorldData::PostAt(uint64 dueAtPump, int callbackId, const void* data, std::size_t size)
{
    Pending p;
    p.dueAtPump = dueAtPump;
    p.callbackId = callbackId;
    p.payload.assign(static_cast<const uint8*>(data), static_cast<const uint8*>(data) + size);
    queue.push_back(std::move(p));
}

void WorldData::PostResultAt(uint64 dueAtPump, SteamAPICall_t handle, int callbackId, bool ioFailure,
                             const void* data, std::size_t size)
{
    Pending p;
    p.dueAtPump = dueAtPump;
    p.callbackId = callbackId;
    p.handle = handle;
    p.ioFailure = ioFailure;
    p.payload.assign(static_cast<const uint8*>(data), static_cast<const uint8*>(data) + size);
    queue.push_back(std::move(p));
}

std::vector<Scheduled> WorldState::TakeDueActions(bool haveTime)
{
    std::vector<Scheduled> due;
    if (scheduled.empty())
        return due;
    auto isDue = [&](const Scheduled& a) {
        return a.due.clock == Clock::Pump ? a.due.at <= pump : haveTime && a.due.at <= engineMs;
    };
    auto keep = std::stable_partition(scheduled.begin(), scheduled.end(),
                                      [&](const Scheduled& a) { return !isDue(a); });
    due.assign(std::make_move_iterator(keep), std::make_move_iterator(scheduled.end()));
    scheduled.erase(keep, scheduled.end());
    std::sort(due.begin(), due.end(), [](const Scheduled& a, const Scheduled& b) {
        if (a.due.clock != b.due.clock)
            return a.due.clock == Clock::Pump;
        return a.due.at != b.due.at ? a.due.at < b.due.at : a.order < b.order;
    });
    return due;
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
        if (it->chance < 100 && static_cast<int>(faultRandom() % 100) >= it->chance) {
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
        case Fault::Kind::RandomLatency:
            applied.extraLatency +=
                static_cast<int>(faultRandom() % (static_cast<uint64>(std::max(0, it->value)) + 1));
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

void WorldState::QueueCallback(int callbackId, const void* data, std::size_t size, int extraLatency)
{
    PostAt(pump + static_cast<uint64>(std::max(1, latency + extraLatency)), callbackId, data, size);
    SyncQueuedCount();
}

SteamAPICall_t WorldState::QueueCallResult(int callbackId, const void* data, std::size_t size,
                                           const AppliedFaults& f, std::function<void()> afterDelivery)
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
    p.afterDelivery = std::move(afterDelivery);
    p.payload.assign(static_cast<const uint8*>(data), static_cast<const uint8*>(data) + size);
    queue.push_back(std::move(p));
    SyncQueuedCount();
    return handle;
}

void WorldState::ResetData()
{
    static_cast<WorldData&>(*this) = WorldData{};
    journalEnabled.store(true);
    ++journalEpoch;
    std::atomic_store(&timeSource, std::shared_ptr<const std::function<uint64_t()>>());
    std::atomic_store(&callObserver,
                      std::shared_ptr<const std::function<void(const char*, const std::string&)>>());
    SyncQueuedCount();
    BumpGeneration();
}

}  // namespace simclient
