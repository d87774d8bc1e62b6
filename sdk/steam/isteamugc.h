// Workshop items: subscriptions, install state, detail queries and publishing.
#ifndef ISTEAMUGC_H
#define ISTEAMUGC_H

#include "isteamremotestorage.h"
#include "steam_api_common.h"

// The whole workshop header uses the callback packing, detail records included.
#if defined(VALVE_CALLBACK_PACK_SMALL)
#pragma pack(push, 4)
#else
#pragma pack(push, 8)
#endif

typedef uint64 UGCQueryHandle_t;
typedef uint64 UGCUpdateHandle_t;

const UGCQueryHandle_t k_UGCQueryHandleInvalid = 0xffffffffffffffffull;
const UGCUpdateHandle_t k_UGCUpdateHandleInvalid = 0xffffffffffffffffull;

const uint32 kNumUGCResultsPerPage = 50;
const uint32 k_cchDeveloperMetadataMax = 5000;

enum EItemState {
    k_EItemStateNone = 0,
    k_EItemStateSubscribed = 1,
    k_EItemStateLegacyItem = 2,
    k_EItemStateInstalled = 4,
    k_EItemStateNeedsUpdate = 8,
    k_EItemStateDownloading = 16,
    k_EItemStateDownloadPending = 32,
};

enum EItemUpdateStatus {
    k_EItemUpdateStatusInvalid = 0,
    k_EItemUpdateStatusPreparingConfig = 1,
    k_EItemUpdateStatusPreparingContent = 2,
    k_EItemUpdateStatusUploadingContent = 3,
    k_EItemUpdateStatusUploadingPreviewFile = 4,
    k_EItemUpdateStatusCommittingChanges = 5
};

struct SteamUGCDetails_t {
    PublishedFileId_t m_nPublishedFileId;
    EResult m_eResult;
    EWorkshopFileType m_eFileType;
    AppId_t m_nCreatorAppID;
    AppId_t m_nConsumerAppID;
    char m_rgchTitle[k_cchPublishedDocumentTitleMax];
    char m_rgchDescription[k_cchPublishedDocumentDescriptionMax];
    uint64 m_ulSteamIDOwner;
    uint32 m_rtimeCreated;
    uint32 m_rtimeUpdated;
    uint32 m_rtimeAddedToUserList;
    ERemoteStoragePublishedFileVisibility m_eVisibility;
    bool m_bBanned;
    bool m_bAcceptedForUse;
    bool m_bTagsTruncated;
    char m_rgchTags[k_cchTagListMax];  // comma-separated
    UGCHandle_t m_hFile;
    UGCHandle_t m_hPreviewFile;
    char m_pchFileName[k_cchFilenameMax];
    int32 m_nFileSize;
    int32 m_nPreviewFileSize;
    char m_rgchURL[k_cchPublishedFileURLMax];
    uint32 m_unVotesUp;
    uint32 m_unVotesDown;
    float m_flScore;
    uint32 m_unNumChildren;
};

class ISteamUGC {
public:
    virtual UGCQueryHandle_t CreateQueryUGCDetailsRequest(PublishedFileId_t* pvecPublishedFileID,
                                                          uint32 unNumPublishedFileIDs) = 0;
    virtual SteamAPICall_t SendQueryUGCRequest(UGCQueryHandle_t handle) = 0;
    virtual bool GetQueryUGCResult(UGCQueryHandle_t handle, uint32 index, SteamUGCDetails_t* pDetails) = 0;
    virtual bool ReleaseQueryUGCRequest(UGCQueryHandle_t handle) = 0;

    virtual SteamAPICall_t CreateItem(AppId_t nConsumerAppId, EWorkshopFileType eFileType) = 0;
    virtual UGCUpdateHandle_t StartItemUpdate(AppId_t nConsumerAppId, PublishedFileId_t nPublishedFileID) = 0;
    virtual bool SetItemTitle(UGCUpdateHandle_t handle, const char* pchTitle) = 0;
    virtual bool SetItemDescription(UGCUpdateHandle_t handle, const char* pchDescription) = 0;
    virtual bool SetItemVisibility(UGCUpdateHandle_t handle,
                                   ERemoteStoragePublishedFileVisibility eVisibility) = 0;
    virtual bool SetItemTags(UGCUpdateHandle_t updateHandle, const SteamParamStringArray_t* pTags) = 0;
    virtual bool SetItemContent(UGCUpdateHandle_t handle, const char* pszContentFolder) = 0;
    virtual bool SetItemPreview(UGCUpdateHandle_t handle, const char* pszPreviewFile) = 0;
    virtual SteamAPICall_t SubmitItemUpdate(UGCUpdateHandle_t handle, const char* pchChangeNote) = 0;
    virtual EItemUpdateStatus GetItemUpdateProgress(UGCUpdateHandle_t handle, uint64* punBytesProcessed,
                                                    uint64* punBytesTotal) = 0;

    virtual SteamAPICall_t SubscribeItem(PublishedFileId_t nPublishedFileID) = 0;
    virtual SteamAPICall_t UnsubscribeItem(PublishedFileId_t nPublishedFileID) = 0;
    virtual uint32 GetNumSubscribedItems() = 0;
    virtual uint32 GetSubscribedItems(PublishedFileId_t* pvecPublishedFileID, uint32 cMaxEntries) = 0;
    virtual uint32 GetItemState(PublishedFileId_t nPublishedFileID) = 0;
    virtual bool GetItemInstallInfo(PublishedFileId_t nPublishedFileID, uint64* punSizeOnDisk,
                                    char* pchFolder, uint32 cchFolderSize, uint32* punTimeStamp) = 0;
    virtual bool GetItemDownloadInfo(PublishedFileId_t nPublishedFileID, uint64* punBytesDownloaded,
                                     uint64* punBytesTotal) = 0;
};

#define STEAMUGC_INTERFACE_VERSION "STEAMUGC_INTERFACE_VERSION015"

STEAM_DEFINE_USER_INTERFACE_ACCESSOR(ISteamUGC*, SteamUGC, STEAMUGC_INTERFACE_VERSION)

struct SteamUGCQueryCompleted_t {
    enum {
        k_iCallback = k_iClientUGCCallbacks + 1
    };
    UGCQueryHandle_t m_handle;
    EResult m_eResult;
    uint32 m_unNumResultsReturned;
    uint32 m_unTotalMatchingResults;
    bool m_bCachedData;
    char m_rgchNextCursor[k_cchPublishedFileURLMax];
};

struct CreateItemResult_t {
    enum {
        k_iCallback = k_iClientUGCCallbacks + 3
    };
    EResult m_eResult;
    PublishedFileId_t m_nPublishedFileId;
    bool m_bUserNeedsToAcceptWorkshopLegalAgreement;
};

struct SubmitItemUpdateResult_t {
    enum {
        k_iCallback = k_iClientUGCCallbacks + 4
    };
    EResult m_eResult;
    bool m_bUserNeedsToAcceptWorkshopLegalAgreement;
    PublishedFileId_t m_nPublishedFileId;
};

#pragma pack(pop)

#endif  // ISTEAMUGC_H
