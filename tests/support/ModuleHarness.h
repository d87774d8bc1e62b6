// Tests of the module as the engine sees it: the built module file loaded the
// way the engine loads it, the simulated engine's table, the simulated client.
// Each test gets a freshly loaded module (fresh statics) and a clean world.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "frame/ExtensionModule.h"
#include "simclient/World.h"
#include "simengine/Engine.h"
#include "simengine/ModuleLoader.h"

#ifndef STEAMEXT_MODULE_PATH
#error "STEAMEXT_MODULE_PATH names the built module file"
#endif

// A public individual account: the low 32 bits are the account id.
constexpr uint64 kIndividualAccountBase = 0x0110000100000000ull;
constexpr AppId_t kTestAppId = 480;

class ModuleTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        world.Reset();
        engine.Reset();
        world.SetAppId(kTestAppId);
        world.SetLocalUser(kIndividualAccountBase + 1234, true, "Player One");
        ASSERT_TRUE(loader.Load(STEAMEXT_MODULE_PATH)) << loader.Error();
        module = loader.Module();
    }

    void TearDown() override
    {
        // As the engine ends: stop the module, let its threads see the quit, unload.
        module->Shutdown();
        engine.QuitAndJoin();
        EXPECT_TRUE(loader.Unload()) << "the module stayed loaded: the next test would share its statics";
        auto faults = engine.Records().All().Faults();
        EXPECT_TRUE(faults.empty()) << "engine fault: " << faults.front().text;
        world.Reset();
        engine.Reset();
    }

    bool Start() { return module->Initialize(engine.Table()); }

    template <class Service> Service* ServiceAt(int32_t number)
    {
        return dynamic_cast<Service*>(module->GetImplementation(number));
    }

    // Platform calls named `name` since the journal was last cleared.
    size_t PlatformCalls(const std::string& name) const { return world.GetJournal().Count(name); }

    std::vector<std::string> LogTexts() const { return engine.Records().All().LogTexts(); }

    simclient::World& world = simclient::GetWorld();
    simengine::Engine& engine = simengine::Engine::Instance();
    simengine::ModuleLoader loader;
    ExtensionModule* module = nullptr;
};
