#include "services/workshop/CWorkshopItemCreate.h"

#include "foundation/DecimalText.h"
#include "foundation/InlineString.h"
#include "foundation/ListToken.h"
#include "foundation/TextFormat.h"
#include "foundation/TextHeap.h"
#include "host/HostEvent.h"
#include "host/HostReport.h"
#include "services/workshop/UGCImplementationSteam.h"
#include "services/workshop/UGCItem.h"

namespace {

constexpr int32_t kTagRoom = 2048;

ERemoteStoragePublishedFileVisibility PlatformVisibility(int32_t visibility)
{
    switch (visibility) {
    case 0:
        return k_ERemoteStoragePublishedFileVisibilityPublic;
    case 1:
        return k_ERemoteStoragePublishedFileVisibilityFriendsOnly;
    default:
        return k_ERemoteStoragePublishedFileVisibilityPrivate;
    }
}

// Hands the item's tags to the platform, an empty list for none; a refusal is logged and not fatal.
void SetTags(ISteamUGC* ugc, UGCUpdateHandle_t handle, const char* tags)
{
    SteamParamStringArray_t list{nullptr, 0};
    if (tags != nullptr && tags[0] != '\0') {
        const int32_t count = CountListTokens(tags, ',');
        auto** strings = new const char*[count];
        char token[kTagRoom];
        for (int32_t i = 0; i < count; ++i)
            strings[i] = DuplicateText(GetListToken(token, kTagRoom, tags, ",", i));  // too long: empty
        list.m_ppStrings = strings;
        list.m_nNumStrings = count;
    }
    if (!ugc->SetItemTags(handle, &list))
        HostLog(kHostLogWarning, "Error setting UGC tags '%s'.", tags != nullptr ? tags : "");
    for (int32_t i = 0; i < list.m_nNumStrings; ++i)
        FreeText(const_cast<char*>(list.m_ppStrings[i]));
    delete[] list.m_ppStrings;
}

}  // namespace

void PostPublishedEvent(int32_t status)
{
    if (hostServices == nullptr)
        return;
    HostEvent record;
    hostServices->InitEvent(&record, kEventWorkshopPublished);
    reinterpret_cast<WorkshopPublishedEvent*>(&record)->status = status;
    hostServices->PostEvent(&record);
}

void CWorkshopItemCreate::CreateItem(UGCItem* item)
{
    ISteamUGC* ugc = SteamUGC();
    if (ugc == nullptr)
        return;
    const SteamAPICall_t call = ugc->CreateItem(appId, k_EWorkshopFileTypeCommunity);
    currentItem = item;
    HostLogInfo("Creating Steam UGC item '%s'...", item->title);
    item->progress = kProgressCreating;
    createCallResult.Set(call, this, &CWorkshopItemCreate::OnCreateItem);
}

void CWorkshopItemCreate::OnCreateItem(CreateItemResult_t* result, bool ioFailure)
{
    if (ioFailure) {
        HostLogInfo("OnCreateItem IO failure.");
        PostPublishedEvent(1);
        return;
    }
    if (currentItem == nullptr)
        return;  // the record went with the lists; nothing is waiting for this answer
    publishedFileId = result->m_nPublishedFileId;
    // The id is taken whatever the result: a failed creation shows what the platform gave back.
    InlineString id = FormatString("%llu", static_cast<unsigned long long>(publishedFileId));
    ReplaceItemText(currentItem->id, id.Text());
    HostLogInfo("OnCreateItem result %d.", static_cast<int>(result->m_eResult));
    currentItem->progress = kProgressCreated;
    if (result->m_eResult == k_EResultTimeout)
        CreateItem(currentItem);  // runs on behind the failure event below
    if (result->m_eResult == k_EResultOK)
        UpdateItem(currentItem, "First version.");
    else
        PostPublishedEvent(1);
}

void CWorkshopItemCreate::UpdateItem(UGCItem* item, const char* changeNote)
{
    ISteamUGC* ugc = SteamUGC();
    if (ugc == nullptr)
        return;
    HostLogInfo("Updating Steam UGC item '%s'..", item->title);
    currentItem = item;
    publishedFileId = DecimalToUInt64(item->id);
    updateHandle = ugc->StartItemUpdate(appId, publishedFileId);
    ugc->SetItemTitle(updateHandle, item->title);
    ugc->SetItemDescription(updateHandle, item->description);
    ugc->SetItemVisibility(updateHandle, PlatformVisibility(item->visibility));
    SetTags(ugc, updateHandle, item->tags);

    InlineString content;
    content.Assign(HostCommandIfPresent("GetNativeOSPath", item->contentPath));
    ugc->SetItemContent(updateHandle, content.Text());
    // The preview always lies beside the content, under one name.
    InlineString preview;
    preview.Assign(content.Text() != nullptr ? content.Text() : "");
    preview.Append("/preview.jpg");
    ugc->SetItemPreview(updateHandle, preview.Text());

    item->progress = kProgressSubmitted;
    const SteamAPICall_t call = ugc->SubmitItemUpdate(updateHandle, changeNote);
    submitCallResult.Set(call, this, &CWorkshopItemCreate::OnSubmitItemUpdate);
}

void CWorkshopItemCreate::OnSubmitItemUpdate(SubmitItemUpdateResult_t* result, bool ioFailure)
{
    if (ioFailure || result->m_eResult != k_EResultOK) {
        PostPublishedEvent(1);
        return;
    }
    if (currentItem == nullptr)
        return;  // the record went with the lists; nothing is waiting for this answer
    ISteamUGC* ugc = SteamUGC();
    if (currentItem->subscribeAfterPublish != 0 && ugc != nullptr)
        ugc->SubscribeItem(publishedFileId);
    currentItem->progress = kProgressDone;
    currentItem = nullptr;
    PostPublishedEvent(0);
}

void CWorkshopItemCreate::UploadStep(UGCItem* item)
{
    if (item != currentItem)
        return;
    uint64 done = 0;
    uint64 total = 100;
    if (SteamUGC()->GetItemUpdateProgress(updateHandle, &done, &total) == k_EItemUpdateStatusInvalid)
        return;
    HostLogInfo("Uploading %llu/%llu", static_cast<unsigned long long>(done),
                static_cast<unsigned long long>(total));
    item->progress = kProgressTransferStart;
    if (total != 0)
        item->progress = UGCImplementationSteam::ScaleProgress(done, total);
    if (done >= total)
        item->progress = kProgressDone;  // a total of 0 counts as complete here
}
