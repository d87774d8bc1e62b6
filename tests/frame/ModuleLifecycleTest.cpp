// The module's start, services and stop, as the engine sees them.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>
#include <vector>

#include "ModuleHarness.h"
#include "simengine/DynamicLibrary.h"

namespace {

using simengine::LogKind;

std::vector<std::string> CallNames(const simclient::Journal& journal, const std::vector<std::string>& keep)
{
    std::vector<std::string> names;
    for (const std::string& name : journal.Names())
        for (const std::string& wanted : keep)
            if (name == wanted)
                names.push_back(name);
    return names;
}

class ModuleLifecycle : public ModuleTest {};

TEST_F(ModuleLifecycle, ExportGivesOneObjectEvenWhenCallsRace)
{
    // Catches an unguarded lazy creation: racing first calls must agree.
    ASSERT_TRUE(loader.Unload());
    simengine::DynamicLibrary library;
    ASSERT_TRUE(library.Open(STEAMEXT_MODULE_PATH)) << library.Error();
    auto entry =
        reinterpret_cast<GetExtensionModuleInterfaceFn>(library.Find("OB_GetExtensionModuleInterface"));
    ASSERT_NE(entry, nullptr);
    std::vector<ExtensionModule*> seen(8);
    std::atomic<bool> go{false};
    std::vector<std::thread> racers;
    for (size_t i = 0; i < seen.size(); ++i)
        racers.emplace_back([&, i] {
            while (!go) {
            }
            seen[i] = entry();
        });
    go = true;
    for (std::thread& racer : racers)
        racer.join();
    ASSERT_NE(seen[0], nullptr);
    for (ExtensionModule* each : seen)
        EXPECT_EQ(each, seen[0]);
    EXPECT_EQ(entry(), seen[0]);
    delete seen[0];
    library.Close();
    ASSERT_TRUE(loader.Load(STEAMEXT_MODULE_PATH)) << loader.Error();
    module = loader.Module();
}

TEST_F(ModuleLifecycle, ConstantsAndServicesBeforeInitialize)
{
    EXPECT_EQ(module->GetModuleType(), 2);
    EXPECT_EQ(module->GetInterfaceStamp(), 0x3C42000);
    EXPECT_STREQ(module->GetName(), "Steam");
    EXPECT_FALSE(module->IsOverlayActive());
    for (int32_t number : {-1, 0, 1, 2, 3, 4, 5, 6, 7}) {
        SCOPED_TRACE(number);
        EXPECT_EQ(module->GetImplementation(number), nullptr);
    }
    // Loading touches neither the engine nor the platform beyond the overlay registration.
    EXPECT_TRUE(engine.Records().All().Entries().empty());
    EXPECT_EQ(world.GetJournal().Names(), std::vector<std::string>{"SteamAPI_RegisterCallback"});
}

TEST_F(ModuleLifecycle, GoodStartUp)
{
    world.SetLocalUser(kIndividualAccountBase + 0xFFFFFFFEull, true, "Negative");  // prints as "-2"
    ASSERT_TRUE(Start());

    auto logs = engine.Records().All().Logs();
    ASSERT_EQ(logs.size(), 2u);
    EXPECT_EQ(logs[0].kind, LogKind::Info);
    EXPECT_EQ(logs[0].text, "Initializing Steam..");
    EXPECT_EQ(logs[1].kind, LogKind::Info);
    EXPECT_EQ(logs[1].text, "Steam OK.");

    auto events = engine.Records().All().Events();
    ASSERT_EQ(events.size(), 1u);
    EXPECT_EQ(events[0].type, 17);
    EXPECT_EQ(events[0].status, 1);
    ASSERT_TRUE(events[0].startup.has_value());
    EXPECT_EQ(events[0].startup->playerId, "-2");
    EXPECT_FALSE(events[0].startup->errorText.has_value());

    simclient::Journal journal = world.GetJournal();
    // The overlay callback was registered at load, before the platform started.
    EXPECT_TRUE(journal.CalledBefore("SteamAPI_RegisterCallback", "SteamAPI_Init"));
    EXPECT_EQ(journal.Calls("SetOverlayNotificationPosition").at(0).args, "1");
    EXPECT_EQ(journal.Count("SetWarningMessageHook"), 1u);
    // Once by the statistics object, once by the start-up itself.
    EXPECT_EQ(journal.Count("RequestCurrentStats"), 2u);
    EXPECT_EQ(engine.Records().All().ThreadStarts().at(0).name, "SteamStats_Updater");
    for (int32_t number : {1, 2, 3, 4, 6}) {
        SCOPED_TRACE(number);
        BaseImplementation* service = module->GetImplementation(number);
        ASSERT_NE(service, nullptr);
        EXPECT_EQ(service->GetServiceType(), number);
        EXPECT_STREQ(service->GetPlatformName(), "Steam");
    }
    for (int32_t number : {-1, 0, 5, 7, 1000})
        EXPECT_EQ(module->GetImplementation(number), nullptr) << number;
}

TEST_F(ModuleLifecycle, InitFailureWithTheClientRunning)
{
    // Catches a failed start that warns about the client, leaves services or the
    // updater thread behind, or pumps and takes down what never started. (The same
    // with the client absent is the scenario startup/steam_not_running.)
    world.SetInitSucceeds(false);
    EXPECT_FALSE(Start());

    std::vector<std::pair<int32_t, std::string>> logs;
    for (const auto& line : engine.Records().All().Logs())
        logs.emplace_back(line.level, line.text);
    EXPECT_EQ(logs, (std::vector<std::pair<int32_t, std::string>>{{0, "Initializing Steam.."},
                                                                  {2, "Steam Init failed."}}));
    auto events = engine.Records().All().Events(17);
    ASSERT_EQ(events.size(), 1u);
    EXPECT_EQ(events[0].status, 0);
    EXPECT_EQ(events[0].startup->errorText, "Steam Init failed.");
    EXPECT_FALSE(events[0].startup->playerId.has_value());
    for (int32_t number : {1, 2, 3, 4, 6})
        EXPECT_EQ(module->GetImplementation(number), nullptr);
    EXPECT_TRUE(engine.Records().All().ThreadStarts().empty());

    world.ClearJournal();
    module->Update();
    module->Shutdown();
    module->Shutdown();
    EXPECT_EQ(PlatformCalls("SteamAPI_RunCallbacks"), 0u);
    EXPECT_EQ(PlatformCalls("SteamAPI_Shutdown"), 0u);
    EXPECT_EQ(PlatformCalls("SteamAPI_UnregisterCallback"), 0u);
}

TEST_F(ModuleLifecycle, WithoutUserInterfaceThePlayerIdIsZero)
{
    world.SetInterfaceAvailable(simclient::Interface::User, false);
    ASSERT_TRUE(Start());
    auto event = engine.Records().All().Events(17).at(0);
    EXPECT_EQ(event.status, 1);
    EXPECT_EQ(event.startup->playerId, "0");
    EXPECT_EQ(PlatformCalls("RequestCurrentStats"), 0u);
}

TEST_F(ModuleLifecycle, WithoutUtilitiesNoUpdaterThreadYetStartUpSucceeds)
{
    world.SetInterfaceAvailable(simclient::Interface::Utils, false);
    ASSERT_TRUE(Start());
    EXPECT_TRUE(engine.Records().All().ThreadStarts().empty());
    EXPECT_EQ(PlatformCalls("SetOverlayNotificationPosition"), 0u);
    // Only the start-up's own request is made. (Its log line and event are the
    // scenario achievements/no_utils.)
    EXPECT_EQ(PlatformCalls("RequestCurrentStats"), 1u);
}

TEST_F(ModuleLifecycle, ShutdownUndoesTheStartOnce)
{
    // Catches a pump before the start, an unbalanced or repeated take-down, a store
    // made here, and services dropped with the connection.
    module->Update();
    EXPECT_EQ(PlatformCalls("SteamAPI_RunCallbacks"), 0u);
    ASSERT_TRUE(Start());
    world.ClearJournal();
    module->Shutdown();
    std::vector<std::string> unregistered;
    for (const auto& call : world.GetJournal().Calls("SteamAPI_UnregisterCallback"))
        unregistered.push_back(call.args);
    EXPECT_EQ(unregistered, (std::vector<std::string>{"1103", "1102", "1101"}));
    EXPECT_EQ(CallNames(world.GetJournal(), {"SteamAPI_UnregisterCallback", "SteamAPI_Shutdown"}).back(),
              "SteamAPI_Shutdown");
    // No store here: the last one belongs to the updater thread.
    EXPECT_EQ(PlatformCalls("StoreStats"), 0u);

    world.ClearJournal();
    module->Shutdown();
    EXPECT_TRUE(world.GetJournal().Names().empty());
    // The services stay.
    EXPECT_NE(module->GetImplementation(1), nullptr);
}

TEST_F(ModuleLifecycle, WarningHookLogsThroughTheEngine)
{
    ASSERT_TRUE(Start());
    ASSERT_TRUE(world.EmitWarning(1, "low disk"));
    auto logs = engine.Records().All().Logs();
    EXPECT_EQ(logs.back().kind, LogKind::Log);
    EXPECT_EQ(logs.back().level, 0);  // the severity is not passed on
    EXPECT_EQ(logs.back().text, "STEAM: low disk");
}

}  // namespace
