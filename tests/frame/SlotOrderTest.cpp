// The engine calls every operation by its position in the table of virtual
// operations, not by name: a reordered declaration would call the wrong code.
// These tests call by position, as the engine does (two destructor slots first).
#include <gtest/gtest.h>

#include <cstring>

#include "ModuleHarness.h"
#include "host/HostServices.h"

namespace {

template <class Result, class... Args> Result CallSlot(void* object, int slot, Args... args)
{
    void** table = *reinterpret_cast<void***>(object);
    using Function = Result (*)(void*, Args...);
    return reinterpret_cast<Function>(table[slot])(object, args...);
}

class SlotOrder : public ModuleTest {};

TEST_F(SlotOrder, ModuleTable)
{
    EXPECT_EQ(CallSlot<int32_t>(module, 2), 2);
    EXPECT_EQ(CallSlot<int32_t>(module, 3), 0x3C42000);
    EXPECT_STREQ(CallSlot<const char*>(module, 4), "Steam");
    EXPECT_FALSE(CallSlot<bool>(module, 7));
    EXPECT_EQ(CallSlot<BaseImplementation*>(module, 10, int32_t{1}), nullptr);
    ASSERT_TRUE(CallSlot<bool>(module, 5, engine.Table()));
    EXPECT_EQ(CallSlot<BaseImplementation*>(module, 10, int32_t{1}), module->GetImplementation(1));
    EXPECT_STREQ(CallSlot<const char*>(module, 9, "GameCenter", "IsAvailable"), "OK");
    CallSlot<void>(module, 8);
    EXPECT_EQ(PlatformCalls("SteamAPI_RunCallbacks"), 1u);
    CallSlot<void>(module, 6);
    EXPECT_EQ(PlatformCalls("SteamAPI_Shutdown"), 1u);
}

TEST_F(SlotOrder, CommonServiceOperations)
{
    ASSERT_TRUE(Start());
    for (int32_t number : {1, 3, 4}) {
        SCOPED_TRACE(number);
        BaseImplementation* service = module->GetImplementation(number);
        ASSERT_NE(service, nullptr);
        EXPECT_EQ(CallSlot<int32_t>(service, 2), number);
        EXPECT_STREQ(CallSlot<const char*>(service, 3), "Steam");
        EXPECT_TRUE(CallSlot<bool>(service, 4));
        CallSlot<void>(service, 5);
        CallSlot<void>(service, 6);
        EXPECT_TRUE(CallSlot<bool>(service, 7));
    }
}

TEST_F(SlotOrder, AchievementOperations)
{
    world.DefineAchievement("FIRST_BLOOD");
    world.DefineStat("kills", 0);
    ASSERT_TRUE(Start());
    BaseImplementation* service = module->GetImplementation(3);
    ASSERT_NE(service, nullptr);
    CallSlot<void>(service, 8, int32_t{0}, "FIRST_BLOOD");
    EXPECT_EQ(world.AchievementUnlocked("FIRST_BLOOD"), true);
    CallSlot<void>(service, 9);
    EXPECT_FALSE(CallSlot<bool>(service, 10));
    CallSlot<void>(service, 11);
    CallSlot<void>(service, 12, "kills", int32_t{17});
    EXPECT_EQ(world.Stat("kills"), 17);
    EXPECT_EQ(CallSlot<int32_t>(service, 13, "kills"), 17);
}

TEST_F(SlotOrder, CloudOperations)
{
    ASSERT_TRUE(Start());
    BaseImplementation* service = module->GetImplementation(1);
    ASSERT_NE(service, nullptr);
    ASSERT_TRUE(CallSlot<bool>(service, 4));
    const char data[] = "save";
    EXPECT_TRUE(CallSlot<bool>(service, 8, "slot1", static_cast<const void*>(data), int32_t{4}));
    HostBuffer* buffer = CallSlot<HostBuffer*>(service, 9, "slot1");
    ASSERT_NE(buffer, nullptr);
    EXPECT_EQ(std::memcmp(buffer->data, "save", 4), 0);
    engine.Table()->ReleaseBuffer(buffer);
    EXPECT_TRUE(CallSlot<bool>(service, 10, "slot1"));
    EXPECT_FALSE(world.File("slot1").has_value());
}

TEST_F(SlotOrder, StoreOperations)
{
    world.SetDlcs({{1001, false, true, "Sword"}});
    engine.Files().AddMemoryFile(
        "in-app-purchases/in-app-purchases.xml",
        "<?xml version=\"1.0\"?><root><array id=\"ITEMS\"><node id=\"a\" steam_id=\"1001\"/></array></root>");
    ASSERT_TRUE(Start());
    BaseImplementation* service = module->GetImplementation(4);
    ASSERT_NE(service, nullptr);
    EXPECT_FALSE(CallSlot<bool>(service, 7));  // not available before Initialize
    ASSERT_TRUE(CallSlot<bool>(service, 4));
    uint64_t mark = engine.Records().Mark();
    CallSlot<void>(service, 8, "a");
    CallSlot<void>(service, 10);
    std::vector<int> states;
    for (const auto& event : engine.Records().Since(mark).Events(33))
        states.push_back(event.store->itemState);
    EXPECT_EQ(states, (std::vector<int>{1, 0}));  // installed, then not available
    CallSlot<void>(service, 9, "a");
    EXPECT_EQ(world.StoreOverlayRequests().size(), 1u);
    EXPECT_TRUE(CallSlot<bool>(service, 11));
}

}  // namespace
