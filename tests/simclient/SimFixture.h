// A fresh, initialised world for each test.
#ifndef TESTS_SIMCLIENT_SIM_FIXTURE_H
#define TESTS_SIMCLIENT_SIM_FIXTURE_H

#include <functional>

#include <gtest/gtest.h>
#include <steam/steam_api.h>

#include "simclient/World.h"

class SimWorld : public ::testing::Test {
protected:
    void SetUp() override
    {
        world.Reset();
        ASSERT_TRUE(SteamAPI_Init());
        world.ClearJournal();
    }
    void TearDown() override { world.Reset(); }

    // Binds the result of `call`, pumps once and returns what the handler got; `inside`
    // runs within the handler (where downloaded entries are readable).
    template <class P> P Await(SteamAPICall_t call, std::function<void(const P&)> inside = {})
    {
        struct Handler {
            std::function<void(const P&)> inside;
            int calls = 0;
            P last{};
            void OnResult(P* p, bool)
            {
                ++calls;
                last = *p;
                if (inside)
                    inside(*p);
            }
        } handler{std::move(inside)};
        CCallResult<Handler, P> result;
        result.Set(call, &handler, &Handler::OnResult);
        SteamAPI_RunCallbacks();
        EXPECT_EQ(handler.calls, 1);
        return handler.last;
    }

    simclient::World& world = simclient::GetWorld();
};

// Records what a callback or call result handler received.
template <class P> struct Catcher {
    int calls = 0;
    bool lastIoFailure = false;
    P last{};
    void OnCallback(P* p)
    {
        ++calls;
        last = *p;
    }
    void OnResult(P* p, bool ioFailure)
    {
        ++calls;
        lastIoFailure = ioFailure;
        last = *p;
    }
};

// A catcher registered for its callback for as long as it lives.
template <class P> struct Listener : Catcher<P> {
    CCallback<Catcher<P>, P> callback{this, &Catcher<P>::OnCallback};
};

// A catcher bound to the result of one call.
template <class P> struct ResultCatcher : Catcher<P> {
    explicit ResultCatcher(SteamAPICall_t call) { result.Set(call, this, &Catcher<P>::OnResult); }
    CCallResult<Catcher<P>, P> result;
};

#endif  // TESTS_SIMCLIENT_SIM_FIXTURE_H
