// The store as the engine sees it: item states and purchase outcomes, all as events.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "ModuleHarness.h"
#include "services/store/InAppPurchaseImplementation.h"

namespace {

using simengine::PostedEvent;

const char kConfiguration[] = "<?xml version=\"1.0\"?>\n<root>\n<array id=\"ITEMS\">\n"
                              "<node id=\"1001\" steam_id=\"1001\"/>\n"
                              "<node id=\"1002\" steam_id=\"1002\"/>\n"
                              "<node id=\"1003\" steam_id=\"1003\"/>\n"
                              "</array>\n</root>\n";

// "33 1001 0" for an item state, "34 1001 1 1001" or "34 - 0 -" for an outcome.
std::string Describe(const PostedEvent& event)
{
    std::string text = std::to_string(event.type);
    if (!event.store)
        return text;
    text += " " + event.store->itemId.value_or("-");
    if (event.type != kEventStoreStarted)
        text += " " + std::to_string(event.store->itemState);
    if (event.type == kEventStorePurchaseOutcome)
        text += " " + event.store->purchaseId.value_or("-");
    return text;
}

class Store : public ModuleTest {
protected:
    void SetUp() override
    {
        ModuleTest::SetUp();
        engine.Files().AddMemoryFile("in-app-purchases/in-app-purchases.xml", kConfiguration);
        world.SetDlcs(
            {{1001, true, false, "Sword"}, {1002, true, false, "Shield"}, {1003, false, false, "Horse"}});
    }

    void StartStore()
    {
        ASSERT_TRUE(Start());
        store = ServiceAt<InAppPurchaseImplementation>(kServiceStore);
        ASSERT_NE(store, nullptr);
        ASSERT_TRUE(store->Initialize());
        mark = engine.Records().Mark();
        world.ClearJournal();
    }

    // What was posted since the last look.
    std::vector<std::string> Posted()
    {
        std::vector<std::string> seen;
        for (const PostedEvent& event : engine.Records().Since(mark).Events())
            seen.push_back(Describe(event));
        mark = engine.Records().Mark();
        return seen;
    }

    // One frame at engine time `ms`; true if it walked the products.
    bool FrameAt(uint32_t ms)
    {
        engine.Time().UseManual(ms);
        const size_t before = PlatformCalls("GetDLCCount");
        module->Update();
        return PlatformCalls("GetDLCCount") > before;
    }

    void CloseOverlay()
    {
        world.SetOverlayActive(false);
        module->Update();
    }

    InAppPurchaseImplementation* store = nullptr;
    uint64_t mark = 0;
};

using Events = std::vector<std::string>;

TEST_F(Store, PendingPurchaseStates)
{
    // Each row starts from "nothing pending" or "1001 pending", makes one
    // happening, and then probes the state left behind: an overlay closing with
    // every product uninstalled asks about the pending product, if any, and
    // posts the failure event for it.
    enum class Happening {
        OverlayPurchase,
        AddressPurchase,
        CloseNotInstalled,
        CloseInstalled
    };
    struct Row {
        const char* name;
        bool pendingBefore;
        Happening happening;
        Events during;
        const char* pendingAfter;  // the product the probe asks about, or null
    };
    const Row rows[] = {
        {"nothing, overlay purchase", false, Happening::OverlayPurchase, {}, "1002"},
        {"nothing, address purchase", false, Happening::AddressPurchase, {}, nullptr},
        {"nothing, overlay closes", false, Happening::CloseNotInstalled, {}, nullptr},
        {"pending, overlay purchase", true, Happening::OverlayPurchase, {}, "1002"},
        {"pending, address purchase", true, Happening::AddressPurchase, {}, "1001"},
        {"pending, closes not installed", true, Happening::CloseNotInstalled, {"34 - 0 -"}, nullptr},
        {"pending, closes installed", true, Happening::CloseInstalled, {}, nullptr},
    };
    StartStore();
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        world.SetDlcInstalled(1001, false);
        world.SetDlcInstalled(1002, false);
        world.SetOverlayEnabled(true);
        if (row.pendingBefore)
            store->PurchaseItem("1001");
        module->Update();
        Posted();

        switch (row.happening) {
        case Happening::OverlayPurchase:
            store->PurchaseItem("1002");
            break;
        case Happening::AddressPurchase:
            world.SetOverlayEnabled(false);
            store->PurchaseItem("1002");
            EXPECT_EQ(engine.Records().Since(mark).Commands("OpenURL").at(0).argument,
                      "steam://purchase/1002");
            break;
        case Happening::CloseInstalled:
            world.SetDlcInstalled(1001, true);
            CloseOverlay();
            break;
        case Happening::CloseNotInstalled:
            CloseOverlay();
            break;
        }
        EXPECT_EQ(Posted(), row.during);

        world.SetDlcInstalled(1001, false);
        world.ClearJournal();
        CloseOverlay();
        const auto asked = world.GetJournal().Calls("BIsDlcInstalled");
        if (row.pendingAfter == nullptr) {
            EXPECT_TRUE(asked.empty());
            EXPECT_EQ(Posted(), Events{});
        } else {
            ASSERT_EQ(asked.size(), 1u);
            EXPECT_EQ(asked[0].args, row.pendingAfter);
            EXPECT_EQ(Posted(), Events{"34 - 0 -"});
        }
    }
}

TEST_F(Store, BoughtFlag)
{
    StartStore();
    // Frames 2000 ms apart, each one scan.
    uint32_t clock = 0;
    const auto scan = [&] {
        clock += 2000;
        EXPECT_TRUE(FrameAt(clock));
        return Posted();
    };

    // QueryItems sets the flag to the platform's answer and never posts event 34.
    store->QueryItems("1001,1002");
    EXPECT_EQ(Posted(), (Events{"33 1001 0", "33 1002 0"}));
    world.SetDlcInstalled(1001, true);
    EXPECT_EQ(scan(), Events{"34 1001 1 1001"});
    EXPECT_EQ(scan(), Events{});  // reported once only

    // The other direction: a later answer turns the flag off, so the scan reports again.
    world.SetDlcInstalled(1001, false);
    store->QueryItems("1001");
    world.SetDlcInstalled(1001, true);
    EXPECT_EQ(Posted(), Events{"33 1001 0"});
    EXPECT_EQ(scan(), Events{"34 1001 1 1001"});

    // A flag turned on by QueryItems keeps the scan silent for good.
    world.SetDlcInstalled(1002, true);
    store->QueryItems("1002");
    EXPECT_EQ(Posted(), Events{"33 1002 1"});
    EXPECT_EQ(scan(), Events{});

    // Initialize forgets the entries: an item queried with its flag off is not
    // reported after it, and event 32 comes again.
    world.SetDlcInstalled(1001, false);
    store->QueryItems("1001");
    ASSERT_TRUE(store->Initialize());
    clock = 0;
    world.SetDlcInstalled(1001, true);
    EXPECT_EQ(Posted(), (Events{"33 1001 0", "32 -"}));
    EXPECT_EQ(scan(), Events{});
}

TEST_F(Store, QueryItemsTokens)
{
    struct Row {
        const char* list;
        Events posted;
    };
    const Row rows[] = {
        {nullptr, {}},
        {"", {}},
        {"1001,1002,", {"33 1001 0", "33 1002 0"}},  // three tokens, the last empty
        {"1001,1001", {"33 1001 0", "33 1001 0"}},
        {",1003", {"33 1003 0"}},
        {"sword,1002", {"33 1002 0"}},  // not sold here: no event
        {"1001 ", {}},                  // ids are compared whole
    };
    StartStore();
    for (const Row& row : rows) {
        SCOPED_TRACE(row.list != nullptr ? row.list : "null");
        world.ClearJournal();
        store->QueryItems(row.list);
        EXPECT_EQ(Posted(), row.posted);
        EXPECT_EQ(PlatformCalls("BIsDlcInstalled"), row.posted.size());
    }
}

TEST_F(Store, ScanGate)
{
    // The scan's clock test in signed 32-bit arithmetic: the time of the
    // previous scan (or of Initialize), the time of the frame, and whether it scans.
    struct Row {
        const char* name;
        uint32_t lastScan;
        uint32_t now;
        bool scans;
    };
    const Row rows[] = {
        {"well after", 3000, 9000, true},
        {"1999 ms after", 3000, 4999, false},
        {"clock went back", 3000, 2500, false},
        {"across the sign bit", 0x7FFFF000u, 0x80000800u, true},
        {"across the wrap", 0xFFFFF000u, 0x00000800u, true},
        {"wrapped back", 0x00000800u, 0xFFFFF000u, false},
        {"half the range on", 1000, 1000 + 0x80000000u, false},
        // Initialize starts again from 0, whatever the last scan was.
        {"first frame before 2000 ms", 0, 1999, false},
        {"first frame at 2000 ms", 0, 2000, true},
    };
    StartStore();
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        ASSERT_TRUE(store->Initialize());
        if (row.lastScan != 0) {
            // A scan at lastScan, reached from Initialize's 0 by scans a quarter
            // of the clock's range apart where the difference would be negative.
            uint32_t at = 0;
            while (static_cast<int32_t>(row.lastScan - at) < 2000) {
                at += 0x40000000u;
                ASSERT_TRUE(FrameAt(at));
            }
            ASSERT_TRUE(FrameAt(row.lastScan));
        }
        EXPECT_EQ(FrameAt(row.now), row.scans);
    }
}

TEST_F(Store, NothingScansBeforeInitializeOrWithoutApps)
{
    ASSERT_TRUE(Start());
    EXPECT_FALSE(FrameAt(5000));  // the service's Initialize has not run
    store = ServiceAt<InAppPurchaseImplementation>(kServiceStore);
    ASSERT_TRUE(store->Initialize());
    world.SetInterfaceAvailable(simclient::Interface::Apps, false);
    EXPECT_FALSE(FrameAt(7000));
    world.SetInterfaceAvailable(simclient::Interface::Apps, true);
    EXPECT_TRUE(FrameAt(7016));
}

TEST_F(Store, InstalledAtTheCloseIsReportedByTheScanAlone)
{
    StartStore();
    store->QueryItems("1001");
    store->PurchaseItem("1001");
    module->Update();  // the overlay opens
    world.SetDlcInstalled(1001, true);
    CloseOverlay();
    EXPECT_EQ(Posted(), Events{"33 1001 0"});
    EXPECT_TRUE(FrameAt(2000));
    EXPECT_TRUE(FrameAt(4000));
    EXPECT_EQ(Posted(), Events{"34 1001 1 1001"});
}

TEST_F(Store, ListItemsTellsTheAvailableFlagAndLeavesTheTableAlone)
{
    StartStore();
    world.InjectFault("BGetDLCDataByIndex", simclient::Fault::Fail().Skip(1).Times(1));
    store->ListItems();
    EXPECT_EQ(Posted(), (Events{"33 1001 1", "33 1003 0"}));
    // No entry was made: the scan finds the installed product in no entry.
    world.SetDlcInstalled(1001, true);
    EXPECT_TRUE(FrameAt(2000));
    EXPECT_EQ(Posted(), Events{});
    EXPECT_TRUE(store->IsStoreOpen());
}

TEST_F(Store, EventTextsAreBlocksOfTheirOwn)
{
    StartStore();
    world.SetDlcInstalled(1001, true);
    store->QueryItems("1001");
    world.SetDlcInstalled(1001, false);
    store->QueryItems("1001");
    world.SetDlcInstalled(1001, true);
    ASSERT_TRUE(FrameAt(2000));
    const auto events = engine.Records().Since(mark).Events();
    ASSERT_EQ(events.size(), 3u);
    for (const PostedEvent& event : events) {
        SCOPED_TRACE(Describe(event));
        EXPECT_EQ(event.status, 1);
        for (size_t offset : {24u, 32u})
            for (size_t i = 0; i < 8; ++i)
                EXPECT_EQ(event.raw[offset + i], 0u);
    }
    const auto pointerAt = [](const PostedEvent& event, size_t offset) {
        const char* pointer = nullptr;
        std::memcpy(&pointer, event.raw.data() + offset, sizeof pointer);
        return pointer;
    };
    const char* itemId = pointerAt(events[2], 8);
    const char* purchaseId = pointerAt(events[2], 40);
    EXPECT_NE(itemId, purchaseId);
    for (const char* text : {pointerAt(events[0], 8), pointerAt(events[1], 8), itemId, purchaseId}) {
        size_t size = 0;
        ASSERT_TRUE(engine.Memory().FindAllocation(text, &size));
        EXPECT_EQ(size, 5u);
    }

    // No block: the field is null and the event goes all the same.
    world.SetDlcInstalled(1002, false);
    store->QueryItems("1002");
    world.SetDlcInstalled(1002, true);
    Posted();
    engine.Memory().FailNextAllocations(1);
    ASSERT_TRUE(FrameAt(4000));
    EXPECT_EQ(Posted(), Events{"34 - 1 1002"});
}

}  // namespace
