// The module's one export.
#include "frame/ExtensionModuleSteam.h"

extern "C" __attribute__((visibility("default"))) ExtensionModule* OB_GetExtensionModuleInterface()
{
    // Created once, thread-safely, and never destroyed: the engine holds it
    // until the process ends.
    static ExtensionModule* const module = new ExtensionModuleSteam();
    return module;
}
