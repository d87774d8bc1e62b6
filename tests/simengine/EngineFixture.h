// Every engine test starts from and leaves a reset engine.
#pragma once

#include <gtest/gtest.h>

#include "simengine/Engine.h"

// The engine's table, for thread entry points that are given no argument.
inline HostServices* Host()
{
    return simengine::Engine::Instance().Table();
}

class EngineTest : public ::testing::Test {
protected:
    void SetUp() override { engine.Reset(); }
    void TearDown() override
    {
        EXPECT_TRUE(engine.Records().All().Faults().empty() || expectFaults)
            << "unexpected engine fault: " << engine.Records().All().Faults().front().text;
        engine.Reset();
    }

    simengine::Engine& engine = simengine::Engine::Instance();
    HostServices* table = engine.Table();
    bool expectFaults = false;
};
