// Service number 6 as the engine sees it: workshop items the user has, and
// publishing new items and versions.
//
// Records given back (GetItem, PublishItem) stay the service's and live until
// the next rebuild of the list (RefreshItems). An engine thread other than the
// one that pumps the platform reads them holding the engine's mutex
// "STEAM_UGC", taken around GetItemCount, GetItem and the reads of the fields:
// the rebuild and the per-frame walk hold the same mutex, and the engine's
// mutexes may be taken again by the thread that holds them.
#pragma once

#include <cstdint>

#include "frame/ExtensionModule.h"

struct UGCItem;

class UGCImplementation : public BaseImplementation {
public:
    virtual void RefreshItems() = 0;
    virtual bool IsItemListReady() = 0;
    virtual int32_t GetItemCount() = 0;
    virtual UGCItem* GetItem(int32_t index) = 0;
    virtual void SubscribeItem(const char* id) = 0;
    virtual void UnsubscribeItem(const char* id) = 0;
    // The service's own copy of `item` (which the engine may release on return), or null when refused.
    virtual UGCItem* PublishItem(const UGCItem* item) = 0;
    virtual void OpenWorkshopBrowser() = 0;
};
