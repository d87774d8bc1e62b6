// Other users' names and the overlay entry points.
#ifndef ISTEAMFRIENDS_H
#define ISTEAMFRIENDS_H

#include "steam_api_common.h"

const int k_cchPersonaNameMax = 128;
const int k_cwchPersonaNameMax = 32;

enum EOverlayToStoreFlag {
    k_EOverlayToStoreFlag_None = 0,
    k_EOverlayToStoreFlag_AddToCart = 1,
    k_EOverlayToStoreFlag_AddToCartAndShow = 2,
};

enum EActivateGameOverlayToWebPageMode {
    k_EActivateGameOverlayToWebPageMode_Default = 0,
    k_EActivateGameOverlayToWebPageMode_Modal = 1,
};

enum EPersonaChange {
    k_EPersonaChangeName = 0x0001,
    k_EPersonaChangeStatus = 0x0002,
    k_EPersonaChangeComeOnline = 0x0004,
    k_EPersonaChangeGoneOffline = 0x0008,
    k_EPersonaChangeGamePlayed = 0x0010,
    k_EPersonaChangeGameServer = 0x0020,
    k_EPersonaChangeAvatar = 0x0040,
    k_EPersonaChangeJoinedSource = 0x0080,
    k_EPersonaChangeLeftSource = 0x0100,
    k_EPersonaChangeRelationshipChanged = 0x0200,
    k_EPersonaChangeNameFirstSet = 0x0400,
    k_EPersonaChangeBroadcast = 0x0800,
    k_EPersonaChangeNickname = 0x1000,
    k_EPersonaChangeSteamLevel = 0x2000,
    k_EPersonaChangeRichPresence = 0x4000,
};

class ISteamFriends {
public:
    virtual const char* GetFriendPersonaName(CSteamID steamIDFriend) = 0;
    virtual void ActivateGameOverlayToWebPage(
        const char* pchURL,
        EActivateGameOverlayToWebPageMode eMode = k_EActivateGameOverlayToWebPageMode_Default) = 0;
    virtual void ActivateGameOverlayToStore(AppId_t nAppID, EOverlayToStoreFlag eFlag) = 0;
    virtual bool RequestUserInformation(CSteamID steamIDUser, bool bRequireNameOnly) = 0;
};

#define STEAMFRIENDS_INTERFACE_VERSION "SteamFriends017"

STEAM_DEFINE_USER_INTERFACE_ACCESSOR(ISteamFriends*, SteamFriends, STEAMFRIENDS_INTERFACE_VERSION)

#if defined(VALVE_CALLBACK_PACK_SMALL)
#pragma pack(push, 4)
#else
#pragma pack(push, 8)
#endif

struct PersonaStateChange_t {
    enum {
        k_iCallback = k_iSteamFriendsCallbacks + 4
    };
    uint64 m_ulSteamID;
    int m_nChangeFlags;
};

struct GameOverlayActivated_t {
    enum {
        k_iCallback = k_iSteamFriendsCallbacks + 31
    };
    uint8 m_bActive;
};

#pragma pack(pop)

#endif  // ISTEAMFRIENDS_H
