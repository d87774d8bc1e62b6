// Service number 4 as the engine sees it: items for sale, their state and purchases.
// Every answer comes as an event; the order of declarations is a binary interface.
#pragma once

#include "frame/ExtensionModule.h"

class InAppPurchaseImplementation : public BaseImplementation {
public:
    // One event 33 per id of the comma-separated list that is sold here.
    virtual void QueryItems(const char* list) = 0;
    // Starts a purchase; its outcome, if any, comes later as event 34.
    virtual void PurchaseItem(const char* itemId) = 0;
    // One event 33 per product the platform lists for the app.
    virtual void ListItems() = 0;
    virtual bool IsStoreOpen() = 0;
};
