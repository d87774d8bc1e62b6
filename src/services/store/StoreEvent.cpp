#include "services/store/StoreEvent.h"

#include <cstring>

#include "host/HostServices.h"

namespace {

// A block of the engine's that travels with the event; null when Allocate
// gives none, and the event goes all the same.
const char* CopyForEvent(const char* text)
{
    const size_t length = std::strlen(text);
    char* block = static_cast<char*>(hostServices->Allocate(static_cast<int32_t>(length + 1)));
    if (block != nullptr)
        std::memcpy(block, text, length + 1);
    return block;
}

void Post(int32_t type, const char* itemId, uint8_t itemState, bool withState, const char* purchaseId)
{
    HostEvent record;
    std::memset(&record, 0, sizeof record);
    hostServices->InitEvent(&record, type);
    StoreEvent* event = reinterpret_cast<StoreEvent*>(&record);
    event->status = 1;
    event->itemId = itemId != nullptr ? CopyForEvent(itemId) : nullptr;
    if (withState) {
        event->itemState = itemState;
        event->reserved24 = 0;
        event->reserved32 = 0;
    }
    if (type == kEventStorePurchaseOutcome)
        event->purchaseId = purchaseId != nullptr ? CopyForEvent(purchaseId) : nullptr;
    hostServices->PostEvent(&record);
}

}  // namespace

void PostStoreStarted()
{
    Post(kEventStoreStarted, nullptr, 0, false, nullptr);
}

void PostItemState(const char* itemId, bool state)
{
    Post(kEventStoreItemState, itemId, state ? 1 : 0, true, nullptr);
}

void PostPurchaseOutcome(const char* itemId)
{
    Post(kEventStorePurchaseOutcome, itemId, itemId != nullptr ? 1 : 0, true, itemId);
}
