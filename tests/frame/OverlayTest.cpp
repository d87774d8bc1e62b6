// The overlay callback: the flag the engine polls, and the input reset that
// keeps keys pressed while the overlay had focus from sticking.
#include <gtest/gtest.h>

#include <set>

#include "ModuleHarness.h"

namespace {

using simengine::InputCall;

class Overlay : public ModuleTest {};

// The calls a reset must make, in order.
std::vector<std::tuple<InputCall::Kind, int32_t>> ExpectedReset()
{
    std::vector<std::tuple<InputCall::Kind, int32_t>> calls;
    for (int32_t id = 0; id <= 254; ++id)
        calls.emplace_back(InputCall::Kind::Button, id);
    for (int32_t first : {801, 865, 929, 993})
        for (int32_t id = first; id < first + 63; ++id) {
            calls.emplace_back(InputCall::Kind::Button, id);
            calls.emplace_back(InputCall::Kind::Axis, id);
        }
    return calls;
}

TEST_F(Overlay, OpeningAndClosingResetAllInputs)
{
    ASSERT_TRUE(Start());
    for (bool active : {true, false, false}) {
        SCOPED_TRACE(active);
        uint64_t mark = engine.Records().Mark();
        world.SetOverlayActive(active);
        EXPECT_TRUE(engine.Records().Since(mark).Inputs().empty()) << "delivered outside the pump";
        module->Update();
        EXPECT_EQ(module->IsOverlayActive(), active);

        std::vector<std::tuple<InputCall::Kind, int32_t>> seen;
        for (const InputCall& call : engine.Records().Since(mark).Inputs()) {
            seen.emplace_back(call.kind, call.inputId);
            if (call.kind == InputCall::Kind::Button)
                EXPECT_EQ(call.buttonValue, 0);
            else
                EXPECT_EQ(call.axisValue, 0.0f);
        }
        EXPECT_EQ(seen, ExpectedReset());
        std::set<int32_t> ids;
        for (const auto& call : seen)
            ids.insert(std::get<1>(call));
        for (int32_t untouched : {255, 800, 864, 928, 992, 1056})
            EXPECT_EQ(ids.count(untouched), 0u) << untouched;
    }
}

TEST_F(Overlay, CallbackRegisteredAtLoadStillDeliversBeforeStartUpIsPumped)
{
    // The registration happens at library load; the flag follows the overlay
    // only once the platform is up and pumped.
    EXPECT_EQ(world.RegisteredCallbackCount(331), 1);
    ASSERT_TRUE(Start());
    world.SetOverlayActive(true);
    EXPECT_FALSE(module->IsOverlayActive());
    module->Update();
    EXPECT_TRUE(module->IsOverlayActive());
}

TEST_F(Overlay, UnloadingUnregistersTheOverlayCallback)
{
    ASSERT_TRUE(loader.Unload());
    EXPECT_EQ(world.RegisteredCallbackCount(331), 0);
    EXPECT_EQ(world.GetJournal().Calls("SteamAPI_UnregisterCallback").back().args, "331");
    ASSERT_TRUE(loader.Load(STEAMEXT_MODULE_PATH));
    module = loader.Module();
}

}  // namespace
