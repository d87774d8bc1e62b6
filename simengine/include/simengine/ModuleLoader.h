// Loads the module file the way the engine does: open the library, look up
// "OB_GetExtensionModuleInterface", call it. Unloading
// first quits and joins the engine's threads (the module never joins its own,
// and they run the module's code), then closes the library so that the next
// load starts with fresh module statics.
#pragma once

#include <string>

#include "frame/ExtensionModule.h"
#include "simengine/DynamicLibrary.h"

namespace simengine {

class ModuleLoader {
public:
    ModuleLoader() = default;
    ~ModuleLoader();
    ModuleLoader(const ModuleLoader&) = delete;
    ModuleLoader& operator=(const ModuleLoader&) = delete;

    // False with Error() set when the file, the export or its object is missing.
    bool Load(const std::string& path);
    ExtensionModule* Module() const { return module_; }
    bool IsLoaded() const { return library_.IsOpen(); }
    const std::string& Error() const { return error_; }

    // Quits and joins the engine's threads, releases the services and the
    // module object through their virtual destructors, then closes the library. True if it
    // is really gone from the process afterwards (its statics will be fresh).
    bool Unload();

private:
    void ReleaseModuleObjects();

    DynamicLibrary library_;
    ExtensionModule* module_ = nullptr;
    std::string path_;
    std::string error_;
};

}  // namespace simengine
