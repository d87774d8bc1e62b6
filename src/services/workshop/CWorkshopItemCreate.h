// Publishing: a new item is first created on the platform, then every item,
// new or not, gets its data set and submitted. Each stage's answer comes as a
// call result inside the pump; the end is told to the engine by event 42.
//
//   PublishItem -> CreateItem -> OnCreateItem: id, UpdateItem("First version.")
//   PublishItem (with id) -> UpdateItem("Updated.")
//   UpdateItem -> SubmitItemUpdate -> OnSubmitItemUpdate -> progress 100, event 42
//   the walk -> UploadStep -> progress 5..100 while the upload runs
#pragma once

#include <cstdint>

#include <steam/steam_api.h>

struct UGCItem;

class CWorkshopItemCreate {
public:
    explicit CWorkshopItemCreate(uint32_t appIdOfProduct) : appId(appIdOfProduct) {}
    CWorkshopItemCreate(const CWorkshopItemCreate&) = delete;
    CWorkshopItemCreate& operator=(const CWorkshopItemCreate&) = delete;

    void CreateItem(UGCItem* item);
    void UpdateItem(UGCItem* item, const char* changeNote);
    void OnCreateItem(CreateItemResult_t* result, bool ioFailure);
    void OnSubmitItemUpdate(SubmitItemUpdateResult_t* result, bool ioFailure);
    // Follows the upload of the current record; from the walk, listMutex held.
    void UploadStep(UGCItem* item);

    // True while a stage waits for the platform's answer.
    bool IsPublishing() const { return createCallResult.IsActive() || submitCallResult.IsActive(); }
    // The record whose stage waits for the platform's answer, or null.
    const UGCItem* RunningItem() const { return IsPublishing() ? currentItem : nullptr; }
    // Drops currentItem once the lists have freed it (no answer is awaited then).
    void ForgetItem() { currentItem = nullptr; }

    uint64_t publishedFileId = 0;
    UGCUpdateHandle_t updateHandle = 0;
    uint32_t appId = 0;
    UGCItem* currentItem = nullptr;  // not owned
    CCallResult<CWorkshopItemCreate, CreateItemResult_t> createCallResult;
    CCallResult<CWorkshopItemCreate, SubmitItemUpdateResult_t> submitCallResult;
};

// Posts event 42 with `status` (0 success, 1 failure).
void PostPublishedEvent(int32_t status);
