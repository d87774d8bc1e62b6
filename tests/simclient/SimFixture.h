// A fresh, initialised world for each test.
#ifndef TESTS_SIMCLIENT_SIM_FIXTURE_H
#define TESTS_SIMCLIENT_SIM_FIXTURE_H

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

#endif  // TESTS_SIMCLIENT_SIM_FIXTURE_H
