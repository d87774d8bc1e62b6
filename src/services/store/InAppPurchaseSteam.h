// The store over the platform's downloadable content. A purchase's outcome is
// worked out from two observations: a product that turns up installed during
// the regular scan is a finished purchase, and an overlay that closes while its
// product is still not installed is a purchase that did not happen.
#pragma once

#include <steam/steam_api.h>

#include "foundation/InlineString.h"
#include "foundation/PtrArray.h"
#include "services/store/InAppPurchaseImplementation.h"
#include "services/store/StoreItem.h"

class InAppPurchaseSteam : public InAppPurchaseImplementation {
public:
    // Registers the overlay callback at once: a purchase waits for the overlay
    // from the object's birth, before the engine's Initialize.
    InAppPurchaseSteam();
    ~InAppPurchaseSteam() override;

    InAppPurchaseSteam(const InAppPurchaseSteam&) = delete;
    InAppPurchaseSteam& operator=(const InAppPurchaseSteam&) = delete;

    int32_t GetServiceType() override;
    const char* GetPlatformName() override;
    bool Initialize() override;
    void Shutdown() override;
    void Update() override;
    bool IsAvailable() override;
    void QueryItems(const char* list) override;
    void PurchaseItem(const char* itemId) override;
    void ListItems() override;
    bool IsStoreOpen() override;

    // The scan for newly installed products, once a frame from the module's Update.
    void CheckPurchases();
    void OnOverlayActivated(GameOverlayActivated_t* param);

    // The `bought` flag of the entry keyed `key`, made with 0 if there is none.
    uint8_t& FindOrAddItem(const char* key);

    // Delivers GameOverlayActivated_t to OnOverlayActivated of its owner.
    class CCallbackInternal_OnOverlayActivated : public CCallbackImpl<sizeof(GameOverlayActivated_t)> {
    public:
        explicit CCallbackInternal_OnOverlayActivated(InAppPurchaseSteam* owner);
        void Unregister();

    protected:
        void Run(void* param) override;

    private:
        InAppPurchaseSteam* owner_;
    };

    CCallbackInternal_OnOverlayActivated overlayCallback;
    uint8_t enabled = 0;
    PtrArray<StoreItem> items;  // owns its entries
    int32_t lastCheckMs = 0;
    InlineString pendingSteamId;  // the product the overlay was opened for; null or empty: none

private:
    StoreItem* FindItem(const char* key);
    void ReleaseItems();
};
