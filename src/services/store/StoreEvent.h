// The view of events 32, 33 and 34, which the store posts. The engine reads the
// fields by position, so each offset is checked here.
#pragma once

#include <cstddef>
#include <cstdint>

#include "host/HostEvent.h"

struct StoreEvent {
    int32_t type;
    int32_t status;
    const char* itemId;  // a block of Allocate, or null
    uint8_t itemState;
    int64_t reserved24;      // always 0 in events 33 and 34
    int64_t reserved32;      // always 0 in events 33 and 34
    const char* purchaseId;  // event 34 only: a second block, or null
    unsigned char unused[24];
};
static_assert(sizeof(StoreEvent) == sizeof(HostEvent), "a view covers the whole event");
static_assert(offsetof(StoreEvent, status) == 4, "status at 4");
static_assert(offsetof(StoreEvent, itemId) == 8, "itemId at 8");
static_assert(offsetof(StoreEvent, itemState) == 16, "itemState at 16");
static_assert(offsetof(StoreEvent, reserved24) == 24, "reserved field at 24");
static_assert(offsetof(StoreEvent, reserved32) == 32, "reserved field at 32");
static_assert(offsetof(StoreEvent, purchaseId) == 40, "purchaseId at 40");

// Event 32: the service has started.
void PostStoreStarted();
// Event 33: the state of one item or product; `itemId` is copied.
void PostItemState(const char* itemId, bool state);
// Event 34: a finished purchase of `itemId` (copied twice), or with null a
// purchase that did not happen.
void PostPurchaseOutcome(const char* itemId);
