// Delivery only inside SteamAPI_RunCallbacks, after the configured latency, and safe
// against handlers that change registrations.
#include <memory>

#include "SimFixture.h"

namespace {

using OverlayCatch = Catcher<GameOverlayActivated_t>;
using OverlayCallback = CCallback<OverlayCatch, GameOverlayActivated_t>;

class Dispatch : public SimWorld {};

TEST_F(Dispatch, LatencyCountsPumps)
{
    struct Row {
        const char* name;
        int latency;
        int extra;
        int deliveredAtPump;
    };
    const Row rows[] = {
        {"default latency", 1, 0, 1},
        {"three pumps", 3, 0, 3},
        {"fault adds two", 1, 2, 3},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        world.SetLatency(row.latency);
        if (row.extra)
            world.InjectFault("RequestCurrentStats", simclient::Fault::ExtraLatency(row.extra));
        Listener<UserStatsReceived_t> c;
        ASSERT_TRUE(SteamUserStats()->RequestCurrentStats());
        EXPECT_EQ(c.calls, 0) << "delivered outside the pump";
        for (int pump = 1; pump <= row.deliveredAtPump; ++pump) {
            EXPECT_EQ(c.calls, 0) << "before pump " << pump;
            SteamAPI_RunCallbacks();
        }
        EXPECT_EQ(c.calls, 1);
        EXPECT_EQ(c.last.m_eResult, k_EResultOK);
        EXPECT_EQ(c.last.m_nGameID, 480u);
    }
}

// Registrations made before Init (as at library load) are kept; nothing is delivered
// while not initialised; Shutdown loses the results in flight.
TEST_F(Dispatch, InitAndShutdown)
{
    SteamAPI_Shutdown();
    world.Reset();
    Listener<GameOverlayActivated_t> c;
    world.SetOverlayActive(true);
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 0);
    ASSERT_TRUE(SteamAPI_Init());
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 1);

    ResultCatcher<LeaderboardFindResult_t> found(SteamUserStats()->FindOrCreateLeaderboard(
        "x", k_ELeaderboardSortMethodAscending, k_ELeaderboardDisplayTypeNumeric));
    SteamAPI_Shutdown();
    ASSERT_TRUE(SteamAPI_Init());
    SteamAPI_RunCallbacks();
    EXPECT_EQ(found.calls, 0);
    EXPECT_EQ(world.PendingCount(), 0u);
}

// Every registered object gets every posted payload, but handlers that destroy another
// registered object, or unregister themselves, must not have those called afterwards.
struct Destroyer {
    std::unique_ptr<OverlayCallback> victim;
    std::unique_ptr<CCallback<Destroyer, GameOverlayActivated_t>> self;
    int calls = 0;
    void OnCallback(GameOverlayActivated_t*)
    {
        ++calls;
        victim.reset();
        self->Unregister();
    }
};

TEST_F(Dispatch, HandlersMayDropCallbacks)
{
    Destroyer d;
    Listener<GameOverlayActivated_t> bystander;
    OverlayCatch c;
    d.self = std::make_unique<CCallback<Destroyer, GameOverlayActivated_t>>(&d, &Destroyer::OnCallback);
    d.victim = std::make_unique<OverlayCallback>(&c, &OverlayCatch::OnCallback);
    world.SetOverlayActive(true);
    world.SetOverlayActive(false);
    SteamAPI_RunCallbacks();
    EXPECT_EQ(d.calls, 1);
    EXPECT_EQ(c.calls, 0);
    EXPECT_EQ(bystander.calls, 2);
    EXPECT_EQ(bystander.last.m_bActive, 0);
}

}  // namespace
