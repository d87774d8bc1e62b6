// Service 6 as the engine sees it: operations by slot, the start-up's app id,
// the walk's locking, and what a publication hands to the platform.
#include <gtest/gtest.h>

#include <optional>
#include <string>
#include <vector>

#include "ModuleHarness.h"
#include "services/workshop/UGCImplementation.h"
#include "services/workshop/UGCItem.h"

namespace {

template <class Result, class... Args> Result CallSlot(void* object, int slot, Args... args)
{
    void** table = *reinterpret_cast<void***>(object);
    using Function = Result (*)(void*, Args...);
    return reinterpret_cast<Function>(table[slot])(object, args...);
}

class Workshop : public ModuleTest {
protected:
    void StartWorkshop()
    {
        engine.SetProductValue("steam_app_id", "480");
        ASSERT_TRUE(Start());
        ugc = ServiceAt<UGCImplementation>(6);
        ASSERT_NE(ugc, nullptr);
        ASSERT_TRUE(ugc->Initialize());
    }

    // A record as the engine fills one; the texts are the engine's.
    static UGCItem Draft(const char* id, const char* tags, int32_t visibility)
    {
        UGCItem item{};
        item.id = const_cast<char*>(id);
        item.title = const_cast<char*>("Title");
        item.description = const_cast<char*>("Text");
        item.tags = const_cast<char*>(tags);
        item.contentPath = const_cast<char*>("mods/m");
        item.visibility = visibility;
        return item;
    }

    UGCImplementation* ugc = nullptr;
};

// A reordered declaration would make the engine call the wrong operation.
TEST_F(Workshop, OperationsByTheirSlots)
{
    simclient::WorkshopItem listed;
    listed.id = 42;
    listed.title = "Listed";
    listed.subscribed = true;
    listed.state = k_EItemStateInstalled;
    listed.folder = "/ws/42";
    world.AddWorkshopItem(listed);
    engine.SetProductValue("steam_app_id", "480");
    ASSERT_TRUE(Start());
    BaseImplementation* service = module->GetImplementation(6);
    ASSERT_NE(service, nullptr);
    EXPECT_FALSE(CallSlot<bool>(service, 7));  // IsAvailable before Initialize
    EXPECT_EQ(CallSlot<int32_t>(service, 2), 6);
    EXPECT_STREQ(CallSlot<const char*>(service, 3), "Steam");
    ASSERT_TRUE(CallSlot<bool>(service, 4));
    EXPECT_TRUE(CallSlot<bool>(service, 7));
    CallSlot<void>(service, 8);  // RefreshItems
    EXPECT_FALSE(CallSlot<bool>(service, 9));
    module->Update();
    EXPECT_TRUE(CallSlot<bool>(service, 9));
    EXPECT_EQ(CallSlot<int32_t>(service, 10), 1);
    auto* item = CallSlot<UGCItem*>(service, 11, int32_t{0});
    ASSERT_NE(item, nullptr);
    EXPECT_STREQ(item->id, "42");
    CallSlot<void>(service, 6);  // Update: the walk
    EXPECT_EQ(item->progress, 100);
    CallSlot<void>(service, 12, "42");
    EXPECT_EQ(PlatformCalls("SubscribeItem"), 1u);
    CallSlot<void>(service, 13, "42");
    EXPECT_EQ(PlatformCalls("UnsubscribeItem"), 1u);
    EXPECT_EQ(CallSlot<int32_t>(service, 10), 0);
    UGCItem draft = Draft(nullptr, nullptr, 0);
    auto* published = CallSlot<UGCItem*>(service, 14, static_cast<const UGCItem*>(&draft));
    ASSERT_NE(published, nullptr);
    EXPECT_EQ(published->progress, 1);
    CallSlot<void>(service, 15);
    EXPECT_EQ(world.WebPageRequests().size(), 1u);
    CallSlot<void>(service, 5);  // Shutdown does nothing
    EXPECT_TRUE(CallSlot<bool>(service, 7));
}

TEST_F(Workshop, AppIdIsReadAsLeadingDecimalDigits)
{
    struct Row {
        std::optional<std::string> value;
        bool starts;
        const char* address;
    } rows[] = {
        {std::string(" \t+480abc"), true, "appid=480&"},
        {std::string("0012"), true, "appid=12&"},
        {std::string("abc"), false, nullptr},
        {std::string("-0"), false, nullptr},
        {std::nullopt, false, nullptr},
    };
    ASSERT_TRUE(Start());
    ugc = ServiceAt<UGCImplementation>(6);
    ASSERT_NE(ugc, nullptr);
    for (const Row& row : rows) {
        SCOPED_TRACE(row.value.value_or("(none)"));
        engine.SetProductValue("steam_app_id", row.value);
        const size_t errorsBefore = engine.Records().All().LogsAtLevel(2).size();
        EXPECT_EQ(ugc->Initialize(), row.starts);
        const size_t errors = engine.Records().All().LogsAtLevel(2).size() - errorsBefore;
        EXPECT_EQ(errors, row.starts ? 0u : 1u);
        if (!row.starts)
            continue;
        ugc->OpenWorkshopBrowser();
        ASSERT_FALSE(world.WebPageRequests().empty());
        EXPECT_NE(world.WebPageRequests().back().first.find(row.address), std::string::npos)
            << world.WebPageRequests().back().first;
        EXPECT_EQ(world.WebPageRequests().back().second, k_EActivateGameOverlayToWebPageMode_Default);
    }
}

TEST_F(Workshop, WalkOverEmptyListsOnlyTakesTheMutex)
{
    StartWorkshop();
    engine.Mutexes().ResetCounts();
    world.ClearJournal();
    ugc->Update();
    simengine::MutexCounts counts = engine.Mutexes().Counts("STEAM_UGC");
    EXPECT_EQ(counts.locks, 1);
    EXPECT_EQ(counts.unlocks, 1);
    EXPECT_EQ(world.GetJournal().Size(), 0u);
}

TEST_F(Workshop, RecordWithoutIdIsNotWalked)
{
    StartWorkshop();
    world.InjectFault("CreateItem", simclient::Fault::ZeroHandle());
    UGCItem draft = Draft(nullptr, nullptr, 0);
    UGCItem* published = ugc->PublishItem(&draft);
    ASSERT_NE(published, nullptr);
    world.SetUpdateProgress(k_EItemUpdateStatusUploadingContent, 1, 2);
    world.ClearJournal();
    ugc->Update();
    EXPECT_EQ(PlatformCalls("GetItemState"), 0u);
    EXPECT_EQ(PlatformCalls("GetItemUpdateProgress"), 0u);
    EXPECT_EQ(published->progress, 1);
}

// What each setter receives, as the platform records it.
TEST_F(Workshop, PublicationHandsThePlatformItsData)
{
    const std::string longTag(3000, 't');
    const std::string withLongTag = longTag + ",x";
    struct Row {
        const char* name;
        const char* tags;
        int32_t visibility;
        std::vector<std::string> expectedTags;
        ERemoteStoragePublishedFileVisibility expectedVisibility;
    } rows[] = {
        {"no tags", nullptr, 0, {}, k_ERemoteStoragePublishedFileVisibilityPublic},
        {"empty tags", "", 1, {}, k_ERemoteStoragePublishedFileVisibilityFriendsOnly},
        {"trailing separator", "a,b,", 2, {"a", "b", ""}, k_ERemoteStoragePublishedFileVisibilityPrivate},
        {"empty middle", "a,,b", 3, {"a", "", "b"}, k_ERemoteStoragePublishedFileVisibilityPrivate},
        {"a tag too long",
         withLongTag.c_str(),
         -1,
         {"", "x"},
         k_ERemoteStoragePublishedFileVisibilityPrivate},
    };
    simclient::WorkshopItem existing;
    existing.id = 555;
    world.AddWorkshopItem(existing);
    engine.Paths().SetDataRoot("/game/data");
    StartWorkshop();
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        const size_t before = world.Submissions().size();
        UGCItem draft = Draft("555", row.tags, row.visibility);
        UGCItem* published = ugc->PublishItem(&draft);
        ASSERT_NE(published, nullptr);
        if (row.tags != nullptr) {
            EXPECT_NE(published->tags, draft.tags);  // the service's own copy
        }
        module->Update();
        ASSERT_EQ(world.Submissions().size(), before + 1);
        const simclient::WorkshopSubmission sent = world.Submissions().back();
        EXPECT_EQ(sent.id, 555u);
        EXPECT_EQ(sent.title, "Title");
        EXPECT_EQ(sent.description, "Text");
        EXPECT_EQ(sent.tags, row.expectedTags);
        EXPECT_EQ(sent.visibility, row.expectedVisibility);
        EXPECT_EQ(sent.content, "/game/data/mods/m");
        EXPECT_EQ(sent.preview, "/game/data/mods/m/preview.jpg");
        EXPECT_EQ(sent.changeNote, "Updated.");
        EXPECT_EQ(published->progress, 100);
    }
    EXPECT_EQ(PlatformCalls("CreateItem"), 0u);
    EXPECT_EQ(engine.Records().All().Events(42).size(), 5u);
}

// The last thing a successful publication does is event 42 with status 0, and the
// record already shows 100 then; a new item's first submission says "First version.".
TEST_F(Workshop, NewItemEndsWithTheSuccessEvent)
{
    StartWorkshop();
    UGCItem draft = Draft(nullptr, "a", 0);
    draft.subscribeAfterPublish = 1;
    UGCItem* published = ugc->PublishItem(&draft);
    ASSERT_NE(published, nullptr);
    EXPECT_EQ(published->id, nullptr);
    module->Update();
    ASSERT_NE(published->id, nullptr);
    EXPECT_EQ(std::to_string(world.Submissions().back().id), published->id);
    EXPECT_EQ(world.Submissions().back().changeNote, "First version.");
    EXPECT_EQ(engine.Records().All().Events(42).size(), 0u);
    module->Update();
    auto events = engine.Records().All().Events(42);
    ASSERT_EQ(events.size(), 1u);
    EXPECT_EQ(events[0].status, 0);
    EXPECT_EQ(published->progress, 100);
    EXPECT_TRUE(world.GetWorkshopItem(world.Submissions().back().id)->subscribed);
    auto calls = world.GetJournal().Calls("SubscribeItem");
    ASSERT_EQ(calls.size(), 1u);
    EXPECT_EQ(calls[0].args, published->id);
}

}  // namespace
