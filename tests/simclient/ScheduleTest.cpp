// Changes that happen by themselves: actions at a pump or an engine time, and names of
// other users that arrive late (or never) through one lookup.
#include <atomic>
#include <string>
#include <thread>

#include "SimFixture.h"
#include "WorldState.h"

namespace {

using simclient::Delay;
using simclient::Due;
using simclient::WorldData;

class Schedule : public SimWorld {
protected:
    // Appends `tag` to the server time's digits, so the order of actions shows.
    simclient::WorldAction Mark(uint32 tag)
    {
        return [tag](WorldData& d) { d.serverTime = d.serverTime * 10 + tag; };
    }
    uint32 Marks() { return SteamUtils()->GetServerRealTime(); }
};

TEST_F(Schedule, ActionsRunAtTheirPumpByDuePointThenOrder)
{
    world.SetServerTime(0);
    world.Schedule(Due::Pump(2), Mark(3));
    world.Schedule(Due::Pump(1), Mark(1));
    world.Schedule(Due::Pump(1), Mark(2));
    world.After(Delay::Pumps(3), Mark(4));
    EXPECT_EQ(world.ScheduledCount(), 4u);
    const uint32 expected[] = {12, 123, 1234, 1234};
    for (uint32 want : expected) {
        SteamAPI_RunCallbacks();
        EXPECT_EQ(Marks(), want) << "after pump " << world.PumpCount();
    }
    EXPECT_EQ(world.ScheduledCount(), 0u);
    world.Schedule(Due::Pump(1), Mark(5));  // already passed: the next pump
    SteamAPI_RunCallbacks();
    EXPECT_EQ(Marks(), 12345u);
}

TEST_F(Schedule, EngineTimeFollowsTheTimeSource)
{
    world.SetServerTime(0);
    world.Schedule(Due::EngineMs(100), Mark(1));
    SteamAPI_RunCallbacks();
    EXPECT_EQ(Marks(), 0u) << "fired without a time source";
    std::atomic<uint64_t> now{99};
    world.SetTimeSource([&now] { return now.load(); });
    SteamAPI_RunCallbacks();
    EXPECT_EQ(Marks(), 0u) << "fired early";
    world.After(Delay::EngineMs(50), Mark(2));  // from 99: at 149
    world.After(Delay::Pumps(1), Mark(3));      // pump-clocked first within a pump
    now = 200;
    SteamAPI_RunCallbacks();
    EXPECT_EQ(Marks(), 312u);
    world.Reset();
    EXPECT_EQ(world.ScheduledCount(), 0u);
    ASSERT_TRUE(SteamAPI_Init());
    world.Schedule(Due::EngineMs(0), Mark(9));
    SteamAPI_RunCallbacks();
    EXPECT_EQ(world.ScheduledCount(), 1u) << "Reset kept the time source";
}

// A callback an action posts for now is delivered by the pump that ran it.
TEST_F(Schedule, PostedCallbacksArriveInTheSamePump)
{
    Listener<GameOverlayActivated_t> c;
    world.SetJournalEnabled(false);  // the idle fast path must still see the action
    world.After(Delay::Pumps(2), [](WorldData& d) { d.PostNow(GameOverlayActivated_t{1}); });
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 0);
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 1);
}

TEST_F(Schedule, PersonaNamesArriveOnceOrNever)
{
    const uint64 base = 76561197960265728ull;
    struct Row {
        const char* name;
        std::function<void(simclient::World&, uint64)> setUp;
        int pumps;            // pumps until the name is known; 0: never
        const char* arrives;  // the name then
    };
    const Row rows[] = {
        {"known now", [](simclient::World& w, uint64 id) { w.SetPersonaName(id, "Ann"); }, -1, "Ann"},
        {"after three pumps",
         [](simclient::World& w, uint64 id) { w.SetPersonaNameArrives(id, "Bob", Delay::Pumps(3)); }, 3,
         "Bob"},
        {"after the latency", [](simclient::World& w, uint64 id) { w.SetPersonaName(id, "Cy", false); }, 1,
         "Cy"},
        {"never", [](simclient::World& w, uint64 id) { w.SetPersonaNameNever(id); }, 0, "[unknown]"},
        {"nobody the world knows", [](simclient::World&, uint64) {}, 1, "[unknown]"},
    };
    uint64 account = 10;
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        const CSteamID id(base + ++account);
        row.setUp(world, id.ConvertToUint64());
        Listener<PersonaStateChange_t> c;
        if (row.pumps < 0) {
            EXPECT_FALSE(SteamFriends()->RequestUserInformation(id, true));
            EXPECT_STREQ(SteamFriends()->GetFriendPersonaName(id), row.arrives);
            continue;
        }
        for (int pump = 1; pump <= 5; ++pump) {
            const bool known = row.pumps > 0 && pump > row.pumps;
            EXPECT_EQ(SteamFriends()->RequestUserInformation(id, true), !known) << "pump " << pump;
            EXPECT_STREQ(SteamFriends()->GetFriendPersonaName(id), known ? row.arrives : "[unknown]");
            SteamAPI_RunCallbacks();
            EXPECT_EQ(c.calls, row.pumps > 0 && pump >= row.pumps ? 1 : 0) << "pump " << pump;
        }
        if (c.calls) {
            EXPECT_EQ(c.last.m_ulSteamID, id.ConvertToUint64());
        }
        EXPECT_EQ(world.PendingCount() + world.ScheduledCount(), 0u);
    }
}

// A thread polling for a name that never comes must not grow the journal or the queue.
TEST_F(Schedule, PollingInATightLoopStaysBounded)
{
    const CSteamID id(76561197960265728ull + 77);
    world.SetPersonaNameArrives(id.ConvertToUint64(), "Late", Delay::Pumps(1000));
    ISteamFriends* friends = SteamFriends();
    std::thread poller([&] {
        for (int i = 0; i < 100000; ++i)
            friends->RequestUserInformation(id, true);
    });
    poller.join();
    simclient::Journal journal = world.GetJournal();
    ASSERT_EQ(journal.Size(), 1u);
    EXPECT_EQ(journal.Entries()[0].count, 100000u);
    EXPECT_EQ(journal.Count("RequestUserInformation"), 100000u);
    EXPECT_LE(world.PendingCount() + world.ScheduledCount(), 1u);
}

}  // namespace
