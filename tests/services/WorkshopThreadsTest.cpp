// Another thread of the engine reads the subscribed list while the engine's own
// thread walks it, rebuilds it and unsubscribes from it. The reader holds the
// engine's mutex "STEAM_UGC" around its calls and reads, as the service asks:
// it must never see a record half made or already freed (ThreadSanitizer and
// AddressSanitizer would tell), nor a count that no list ever had.
#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <cstring>
#include <string>
#include <thread>

#include "ModuleHarness.h"
#include "host/HostServices.h"
#include "services/workshop/UGCImplementation.h"
#include "services/workshop/UGCItem.h"

namespace {

constexpr int kItems = 12;
constexpr int kRounds = 60;

class WorkshopThreads : public ModuleTest {};

TEST_F(WorkshopThreads, ReaderSeesWholeListsWhileTheEngineThreadChangesThem)
{
    for (int i = 0; i < kItems; ++i) {
        simclient::WorkshopItem item;
        item.id = 7000 + static_cast<PublishedFileId_t>(i);
        item.title = "Item " + std::to_string(i);
        item.subscribed = true;
        item.state = k_EItemStateInstalled;
        item.folder = "/ws/" + std::to_string(item.id);
        world.AddWorkshopItem(item);
    }
    engine.SetProductValue("steam_app_id", "480");
    ASSERT_TRUE(Start());
    auto* ugc = ServiceAt<UGCImplementation>(6);
    ASSERT_NE(ugc, nullptr);
    ASSERT_TRUE(ugc->Initialize());

    HostThreadApi* threads = engine.Table()->threads;
    HostMutex* lists = threads->CreateMutex("STEAM_UGC");
    std::atomic<bool> done{false};
    std::atomic<int> reads{0};
    std::atomic<int> badRecords{0};
    std::atomic<int> badCounts{0};

    std::thread reader([&] {
        while (!done.load(std::memory_order_acquire)) {
            threads->LockMutex(lists);
            const int32_t count = ugc->GetItemCount();
            if (count < 0 || count > kItems)
                badCounts.fetch_add(1);
            for (int32_t i = 0; i < count; ++i) {
                // Null once RefreshItems has marked the list not ready (that flag is not under the mutex).
                const UGCItem* item = ugc->GetItem(i);
                if (item == nullptr)
                    continue;
                const long id = item->id != nullptr ? std::strtol(item->id, nullptr, 10) : 0;
                const bool whole = id >= 7000 && id < 7000 + kItems && item->title != nullptr &&
                                   std::strncmp(item->title, "Item ", 5) == 0 &&
                                   (item->progress == 0 || item->progress == 100);
                if (!whole)
                    badRecords.fetch_add(1);
            }
            threads->UnlockMutex(lists);
            reads.fetch_add(1, std::memory_order_release);
        }
    });

    // The engine's thread: rebuild, walk, drop an item, rebuild again. Each round waits
    // (bounded, without sleeping) for the reader to have read at least once more.
    for (int round = 0; round < kRounds; ++round) {
        ugc->RefreshItems();
        module->Update();  // the query's answer: the rebuild
        ugc->Update();
        ugc->UnsubscribeItem(std::to_string(7000 + round % kItems).c_str());
        ugc->Update();
        if (round % kItems == kItems - 1) {
            for (int i = 0; i < kItems; ++i) {  // subscribed again to everything
                auto item = world.GetWorkshopItem(7000 + static_cast<PublishedFileId_t>(i));
                item->subscribed = true;
                world.AddWorkshopItem(*item);
            }
        }
        const int seen = reads.load(std::memory_order_acquire);
        for (int spin = 0; spin < 1000000 && reads.load(std::memory_order_acquire) == seen; ++spin)
            std::this_thread::yield();
    }
    done.store(true, std::memory_order_release);
    reader.join();

    EXPECT_GT(reads.load(), kRounds / 2);
    EXPECT_EQ(badCounts.load(), 0);
    EXPECT_EQ(badRecords.load(), 0);
    EXPECT_GE(engine.Records().All().LogTexts().size(), static_cast<size_t>(kRounds));
}

}  // namespace
