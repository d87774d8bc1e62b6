#include "simengine/ModuleLoader.h"

#include <dlfcn.h>

#include "simengine/Engine.h"

namespace simengine {

namespace {

const char kExportName[] = "OB_GetExtensionModuleInterface";

std::string LastDlError()
{
    const char* text = dlerror();
    return text != nullptr ? text : "unknown error";
}

}  // namespace

ModuleLoader::~ModuleLoader()
{
    Unload();
}

bool ModuleLoader::Load(const std::string& path)
{
    Unload();
    error_.clear();
    dlerror();  // clear any stale error text
    void* library = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (library == nullptr) {
        error_ = "cannot load module '" + path + "': " + LastDlError();
        return false;
    }

    dlerror();
    void* symbol = dlsym(library, kExportName);
    if (symbol == nullptr) {
        error_ = "module '" + path + "' does not export " + kExportName + ": " + LastDlError();
        dlclose(library);
        return false;
    }

    auto getInterface = reinterpret_cast<GetExtensionModuleInterfaceFn>(symbol);
    ExtensionModule* module = getInterface();
    if (module == nullptr) {
        error_ = "module '" + path + "': " + kExportName + " returned null";
        dlclose(library);
        return false;
    }
    library_ = library;
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
    if (library_ == nullptr)
        return true;
    Engine::Instance().QuitAndJoin();
    ReleaseModuleObjects();
    bool closed = dlclose(library_) == 0;
    library_ = nullptr;
    if (!closed) {
        error_ = "cannot unload module '" + path_ + "': " + LastDlError();
        return false;
    }
    // RTLD_NOLOAD finds the library only if something keeps it in the process.
    void* stillThere = dlopen(path_.c_str(), RTLD_NOW | RTLD_LOCAL | RTLD_NOLOAD);
    if (stillThere != nullptr) {
        dlclose(stillThere);
        error_ = "module '" + path_ + "' stays loaded after dlclose; its statics are not fresh";
        return false;
    }
    return true;
}

}  // namespace simengine
