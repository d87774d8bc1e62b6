#include "services/workshop/CWorkshopSubscriptions.h"

#include <algorithm>
#include <cstring>

#include "foundation/DecimalText.h"
#include "foundation/TextFormat.h"
#include "host/HostReport.h"
#include "services/workshop/UGCImplementationSteam.h"
#include "services/workshop/UGCItem.h"

namespace {

// The room the platform is given for an install folder.
constexpr uint32_t kFolderRoom = 512;

// The first record whose id text is `id`, byte for byte; records without an id never match.
UGCItem* FindById(const PtrArray<UGCItem>& list, const char* id)
{
    if (id == nullptr)
        return nullptr;
    for (UGCItem* item : list) {
        if (item->id != nullptr && std::strcmp(item->id, id) == 0)
            return item;
    }
    return nullptr;
}

}  // namespace

CWorkshopSubscriptions::~CWorkshopSubscriptions()
{
    delete[] fileIds;
}

void CWorkshopSubscriptions::RefreshItems()
{
    listReady.store(0, std::memory_order_release);
    ISteamUGC* ugc = SteamUGC();
    if (ugc == nullptr)
        return;
    const uint32_t subscribed = ugc->GetNumSubscribedItems();
    if (subscribed == 0) {
        listReady.store(1, std::memory_order_release);
        ugcService->ClearItemLists();
        return;
    }
    delete[] fileIds;
    // Room for twice as many as counted: the list may grow between the two calls.
    const uint32_t room = 2 * subscribed + 1;
    fileIds = new PublishedFileId_t[room];
    fileIdCount = ugc->GetSubscribedItems(fileIds, room);
    queryHandle = ugc->CreateQueryUGCDetailsRequest(fileIds, fileIdCount);
    const SteamAPICall_t call = ugc->SendQueryUGCRequest(queryHandle);
    queryCallResult.Set(call, this, &CWorkshopSubscriptions::OnQueryCompleted);
}

int32_t CWorkshopSubscriptions::GetItemCount()
{
    if (!IsItemListReady())
        return 0;
    ugcService->LockLists();
    const int32_t count = ugcService->subscribedItems.count;
    ugcService->UnlockLists();
    return count;
}

UGCItem* CWorkshopSubscriptions::GetItem(int32_t index)
{
    if (!IsItemListReady())
        return nullptr;
    ugcService->LockLists();
    const PtrArray<UGCItem>& list = ugcService->subscribedItems;
    UGCItem* item = index >= 0 && index < list.count ? list[index] : nullptr;
    ugcService->UnlockLists();
    return item;
}

UGCItem* CWorkshopSubscriptions::FindListed(const char* id)
{
    ugcService->LockLists();
    UGCItem* match = FindById(ugcService->subscribedItems, id);
    ugcService->UnlockLists();
    return match;
}

void CWorkshopSubscriptions::SubscribeItem(const char* id)
{
    UGCItem* item = FindListed(id);
    ISteamUGC* ugc = SteamUGC();
    if (item != nullptr && ugc != nullptr)
        ugc->SubscribeItem(DecimalToUInt64(item->id));  // the answer is not awaited
}

void CWorkshopSubscriptions::UnsubscribeItem(const char* id)
{
    UGCItem* item = FindListed(id);
    ISteamUGC* ugc = SteamUGC();
    if (item == nullptr || ugc == nullptr)
        return;
    ugc->UnsubscribeItem(DecimalToUInt64(item->id));
    // Parked, not freed: the engine may still hold the pointer until the next rebuild.
    ugcService->LockLists();
    PtrArray<UGCItem>& list = ugcService->subscribedItems;
    if (list.Remove(item))
        list.Shrink();
    ugcService->removedItems.Add(item);
    ugcService->UnlockLists();
}

void CWorkshopSubscriptions::OnQueryCompleted(SteamUGCQueryCompleted_t* result, bool ioFailure)
{
    ISteamUGC* ugc = SteamUGC();
    if (ugc == nullptr)
        return;
    if (ioFailure) {
        // The answer is lost, but the query is still ours to free.
        ugc->ReleaseQueryUGCRequest(queryHandle);
        return;
    }
    if (result->m_eResult != k_EResultOK) {
        ugc->ReleaseQueryUGCRequest(result->m_handle);
        return;
    }
    ugcService->ClearItemLists();  // takes the mutex itself, so before ours
    ugcService->LockLists();
    PtrArray<UGCItem>& list = ugcService->subscribedItems;
    for (uint32_t i = 0; i < result->m_unNumResultsReturned; ++i) {
        SteamUGCDetails_t details;
        if (!ugc->GetQueryUGCResult(result->m_handle, i, &details))
            continue;
        HostLogInfo("Item #%d: '%s'", static_cast<int>(i), details.m_rgchTitle);
        if (details.m_eResult == k_EResultFileNotFound)
            ugc->UnsubscribeItem(details.m_nPublishedFileId);  // gone from the platform: end the subscription
        if (details.m_eResult != k_EResultOK)
            continue;

        char folder[kFolderRoom] = {};
        uint64 sizeOnDisk = 0;
        uint32 timeStamp = 0;
        if (!ugc->GetItemInstallInfo(details.m_nPublishedFileId, &sizeOnDisk, folder, kFolderRoom,
                                     &timeStamp)) {
            HostLogInfo("Getting install path failed. Is Steam Cloud enabled for the user?");
            continue;
        }
        if (folder[0] == '\0')
            continue;

        InlineString id = FormatString("%llu", static_cast<unsigned long long>(details.m_nPublishedFileId));
        UGCItem* item = FindById(list, id.Text());
        if (item == nullptr) {
            item = NewUGCItem();
            ReplaceItemText(item->id, id.Text());
            list.Add(item);
        }
        ReplaceItemText(item->title, details.m_rgchTitle);
        ReplaceItemText(item->description, details.m_rgchDescription);
        InlineString path = GetInstallPath(details.m_nPublishedFileId);
        ReplaceItemText(item->installPath, path.Length() > 1 ? path.Text() : nullptr);
    }
    listReady.store(1, std::memory_order_release);
    ugcService->UnlockLists();
    ugc->ReleaseQueryUGCRequest(result->m_handle);
}

InlineString CWorkshopSubscriptions::GetInstallPath(PublishedFileId_t publishedFileId)
{
    InlineString result;
    char folder[kFolderRoom] = {};
    uint64 sizeOnDisk = 0;
    uint32 timeStamp = 0;
    ISteamUGC* ugc = SteamUGC();
    const bool installed = ugc != nullptr && ugc->GetItemInstallInfo(publishedFileId, &sizeOnDisk, folder,
                                                                     kFolderRoom, &timeStamp);
    if (installed && folder[0] == '\0')
        return result;

    // The folder that holds the item's own folder, with "/" as separator.
    InlineString base;
    base.Assign(folder);
    if (base.text != nullptr) {
        ReplaceAllText(base.text, "\\", "/", base.text, base.length + 1);
        char* last = std::strrchr(base.text, '/');
        if (last != nullptr) {
            *last = '\0';
            base.length = static_cast<int32_t>(last - base.text);
        }
        if (base.length > 1)
            HostCommandIfPresent("SetUGCBasePath", base.text);
    }

    ReplaceAllText(folder, "\\", "/", folder, kFolderRoom);
    if (folder[0] == '\0')
        return result;
    result.Assign(HostCommandIfPresent("ConvertNativeOSPathToStaticPath", folder));
    HostLogInfo("Install path: '%s'", result.Text() != nullptr ? result.Text() : "");
    return result;
}

void CWorkshopSubscriptions::DownloadStep(UGCItem* item, PublishedFileId_t publishedFileId)
{
    ISteamUGC* ugc = SteamUGC();
    const uint32 state = ugc->GetItemState(publishedFileId);
    if ((state & k_EItemStateInstalled) != 0) {
        item->progress = kProgressDone;
        if (item->installPath == nullptr) {
            InlineString path = GetInstallPath(publishedFileId);
            if (path.Length() > 1) {
                ReplaceItemText(item->installPath, path.Text());
                HostLogInfo("Install path now: '%s'", path.Text());
            }
        }
        return;
    }
    if ((state & (k_EItemStateNeedsUpdate | k_EItemStateDownloading)) == 0)
        return;  // subscribed only, or waiting for its turn: nothing moves yet
    item->progress = kProgressTransferStart;
    uint64 done = 0;
    uint64 total = 100;
    if (!ugc->GetItemDownloadInfo(publishedFileId, &done, &total))
        return;
    HostLogInfo("Downloading %d/%d", static_cast<int>(static_cast<uint32_t>(done)),
                static_cast<int>(static_cast<uint32_t>(total)));
    if (total == 0)
        return;
    item->progress = done >= total ? kProgressDone : UGCImplementationSteam::ScaleProgress(done, total);
}

char* CWorkshopSubscriptions::ReplaceAllText(const char* source, const char* search, const char* replacement,
                                             char* buffer, int32_t size)
{
    if (source == nullptr || buffer == nullptr || size < 1)
        return nullptr;
    size_t length = std::strlen(source);
    if (length + 1 > static_cast<size_t>(size))
        return buffer;
    std::memmove(buffer, source, length + 1);  // the source may be the buffer itself
    if (search == nullptr || replacement == nullptr || search[0] == '\0')
        return buffer;

    const size_t searchLength = std::strlen(search);
    const size_t replacementLength = std::strlen(replacement);
    char* from = buffer;
    while (char* found = std::strstr(from, search)) {
        if (replacementLength > searchLength &&
            length + (replacementLength - searchLength) + 1 > static_cast<size_t>(size))
            break;
        const size_t tail = length - static_cast<size_t>(found - buffer) - searchLength;
        std::memmove(found + replacementLength, found + searchLength, tail + 1);
        std::copy_n(replacement, replacementLength, found);  // into the middle: no terminator of its own
        length = length - searchLength + replacementLength;
        from = found + replacementLength;
    }
    return buffer;
}
