// What the user is subscribed to, and where those items lie on this machine.
//
// RefreshItems asks the platform for the subscribed ids and sends one detail
// query; OnQueryCompleted (inside the pump) rebuilds subscribedItems with a
// record for each item that exists and is installed. The per-frame walk calls
// DownloadStep for each record to follow installs and downloads.
#pragma once

#include <atomic>
#include <cstdint>

#include <steam/steam_api.h>

#include "foundation/InlineString.h"

struct UGCItem;

class CWorkshopSubscriptions {
public:
    explicit CWorkshopSubscriptions(uint32_t appIdOfProduct) : appId(appIdOfProduct) {}
    ~CWorkshopSubscriptions();
    CWorkshopSubscriptions(const CWorkshopSubscriptions&) = delete;
    CWorkshopSubscriptions& operator=(const CWorkshopSubscriptions&) = delete;

    void RefreshItems();
    bool IsItemListReady() const { return listReady.load(std::memory_order_acquire) != 0; }
    int32_t GetItemCount();
    UGCItem* GetItem(int32_t index);
    void SubscribeItem(const char* id);
    void UnsubscribeItem(const char* id);

    void OnQueryCompleted(SteamUGCQueryCompleted_t* result, bool ioFailure);
    // The engine path of the item's install folder; empty (no text) when there is none.
    // Also tells the engine the folder that holds the item's folder. Called with listMutex held.
    InlineString GetInstallPath(PublishedFileId_t publishedFileId);
    // Follows the install and download state of one record; from the walk, listMutex held.
    void DownloadStep(UGCItem* item, PublishedFileId_t publishedFileId);

    // Copies `source` into `buffer` of `size` bytes and there replaces every `search`
    // by `replacement`, left to right, going on behind each inserted text. Null for a
    // null source or buffer or a size below 1; the buffer untouched when the source
    // does not fit; stops early when one more replacement would not fit. An empty
    // search replaces nothing.
    static char* ReplaceAllText(const char* source, const char* search, const char* replacement, char* buffer,
                                int32_t size);

    PublishedFileId_t* fileIds = nullptr;
    uint32_t fileIdCount = 0;
    UGCQueryHandle_t queryHandle = 0;
    uint32_t appId = 0;                 // kept for symmetry with the publishing side; nothing reads it
    std::atomic<uint8_t> listReady{0};  // read by other engine threads without the mutex
    CCallResult<CWorkshopSubscriptions, SteamUGCQueryCompleted_t> queryCallResult;

private:
    // The first record of subscribedItems whose id text is `id`, or null; takes listMutex.
    UGCItem* FindListed(const char* id);
};
