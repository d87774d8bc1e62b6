// The module's one export.
#include "foundation/Compiler.h"
#include "frame/ExtensionModuleSteam.h"

STEAMEXT_EXPORT ExtensionModule* OB_GetExtensionModuleInterface()
{
    // Created once, thread-safely, and never destroyed: the engine holds it
    // until the process ends.
    static ExtensionModule* const module = new ExtensionModuleSteam();
    return module;
}
