// Achievements and statistics: the operations of service 3, the three
// statistics handlers, and the updater thread's timing on a manual clock.
#include <gtest/gtest.h>

#include "ModuleHarness.h"
#include "services/achievements/AchievementImplementation.h"

namespace {

constexpr const char* kUpdater = "SteamStats_Updater";

class Achievements : public ModuleTest {
protected:
    void StartAndSettle()
    {
        ASSERT_TRUE(Start());
        ASSERT_TRUE(engine.Time().WaitUntilSleeping(kUpdater));
        module->Update();  // deliver the answers to the start-up's requests
        service = ServiceAt<AchievementImplementation>(3);
        ASSERT_NE(service, nullptr);
    }

    // Moves engine time on and waits until the updater is back asleep.
    void AdvanceUpdater(uint32_t milliseconds)
    {
        engine.Time().Advance(milliseconds);
        ASSERT_TRUE(engine.Time().WaitUntilSleeping(kUpdater));
    }

    AchievementImplementation* service = nullptr;
};

TEST_F(Achievements, StoreComesOnlyAfterMoreThanTwentySeconds)
{
    struct Row {
        uint32_t advance;
        size_t stores;
    };
    const Row rows[] = {{19999, 0}, {20000, 0}, {20001, 1}};
    for (const Row& row : rows) {
        SCOPED_TRACE(row.advance);
        TearDown();
        SetUp();
        StartAndSettle();
        AdvanceUpdater(row.advance);
        EXPECT_EQ(PlatformCalls("StoreStats"), row.stores);
    }
}

TEST_F(Achievements, IntervalRestartsAfterEachStoreAndQuitStoresOnceMore)
{
    StartAndSettle();
    AdvanceUpdater(20001);
    AdvanceUpdater(20000);  // measured from the last store: not yet
    EXPECT_EQ(PlatformCalls("StoreStats"), 1u);
    AdvanceUpdater(400);
    EXPECT_EQ(PlatformCalls("StoreStats"), 2u);
    engine.QuitAndJoin();
    EXPECT_EQ(PlatformCalls("StoreStats"), 3u);
}

TEST_F(Achievements, QuitBeforeTheFirstPassStillStoresOnce)
{
    engine.SetQuitting(true);
    ASSERT_TRUE(Start());
    engine.Threads().Join(kUpdater);
    EXPECT_EQ(PlatformCalls("StoreStats"), 1u);
    EXPECT_EQ(engine.Time().SleepCalls(kUpdater), 0u);
}

TEST_F(Achievements, UnlockIsStoredByTheThreadAndReported)
{
    world.DefineAchievement("FIRST_BLOOD");
    StartAndSettle();
    service->UnlockAchievement(0, "FIRST_BLOOD");
    EXPECT_EQ(world.AchievementUnlocked("FIRST_BLOOD"), true);
    EXPECT_EQ(PlatformCalls("StoreStats"), 0u);  // setting never stores

    AdvanceUpdater(20001);
    uint64_t mark = engine.Records().Mark();
    module->Update();
    auto logs = engine.Records().Since(mark).Logs();
    ASSERT_EQ(logs.size(), 1u);
    EXPECT_EQ(logs[0].level, 0);
    EXPECT_EQ(logs[0].text, "Stored Achievement for Steam");
}

TEST_F(Achievements, OperationsPassNamesUnchangedAndRespectTheConnection)
{
    world.DefineStat("kills", 5);
    StartAndSettle();
    EXPECT_EQ(service->GetStatistic("kills"), 5);
    service->SetStatistic("kills", -3);
    EXPECT_EQ(world.Stat("kills"), -3);
    EXPECT_EQ(service->GetStatistic("missing"), 0);
    EXPECT_FALSE(service->ReservedQuery());

    world.ClearJournal();
    service->UnlockAchievement(0, nullptr);
    EXPECT_EQ(PlatformCalls("SetAchievement"), 0u);

    module->Shutdown();
    world.ClearJournal();
    service->UnlockAchievement(0, "FIRST_BLOOD");
    EXPECT_EQ(service->GetStatistic("kills"), 0);
    EXPECT_TRUE(world.GetJournal().Names().empty());
}

TEST_F(Achievements, HandlersLogByGameAndResult)
{
    struct Row {
        const char* name;
        int callback;  // 1101, 1102 or 1103
        uint64 gameId;
        EResult result;
        std::vector<std::pair<int32_t, std::string>> logs;
    };
    const uint64 app = kTestAppId;
    const Row rows[] = {
        {"received ok", 1101, app, k_EResultOK, {}},
        {"received failed", 1101, app, k_EResultFail, {{1, "RequestStats - failed, 2"}}},
        {"received for another game", 1101, app + 1, k_EResultFail, {}},
        {"stored ok", 1102, app, k_EResultOK, {}},
        {"stored invalid", 1102, app, k_EResultInvalidParam, {{1, "StoreStats - some failed to validate"}}},
        {"stored timeout", 1102, app, k_EResultTimeout, {{1, "StatsStored - failed, 16"}}},
        {"stored for another game", 1102, 0, k_EResultTimeout, {}},
        {"achievement", 1103, app, k_EResultOK, {{0, "Stored Achievement for Steam"}}},
        {"achievement for another game", 1103, app + 7, k_EResultOK, {}},
    };
    StartAndSettle();
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        if (row.callback == 1101) {
            UserStatsReceived_t data{};
            data.m_nGameID = row.gameId;
            data.m_eResult = row.result;
            world.Post(data);
        } else if (row.callback == 1102) {
            UserStatsStored_t data{};
            data.m_nGameID = row.gameId;
            data.m_eResult = row.result;
            world.Post(data);
        } else {
            UserAchievementStored_t data{};
            data.m_nGameID = row.gameId;
            world.Post(data);
        }
        uint64_t mark = engine.Records().Mark();
        module->Update();
        std::vector<std::pair<int32_t, std::string>> logs;
        for (const auto& line : engine.Records().Since(mark).Logs())
            logs.emplace_back(line.level, line.text);
        EXPECT_EQ(logs, row.logs);
    }
}

TEST_F(Achievements, AfterShutdownTheHandlersAreGone)
{
    StartAndSettle();
    module->Shutdown();
    EXPECT_EQ(world.RegisteredCallbackCount(1101), 0);
    EXPECT_EQ(world.RegisteredCallbackCount(1102), 0);
    EXPECT_EQ(world.RegisteredCallbackCount(1103), 0);
    EXPECT_EQ(world.RegisteredCallbackCount(331), 2);  // the overlay's and the store's stay until unload
}

}  // namespace
