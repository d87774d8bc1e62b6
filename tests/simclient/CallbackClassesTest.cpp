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

// Set, replace, cancel, destroy: only the latest live binding gets its result, once.
TEST_F(CallbackClasses, CallResultBindingLifecycle)
{
    Catch c;
    CCallResult<Catch, LeaderboardFindResult_t> result;
    result.Set(k_uAPICallInvalid, &c, &Catch::OnResult);
    EXPECT_FALSE(result.IsActive()) << "a zero handle was bound";
    world.InjectFault("FindOrCreateLeaderboard", simclient::Fault::IoFailure().Skip(1));
    SteamAPICall_t replaced = StartFind("a");
    result.Set(replaced, &c, &Catch::OnResult);
    result.Set(StartFind("b"), &c, &Catch::OnResult);
    EXPECT_TRUE(result.IsActive());
    EXPECT_EQ(world.BoundCallResultCount(), 1u);
    {
        CCallResult<Catch, LeaderboardFindResult_t> cancelled, destroyed;
        cancelled.Set(StartFind("c"), &c, &Catch::OnResult);
        cancelled.Cancel();
        EXPECT_FALSE(cancelled.IsActive());
        destroyed.Set(StartFind("d"), &c, &Catch::OnResult);
    }
    EXPECT_EQ(world.BoundCallResultCount(), 1u);
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 1);
    EXPECT_EQ(c.last.m_hSteamLeaderboard, 2u);  // board "b"
    EXPECT_TRUE(c.lastIoFailure);
    EXPECT_FALSE(result.IsActive());
    EXPECT_EQ(world.BoundCallResultCount(), 0u);
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

// A delivery through the three-argument Run with a foreign handle must be ignored.
TEST_F(CallbackClasses, ForeignHandleIsIgnored)
{
    SteamAPICall_t h = StartFind("a");
    ResultCatcher<LeaderboardFindResult_t> c(h);
    LeaderboardFindResult_t payload{};
    CCallbackBase& base = (CCallbackBase&)c.result;  // private base: C-style cast
    base.Run(&payload, false, h + 1000);
    EXPECT_EQ(c.calls, 0);
    EXPECT_TRUE(c.result.IsActive());
    base.Run(&payload, false, h);
    EXPECT_EQ(c.calls, 1);
    EXPECT_FALSE(c.result.IsActive());
    EXPECT_EQ(base.GetCallbackSizeBytes(), int(sizeof(LeaderboardFindResult_t)));
    EXPECT_EQ(base.GetICallback(), LeaderboardFindResult_t::k_iCallback);
}

// Registration follows the object's life, without duplicates; game-server objects get
// nothing from the client.
TEST_F(CallbackClasses, CallbackRegistrationFollowsTheObject)
{
    using OverlayCatch = Catcher<GameOverlayActivated_t>;
    OverlayCatch c, server;
    const int id = GameOverlayActivated_t::k_iCallback;
    const int before = world.RegisteredCallbackCount(id);
    CCallback<OverlayCatch, GameOverlayActivated_t, true> serverCallback(&server, &OverlayCatch::OnCallback);
    {
        CCallback<OverlayCatch, GameOverlayActivated_t> cb(&c, &OverlayCatch::OnCallback);
        EXPECT_EQ(world.RegisteredCallbackCount(id), before + 2);
        cb.Register(&c, &OverlayCatch::OnCallback);  // re-register must not duplicate
        EXPECT_EQ(world.RegisteredCallbackCount(id), before + 2);
        world.SetOverlayActive(true);
        SteamAPI_RunCallbacks();
        cb.Unregister();
        EXPECT_EQ(world.RegisteredCallbackCount(id), before + 1);
        cb.Register(&c, &OverlayCatch::OnCallback);
    }
    EXPECT_EQ(world.RegisteredCallbackCount(id), before + 1);
    EXPECT_EQ(c.calls, 1);
    EXPECT_EQ(server.calls, 0);
}

}  // namespace
