// Delivery of callbacks and call results inside SteamAPI_RunCallbacks.
//
// RunCallbacks: read the engine's clock -> lock -> advance the pump -> run the scheduled
// actions now due -> take the due items -> unlock, then per item:
//   call result: lock, take the binding for its handle, unlock, Run(p, ioFailure, handle),
//                lock, release what only the handler could read (afterDelivery), unlock
//   broadcast:   lock, snapshot the objects of its number, unlock; for each object,
//                lock, check it is still registered, unlock, Run(p)
// Handlers may register, unregister or destroy callback objects (their own or others')
// and may issue new calls; those land at a later pump.
#include "CallbackManager.h"

#include <algorithm>
#include <functional>
#include <memory>
#include <vector>

#include "Args.h"
#include "WorldState.h"

using simclient::Args;
using simclient::Pending;
using simclient::Scheduled;
using simclient::State;
using simclient::WorldState;

namespace {

bool IsRegisteredFor(const WorldState& s, CCallbackBase* cb, int id)
{
    auto found = s.callbacks.find(id);
    if (found == s.callbacks.end())
        return false;
    const auto& list = found->second;
    return std::find(list.begin(), list.end(), cb) != list.end();
}

void RemoveFrom(WorldState& s, CCallbackBase* cb, int id)
{
    auto found = s.callbacks.find(id);
    if (found == s.callbacks.end())
        return;
    auto& list = found->second;
    list.erase(std::remove(list.begin(), list.end(), cb), list.end());
    if (list.empty())
        s.callbacks.erase(found);
}

// Nested pumps from inside a handler do nothing, as with the real client.
thread_local bool t_dispatching = false;

}  // namespace

void CCallbackMgr::Register(CCallbackBase* cb, int callbackId)
{
    WorldState& s = State();
    std::lock_guard<std::mutex> lock(s.mutex);
    s.Record(SIM_CALL("SteamAPI_RegisterCallback"), Args(callbackId));
    if (!cb)
        return;
    if (cb->m_nCallbackFlags & CCallbackBase::k_ECallbackFlagsRegistered)
        RemoveFrom(s, cb, cb->m_iCallback);
    cb->m_nCallbackFlags |= CCallbackBase::k_ECallbackFlagsRegistered;
    cb->m_iCallback = callbackId;
    s.callbacks[callbackId].push_back(cb);
}

void CCallbackMgr::Unregister(CCallbackBase* cb)
{
    WorldState& s = State();
    std::lock_guard<std::mutex> lock(s.mutex);
    s.Record(SIM_CALL("SteamAPI_UnregisterCallback"), Args(cb ? cb->m_iCallback : 0));
    if (!cb || !(cb->m_nCallbackFlags & CCallbackBase::k_ECallbackFlagsRegistered))
        return;
    RemoveFrom(s, cb, cb->m_iCallback);
    cb->m_nCallbackFlags &= ~CCallbackBase::k_ECallbackFlagsRegistered;
}

void CCallbackMgr::RegisterCallResult(CCallbackBase* cb, SteamAPICall_t handle)
{
    WorldState& s = State();
    std::lock_guard<std::mutex> lock(s.mutex);
    s.Record(SIM_CALL("SteamAPI_RegisterCallResult"), Args(handle));
    if (!cb || handle == k_uAPICallInvalid)
        return;
    s.callResults.emplace(handle, cb);
}

void CCallbackMgr::UnregisterCallResult(CCallbackBase* cb, SteamAPICall_t handle)
{
    WorldState& s = State();
    std::lock_guard<std::mutex> lock(s.mutex);
    s.Record(SIM_CALL("SteamAPI_UnregisterCallResult"), Args(handle));
    auto bound = s.callResults.equal_range(handle);
    for (auto found = bound.first; found != bound.second; ++found) {
        if (found->second == cb) {
            s.callResults.erase(found);
            break;
        }
    }
}

void CCallbackMgr::RunCallbacks()
{
    WorldState& s = State();
    // Idle fast path: with the journal off and nothing queued, a pump has nothing to do
    // (no pending item or scheduled action depends on the pump count while there is none).
    if (!s.journalEnabled.load(std::memory_order_relaxed) &&
        s.queuedCount.load(std::memory_order_acquire) == 0)
        return;
    // The engine's clock is read outside the world's lock: its owner may hold locks of
    // its own that the module's threads take before calling the SDK.
    uint64_t now = 0;
    std::shared_ptr<const std::function<uint64_t()>> clock;
    if (!t_dispatching)
        clock = std::atomic_load(&s.timeSource);
    if (clock)
        now = (*clock)();
    std::vector<Pending> due;
    {
        std::lock_guard<std::mutex> lock(s.mutex);
        s.Record(SIM_CALL("SteamAPI_RunCallbacks"), "");
        if (t_dispatching || !s.initialised)
            return;
        ++s.pump;
        if (clock)
            s.engineMs = now;
        for (Scheduled& action : s.TakeDueActions(clock != nullptr))
            action.action(s);
        for (auto it = s.queue.begin(); it != s.queue.end();) {
            const bool waitsForBinding = s.holdUnboundResults && it->handle != k_uAPICallInvalid &&
                                         s.callResults.count(it->handle) == 0;
            if (it->dueAtPump <= s.pump && !waitsForBinding) {
                due.push_back(std::move(*it));
                it = s.queue.erase(it);
            } else {
                ++it;
            }
        }
        s.SyncQueuedCount();
    }
    t_dispatching = true;
    for (Pending& item : due) {
        if (item.handle != k_uAPICallInvalid) {
            std::vector<CCallbackBase*> targets;
            {
                std::lock_guard<std::mutex> lock(s.mutex);
                auto bound = s.callResults.equal_range(item.handle);
                for (auto found = bound.first; found != bound.second; ++found)
                    targets.push_back(found->second);
                s.callResults.erase(bound.first,
                                    bound.second);  // the dispatcher, not the object, drops the bindings
            }
            for (CCallbackBase* target : targets) {
                std::vector<uint8> buffer(item.payload);
                buffer.resize(std::max<std::size_t>(buffer.size(), target->GetCallbackSizeBytes()));
                target->Run(buffer.data(), item.ioFailure, item.handle);
            }
            if (item.afterDelivery) {
                std::lock_guard<std::mutex> lock(s.mutex);
                item.afterDelivery();
            }
            continue;
        }
        std::vector<CCallbackBase*> targets;
        {
            std::lock_guard<std::mutex> lock(s.mutex);
            auto found = s.callbacks.find(item.callbackId);
            if (found != s.callbacks.end())
                targets = found->second;
        }
        for (CCallbackBase* target : targets) {
            {
                std::lock_guard<std::mutex> lock(s.mutex);
                // Skip objects a previous handler unregistered (or destroyed), and game-server
                // objects: everything here comes from the client pipe.
                if (!IsRegisteredFor(s, target, item.callbackId))
                    continue;
                if (target->m_nCallbackFlags & CCallbackBase::k_ECallbackFlagsGameServer)
                    continue;
            }
            std::vector<uint8> buffer(item.payload);
            buffer.resize(std::max<std::size_t>(buffer.size(), target->GetCallbackSizeBytes()));
            target->Run(buffer.data());
        }
    }
    t_dispatching = false;
}
