// Per-user cloud files, plus types shared with the workshop interface.
#ifndef ISTEAMREMOTESTORAGE_H
#define ISTEAMREMOTESTORAGE_H

#include "steam_api_common.h"

typedef uint64 UGCHandle_t;
typedef uint64 PublishedFileId_t;
const PublishedFileId_t k_PublishedFileIdInvalid = 0;
const UGCHandle_t k_UGCHandleInvalid = 0xffffffffffffffffull;

const uint32 k_unMaxCloudFileChunkSize = 100 * 1024 * 1024;

const uint32 k_cchPublishedDocumentTitleMax = 128 + 1;
const uint32 k_cchPublishedDocumentDescriptionMax = 8000;
const uint32 k_cchPublishedDocumentChangeDescriptionMax = 8000;
const uint32 k_cchTagListMax = 1024 + 1;
const uint32 k_cchFilenameMax = 260;
const uint32 k_cchPublishedFileURLMax = 256;

enum ERemoteStoragePublishedFileVisibility {
    k_ERemoteStoragePublishedFileVisibilityPublic = 0,
    k_ERemoteStoragePublishedFileVisibilityFriendsOnly = 1,
    k_ERemoteStoragePublishedFileVisibilityPrivate = 2,
    k_ERemoteStoragePublishedFileVisibilityUnlisted = 3,
};

enum EWorkshopFileType {
    k_EWorkshopFileTypeFirst = 0,
    k_EWorkshopFileTypeCommunity = 0,
    k_EWorkshopFileTypeMicrotransaction = 1,
    k_EWorkshopFileTypeCollection = 2,
    k_EWorkshopFileTypeArt = 3,
    k_EWorkshopFileTypeVideo = 4,
    k_EWorkshopFileTypeScreenshot = 5,
    k_EWorkshopFileTypeGame = 6,
    k_EWorkshopFileTypeSoftware = 7,
    k_EWorkshopFileTypeConcept = 8,
    k_EWorkshopFileTypeWebGuide = 9,
    k_EWorkshopFileTypeIntegratedGuide = 10,
    k_EWorkshopFileTypeMerch = 11,
    k_EWorkshopFileTypeControllerBinding = 12,
    k_EWorkshopFileTypeSteamworksAccessInvite = 13,
    k_EWorkshopFileTypeSteamVideo = 14,
    k_EWorkshopFileTypeGameManagedItem = 15,
    k_EWorkshopFileTypeMax = 16
};

#if defined(VALVE_CALLBACK_PACK_SMALL)
#pragma pack(push, 4)
#else
#pragma pack(push, 8)
#endif

struct SteamParamStringArray_t {
    const char** m_ppStrings;
    int32 m_nNumStrings;
};

struct RemoteStorageSubscribePublishedFileResult_t {
    enum {
        k_iCallback = k_iClientRemoteStorageCallbacks + 13
    };
    EResult m_eResult;
    PublishedFileId_t m_nPublishedFileId;
};

struct RemoteStorageUnsubscribePublishedFileResult_t {
    enum {
        k_iCallback = k_iClientRemoteStorageCallbacks + 15
    };
    EResult m_eResult;
    PublishedFileId_t m_nPublishedFileId;
};

#pragma pack(pop)

class ISteamRemoteStorage {
public:
    virtual bool FileWrite(const char* pchFile, const void* pvData, int32 cubData) = 0;
    virtual int32 FileRead(const char* pchFile, void* pvData, int32 cubDataToRead) = 0;
    virtual bool FileDelete(const char* pchFile) = 0;
    virtual bool FileExists(const char* pchFile) = 0;
    virtual int32 GetFileSize(const char* pchFile) = 0;
    virtual void SetCloudEnabledForApp(bool bEnabled) = 0;
};

#define STEAMREMOTESTORAGE_INTERFACE_VERSION "STEAMREMOTESTORAGE_INTERFACE_VERSION016"

STEAM_DEFINE_USER_INTERFACE_ACCESSOR(ISteamRemoteStorage*, SteamRemoteStorage,
                                     STEAMREMOTESTORAGE_INTERFACE_VERSION)

#endif  // ISTEAMREMOTESTORAGE_H
