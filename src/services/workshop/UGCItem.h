// The record of one workshop item, shared with the engine: the engine fills one
// for PublishItem and polls the ones that PublishItem and GetItem give back.
// The engine reads it by position, so the layout below is checked field by field.
#pragma once

#include <cstddef>
#include <cstdint>

#include "host/HostEvent.h"

struct UGCItem {
    char* id;  // decimal published file id; null until the platform has created the item
    char* title;
    char* description;
    char* tags;          // separated by ","; may be null
    char* installPath;   // engine path of the item's folder here; null when not known
    char* contentPath;   // engine path of the folder to upload; null in subscribed items
    int32_t visibility;  // 0 public, 1 friends only, anything else private
    uint8_t subscribeAfterPublish;
    uint8_t padding[3];
    int32_t progress;  // 0 nothing yet, 1 creating, 2 created, 3 submitted, 5-99 transfer, 100 done
    uint8_t reserved[4];
};
static_assert(sizeof(UGCItem) == 64, "the engine reads 64-byte workshop records");
static_assert(offsetof(UGCItem, id) == 0, "id at 0");
static_assert(offsetof(UGCItem, title) == 8, "title at 8");
static_assert(offsetof(UGCItem, description) == 16, "description at 16");
static_assert(offsetof(UGCItem, tags) == 24, "tags at 24");
static_assert(offsetof(UGCItem, installPath) == 32, "installPath at 32");
static_assert(offsetof(UGCItem, contentPath) == 40, "contentPath at 40");
static_assert(offsetof(UGCItem, visibility) == 48, "visibility at 48");
static_assert(offsetof(UGCItem, subscribeAfterPublish) == 52, "subscribeAfterPublish at 52");
static_assert(offsetof(UGCItem, progress) == 56, "progress at 56");

// Values of `progress` that mark a stage rather than a share of a transfer.
enum UGCItemProgress : int32_t {
    kProgressNone = 0,
    kProgressCreating = 1,
    kProgressCreated = 2,
    kProgressSubmitted = 3,
    kProgressTransferStart = 5,
    kProgressDone = 100,
};

// Type 42: the end of a publication. Only `status` is set; the event does not
// say which item it is about.
struct WorkshopPublishedEvent {
    int32_t type;
    int32_t status;  // 0 success, 1 failure
    unsigned char reserved[64];
};
static_assert(sizeof(WorkshopPublishedEvent) == sizeof(HostEvent), "a view covers the whole event");
static_assert(offsetof(WorkshopPublishedEvent, type) == 0, "type at 0");
static_assert(offsetof(WorkshopPublishedEvent, status) == 4, "status at 4");
