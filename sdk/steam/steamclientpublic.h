// Result codes, account identity (CSteamID) and the structure-packing rule for callback data.
#ifndef STEAMCLIENTPUBLIC_H
#define STEAMCLIENTPUBLIC_H

#include "steamtypes.h"

// Callback records use 4-byte packing on Linux/macOS and 8 elsewhere, so 32- and 64-bit
// builds of one platform share a layout.
#if defined(__linux__) || defined(__APPLE__)
#define VALVE_CALLBACK_PACK_SMALL
#else
#define VALVE_CALLBACK_PACK_LARGE
#endif

enum EResult {
    k_EResultNone = 0,
    k_EResultOK = 1,
    k_EResultFail = 2,
    k_EResultNoConnection = 3,
    k_EResultInvalidPassword = 5,
    k_EResultLoggedInElsewhere = 6,
    k_EResultInvalidProtocolVer = 7,
    k_EResultInvalidParam = 8,
    k_EResultFileNotFound = 9,
    k_EResultBusy = 10,
    k_EResultInvalidState = 11,
    k_EResultInvalidName = 12,
    k_EResultInvalidEmail = 13,
    k_EResultDuplicateName = 14,
    k_EResultAccessDenied = 15,
    k_EResultTimeout = 16,
    k_EResultBanned = 17,
    k_EResultAccountNotFound = 18,
    k_EResultInvalidSteamID = 19,
    k_EResultServiceUnavailable = 20,
    k_EResultNotLoggedOn = 21,
    k_EResultPending = 22,
    k_EResultLimitExceeded = 25,
    k_EResultRevoked = 26,
    k_EResultExpired = 27,
    k_EResultInsufficientPrivilege = 35,
};

enum EUniverse {
    k_EUniverseInvalid = 0,
    k_EUniversePublic = 1,
    k_EUniverseBeta = 2,
    k_EUniverseInternal = 3,
    k_EUniverseDev = 4,
    k_EUniverseMax
};

enum EAccountType {
    k_EAccountTypeInvalid = 0,
    k_EAccountTypeIndividual = 1,
    k_EAccountTypeMultiseat = 2,
    k_EAccountTypeGameServer = 3,
    k_EAccountTypeAnonGameServer = 4,
    k_EAccountTypePending = 5,
    k_EAccountTypeContentServer = 6,
    k_EAccountTypeClan = 7,
    k_EAccountTypeChat = 8,
    k_EAccountTypeConsoleUser = 9,
    k_EAccountTypeAnonUser = 10,
    k_EAccountTypeMax
};

enum ENotificationPosition {
    k_EPositionInvalid = -1,
    k_EPositionTopLeft = 0,
    k_EPositionTopRight = 1,
    k_EPositionBottomLeft = 2,
    k_EPositionBottomRight = 3,
};

const unsigned int k_unSteamAccountIDMask = 0xFFFFFFFF;
const unsigned int k_unSteamAccountInstanceMask = 0x000FFFFF;
const unsigned int k_unSteamUserDefaultInstance = 1;

// Identity types are byte-aligned so they sit unpadded inside callback records.
#pragma pack(push, 1)

class CSteamID {
public:
    CSteamID() { m_steamid.m_unAll64Bits = 0; }

    CSteamID(uint32 unAccountID, EUniverse eUniverse, EAccountType eAccountType)
    {
        Set(unAccountID, eUniverse, eAccountType);
    }

    CSteamID(uint32 unAccountID, unsigned int unAccountInstance, EUniverse eUniverse,
             EAccountType eAccountType)
    {
        InstancedSet(unAccountID, unAccountInstance, eUniverse, eAccountType);
    }

    CSteamID(uint64 ulSteamID) { SetFromUint64(ulSteamID); }

    void Set(uint32 unAccountID, EUniverse eUniverse, EAccountType eAccountType)
    {
        unsigned int instance = (eAccountType == k_EAccountTypeIndividual) ? k_unSteamUserDefaultInstance : 0;
        InstancedSet(unAccountID, instance, eUniverse, eAccountType);
    }

    void InstancedSet(uint32 unAccountID, unsigned int unInstance, EUniverse eUniverse,
                      EAccountType eAccountType)
    {
        m_steamid.m_unAll64Bits = (uint64)unAccountID |
                                  ((uint64)(unInstance & k_unSteamAccountInstanceMask) << 32) |
                                  ((uint64)(eAccountType & 0xF) << 52) | ((uint64)(eUniverse & 0xFF) << 56);
    }

    void SetFromUint64(uint64 ulSteamID) { m_steamid.m_unAll64Bits = ulSteamID; }
    void Clear() { m_steamid.m_unAll64Bits = 0; }

    uint64 ConvertToUint64() const { return m_steamid.m_unAll64Bits; }
    AccountID_t GetAccountID() const
    {
        return (AccountID_t)(m_steamid.m_unAll64Bits & k_unSteamAccountIDMask);
    }
    unsigned int GetUnAccountInstance() const
    {
        return (unsigned int)((m_steamid.m_unAll64Bits >> 32) & k_unSteamAccountInstanceMask);
    }
    EAccountType GetEAccountType() const { return (EAccountType)((m_steamid.m_unAll64Bits >> 52) & 0xF); }
    EUniverse GetEUniverse() const { return (EUniverse)((m_steamid.m_unAll64Bits >> 56) & 0xFF); }

    bool BIndividualAccount() const
    {
        return GetEAccountType() == k_EAccountTypeIndividual ||
               GetEAccountType() == k_EAccountTypeConsoleUser;
    }

    bool IsValid() const
    {
        EAccountType type = GetEAccountType();
        EUniverse universe = GetEUniverse();
        if (type <= k_EAccountTypeInvalid || type >= k_EAccountTypeMax)
            return false;
        if (universe <= k_EUniverseInvalid || universe >= k_EUniverseMax)
            return false;
        if (type == k_EAccountTypeIndividual && (GetAccountID() == 0 || GetUnAccountInstance() > 4))
            return false;
        return true;
    }

    bool operator==(const CSteamID& val) const { return ConvertToUint64() == val.ConvertToUint64(); }
    bool operator!=(const CSteamID& val) const { return !operator==(val); }
    bool operator<(const CSteamID& val) const { return ConvertToUint64() < val.ConvertToUint64(); }
    bool operator>(const CSteamID& val) const { return ConvertToUint64() > val.ConvertToUint64(); }

private:
    // Blocked so a 32-bit account number is never mistaken for a full id.
    CSteamID(uint32);
    CSteamID(int32);

    union SteamID_t {
        uint64 m_unAll64Bits;
    } m_steamid;
};

#pragma pack(pop)

const CSteamID k_steamIDNil;

#endif  // STEAMCLIENTPUBLIC_H
