// CCallback / CCallResult semantics as the module relies on them.
#include "SimFixture.h"

namespace {

using Catch = Catcher<LeaderboardFindResult_t>;

class CallbackClasses : public SimWorld {};

// A handle of a real call: the result arrives at the next pump.
SteamAPICall_t StartFind(const char* name)
{
    return SteamUserStats()->FindOrCreateLeaderboard(name, k_ELeaderboardSortMethodDescending,
                                                     k_ELeaderboardDisplayTypeNumeric);
}

TEST_F(CallbackClasses, CallResultDeliversOnceAndClearsHandle)
{
    Catch c;
    CCallResult<Catch, LeaderboardFindResult_t> result;
    EXPECT_FALSE(result.IsActive());
    SteamAPICall_t h = StartFind("board");
    ASSERT_NE(h, k_uAPICallInvalid);
    result.Set(h, &c, &Catch::OnResult);
    EXPECT_TRUE(result.IsActive());
    EXPECT_EQ(world.BoundCallResultCount(), 1u);

    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 1);
    EXPECT_FALSE(result.IsActive());
    EXPECT_EQ(world.BoundCallResultCount(), 0u);
    EXPECT_TRUE(c.last.m_bLeaderboardFound);
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 1);
}

// Catches a handler that still sees its handle set (it could not Set a follow-up call).
struct Chainer {
    CCallResult<Chainer, LeaderboardFindResult_t> result;
    bool activeInside = true;
    int calls = 0;
    void OnResult(LeaderboardFindResult_t*, bool)
    {
        ++calls;
        activeInside = result.IsActive();
        if (calls == 1)
            result.Set(StartFind("second"), this, &Chainer::OnResult);
    }
};

TEST_F(CallbackClasses, HandleIsClearedBeforeHandlerSoItCanChain)
{
    Chainer chain;
    chain.result.Set(StartFind("first"), &chain, &Chainer::OnResult);
    SteamAPI_RunCallbacks();
    EXPECT_FALSE(chain.activeInside);
    EXPECT_TRUE(chain.result.IsActive());
    SteamAPI_RunCallbacks();
    EXPECT_EQ(chain.calls, 2);
}

TEST_F(CallbackClasses, SetReplacesPendingCallAndOldResultIsIgnored)
{
    Catch c;
    CCallResult<Catch, LeaderboardFindResult_t> result;
    SteamAPICall_t first = StartFind("a");
    SteamAPICall_t second = StartFind("b");
    result.Set(first, &c, &Catch::OnResult);
    result.Set(second, &c, &Catch::OnResult);
    EXPECT_EQ(world.BoundCallResultCount(), 1u);
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 1);
    EXPECT_EQ(c.last.m_hSteamLeaderboard, 2u);  // board "b"
}

TEST_F(CallbackClasses, SetWithZeroHandleRegistersNothing)
{
    Catch c;
    CCallResult<Catch, LeaderboardFindResult_t> result;
    result.Set(k_uAPICallInvalid, &c, &Catch::OnResult);
    EXPECT_FALSE(result.IsActive());
    EXPECT_EQ(world.BoundCallResultCount(), 0u);
}

TEST_F(CallbackClasses, CancelAndDestructorDropTheBinding)
{
    Catch c;
    {
        CCallResult<Catch, LeaderboardFindResult_t> result;
        result.Set(StartFind("a"), &c, &Catch::OnResult);
        result.Cancel();
        EXPECT_FALSE(result.IsActive());
        EXPECT_EQ(world.BoundCallResultCount(), 0u);
        result.Set(StartFind("b"), &c, &Catch::OnResult);
    }
    EXPECT_EQ(world.BoundCallResultCount(), 0u);
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 0);
}

TEST_F(CallbackClasses, IoFailureFlagReachesHandler)
{
    world.InjectFault("FindOrCreateLeaderboard", simclient::Fault::IoFailure());
    Catch c;
    CCallResult<Catch, LeaderboardFindResult_t> result;
    result.Set(StartFind("a"), &c, &Catch::OnResult);
    SteamAPI_RunCallbacks();
    ASSERT_EQ(c.calls, 1);
    EXPECT_TRUE(c.lastIoFailure);
}

// A delivery through the three-argument Run with a foreign handle must be ignored.
TEST_F(CallbackClasses, ForeignHandleIsIgnored)
{
    Catch c;
    CCallResult<Catch, LeaderboardFindResult_t> result;
    SteamAPICall_t h = StartFind("a");
    result.Set(h, &c, &Catch::OnResult);
    LeaderboardFindResult_t payload{};
    CCallbackBase& base = (CCallbackBase&)result;  // private base: C-style cast
    base.Run(&payload, false, h + 1000);
    EXPECT_EQ(c.calls, 0);
    EXPECT_TRUE(result.IsActive());
    base.Run(&payload, false, h);
    EXPECT_EQ(c.calls, 1);
    EXPECT_FALSE(result.IsActive());
    EXPECT_EQ(base.GetCallbackSizeBytes(), int(sizeof(LeaderboardFindResult_t)));
    EXPECT_EQ(base.GetICallback(), LeaderboardFindResult_t::k_iCallback);
}

TEST_F(CallbackClasses, CallbackRegistersOnConstructionAndUnregistersOnDestruction)
{
    using OverlayCatch = Catcher<GameOverlayActivated_t>;
    OverlayCatch c;
    const int id = GameOverlayActivated_t::k_iCallback;
    const int before = world.RegisteredCallbackCount(id);
    {
        CCallback<OverlayCatch, GameOverlayActivated_t> cb(&c, &OverlayCatch::OnCallback);
        EXPECT_EQ(world.RegisteredCallbackCount(id), before + 1);
        cb.Register(&c, &OverlayCatch::OnCallback);  // re-register must not duplicate
        EXPECT_EQ(world.RegisteredCallbackCount(id), before + 1);
        cb.Unregister();
        EXPECT_EQ(world.RegisteredCallbackCount(id), before);
        cb.Register(&c, &OverlayCatch::OnCallback);
    }
    EXPECT_EQ(world.RegisteredCallbackCount(id), before);
}

TEST_F(CallbackClasses, GameServerCallbacksDoNotGetClientCallbacks)
{
    using OverlayCatch = Catcher<GameOverlayActivated_t>;
    OverlayCatch client, server;
    CCallback<OverlayCatch, GameOverlayActivated_t> c1(&client, &OverlayCatch::OnCallback);
    CCallback<OverlayCatch, GameOverlayActivated_t, true> c2(&server, &OverlayCatch::OnCallback);
    world.SetOverlayActive(true);
    SteamAPI_RunCallbacks();
    EXPECT_EQ(client.calls, 1);
    EXPECT_EQ(server.calls, 0);
}

}  // namespace
