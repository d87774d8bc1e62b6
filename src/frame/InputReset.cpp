#include "frame/InputReset.h"

#include "host/HostServices.h"

namespace {

// The engine's input table: ids 0..254 are buttons, then four pads of 63
// button/axis pairs each, starting 64 apart (the 64th id of each pad is left alone).
constexpr int32_t kButtonCount = 255;
constexpr int32_t kPadFirstIds[] = {801, 865, 929, 993};
constexpr int32_t kPadIdCount = 63;

}  // namespace

void ResetEngineInput()
{
    for (int32_t id = 0; id < kButtonCount; ++id)
        hostServices->SetInputButton(id, 0);
    for (int32_t first : kPadFirstIds) {
        for (int32_t id = first; id < first + kPadIdCount; ++id) {
            hostServices->SetInputButton(id, 0);
            hostServices->SetInputAxis(id, 0.0f);
        }
    }
}
