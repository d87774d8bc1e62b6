#include "simengine/ModuleLoader.h"

#include "simengine/Engine.h"

namespace simengine {

namespace {

const char kExportName[] = "OB_GetExtensionModuleInterface";

}  // namespace

ModuleLoader::~ModuleLoader()
{
    Unload();
}

bool ModuleLoader::Load(const std::string& path)
{
    Unload();
    error_.clear();
    if (!library_.Open(path)) {
        error_ = "cannot load module '" + path + "': " + library_.Error();
        return false;
    }

    void* symbol = library_.Find(kExportName);
    if (symbol == nullptr) {
        error_ = "module '" + path + "' does not export " + kExportName + ": " + library_.Error();
        library_.Close();
        return false;
    }

    auto getInterface = reinterpret_cast<GetExtensionModuleInterfaceFn>(symbol);
    ExtensionModule* module = getInterface();
    if (module == nullptr) {
        error_ = "module '" + path + "': " + kExportName + " returned null";
        library_.Close();
        return false;
    }
    module_ = module;
    path_ = path;
    return true;
}

void ModuleLoader::ReleaseModuleObjects()
{
    // The module never destroys its objects; the engine releases the services
    // and the module through their virtual destructors before the code goes away.
    constexpr int32_t kServiceNumbers[] = {kServiceStore, kServiceLeaderboards, kServiceCloud,
                                           kServiceAchievements, kServiceWorkshop};
    for (int32_t number : kServiceNumbers)
        delete module_->GetImplementation(number);
    delete module_;
    module_ = nullptr;
}

bool ModuleLoader::Unload()
{
    if (!library_.IsOpen())
        return true;
    Engine::Instance().QuitAndJoin();
    ReleaseModuleObjects();
    if (!library_.Close()) {
        error_ = "cannot unload module '" + path_ + "': " + library_.Error();
        return false;
    }
    if (DynamicLibrary::IsLoadedAnywhere(path_)) {
        error_ = "module '" + path_ + "' stays loaded after it was closed; its statics are not fresh";
        return false;
    }
    return true;
}

}  // namespace simengine
