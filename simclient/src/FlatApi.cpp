// The exported flat functions: start-up, shut-down, pump, registration, interface lookup.
#include <cstring>

#include "Args.h"
#include "CallbackManager.h"
#include "SimInterfaces.h"
#include "WorldState.h"

using namespace simclient;

namespace {

constexpr HSteamUser kUser = 1;
constexpr HSteamPipe kPipe = 1;

struct VersionedInterface {
    const char* version;
    Interface which;
    void* (*get)();
};

const VersionedInterface kUserInterfaces[] = {
    {STEAMUSER_INTERFACE_VERSION, Interface::User, [] { return (void*)SimUser(); }},
    {STEAMUTILS_INTERFACE_VERSION, Interface::Utils, [] { return (void*)SimUtils(); }},
    {STEAMAPPS_INTERFACE_VERSION, Interface::Apps, [] { return (void*)SimApps(); }},
    {STEAMFRIENDS_INTERFACE_VERSION, Interface::Friends, [] { return (void*)SimFriends(); }},
    {STEAMUSERSTATS_INTERFACE_VERSION, Interface::UserStats, [] { return (void*)SimUserStats(); }},
    {STEAMREMOTESTORAGE_INTERFACE_VERSION, Interface::RemoteStorage,
     [] { return (void*)SimRemoteStorage(); }},
    {STEAMUGC_INTERFACE_VERSION, Interface::UGC, [] { return (void*)SimUGC(); }},
};

// Serialises refills of accessor contexts so concurrent first uses don't race.
std::mutex g_contextMutex;

}  // namespace

S_API bool S_CALLTYPE SteamAPI_Init()
{
    CallScope call(SIM_CALL("SteamAPI_Init"), "");
    if (!call.state.initSucceeds || call.faults.fail)
        return false;
    call.state.initialised = true;
    call.state.BumpGeneration();
    return true;
}

S_API void S_CALLTYPE SteamAPI_Shutdown()
{
    CallScope call(SIM_CALL("SteamAPI_Shutdown"), "");
    call.state.initialised = false;
    call.state.queue.clear();
    call.state.downloads.clear();  // their results will never be handled
    call.state.SyncQueuedCount();  // results of calls in flight are lost with the connection
    call.state.BumpGeneration();
}

S_API bool S_CALLTYPE SteamAPI_IsSteamRunning()
{
    CallScope call(SIM_CALL("SteamAPI_IsSteamRunning"), "");
    return call.state.steamRunning && !call.faults.fail;
}

S_API void S_CALLTYPE SteamAPI_RunCallbacks()
{
    CCallbackMgr::RunCallbacks();
}

S_API void S_CALLTYPE SteamAPI_RegisterCallback(CCallbackBase* pCallback, int iCallback)
{
    CCallbackMgr::Register(pCallback, iCallback);
}

S_API void S_CALLTYPE SteamAPI_UnregisterCallback(CCallbackBase* pCallback)
{
    CCallbackMgr::Unregister(pCallback);
}

S_API void S_CALLTYPE SteamAPI_RegisterCallResult(CCallbackBase* pCallback, SteamAPICall_t hAPICall)
{
    CCallbackMgr::RegisterCallResult(pCallback, hAPICall);
}

S_API void S_CALLTYPE SteamAPI_UnregisterCallResult(CCallbackBase* pCallback, SteamAPICall_t hAPICall)
{
    CCallbackMgr::UnregisterCallResult(pCallback, hAPICall);
}

// Accessor plumbing below is not journaled: it runs at every SteamX() use.
S_API HSteamUser SteamAPI_GetHSteamUser()
{
    std::lock_guard<std::mutex> lock(State().mutex);
    return State().initialised ? kUser : 0;
}

S_API HSteamPipe SteamAPI_GetHSteamPipe()
{
    std::lock_guard<std::mutex> lock(State().mutex);
    return State().initialised ? kPipe : 0;
}

S_API void* S_CALLTYPE SteamInternal_ContextInit(void* pContextInitData)
{
    uintptr_t* ctx = static_cast<uintptr_t*>(pContextInitData);
    // The accessors run on every call into an interface, often every frame: a context
    // that is up to date costs one atomic read, as with the platform's own library.
    // The stamp is published after the pointers it guards.
    if (__atomic_load_n(&ctx[1], __ATOMIC_ACQUIRE) == State().generation.load(std::memory_order_acquire))
        return &ctx[2];
    std::lock_guard<std::mutex> lock(g_contextMutex);
    uintptr_t generation = State().generation.load(std::memory_order_acquire);
    if (ctx[1] != generation) {
        // The init helper calls back into the lookup functions, which take the world lock;
        // this one is a different mutex, so that is fine.
        auto init = reinterpret_cast<void (*)(void*)>(ctx[0]);
        init(&ctx[2]);
        __atomic_store_n(&ctx[1], generation, __ATOMIC_RELEASE);
    }
    return &ctx[2];
}

S_API void* S_CALLTYPE SteamInternal_FindOrCreateUserInterface(HSteamUser hSteamUser, const char* pszVersion)
{
    (void)hSteamUser;  // one user only; utilities come with the literal 0
    if (!pszVersion)
        return nullptr;
    for (const VersionedInterface& entry : kUserInterfaces) {
        if (std::strcmp(entry.version, pszVersion) != 0)
            continue;
        std::lock_guard<std::mutex> lock(State().mutex);
        return State().Usable(entry.which) ? entry.get() : nullptr;
    }
    return nullptr;
}

S_API void* S_CALLTYPE SteamInternal_CreateInterface(const char* ver)
{
    if (!ver || std::strcmp(ver, STEAMCLIENT_INTERFACE_VERSION) != 0)
        return nullptr;
    std::lock_guard<std::mutex> lock(State().mutex);
    return State().Usable(Interface::Client) ? SimClient() : nullptr;
}
