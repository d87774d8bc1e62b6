#include "services/store/InAppPurchaseSteam.h"

#include <cstring>

#include "foundation/DecimalText.h"
#include "foundation/ListToken.h"
#include "foundation/TextFormat.h"
#include "host/HostServices.h"
#include "services/store/ProductNumber.h"
#include "services/store/StoreEvent.h"

namespace {

// A token of 2048 bytes or more does not fit and counts as not found.
constexpr int32_t kTokenBufferSize = 2048;
constexpr int32_t kAddressBufferSize = 256;
constexpr int32_t kDlcNameBufferSize = 256;
// The scan over the products runs at most this often.
constexpr int32_t kScanIntervalMs = 2000;

const char kOverlayPurchaseAddress[] = "steam://purchase/%s";
const char kWebStoreAddress[] = "https://store.steampowered.com/app/%s";

// The product at `index` of the app's list; false when the platform gives none.
// The name buffer is the platform's to fill; nothing reads it.
bool ProductAt(ISteamApps* apps, int index, AppId_t& productNumber, bool& available)
{
    char name[kDlcNameBufferSize];
    return apps->BGetDLCDataByIndex(index, &productNumber, &available, name, kDlcNameBufferSize);
}

}  // namespace

InAppPurchaseSteam::CCallbackInternal_OnOverlayActivated::CCallbackInternal_OnOverlayActivated(
    InAppPurchaseSteam* owner)
    : owner_(owner)
{
    SteamAPI_RegisterCallback(this, GameOverlayActivated_t::k_iCallback);
}

void InAppPurchaseSteam::CCallbackInternal_OnOverlayActivated::Unregister()
{
    if ((m_nCallbackFlags & k_ECallbackFlagsRegistered) != 0)
        SteamAPI_UnregisterCallback(this);
}

void InAppPurchaseSteam::CCallbackInternal_OnOverlayActivated::Run(void* param)
{
    owner_->OnOverlayActivated(static_cast<GameOverlayActivated_t*>(param));
}

InAppPurchaseSteam::InAppPurchaseSteam() : overlayCallback(this) {}

InAppPurchaseSteam::~InAppPurchaseSteam()
{
    pendingSteamId.Assign(nullptr);
    ReleaseItems();
    delete[] items.data;
    items.data = nullptr;
    items.capacity = 0;
    overlayCallback.Unregister();
}

int32_t InAppPurchaseSteam::GetServiceType()
{
    return kServiceStore;
}

const char* InAppPurchaseSteam::GetPlatformName()
{
    return "Steam";
}

bool InAppPurchaseSteam::Initialize()
{
    ReleaseItems();
    lastCheckMs = 0;
    enabled = 1;
    PostStoreStarted();
    return true;
}

void InAppPurchaseSteam::Shutdown() {}

void InAppPurchaseSteam::Update() {}

bool InAppPurchaseSteam::IsAvailable()
{
    return enabled != 0;
}

void InAppPurchaseSteam::QueryItems(const char* list)
{
    ISteamApps* apps = SteamApps();
    if (apps == nullptr || list == nullptr || list[0] == '\0')
        return;
    // A separator at the very end still counts: its token is empty and finds nothing.
    const int32_t tokens = CountListTokens(list, ',');
    for (int32_t index = 0; index < tokens; ++index) {
        char buffer[kTokenBufferSize];
        InlineString itemId;
        itemId.Assign(GetListToken(buffer, kTokenBufferSize, list, ",", index));
        InlineString steamIdText;
        const int32_t productNumber = LookUpProductNumber(itemId.Text(), steamIdText);
        if (productNumber == 0)
            continue;
        const bool installed = apps->BIsDlcInstalled(static_cast<AppId_t>(productNumber));
        // The platform's present answer wins, in either direction.
        FindOrAddItem(itemId.Text()) = installed ? 1 : 0;
        PostItemState(itemId.Text(), installed);
    }
}

void InAppPurchaseSteam::PurchaseItem(const char* itemId)
{
    if (itemId == nullptr)
        return;
    InlineString steamIdText;
    const int32_t productNumber = LookUpProductNumber(itemId, steamIdText);
    if (steamIdText.Text() == nullptr || productNumber == 0)
        return;

    const char* addressTemplate = kWebStoreAddress;
    if (SteamUtils() != nullptr && SteamFriends() != nullptr) {
        if (SteamUtils()->IsOverlayEnabled()) {
            SteamFriends()->ActivateGameOverlayToStore(static_cast<AppId_t>(productNumber),
                                                       k_EOverlayToStoreFlag_AddToCartAndShow);
            // The file's own text: the overlay's closing asks about this product.
            pendingSteamId.Assign(steamIdText.Text());
            return;
        }
        addressTemplate = kOverlayPurchaseAddress;
    }
    // Nothing waits for an overlay here: only the scan can tell the outcome.
    char address[kAddressBufferSize];
    FormatToBuffer(address, kAddressBufferSize, addressTemplate, steamIdText.Text());
    hostServices->HostCommand("OpenURL", address);
}

void InAppPurchaseSteam::ListItems()
{
    ISteamApps* apps = SteamApps();
    if (apps == nullptr)
        return;
    const int count = apps->GetDLCCount();
    for (int index = 0; index < count; ++index) {
        AppId_t productNumber = 0;
        bool available = false;
        if (!ProductAt(apps, index, productNumber, available))
            continue;
        char key[16];
        FormatToBuffer(key, sizeof key, "%d", static_cast<int32_t>(productNumber));
        PostItemState(key, available);
    }
}

bool InAppPurchaseSteam::IsStoreOpen()
{
    return true;
}

void InAppPurchaseSteam::OnOverlayActivated(GameOverlayActivated_t* param)
{
    // Only the closing matters: what the user did is settled by then.
    if (param->m_bActive != 0)
        return;
    if (pendingSteamId.Text() == nullptr || pendingSteamId.Text()[0] == '\0')
        return;
    ISteamApps* apps = SteamApps();
    const AppId_t productNumber = static_cast<AppId_t>(DecimalToInt32(pendingSteamId.Text()));
    // An installed product is reported by the scan, not here.
    if (apps != nullptr && !apps->BIsDlcInstalled(productNumber))
        PostPurchaseOutcome(nullptr);
    pendingSteamId.Assign(nullptr);
}

void InAppPurchaseSteam::CheckPurchases()
{
    ISteamApps* apps = SteamApps();
    if (enabled == 0 || apps == nullptr)
        return;
    // Called every frame: beyond the interface's cached pointer an idle frame
    // costs one clock reading. The engine's clock wraps; only the signed 32-bit
    // difference counts, so a clock that went back waits until it has passed
    // the last scan again.
    const int32_t sinceLastScan =
        static_cast<int32_t>(hostServices->GetTimeMs() - static_cast<uint32_t>(lastCheckMs));
    if (sinceLastScan < kScanIntervalMs)
        return;
    lastCheckMs = static_cast<int32_t>(hostServices->GetTimeMs());

    const int count = apps->GetDLCCount();
    for (int index = 0; index < count; ++index) {
        AppId_t productNumber = 0;
        bool available = false;
        if (!ProductAt(apps, index, productNumber, available))
            productNumber = 0;
        if (!apps->BIsDlcInstalled(productNumber))
            continue;
        // Items are keyed by the engine's ids; only an id that is the decimal
        // text of its own product number can be found from here.
        char key[16];
        FormatToBuffer(key, sizeof key, "%d", static_cast<int32_t>(productNumber));
        StoreItem* item = FindItem(key);
        if (item == nullptr || item->bought != 0)
            continue;
        item->bought = 1;
        PostPurchaseOutcome(key);
    }
}

uint8_t& InAppPurchaseSteam::FindOrAddItem(const char* key)
{
    StoreItem* item = FindItem(key);
    if (item == nullptr) {
        item = new StoreItem();
        item->itemId.Assign(key);
        items.Add(item);
    }
    return item->bought;
}

StoreItem* InAppPurchaseSteam::FindItem(const char* key)
{
    if (key == nullptr)
        return nullptr;
    for (StoreItem* item : items) {
        if (item->itemId.Text() != nullptr && std::strcmp(item->itemId.Text(), key) == 0)
            return item;
    }
    return nullptr;
}

void InAppPurchaseSteam::ReleaseItems()
{
    for (StoreItem* item : items)
        delete item;
    items.count = 0;
}
