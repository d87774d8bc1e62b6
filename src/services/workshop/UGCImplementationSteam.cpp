#include "services/workshop/UGCImplementationSteam.h"

#include <cstdlib>
#include <initializer_list>

#include <steam/steam_api.h>

#include "foundation/DecimalText.h"
#include "foundation/TextFormat.h"
#include "foundation/TextHeap.h"
#include "host/HostReport.h"
#include "services/workshop/CWorkshopItemCreate.h"
#include "services/workshop/CWorkshopSubscriptions.h"
#include "services/workshop/UGCItem.h"

UGCImplementationSteam* ugcService = nullptr;
CWorkshopItemCreate* workshopItemCreate = nullptr;
CWorkshopSubscriptions* workshopSubscriptions = nullptr;

namespace {

// The platform's public community site; the page lists the items ready to use, most popular first.
constexpr const char* kWorkshopBrowseAddress =
    "https://steamcommunity.com/workshop/browse/?appid=%d&browsesort=trend&section=readytouseitems";

void FreeRecords(PtrArray<UGCItem>& list, const UGCItem* keep)
{
    int32_t kept = 0;
    for (int32_t i = 0; i < list.count; ++i) {
        if (list[i] == keep)
            list[kept++] = list[i];
        else
            FreeUGCItem(list[i]);
    }
    list.count = kept;
    list.Shrink();
}

}  // namespace

UGCItem* NewUGCItem()
{
    auto* item = new UGCItem{};
    item->visibility = 2;
    return item;
}

void FreeUGCItem(UGCItem* item)
{
    FreeText(item->id);
    FreeText(item->title);
    FreeText(item->description);
    FreeText(item->tags);
    FreeText(item->installPath);
    FreeText(item->contentPath);
    delete item;
}

void ReplaceItemText(char*& slot, const char* text)
{
    FreeText(slot);
    slot = text != nullptr ? DuplicateText(text) : nullptr;
}

// Only the engine destroys the service, as it unloads the module: nothing can read a
// record after that, so the records go too, and the companions with their pending call
// results, so that no answer is ever delivered into code that is gone.
UGCImplementationSteam::~UGCImplementationSteam()
{
    FreeRecords(subscribedItems, nullptr);
    FreeRecords(publishedItems, nullptr);
    FreeRecords(removedItems, nullptr);
    if (ugcService != this)
        return;
    delete workshopItemCreate;
    delete workshopSubscriptions;
    workshopItemCreate = nullptr;
    workshopSubscriptions = nullptr;
    ugcService = nullptr;
}

int32_t UGCImplementationSteam::GetServiceType()
{
    return kServiceWorkshop;
}

const char* UGCImplementationSteam::GetPlatformName()
{
    return "Steam";
}

bool UGCImplementationSteam::Initialize()
{
    if (SteamUGC() == nullptr)
        return false;
    ugcService = this;
    // A second start-up starts afresh; the old companions' pending answers are detached with them.
    delete workshopItemCreate;
    delete workshopSubscriptions;
    workshopItemCreate = nullptr;
    workshopSubscriptions = nullptr;

    HostThreadApi* threads = HostThreads();
    listMutex = threads != nullptr ? threads->CreateMutex("STEAM_UGC") : nullptr;

    const char* value = hostServices != nullptr ? hostServices->GetProductValue("steam_app_id") : nullptr;
    appId = static_cast<uint32_t>(DecimalToInt32(value));
    if (appId == 0) {
        HostLog(kHostLogError, "Not able to read Steam app id from product values. Not initializing UGC.");
        return false;
    }
    workshopItemCreate = new CWorkshopItemCreate(appId);
    workshopSubscriptions = new CWorkshopSubscriptions(appId);
    HostLogInfo("Steam UGC init OK.");
    return true;
}

void UGCImplementationSteam::Shutdown() {}

void UGCImplementationSteam::Update()
{
    ISteamUGC* ugc = SteamUGC();
    if (ugc == nullptr)
        return;
    LockLists();
    for (PtrArray<UGCItem>* list : {&subscribedItems, &publishedItems}) {
        for (UGCItem* item : *list) {
            if (item->id == nullptr)
                continue;  // not created by the platform yet: nothing to ask about
            const uint64_t publishedFileId = DecimalToUInt64(item->id);
            workshopSubscriptions->DownloadStep(item, publishedFileId);
            workshopItemCreate->UploadStep(item);  // after the download step: it has the last word
        }
    }
    UnlockLists();
}

bool UGCImplementationSteam::IsAvailable()
{
    return workshopItemCreate != nullptr && workshopSubscriptions != nullptr;
}

// The list operations go straight to the companion objects. The engine calls them
// only once IsAvailable is true; before that they answer as an empty list would.
void UGCImplementationSteam::RefreshItems()
{
    if (workshopSubscriptions != nullptr)
        workshopSubscriptions->RefreshItems();
}

bool UGCImplementationSteam::IsItemListReady()
{
    return workshopSubscriptions != nullptr && workshopSubscriptions->IsItemListReady();
}

int32_t UGCImplementationSteam::GetItemCount()
{
    return workshopSubscriptions != nullptr ? workshopSubscriptions->GetItemCount() : 0;
}

UGCItem* UGCImplementationSteam::GetItem(int32_t index)
{
    return workshopSubscriptions != nullptr ? workshopSubscriptions->GetItem(index) : nullptr;
}

void UGCImplementationSteam::SubscribeItem(const char* id)
{
    if (workshopSubscriptions != nullptr)
        workshopSubscriptions->SubscribeItem(id);
}

void UGCImplementationSteam::UnsubscribeItem(const char* id)
{
    if (workshopSubscriptions != nullptr)
        workshopSubscriptions->UnsubscribeItem(id);
}

UGCItem* UGCImplementationSteam::PublishItem(const UGCItem* item)
{
    if (item == nullptr || item->title == nullptr || item->description == nullptr ||
        item->contentPath == nullptr)
        return nullptr;
    // One publication at a time: a second one would take over the handlers of the first.
    if (workshopItemCreate == nullptr || workshopItemCreate->IsPublishing() || SteamUGC() == nullptr)
        return nullptr;

    auto* copy = new UGCItem(*item);
    copy->id = item->id != nullptr ? DuplicateText(item->id) : nullptr;
    copy->title = DuplicateText(item->title);
    copy->description = DuplicateText(item->description);
    copy->contentPath = DuplicateText(item->contentPath);
    // Never null, so the walk never looks up an install folder for a published record.
    copy->installPath = DuplicateText(item->installPath);
    copy->tags = item->tags != nullptr ? DuplicateText(item->tags) : nullptr;
    copy->progress = kProgressNone;

    if (item->id != nullptr)
        workshopItemCreate->UpdateItem(copy, "Updated.");
    else
        workshopItemCreate->CreateItem(copy);

    LockLists();
    publishedItems.Add(copy);
    UnlockLists();
    return copy;
}

void UGCImplementationSteam::OpenWorkshopBrowser()
{
    ISteamFriends* friends = SteamFriends();
    if (friends == nullptr)
        return;
    InlineString address = FormatString(kWorkshopBrowseAddress, static_cast<int>(appId));
    friends->ActivateGameOverlayToWebPage(address.Text(), k_EActivateGameOverlayToWebPageMode_Default);
}

void UGCImplementationSteam::ClearItemLists()
{
    // The record of a publication that still waits for the platform stays listed
    // (and walked) until a later rebuild: its handlers write into it.
    const UGCItem* running = workshopItemCreate != nullptr ? workshopItemCreate->RunningItem() : nullptr;
    LockLists();
    FreeRecords(subscribedItems, nullptr);
    FreeRecords(publishedItems, running);
    FreeRecords(removedItems, nullptr);
    UnlockLists();
    if (workshopItemCreate != nullptr && running == nullptr)
        workshopItemCreate->ForgetItem();
}

void UGCImplementationSteam::LockLists()
{
    HostThreadApi* threads = HostThreads();
    if (listMutex != nullptr && threads != nullptr)
        threads->LockMutex(listMutex);
}

void UGCImplementationSteam::UnlockLists()
{
    HostThreadApi* threads = HostThreads();
    if (listMutex != nullptr && threads != nullptr)
        threads->UnlockMutex(listMutex);
}

int32_t UGCImplementationSteam::ScaleProgress(uint64_t done, uint64_t total)
{
    float share = static_cast<float>(static_cast<double>(done) / static_cast<double>(total));
    if (share < 0.0f)
        share = 0.0f;
    if (share > 1.0f)
        share = 1.0f;
    const float scaled = share * 95.0f + 5.0f;
    return static_cast<int32_t>(scaled);
}
