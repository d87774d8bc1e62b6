// Registration entry points, the callback object classes, and the cached-accessor
// machinery behind SteamUser(), SteamUtils() and friends.
#ifndef STEAM_API_INTERNAL_H
#define STEAM_API_INTERNAL_H

#include "steamtypes.h"

// First callback number of each interface's range.
enum {
    k_iSteamUserCallbacks = 100,
    k_iSteamGameServerCallbacks = 200,
    k_iSteamFriendsCallbacks = 300,
    k_iSteamBillingCallbacks = 400,
    k_iSteamMatchmakingCallbacks = 500,
    k_iSteamContentServerCallbacks = 600,
    k_iSteamUtilsCallbacks = 700,
    k_iClientFriendsCallbacks = 800,
    k_iClientUserCallbacks = 900,
    k_iSteamAppsCallbacks = 1000,
    k_iSteamUserStatsCallbacks = 1100,
    k_iSteamNetworkingCallbacks = 1200,
    k_iClientRemoteStorageCallbacks = 1300,
    k_iClientUGCCallbacks = 3400,
};

S_API HSteamUser SteamAPI_GetHSteamUser();
S_API HSteamPipe SteamAPI_GetHSteamPipe();

S_API void* S_CALLTYPE SteamInternal_ContextInit(void* pContextInitData);
S_API void* S_CALLTYPE SteamInternal_CreateInterface(const char* ver);
S_API void* S_CALLTYPE SteamInternal_FindOrCreateUserInterface(HSteamUser hSteamUser, const char* pszVersion);

S_API void S_CALLTYPE SteamAPI_RegisterCallback(class CCallbackBase* pCallback, int iCallback);
S_API void S_CALLTYPE SteamAPI_UnregisterCallback(class CCallbackBase* pCallback);
S_API void S_CALLTYPE SteamAPI_RegisterCallResult(class CCallbackBase* pCallback, SteamAPICall_t hAPICall);
S_API void S_CALLTYPE SteamAPI_UnregisterCallResult(class CCallbackBase* pCallback, SteamAPICall_t hAPICall);

// Accessor pattern: a function-local context of three pointer-sized words
// { init function, interface generation seen, cached pointer }. ContextInit refetches
// the pointer whenever the library's generation has moved and returns &word[2].
#define _STEAM_CALLBACK_AUTO_HOOK(thisclass, func, param)

#define STEAM_DEFINE_INTERFACE_ACCESSOR(type, name, expr, kind, version)                                     \
    inline void S_CALLTYPE SteamInternal_Init_##name(type* p)                                                \
    {                                                                                                        \
        *p = (type)(expr);                                                                                   \
    }                                                                                                        \
    inline type name()                                                                                       \
    {                                                                                                        \
        static void* s_CallbackCounterAndContext[3] = {(void*)&SteamInternal_Init_##name, 0, 0};             \
        return *(type*)SteamInternal_ContextInit(s_CallbackCounterAndContext);                               \
    }

#define STEAM_DEFINE_USER_INTERFACE_ACCESSOR(type, name, version)                                            \
    STEAM_DEFINE_INTERFACE_ACCESSOR(                                                                         \
        type, name, SteamInternal_FindOrCreateUserInterface(SteamAPI_GetHSteamUser(), version), "user",      \
        version)

// Base of every callback and call-result object. The library's dispatcher (CCallbackMgr)
// reads and writes the flags and the callback number directly.
class CCallbackBase {
public:
    CCallbackBase()
    {
        m_nCallbackFlags = 0;
        m_iCallback = 0;
    }
    virtual void Run(void* pvParam) = 0;
    virtual void Run(void* pvParam, bool bIOFailure, SteamAPICall_t hSteamAPICall) = 0;
    int GetICallback() { return m_iCallback; }
    virtual int GetCallbackSizeBytes() = 0;

protected:
    enum {
        k_ECallbackFlagsRegistered = 0x01,
        k_ECallbackFlagsGameServer = 0x02
    };
    uint8 m_nCallbackFlags;
    int m_iCallback;
    friend class CCallbackMgr;

private:
    CCallbackBase(const CCallbackBase&);
    CCallbackBase& operator=(const CCallbackBase&);
};

// Shared part of CCallback: unregisters itself on destruction.
template <int sizeof_P> class CCallbackImpl : protected CCallbackBase {
public:
    virtual ~CCallbackImpl()
    {
        if (m_nCallbackFlags & k_ECallbackFlagsRegistered)
            SteamAPI_UnregisterCallback(this);
    }
    void SetGameserverFlag() { m_nCallbackFlags |= k_ECallbackFlagsGameServer; }

protected:
    friend class CCallbackMgr;
    virtual void Run(void* pvParam) = 0;
    virtual void Run(void* pvParam, bool /*bIOFailure*/, SteamAPICall_t /*hSteamAPICall*/) { Run(pvParam); }
    virtual int GetCallbackSizeBytes() { return sizeof_P; }
};

// Broadcast callback bound to a member function; registered from construction.
template <class T, class P, bool bGameserver = false> class CCallback : public CCallbackImpl<sizeof(P)> {
public:
    typedef void (T::*func_t)(P*);

    CCallback(T* pObj, func_t func) : m_pObj(NULL), m_Func(NULL)
    {
        if (bGameserver)
            this->SetGameserverFlag();
        Register(pObj, func);
    }

    void Register(T* pObj, func_t func)
    {
        if (!pObj || !func)
            return;
        if (this->m_nCallbackFlags & CCallbackBase::k_ECallbackFlagsRegistered)
            Unregister();
        m_pObj = pObj;
        m_Func = func;
        SteamAPI_RegisterCallback(this, P::k_iCallback);
    }

    void Unregister() { SteamAPI_UnregisterCallback(this); }

protected:
    virtual void Run(void* pvParam) { (m_pObj->*m_Func)((P*)pvParam); }

    T* m_pObj;
    func_t m_Func;
};

// Result of one asynchronous call, bound to a member function while the call is pending.
template <class T, class P> class CCallResult : private CCallbackBase {
public:
    typedef void (T::*func_t)(P*, bool);

    CCallResult()
    {
        m_hAPICall = k_uAPICallInvalid;
        m_pObj = NULL;
        m_Func = NULL;
        m_iCallback = P::k_iCallback;
    }

    void Set(SteamAPICall_t hAPICall, T* p, func_t func)
    {
        if (m_hAPICall)
            SteamAPI_UnregisterCallResult(this, m_hAPICall);
        m_hAPICall = hAPICall;
        m_pObj = p;
        m_Func = func;
        if (hAPICall)
            SteamAPI_RegisterCallResult(this, hAPICall);
    }

    bool IsActive() const { return (m_hAPICall != k_uAPICallInvalid); }

    void Cancel()
    {
        if (m_hAPICall != k_uAPICallInvalid) {
            SteamAPI_UnregisterCallResult(this, m_hAPICall);
            m_hAPICall = k_uAPICallInvalid;
        }
    }

    ~CCallResult() { Cancel(); }

    void SetGameserverFlag() { m_nCallbackFlags |= k_ECallbackFlagsGameServer; }

private:
    virtual void Run(void* pvParam)
    {
        m_hAPICall = k_uAPICallInvalid;  // the dispatcher has already dropped the registration
        (m_pObj->*m_Func)((P*)pvParam, false);
    }

    virtual void Run(void* pvParam, bool bIOFailure, SteamAPICall_t hSteamAPICall)
    {
        if (hSteamAPICall == m_hAPICall) {
            m_hAPICall = k_uAPICallInvalid;  // cleared first so the handler may Set a new call
            (m_pObj->*m_Func)((P*)pvParam, bIOFailure);
        }
    }

    virtual int GetCallbackSizeBytes() { return sizeof(P); }

    SteamAPICall_t m_hAPICall;
    T* m_pObj;
    func_t m_Func;
};

#endif  // STEAM_API_INTERNAL_H
