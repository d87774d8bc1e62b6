// The workshop over the platform's UGC interface. This object holds what both
// conversations with the platform share: the three lists of records, their
// mutex and the per-frame walk. CWorkshopSubscriptions asks what the user is
// subscribed to; CWorkshopItemCreate creates and uploads items.
//
//   RefreshItems -> query of the subscribed ids -> OnQueryCompleted (pump) -> subscribedItems
//   PublishItem -> CreateItem -> OnCreateItem (pump) -> UpdateItem -> OnSubmitItemUpdate (pump) -> event 42
//   Update (engine) -> per record: download step, then upload step -> `progress`
#pragma once

#include <cstdint>

#include "foundation/PtrArray.h"
#include "services/workshop/UGCImplementation.h"

struct HostMutex;
class CWorkshopItemCreate;
class CWorkshopSubscriptions;

class UGCImplementationSteam : public UGCImplementation {
public:
    ~UGCImplementationSteam() override;

    int32_t GetServiceType() override;
    const char* GetPlatformName() override;
    bool Initialize() override;
    void Shutdown() override;
    void Update() override;
    bool IsAvailable() override;
    void RefreshItems() override;
    bool IsItemListReady() override;
    int32_t GetItemCount() override;
    UGCItem* GetItem(int32_t index) override;
    void SubscribeItem(const char* id) override;
    void UnsubscribeItem(const char* id) override;
    UGCItem* PublishItem(const UGCItem* item) override;
    void OpenWorkshopBrowser() override;

    // Frees every record of the three lists; takes listMutex itself. The record
    // of a publication still waiting for the platform is kept (see the .cpp).
    void ClearItemLists();
    void LockLists();
    void UnlockLists();

    // The 5-to-100 scale of `progress` for a transfer; `total` is not 0.
    static int32_t ScaleProgress(uint64_t done, uint64_t total);

    uint32_t appId = 0;
    HostMutex* listMutex = nullptr;
    PtrArray<UGCItem> subscribedItems;
    PtrArray<UGCItem> publishedItems;
    PtrArray<UGCItem> removedItems;
};

// The one service, and its two companions; set by Initialize.
extern UGCImplementationSteam* ugcService;
extern CWorkshopItemCreate* workshopItemCreate;
extern CWorkshopSubscriptions* workshopSubscriptions;

// A record with every text null, private, not subscribing, progress 0.
UGCItem* NewUGCItem();
// Frees the six texts of `item`, then the record.
void FreeUGCItem(UGCItem* item);
// Replaces the text at `slot` by a heap copy of `text` (null gives null).
void ReplaceItemText(char*& slot, const char* text);
